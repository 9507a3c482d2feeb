// SPDX-License-Identifier: MIT
// Hostile strings in every member and before members of every kind.

#include "support/database.h"
#include "support/hostile_strings.h"

#include <iostream>
#include <set>

namespace {

bool has(const std::string& strText, char c)
{
    return std::string::npos != strText.find(c);
}

struct Kind {
    const char* szWord;
    const char* szValue;
    bool blDecoded;
};

const Kind kKinds[] = {
    {"string", "\"m\"", true},
    {"int", "42", true},
    {"unsigned int", "42", true},
    {"unsigned", "42", false},
    {"long", "42", false},
    {"unsigned long", "42", false},
    {"long long", "42", true},
    {"unsigned long long", "42", true},
    {"float", "1.5", false},
    {"double", "2.5", false},
    {"bool", "true", true},
    {"Json::objectValue", R"({"k":1})", true},
    {"Json::arrayValue", "[1]", true},
};

class Hostile : public TableTest, public testing::WithParamInterface<Kind> {
protected:
    Hostile() { database_.run("begin"); }
    ~Hostile() override { database_.run("commit"); }

    Json::Value record(const std::string& strFirst, const std::string& strLast) const
    {
        Json::Value jRecord;
        jRecord["a"] = strFirst;
        jRecord["m"] = json(GetParam().szValue);
        jRecord["z"] = strLast;
        return jRecord;
    }

    // A record that has to be stored as it is.
    void expectStored(const Json::Value& jRecord)
    {
        Json::Value jOut = jRecord;
        const int iResult = table_->api.recSave(jOut, true);
        EXPECT_EQ(GetParam().blDecoded ? 0 : -1, iResult);
        EXPECT_EQ(jRecord, jOut);
        const Rows rows =
            database_.rows("select a, z from " + table_->strName + " order by rowid desc limit 1");
        ASSERT_EQ(1U, rows.size());
        EXPECT_EQ(jRecord["a"].asString(), rows[0][0]);
        EXPECT_EQ(jRecord["z"].asString(), rows[0][1]);
        doubles::state().log.clear();
    }

    // A record that may end either way; on failure it stays as it is.
    void expectEnds(const Json::Value& jRecord)
    {
        Json::Value jOut = jRecord;
        const int iResult = table_->api.recSave(jOut, true);
        EXPECT_TRUE(0 == iResult || -1 == iResult);
        EXPECT_EQ(0 != iResult, !takeLog().empty());
        if (0 > iResult) {
            EXPECT_EQ(jRecord, jOut);
        }
    }

    std::unique_ptr<Table> table_ =
        std::make_unique<Table>(database_,
                                std::string(R"({"a":{"cpptype":"string"},"m":{"cpptype":")") +
                                    GetParam().szWord + R"("},"z":{"cpptype":"string"}})",
                                "a text, m, z text");
};

TEST_P(Hostile, StringsBeforeAndBehindAMember)
{
    for (const std::string& strHostile : hostileStrings()) {
        SCOPED_TRACE(testing::PrintToString(strHostile.substr(0, 100)));
        const bool blPlain = !has(strHostile, '\0') && !has(strHostile, '%');
        if (blPlain) {
            expectStored(record(strHostile, "z"));
            expectStored(record(strHostile, strHostile));
        } else {
            expectEnds(record(strHostile, "z"));
            expectEnds(record(strHostile, strHostile));
        }
        // No value follows the last one.
        if (!has(strHostile, '\0'))
            expectStored(record("a", strHostile));
        else
            expectEnds(record("a", strHostile));
        expectStored(record("sound", "handle"));
    }
}

std::string wordName(const testing::TestParamInfo<Kind>& kind)
{
    std::string strName;
    for (const char* szWord = kind.param.szWord; '\0' != *szWord; ++szWord)
        if (isalnum(static_cast<unsigned char>(*szWord))) strName += *szWord;
    return strName;
}

INSTANTIATE_TEST_SUITE_P(Words, Hostile, testing::ValuesIn(kKinds), wordName);

class HostileRecords : public TableTest {
protected:
    HostileRecords() { database_.run("begin"); }
    ~HostileRecords() override { database_.run("commit"); }
};

TEST_F(HostileRecords, AreEnough)
{
    const std::vector<std::string> strings = hostileStrings();
    const std::size_t nStrings = std::set<std::string>(strings.begin(), strings.end()).size();
    EXPECT_LE(400U, nStrings);
    std::cout << "figure: hostile strings = " << nStrings << std::endl;
}

TEST_F(HostileRecords, InObjectsAndArrays)
{
    Table table(database_,
                R"({"a":{"cpptype":"Json::arrayValue"},"o":{"cpptype":"Json::objectValue"}})",
                "a text, o text");
    for (const std::string& strHostile : hostileStrings()) {
        SCOPED_TRACE(testing::PrintToString(strHostile.substr(0, 100)));
        Json::Value jRecord = json(R"({"a":["a"],"o":{}})");
        jRecord["o"][strHostile] = strHostile;
        Json::Value jOut;
        EXPECT_EQ(0, table.api.recCreate(jRecord, jOut));
        EXPECT_EQ(jRecord, jOut);
        EXPECT_EQ(Lines(), takeLog());

        jRecord["a"][0] = strHostile;
        const Json::Value jBefore = jRecord;
        jOut = "untouched";
        const int iResult = table.api.recCreate(jRecord, jOut);
        EXPECT_EQ(jBefore, jRecord);
        if (!has(strHostile, '%')) {
            EXPECT_EQ(0, iResult);
            EXPECT_EQ(jRecord, jOut);
        } else if (0 != iResult) {
            EXPECT_EQ(-1, iResult);
            EXPECT_EQ(Json::Value("untouched"), jOut);
        }
        takeLog();
        EXPECT_EQ(json(R"({"a":[],"o":{}})"), table.create(R"({"a":[],"o":{}})"));
    }
}

TEST_F(HostileRecords, InKeysAndKindsThatAreRefused)
{
    Table table(database_, R"({"a":{"cpptype":"int"}})", "a");
    for (const std::string& strHostile : hostileStrings()) {
        SCOPED_TRACE(testing::PrintToString(strHostile.substr(0, 100)));
        Json::Value jRecord;
        jRecord["a"] = strHostile;
        jRecord["x" + strHostile] = strHostile;
        Json::Value jOut;
        EXPECT_EQ(-1, table.api.recCreate(jRecord, jOut));
        EXPECT_EQ((Lines{error("type failed, strKey=a, jRecParam=" + text(jRecord)),
                         failed("0 > checkJsonType(jParam)"),
                         plain("call create rec, rec=" + text(jRecord))}),
                  takeLog());
        jRecord["a"] = 1;
        EXPECT_EQ(0, table.api.recCreate(jRecord, jOut));
        EXPECT_EQ(json(R"({"a":1})"), jOut);
    }
}

TEST_F(HostileRecords, InNamesOfMembers)
{
    Json::Value jMembers;
    std::string strNames;
    for (const std::string& strHostile : hostileStrings())
        jMembers["a" + strHostile] = Json::Value();
    for (const std::string& strName : jMembers.getMemberNames()) {
        jMembers[strName]["cpptype"] = "string";
        strNames += strName + ",";
    }
    jMembers["z"]["cpptype"] = "int";
    Table table(database_, text(jMembers), "z");
    std::string strSql;
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strSql));
    EXPECT_EQ(strNames + "z", strSql);
    Json::Value jRecord = json(R"({"z":1})");
    EXPECT_EQ(0, table.api.recSave(jRecord, true));
    EXPECT_EQ(json(R"({"z":1})"), jRecord);
    EXPECT_EQ(Lines(), takeLog());
    // Names stay in the process-wide member types, which other tests dump.
    VORN_JSON_DB::recType(table.jDefinition, table.strName) = Json::Value(Json::objectValue);
}

}  // namespace
