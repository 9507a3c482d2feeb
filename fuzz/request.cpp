// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON text as the request of every operation that takes one. The input is an array of the request
// (the filter) and, where an operation takes a second object, of that; or the request alone.

#include "support/database.h"
#include "support/sql_roles.h"
#include "support/target.h"

#include <algorithm>
#include <climits>
#include <vector>

namespace {

// Named so that each word is asked for by name.
constexpr const char* kMembers = R"({
    "any": {"cpptype": "any other word"}, "arr": {"cpptype": "Json::arrayValue"},
    "bool": {"cpptype": "bool", "cppDefaultValue": true}, "double": {"cpptype": "double"},
    "id": {"cpptype": "int"}, "jval": {"cpptype": "Json::Value"},
    "long": {"cpptype": "long long"}, "name": {"cpptype": "string", "cppDefaultValue": "x"},
    "obj": {"cpptype": "Json::objectValue"}, "time": {"cpptype": "time_t"},
    "uns": {"cpptype": "unsigned int"}, "zip": {"cpptype": "string"}})";
constexpr char kColumns[] =
    "any,arr,bool,double,id integer primary key,jval,long,name,obj,time,uns,zip";
constexpr char kRows[] =
    "insert into t (arr,bool,id,jval,long,name,obj,uns,zip) values"
    "('[1]',1,1,'null',5,'x','{}',7,'a'),('[]',0,2,'{}',-5,'it''s','{\"k\":1}',8,'b'),"
    "('[\"x\"]',1,3,'5',5,'100%','null',9,'c')";

struct Input {
    Json::Value jRequest;
    Json::Value jRecord;
};

bool read(const std::string& strText, Input& input)
{
    Json::Value jInput;
    if (!parseJson(strText, jInput)) return false;
    const bool blPair = jInput.isArray() && 2 == jInput.size();
    input.jRequest = blPair ? jInput[0] : jInput;
    input.jRecord = blPair ? jInput[1] : jInput;
    return true;
}

// One handle on fresh rows, and the calls with what they may return.
class Session {
public:
    explicit Session(const Input& input) : input_(input), table_(database_, members(), kColumns)
    {
        database_.value(kRows);
    }

    template <typename Call>
    Outcome call(int iHigh, const char* szCall, Call run)
    {
        const Outcome outcome = outcomeOf([&] { return run(table_.api); });
        requireResult(outcome, 0, iHigh, szCall);
        require(!outcome.blThrew || jRequest.isObject() || jRecord.isObject(), szCall, " threw");
        require(jRequest == input_.jRequest, szCall, " changed the request");
        return outcome;
    }

    FuzzDatabase& database() { return database_; }
    FuzzTable& table() { return table_; }

private:
    static Json::Value members()
    {
        Json::Value jMembers;
        require(parseJson(kMembers, jMembers), "members");
        return jMembers;
    }

    const Input& input_;
    FuzzDatabase database_;
    FuzzTable table_;

public:
    Json::Value jRequest = input_.jRequest;
    Json::Value jRecord = input_.jRecord;
};

void build(Session& session)
{
    std::string strOut;
    Json::Value& jRequest = session.jRequest;
    for (int iJoiner = -1; iJoiner <= 3; ++iJoiner)
        session.call(1, "SqlExpandMemberList", [&](VornJsonDbApi& api) {
            return api.SqlExpandMemberList(jRequest, strOut, iJoiner);
        });
    session.call(0, "SqlFilterConditionFromJson", [&](VornJsonDbApi& api) {
        return api.SqlFilterConditionFromJson(jRequest, strOut);
    });
    session.call(0, "SqlExpandMemberName",
                 [&](VornJsonDbApi& api) { return api.SqlExpandMemberName(strOut, &jRequest); });
    session.call(0, "SqlExpandMemberSymbol",
                 [&](VornJsonDbApi& api) { return api.SqlExpandMemberSymbol(strOut, jRequest); });
    session.call(0, "checkJsonType",
                 [&](VornJsonDbApi& api) { return api.checkJsonType(jRequest); });
    session.call(0, "fillDefaultValue",
                 [&](VornJsonDbApi& api) { return api.fillDefaultValue(jRequest, true); });
    Json::Value jFilled = session.jRecord;
    session.call(0, "fillDefaultValue",
                 [&](VornJsonDbApi& api) { return api.fillDefaultValue(jFilled, false); });

    const bool blMembers = jRequest.isObject() && !jRequest.empty();
    std::string strKey = blMembers ? jRequest.getMemberNames()[0] : "";
    Json::Value& jValue = blMembers ? jRequest[strKey] : jRequest;
    const std::string strBefore = strOut;
    const Outcome matched = session.call(0, "SqlMakeByMatchField", [&](VornJsonDbApi& api) {
        return api.SqlMakeByMatchField(strKey, jValue, strOut);
    });
    require(0 == matched.iResult && !matched.blThrew ? strBefore.size() < strOut.size()
                                                     : strBefore == strOut,
            "the text of SqlMakeByMatchField");
    session.call(0, "SqlMakeByListField", [&](VornJsonDbApi& api) {
        return api.SqlMakeByListField(strKey.c_str(), jValue, strOut);
    });
}

// The number of rows that recList gives, or -1.
int list(Session& session)
{
    Json::Value jRows;
    const Outcome listed = session.call(
        0, "recList", [&](VornJsonDbApi& api) { return api.recList(session.jRequest, jRows); });
    Json::Value jOut;
    const Outcome got = session.call(
        1, "recGetOne", [&](VornJsonDbApi& api) { return api.recGetOne(session.jRequest, jOut); });
    require(1 == got.iResult || jOut.isNull(), "recGetOne wrote without a row");
    if (listed.blThrew || 0 != listed.iResult) return -1;
    const int iRows = static_cast<int>(jRows.size());
    require(mayBeSql(session.jRequest) || got.iResult == std::min(1, iRows), "recGetOne gave ",
            got.iResult, " of ", iRows);
    return iRows;
}

std::vector<std::string> texts(const Json::Value& jValue)
{
    std::vector<std::string> strTexts;
    if (!jValue.isObject() && !jValue.isArray()) return strTexts;
    for (const Json::Value& jItem : jValue)
        if (jItem.isString()) strTexts.push_back(jItem.asString());
    return strTexts;
}

// Texts under a member that is declared "string", so that none of them is SQL.
void deleteByTexts(const Input& input)
{
    Session session(input);
    std::vector<std::string> strTexts = texts(input.jRequest);
    std::string strFirst = strTexts.empty() ? "" : strTexts[0];
    for (const char* szKey : {"name", "id", "unknown", ""}) {
        session.call(3, "recDeleteByArray",
                     [&](VornJsonDbApi& api) { return api.recDeleteByArray(strTexts, szKey); });
        session.call(3, "recDeleteByName",
                     [&](VornJsonDbApi& api) { return api.recDeleteByName(strFirst, szKey); });
        session.call(0, "VectorParamToJson", [&](VornJsonDbApi& api) {
            return api.VectorParamToJson(strTexts, szKey, session.jRecord);
        });
        session.jRecord = input.jRecord;
    }
    session.database().requireOtherUntouched();
}

void copyMembers(const Input& input)
{
    for (const bool blOverwrite : {false, true}) {
        Json::Value jInto = input.jRequest;
        Json::Value jFrom = input.jRecord;
        const int iResult = VORN_JSON_DB::jsonCopyMember(jInto, jFrom, blOverwrite);
        require((input.jRequest.isNull() || input.jRequest.isObject()) && input.jRecord.isObject()
                    ? 0 == iResult
                    : -1 == iResult && jInto == input.jRequest,
                "jsonCopyMember");
    }
}

// The number of rows that a request consisting of texts selects; -1 for other requests.
int selectedByTexts(FuzzDatabase& database, const Json::Value& jRequest)
{
    if (!jRequest.isObject()) return -1;
    std::string strSql = "select count(*) from t where 1";
    std::vector<std::string> bound;
    for (const std::string& strKey : jRequest.getMemberNames()) {
        if (!jRequest[strKey].isString()) return -1;
        if ("name" == strKey || "zip" == strKey) {
            strSql += " and " + strKey + "=?";
            // A text ends at its first NUL byte.
            bound.emplace_back(jRequest[strKey].asCString());
        } else if ("sort_by" != strKey && "sort_direction" != strKey) {
            return -1;
        }
    }
    return database.number(strSql, bound);
}

// Without SQL in the request, as many rows are deleted as are listed, and only from that table.
void deleteListed(const Input& input)
{
    Session session(input);
    const int iSelected = selectedByTexts(session.database(), input.jRequest);
    const int iListed = list(session);
    require(-1 == iSelected || iSelected == iListed, "listed ", iListed, " of ", iSelected);
    const Outcome deleted = session.call(
        INT_MAX, "recDelete", [&](VornJsonDbApi& api) { return api.recDelete(session.jRequest); });
    if (mayBeSql(input.jRequest)) return;
    if (0 <= iListed && 0 <= deleted.iResult && !input.jRequest.isMember("limit"))
        require(iListed == deleted.iResult, "listed ", iListed, ", deleted ", deleted.iResult);
    session.database().requireOtherUntouched();
}

void change(const Input& input)
{
    Session session(input);
    session.call(0, "recUpdateByFilter", [&](VornJsonDbApi& api) {
        return api.recUpdateByFilter(session.jRequest, session.jRecord);
    });
    std::string strWhere = "id = 1";
    session.call(0, "recUpdateByWhere", [&](VornJsonDbApi& api) {
        return api.recUpdateByWhere(session.jRecord, strWhere);
    });
    require(session.jRecord == input.jRecord, "an update changed its record");
    if (!mayBeSql(input.jRequest) && !mayBeSql(input.jRecord)) {
        require("3" == session.table().rows(session.database()), "an update changed the rows");
        session.database().requireOtherUntouched();
    }
}

void deleteEverything(const Input& input)
{
    Session session(input);
    session.call(INT_MAX, "recDelete",
                 [&](VornJsonDbApi& api) { return api.recDelete(session.jRequest, true); });
    build(session);
    if (!mayBeSql(input.jRequest)) session.database().requireOtherUntouched();
}

}  // namespace

void testInput(const std::string& strInput)
{
    Input input;
    if (!read(strInput, input)) return;
    copyMembers(input);
    deleteListed(input);
    change(input);
    deleteByTexts(input);
    deleteEverything(input);
}
