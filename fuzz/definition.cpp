// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON text as the definition of a table: the member types that are read from it, against a model,
// and each operation on a handle that has it. The table is called "t" in the input.

#include "support/database.h"
#include "support/target.h"

#include <algorithm>
#include <cctype>
#include <climits>
#include <utility>
#include <vector>

namespace {

constexpr std::size_t kMaxColumns = 20;

// Definitions are read once per name, so that each input needs a name of its own. The library keeps
// the names, so the process should end after some thousand inputs.
std::string freshName()
{
    static int iCount = 0;
    return "t" + std::to_string(++iCount);
}

// What the member types of the table have to be.
Json::Value expectedTypes(const Json::Value& jDefinition, const std::string& strName)
{
    Json::Value jTypes;
    if (!jDefinition.isObject() || !jDefinition[strName].isObject()) return jTypes;
    const Json::Value& jMembers = jDefinition[strName]["member"];
    if (!jMembers.isObject()) return jTypes;
    for (const std::string& strKey : jMembers.getMemberNames()) {
        const Json::Value& jMember = jMembers[strKey];
        if (!jMember.isObject() || !jMember["cpptype"].isString()) return jTypes;
        jTypes[strKey]["cpptype"] = jMember["cpptype"];
        if (jMember.isMember("cppDefaultValue"))
            jTypes[strKey]["cppDefaultValue"] = jMember["cppDefaultValue"];
    }
    return jTypes;
}

bool isPlain(const std::string& strKey)
{
    const auto isLetter = [](unsigned char c) { return c < 128 && 0 != std::isalpha(c); };
    return !strKey.empty() && strKey.size() < 20 &&
           std::all_of(strKey.begin(), strKey.end(), isLetter);
}

std::string quoted(const std::string& strKey)
{
    std::string strQuoted = "\"";
    for (const char c : strKey) strQuoted += '"' == c ? std::string("\"\"") : std::string(1, c);
    return strQuoted + "\"";
}

struct Sample {
    Json::Value jRecord{Json::objectValue};
    std::string strColumns = "x_x";
    bool blSql = false;  // a name of a member or a default can carry SQL
};

Json::Value sampleValue(const std::string& strWord)
{
    if ("string" == strWord) return "x'y";
    if ("bool" == strWord) return true;
    if ("Json::objectValue" == strWord) return Json::objectValue;
    if ("Json::arrayValue" == strWord) return Json::arrayValue;
    return 5;
}

Sample sample(const Json::Value& jTypes, const Json::Value& jDefinition, const std::string& strName)
{
    Sample sample;
    sample.blSql = std::string::npos != text(jDefinition).find('%');
    if (expectedTypes(jDefinition, strName).isNull()) return sample;
    std::size_t nColumns = 0;
    for (const std::string& strKey : jDefinition[strName]["member"].getMemberNames())
        sample.blSql = sample.blSql || !isPlain(strKey);
    for (const std::string& strKey : jTypes.getMemberNames()) {
        sample.jRecord[strKey] = sampleValue(jTypes[strKey]["cpptype"].asString());
        if (nColumns++ < kMaxColumns && std::string::npos == strKey.find('\0'))
            sample.strColumns.append(",").append(quoted(strKey));
    }
    return sample;
}

// The handle's own copy of the definition: names, defaults and the type check.
void validate(VornJsonDbApi& api, const Json::Value& jTypes, const Json::Value& jRecord)
{
    Json::Value jDefaults;
    require(0 == api.fillDefaultValue(jDefaults, false), "fillDefaultValue");
    bool blComplete = true;
    for (const std::string& strKey : jTypes.getMemberNames()) {
        const Json::Value& jMember = jTypes[strKey];
        const bool blDefault = jMember.isMember("cppDefaultValue");
        blComplete = blComplete && blDefault;
        require(blDefault == jDefaults.isMember(strKey), "default of ", strKey);
        require(!blDefault || jMember["cppDefaultValue"] == jDefaults[strKey], "a default differs");
    }
    require((blComplete ? 0 : -1) == api.fillDefaultValue(jDefaults, true), "check for members");

    Json::Value jCopy = jRecord;
    requireResult(outcomeOf([&] { return api.checkJsonType(jCopy); }), 0, 0, "checkJsonType");
    std::string strList;
    require(0 == api.SqlExpandMemberName(strList), "SqlExpandMemberName");
    requireResult(outcomeOf([&] { return api.SqlExpandMemberSymbol(strList, jCopy); }), 0, 0,
                  "SqlExpandMemberSymbol");
}

void operate(VornJsonDbApi& api, const Json::Value& jRecord)
{
    const auto expect = [](int iHigh, const char* szCall, auto call) {
        requireResult(outcomeOf(call), 0, iHigh, szCall);
    };
    Json::Value jCopy = jRecord;
    Json::Value jOut;
    Json::Value jNone(Json::objectValue);
    Json::Value jRows;
    expect(0, "tableCreate", [&] { return api.tableCreate(); });
    expect(0, "recCreate", [&] { return api.recCreate(jCopy, jOut); });
    expect(0, "recSave", [&] { return api.recSave(jCopy, false); });
    expect(0, "recList", [&] { return api.recList(jNone, jRows); });
    Json::Value jFilter = jRecord;
    expect(1, "recGetOne", [&] { return api.recGetOne(jFilter, jOut); });
    jCopy = jRecord;
    expect(0, "recUpdateByFilter", [&] { return api.recUpdateByFilter(jFilter, jCopy); });
    if (!jRecord.empty()) {
        std::string strValue = "x'y";
        const std::string strKey = jRecord.getMemberNames().back();
        expect(INT_MAX, "recDeleteByName",
               [&] { return api.recDeleteByName(strValue, strKey.c_str()); });
    }
    require(-1 == api.recDelete(jNone), "a request for nothing deleted");
    expect(INT_MAX, "recDeleteAll", [&] { return api.recDeleteAll(); });
    const std::string strMessage = api.getErrMsg();
    require(strMessage.empty() || "DUPLICATE_PRIMARY_KEY" == strMessage, "message ", strMessage);
    const std::string strText = text(jRecord);
    api.setErrMsg(strText);
    require(strText == api.getErrMsg(), "message ", api.getErrMsg());
}

}  // namespace

void testInput(const std::string& strInput)
{
    Json::Value jDefinition;
    if (!parseJson(strInput, jDefinition)) return;
    std::string strName = freshName();
    if (jDefinition.isObject() && jDefinition.isMember("t")) {
        jDefinition[strName] = Json::Value(jDefinition["t"]);
        jDefinition.removeMember("t");
    } else if (jDefinition.isObject() && jDefinition.isMember("")) {
        strName.clear();
    }

    FuzzDatabase database;
    Json::Value jCopy = jDefinition;
    Json::Value& jTypes = VORN_JSON_DB::recType(jCopy, strName);
    require(jCopy == jDefinition, "recType changed the definition");
    const Json::Value jWanted =
        strName.empty() ? Json::Value() : expectedTypes(jDefinition, strName);
    require(jTypes == jWanted, "types ", jTypes, " for ", jWanted);

    const Sample record = sample(jTypes, jDefinition, strName);
    std::string strCreate =
        "create table if not exists " + strName + " (" + record.strColumns + ")";
    {
        VornJsonDbApi api(database.get(), strName, jDefinition, strCreate);
        validate(api, jTypes, record.jRecord);
        operate(api, record.jRecord);
    }
    if (!record.blSql) database.requireOtherUntouched();
    // The log shows all member types after a failure: those no longer needed would make it slow.
    jTypes = Json::Value();
}
