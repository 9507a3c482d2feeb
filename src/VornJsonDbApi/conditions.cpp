// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/operation.h"
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/member_types.h"
#include "util/sqlite_text.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

#include <utility>

using namespace vorn;

namespace {

// How terms are joined: " (" a " and " b " )", or a " , " b.
struct Joiner {
    const char* szBefore;
    const char* szBetween;
    const char* szAfter;
};

constexpr Joiner kOr = {" (", " or ", " )"};
constexpr Joiner kAnd = {" (", " and ", " )"};
constexpr Joiner kComma = {"", " , ", ""};

// Null for an unknown joiner type.
const Joiner* joinerOf(int iType)
{
    switch (iType) {
    case VORN_SQL_WHERE_TYPE_OR: return &kOr;
    case VORN_SQL_WHERE_TYPE_AND: return &kAnd;
    case VORN_SQL_WHERE_TYPE_COMMA: return &kComma;
    default: return nullptr;
    }
}

// name='O''Brien', flag=1, id=5
int appendMatch(std::string_view strField, const Json::Value& jMember, const Json::Value& jParam,
                std::string& out)
{
    SqliteText szSql;
    const char* szQuote = "'";
    switch (TypeWord(jMember).forms().term) {
    case TermForm::kText:
        if (FAILED(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))) return -1;
        break;
    case TermForm::kJson:
        if (FAILED_AS(NULL == (szSql = sqlite3_mprintf("%q", toString(jParam).c_str())),
                      "NULL == (szSql = sqlite3_mprintf(\"%q\", jParam.toString().c_str()))"))
            return -1;
        break;
    case TermForm::kBool:
        szQuote = "";
        if (FAILED(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))) return -1;
        break;
    case TermForm::kBare:
        szQuote = "";
        if (FAILED(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))) return -1;
        break;
    }
    std::string strTerm(strField);
    strTerm.append("=").append(szQuote).append(szSql).append(szQuote);
    out += strTerm;
    return 0;
}

}  // namespace

//  (a='x' and b in ('1' ) and  x > 1  )
int VornJsonDbApi::SqlExpandMemberList(Json::Value& jRecParam, std::string& strSqlWhereOut,
                                       int andType)
{
    const Json::Value& jType = memberTypes(jTableDef, strName);
    if (FAILED(jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue))
        return -1;
    const Joiner* pJoiner = joinerOf(andType);
    if (nullptr == pJoiner) {
        LOG_ERROR("error andType=%d", andType);
        return -1;
    }

    MemberWalk types(jType);
    bool blWritten = false;
    for (auto it = jRecParam.begin(), end = jRecParam.end(); it != end; ++it) {
        const std::string_view strField = memberName(it);
        const bool blRawFilter = kRawFilterKey == strField;
        const Json::Value* pjMember = types.find(strField);
        // Kept(Conditions.SkipUndeclaredKeys): undeclared keys of a request are ignored
        if (nullptr == pjMember && !blRawFilter) continue;
        // Kept(Conditions.WriteTheJoinerAroundAnEmptyArray): for an empty list, the joiner is
        // written but no term
        strSqlWhereOut += blWritten ? pJoiner->szBetween : pJoiner->szBefore;
        Json::Value& jTmp = *it;
        // Kept(Conditions.PreferTheRawFilterToAMemberOfItsName): the raw filter wins over a member
        // of its name
        if (blRawFilter) {
            if (FAILED_AS(!jTmp.isString(), "!jRecParam[jmFieldName[i]].isString()")) return -1;
            strSqlWhereOut.append(" ").append(jTmp.asString()).append(" ");
        } else if (jTmp.isArray()) {
            const std::string strList(strField);
            if (FAILED_AS(0 > SqlMakeByListField(strList.c_str(), jTmp, strSqlWhereOut),
                          "0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)"))
                return -1;
        } else {
            if (FAILED_AS(0 > appendMatch(strField, *pjMember, jTmp, strSqlWhereOut),
                          "0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)"))
                return -1;
        }
        blWritten = true;
    }
    if (!blWritten) return 1;
    strSqlWhereOut += pJoiner->szAfter;
    return 0;
}

int VornJsonDbApi::SqlMakeByMatchField(std::string& strField, Json::Value& jParam, std::string& out)
{
    const Json::Value& jType = memberTypes(jTableDef, strName);
    const Json::Value* pjMember = findMember(jType, strField);
    if (FAILED_AS(nullptr == pjMember, "!jType.isMember(strField)")) return -1;
    return appendMatch(strField, *pjMember, jParam, out);
}

// name in ('x' ), id in (5 )
int VornJsonDbApi::SqlMakeByListField(const char* szField, Json::Value& jHostList, std::string& out)
{
    // Const, because non-const access by index would fill the holes of the host's array.
    const Json::Value& jList = jHostList;
    const Json::Value& jType = memberTypes(jTableDef, strName);
    if (FAILED(!szField || !szField[0])) return -1;
    const Json::Value* pjMember = findMember(jType, szField);
    if (FAILED_AS(nullptr == pjMember, "!jType.isMember(szField)")) return -1;
    const TermForm form = TypeWord(*pjMember).forms().term;
    if (FAILED(jList.type() != Json::arrayValue)) return -1;
    if (jList.empty()) return 0;

    // Kept(Terms.PutNothingBetweenTheItemsOfAList): several items of a list are written without
    // commas between them
    std::string strTerm = std::string(szField) + " in (";
    for (Json::ArrayIndex i = 0; i < jList.size(); ++i) {
        SqliteText szSql;
        const char* szQuote = "'";
        switch (form) {
        case TermForm::kJson:
            if (FAILED_AS(NULL == (szSql = sqlite3_mprintf("%q", toString(jList[i]).c_str())),
                          "NULL == (szSql = sqlite3_mprintf(\"%q\", jList[i].toString().c_str()))"))
                return -1;
            break;
        case TermForm::kBool:
        case TermForm::kBare: szQuote = ""; [[fallthrough]];
        case TermForm::kText:
            if (FAILED(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str()))))
                return -1;
            break;
        }
        strTerm.append(szQuote).append(szSql).append(szQuote);
    }
    out += strTerm + " )";
    return 0;
}

int VornJsonDbApi::VectorParamToJson(std::vector<std::string>& strVector, const char* szKey,
                                     Json::Value& jParamOut)
{
    if (FAILED(jParamOut.type() != Json::objectValue && jParamOut.type() != Json::nullValue))
        return -1;
    if (FAILED(!szKey || !szKey[0])) return -1;
    Json::Value jList(Json::arrayValue);
    for (const std::string& strValue : strVector) jList.append(strValue);
    jParamOut[szKey] = std::move(jList);
    return 0;
}
