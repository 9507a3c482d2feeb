// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A record through create, save and fetch, against what each type word promises. The input is the
// list of the members, named a, b, c ... in their order:
//
//     [{"cpptype": "int", "value": 5}, {"cpptype": "string", "cppDefaultValue": "x"}]

#include "support/database.h"
#include "support/stored_record.h"
#include "support/target.h"

namespace {

constexpr Json::ArrayIndex kMaxMembers = 10;

struct Input {
    Json::Value jMembers{Json::objectValue};
    Json::Value jRecord{Json::objectValue};
    std::string strColumns;
};

bool read(const std::string& strText, Input& input)
{
    Json::Value jList;
    if (!parseJson(strText, jList) || !jList.isArray() || jList.empty()) return false;
    for (Json::ArrayIndex i = 0; i < jList.size() && i < kMaxMembers; ++i) {
        const Json::Value& jItem = jList[i];
        if (!jItem.isObject() || !jItem["cpptype"].isString()) return false;
        const std::string strKey(1, static_cast<char>('a' + i));
        input.jMembers[strKey]["cpptype"] = jItem["cpptype"];
        if (jItem.isMember("cppDefaultValue"))
            input.jMembers[strKey]["cppDefaultValue"] = jItem["cppDefaultValue"];
        if (jItem.isMember("value")) input.jRecord[strKey] = jItem["value"];
        input.strColumns.append(input.strColumns.empty() ? "" : ",").append(strKey);
    }
    return true;
}

void requireEnd(const Stored& expected, const Outcome& outcome, const std::string& strCall)
{
    requireResult(outcome, 0, 0, strCall.c_str());
    if (Stored::End::kAny == expected.end) return;
    require((Stored::End::kThrows == expected.end) == outcome.blThrew, strCall, ": exception");
    if (!outcome.blThrew)
        require((Stored::End::kRow == expected.end) == (0 == outcome.iResult), strCall, " gave ",
                outcome.iResult);
}

// Runs one writing call and compares what it returns and what is fetched afterwards.
template <typename Call>
void write(FuzzDatabase& database, FuzzTable& table, const Stored& expected, const Json::Value& jIn,
           const std::string& strCall, Call call)
{
    Json::Value jOut = jIn;
    const std::string strBefore = Stored::End::kAny == expected.end ? "" : table.rows(database);
    const Outcome outcome = outcomeOf([&] { return call(jOut); });
    requireEnd(expected, outcome, strCall);
    if (outcome.blThrew || 0 != outcome.iResult) require(jOut == jIn, strCall, " wrote on failure");
    if (Stored::End::kThrows == expected.end)
        require(strBefore == table.rows(database), strCall, " threw and stored");
    if (Stored::End::kRow != expected.end) return;

    require(jOut == expected.jRow, strCall, ": ", jOut, " for ", expected.jRow);
    Json::Value jLast;
    jLast["vornSqlWhereFilter"] = "rowid == last_insert_rowid()";
    Json::Value jFetched;
    require(1 == table.api.recGetOne(jLast, jFetched), strCall, ": not fetched");
    require(jFetched == expected.jRow, strCall, ": fetched ", jFetched);
}

// Each text and number of the stored record finds it again.
void findAgain(FuzzTable& table, const Stored& expected, const Json::Value& jRecord)
{
    if (Stored::End::kRow != expected.end) return;
    for (const std::string& strKey : jRecord.getMemberNames()) {
        const std::string strWord = table.jDefinition["t"]["member"][strKey]["cpptype"].asString();
        if ("string" != strWord && "int" != strWord && "bool" != strWord) continue;
        Json::Value jRequest;
        jRequest[strKey] = jRecord[strKey];
        Json::Value jFetched;
        require(1 == table.api.recGetOne(jRequest, jFetched), "not found by ", jRequest);
        require(jFetched == expected.jRow, "found ", jFetched);
    }
}

void fillDefaults(FuzzTable& table, const Input& input, const Json::Value& jComplete)
{
    for (const Json::Value& jRecord : {input.jRecord, jComplete}) {
        Json::Value jFilled = jRecord;
        require((input.jMembers.size() == jRecord.size() ? 0 : -1) ==
                    table.api.fillDefaultValue(jFilled, true),
                "check for members");
        require(jFilled == jRecord, "a check changed the record");
        require(0 == table.api.fillDefaultValue(jFilled, false), "fillDefaultValue");
        require(jFilled == jComplete, "defaults: ", jFilled, " for ", jComplete);
    }
}

}  // namespace

void testInput(const std::string& strInput)
{
    Input input;
    if (!read(strInput, input)) return;
    FuzzDatabase database;
    FuzzTable table(database, input.jMembers, input.strColumns);
    bool blSql = false;

    const Json::Value jComplete = withDefaults(input.jMembers, input.jRecord);
    fillDefaults(table, input, jComplete);
    Stored created = storedRecord(input.jMembers, jComplete);
    if (input.jRecord.empty() || !passesTypeCheck(input.jMembers, jComplete))
        created = {Stored::End::kFails, {}};
    write(database, table, created, input.jRecord, "recCreate", [&](Json::Value& jOut) {
        Json::Value jIn = input.jRecord;
        return table.api.recCreate(jIn, jOut);
    });
    findAgain(table, created, jComplete);

    const Stored saved = storedRecord(input.jMembers, input.jRecord);
    for (const bool blCreate : {true, false}) {
        blSql = blSql || Stored::End::kAny == created.end || Stored::End::kAny == saved.end;
        if (blSql && Stored::End::kAny != saved.end) break;
        write(database, table, saved, input.jRecord, blCreate ? "recSave" : "recSave(replace)",
              [&](Json::Value& jOut) { return table.api.recSave(jOut, blCreate); });
    }
    if (!blSql) database.requireOtherUntouched();
}
