// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Random records of hostile texts through every operation that writes: what is in the file
// afterwards is what was sent, or the call was refused with a reason and the file is unchanged.
#include "front/exact.h"
#include "front/front.h"
#include "front/random.h"

#include <limits>
#include <map>

namespace {

constexpr char kMembers[] = R"({
    "any":  {"cpptype": "Json::Value"},
    "flag": {"cpptype": "bool", "cppDefaultValue": true},
    "id":   {"cpptype": "long long"},
    "list": {"cpptype": "Json::arrayValue", "cppDefaultValue": ["%s"]},
    "name": {"cpptype": "string"},
    "obj":  {"cpptype": "Json::objectValue"},
    "qty":  {"cpptype": "int", "cppDefaultValue": -1},
    "text": {"cpptype": "string", "cppDefaultValue": "100%"}})";
constexpr char kColumns[] =
    "any text, flag integer, id integer primary key, list text, name text unique, obj text, "
    "qty integer, text text";

const char* const kTriggers[] = {
    "",
    "create trigger @_t after insert on @ when length(new.text) % 3 = 0 "
    "begin update @ set qty = qty + 1 where id = new.id; end",
    "create trigger @_t before insert on @ when length(new.text) % 3 = 0 "
    "begin select raise(ignore); end",
    "create trigger @_t after update on @ when length(new.text) % 3 = 0 "
    "begin update @ set text = text || 'x' where id = new.id; end",
    "create table @_log (a); create trigger @_t after insert on @ "
    "begin insert into @_log values (new.text); delete from @_log; end",
};

class Property : public FrontTest {
protected:
    using File = std::map<long long, std::string>;

    Property() { database_.run("pragma journal_mode=memory"); }

    // What is in the file, read apart from the library.
    File file(Front& front)
    {
        sqlite3_stmt* pStatement = nullptr;
        const std::string strSql = front.named("select any,flag,id,list,name,obj,qty,text from @");
        sqlite3_prepare_v2(database_.get(), strSql.c_str(), -1, &pStatement, nullptr);
        File rows;
        jRows_.clear();
        while (SQLITE_ROW == sqlite3_step(pStatement)) {
            Json::Value jRow;
            for (int i = 0; i < 8; ++i) {
                const char* szName = sqlite3_column_name(pStatement, i);
                if (SQLITE_NULL == sqlite3_column_type(pStatement, i)) continue;
                if (SQLITE_INTEGER == sqlite3_column_type(pStatement, i)) {
                    const Json::Int64 iValue = sqlite3_column_int64(pStatement, i);
                    jRow[szName] = 1 == i ? Json::Value(0 != iValue) : Json::Value(iValue);
                    continue;
                }
                const auto* szText =
                    reinterpret_cast<const char*>(sqlite3_column_text(pStatement, i));
                const std::string strText(
                    szText, static_cast<std::size_t>(sqlite3_column_bytes(pStatement, i)));
                jRow[szName] = 4 == i || 7 == i ? Json::Value(strText) : json(strText);
            }
            const long long iId = jRow["id"].asInt64();
            rows[iId] = exact(jRow);
            jRows_[iId] = jRow;
        }
        sqlite3_finalize(pStatement);
        return rows;
    }

    Json::Value record()
    {
        Json::Value jRecord(Json::objectValue);
        if (!draws_.once(6)) jRecord["any"] = draws_.value();
        if (!draws_.once(3)) jRecord["flag"] = draws_.once(2);
        if (!draws_.once(3)) jRecord["list"] = draws_.array();
        if (!draws_.once(3)) jRecord["obj"] = draws_.object();
        if (!draws_.once(3)) jRecord["name"] = draws_.text();
        if (!draws_.once(6)) jRecord["text"] = draws_.text();
        if (!draws_.once(3)) jRecord["qty"] = static_cast<int>(draws_.below(7)) - 3;
        if (draws_.once(9)) jRecord["qty"] = std::numeric_limits<int>::min();
        if (draws_.once(9)) jRecord[draws_.of(kOptional)] = Json::Value();
        return jRecord;
    }

    Json::Value withId(Json::Value jRecord)
    {
        jRecord["id"] = Json::Int64(draws_.below(40));
        if (draws_.once(9)) jRecord["id"] = std::numeric_limits<Json::Int64>::min();
        return jRecord;
    }

    static Json::Value filled(Json::Value jRecord)
    {
        const Json::Value jMembers = json(kMembers);
        for (const std::string& strName : jMembers.getMemberNames())
            if (!jRecord.isMember(strName) && jMembers[strName].isMember("cppDefaultValue"))
                jRecord[strName] = jMembers[strName]["cppDefaultValue"];
        return jRecord;
    }

    // What the file has to hold after the call succeeds: the rows before, with the records in it.
    void expectStored(Front& front, File before, const std::vector<Json::Value>& records)
    {
        File after = file(front);
        for (Json::Value jRecord : records) {
            auto found = after.end();
            if (jRecord.isMember("id") && !jRecord["id"].isNull()) {
                found = after.find(jRecord["id"].asInt64());
            } else {
                // SQLite made a key that was not there before.
                for (auto it = after.begin(); it != after.end() && after.end() == found; ++it)
                    if (0 == before.count(it->first)) {
                        jRecord["id"] = Json::Int64(it->first);
                        if (exactRecord(jRecord) == it->second) found = it;
                    }
            }
            ASSERT_NE(after.end(), found) << jRecord;
            ASSERT_EQ(exactRecord(jRecord), found->second);
            before[found->first] = found->second;
        }
        ASSERT_EQ(before, after);
    }

    void step(Front& front)
    {
        const File before = file(front);
        const std::map<long long, Json::Value> rows = jRows_;
        std::vector<Json::Value> records;
        std::string strOutcome;
        const std::size_t uOperation = draws_.below(4);
        if (0 == uOperation) {
            const Json::Value jRecord = draws_.once(2) ? record() : withId(record());
            strOutcome = front.create(jRecord);
            records = {filled(jRecord)};
        } else if (1 == uOperation) {
            Json::Value jMany(Json::arrayValue);
            const bool blIds = draws_.once(2);
            for (std::size_t n = 1 + draws_.below(4); 0 < n; --n) {
                jMany.append(blIds ? withId(filled(record())) : record());
                records.push_back(filled(jMany[jMany.size() - 1]));
            }
            strOutcome = front.createMany(jMany);
        } else {
            const Json::Value jRecord = withId(record());
            const auto found = rows.find(jRecord["id"].asInt64());
            Json::Value jExpected = rows.end() == found ? filled(jRecord) : found->second;
            if (2 == uOperation) strOutcome = front.save(jRecord);
            if (3 == uOperation) {
                Json::Value jCondition;
                jCondition["id"] = jRecord["id"];
                strOutcome = front.update(jCondition, jRecord);
            }
            // A trigger may set the text if it was not sent.
            file(front);
            if (rows.end() != found) jExpected["text"] = jRows_[found->first]["text"];
            for (const std::string& strName : jRecord.getMemberNames())
                jExpected[strName] = jRecord[strName];
            if (2 == uOperation || rows.end() != found) records = {jExpected};
        }
        Figures::of("front, records sent") += static_cast<long long>(records.size());
        if (std::isdigit(static_cast<unsigned char>(strOutcome[0]))) {
            Figures::of("front, calls that stored")++;
            expectStored(front, before, records);
            return;
        }
        Figures::of("front, calls refused: " + strOutcome.substr(0, strOutcome.find(':')))++;
        EXPECT_LT(10U, front.table->reason().size());
        ASSERT_EQ(before, file(front));
    }

    static constexpr const char* kOptional[] = {"any", "flag", "list", "name", "obj", "text"};
    Draws draws_;
    std::map<long long, Json::Value> jRows_;
};

TEST_F(Property, StoresWhatWasSentOrChangesNothing)
{
    const long long nRecords = fromEnvironment("VORN_FRONT_RECORDS", 3000);
    for (const char* szTrigger : kTriggers) {
        Front front(database_, kMembers, kColumns);
        front.run(szTrigger);
        const long long nEnd = Figures::of("front, records sent") + nRecords / 5;
        while (nEnd > Figures::of("front, records sent") && !HasFailure()) {
            step(front);
            doubles::reset();
            if (20 < jRows_.size() || draws_.once(50)) front.run("delete from @");
        }
    }
    // The texts are hostile, but most of them can be stored.
    EXPECT_LT(nRecords / 10, Figures::of("front, calls that stored"));
}

// Alone: each hostile text as the only one, in each member that takes it.
TEST_F(Property, StoresEachTextInEachMember)
{
    Front front(database_, kMembers, kColumns);
    long long nStored = 0;
    for (const std::string& strText : hostileStrings())
        for (const char* szMember : {"name", "text", "any", "list", "obj"}) {
            Json::Value jRecord;
            if (std::string("list") == szMember)
                jRecord[szMember][0] = strText;
            else if (std::string("obj") == szMember)
                jRecord["obj"][strText] = strText;
            else
                jRecord[szMember] = strText;
            const File before = file(front);
            const bool blJson = 'n' != *szMember && 't' != *szMember;
            const bool blStorable =
                isUtf8(strText) && (blJson || std::string::npos == strText.find('\0'));
            EXPECT_EQ(blStorable ? "0" : "refused", front.create(jRecord).substr(0, 7));
            if (blStorable) expectStored(front, before, {filled(jRecord)});
            if (!blStorable) {
                EXPECT_EQ(before, file(front));
            }
            nStored += blStorable ? 1 : 0;
            if (HasFailure()) return;
            front.run("delete from @");
        }
    Figures::of("front, texts stored alone") += nStored;
}

}  // namespace
