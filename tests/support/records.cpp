// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/records.h"

namespace {

Json::Value withDefaults(Json::Value jRecord, const Json::Value& jTypes)
{
    if (!jRecord.isObject() || jRecord.empty() || !jTypes.isObject()) return jRecord;
    for (const std::string& strKey : jTypes.getMemberNames())
        if (!jRecord.isMember(strKey) && jTypes[strKey].isMember("cppDefaultValue"))
            jRecord[strKey] = jTypes[strKey]["cppDefaultValue"];
    return jRecord;
}

}  // namespace

Lines fieldFailed(const std::string& strFirst)
{
    return {strFirst,
            failed("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))")};
}

Lines rowRefused(const Lines& field, const Lines& shown)
{
    return field + shown +
           Lines{failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)")};
}

std::vector<Lines> levelsOf(const std::string& strFunction, Json::Value jArguments,
                            const Json::Value& jTypes)
{
    // The levels of the operation that this one calls, and its own.
    const auto above = [&](const char* szCalled, const Lines& level) {
        return levelsOf(szCalled, jArguments, jTypes) + std::vector<Lines>{level};
    };
    const auto shown = [](const char* szName, const Json::Value& jValue) {
        return plain(szName + ("=" + text(jValue)));
    };
    Json::Value& jFirst = jArguments["first"];

    if ("tableCreate" == strFunction)
        return {{error("create table failed, sql=" + jArguments["create"].asString())}};
    if ("constructor" == strFunction) return above("tableCreate", {failed("0 > tableCreate()")});

    if ("recSave" == strFunction)
        return {
            {failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
             shown(jArguments["flag"].asBool() ? "blCreate=1, jRecInOut" : "blCreate=0, jRecInOut",
                   jFirst),
             shown("jType", jTypes)}};
    if ("recCreate" == strFunction) {
        jFirst = withDefaults(jFirst, jTypes);
        jArguments["flag"] = true;
        return above("recSave",
                     {failed("0 > recSave(jParam, true)"), shown("call create rec, rec", jFirst)});
    }

    if ("recList" == strFunction)
        return {{failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
                 shown("jRecParam", jFirst)}};
    if ("recGetOne" == strFunction)
        return above("recList", {failed("0 > recList(jRecParam, jRecArray)")});

    if ("recUpdateByWhere" == strFunction)
        return {{failed("0 > runSqlEx(strSql, NULL, NULL)"), shown("jRecIn", jFirst)}};
    if ("recUpdateByFilter" == strFunction) {
        jFirst = jArguments["second"];
        return above("recUpdateByWhere", {failed("0 > recUpdateByWhere(jParamIn, strSql)"),
                                          shown("recUpdateByFilter failed, jParamIn", jFirst)});
    }

    if ("recDelete" == strFunction || "recDeleteAll" == strFunction)
        return {{failed("0 > (err = runSqlEx(strSqlRun))")}};
    const std::string strKey = jArguments.isMember("key") ? jArguments["key"].asString() : "(null)";
    if ("recDeleteByArray" == strFunction) {
        std::string strTexts;
        for (const Json::Value& jText : jArguments["vector"]) strTexts += "," + jText.asString();
        strTexts.erase(0, 1);
        return above("recDelete", {failed("0 > (err = recDelete(jParam))"),
                                   plain("recDeleteByArray failed, name=" + strKey +
                                         ", strVector=" + strTexts)});
    }
    if ("recDeleteByName" == strFunction) {
        const std::string strValue = jArguments["text"].asString();
        jArguments["vector"].append(strValue);
        return above("recDeleteByArray",
                     {failed("0 > (err = recDeleteByArray(strVector, szKey))"),
                      plain("recDeleteByName failed, name=" + strKey + ", strValue=" + strValue)});
    }
    return {};
}

Lines restOf(const std::vector<Lines>& levels, std::size_t nLevel, const std::string& strError,
             const std::string& strSql)
{
    Lines lines(levels[nLevel].begin() + 1, levels[nLevel].end());
    if (0 == nLevel && !strError.empty()) lines.push_back(sqlError(strError, strSql));
    for (std::size_t i = nLevel + 1; i < levels.size(); ++i) lines = lines + levels[i];
    return lines;
}
