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

std::vector<Lines> levelsOf(const std::string& strFunction, const Json::Value& jArguments,
                            const Json::Value& jTypes)
{
    const auto is = [&](const char* szFirst, const char* szSecond) {
        return szFirst == strFunction || szSecond == strFunction;
    };
    const std::string strFirst = text(jArguments["first"]);
    std::vector<Lines> levels;

    if (is("tableCreate", "constructor"))
        levels = {{error("create table failed, sql=" + jArguments["create"].asString())}};
    if (is("constructor", "")) levels.push_back({failed("0 > tableCreate()")});

    const bool blCreate = is("recCreate", "");
    const std::string strRecord =
        blCreate ? text(withDefaults(jArguments["first"], jTypes)) : strFirst;
    const std::string strFlag = blCreate || jArguments["flag"].asBool() ? "1" : "0";
    if (is("recSave", "recCreate"))
        levels = {{failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
                   plain("blCreate=" + strFlag + ", jRecInOut=" + strRecord),
                   plain("jType=" + text(jTypes))}};
    if (blCreate)
        levels.push_back(
            {failed("0 > recSave(jParam, true)"), plain("call create rec, rec=" + strRecord)});

    if (is("recList", "recGetOne"))
        levels = {{failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
                   plain("jRecParam=" + strFirst)}};
    if (is("recGetOne", "")) levels.push_back({failed("0 > recList(jRecParam, jRecArray)")});

    const std::string strValues =
        is("recUpdateByFilter", "") ? text(jArguments["second"]) : strFirst;
    if (is("recUpdateByWhere", "recUpdateByFilter"))
        levels = {{failed("0 > runSqlEx(strSql, NULL, NULL)"), plain("jRecIn=" + strValues)}};
    if (is("recUpdateByFilter", ""))
        levels.push_back({failed("0 > recUpdateByWhere(jParamIn, strSql)"),
                          plain("recUpdateByFilter failed, jParamIn=" + strValues)});

    if (0 == strFunction.find("recDelete")) levels = {{failed("0 > (err = runSqlEx(strSqlRun))")}};
    const bool blByName = is("recDeleteByName", "");
    const std::string strName =
        "name=" + (jArguments.isMember("key") ? jArguments["key"].asString() : "(null)");
    std::string strTexts = blByName ? "," + jArguments["text"].asString() : "";
    for (const Json::Value& jText : jArguments["vector"]) strTexts += "," + jText.asString();
    strTexts.erase(0, 1);
    if (is("recDeleteByArray", "recDeleteByName"))
        levels.push_back(
            {failed("0 > (err = recDelete(jParam))"),
             plain("recDeleteByArray failed, " + strName + ", strVector=" + strTexts)});
    if (blByName)
        levels.push_back({failed("0 > (err = recDeleteByArray(strVector, szKey))"),
                          plain("recDeleteByName failed, " + strName + ", strValue=" + strTexts)});
    return levels;
}

Lines restOf(const std::vector<Lines>& levels, std::size_t nLevel, const std::string& strError,
             const std::string& strSql)
{
    Lines lines(levels[nLevel].begin() + 1, levels[nLevel].end());
    if (0 == nLevel && !strError.empty()) lines.push_back(sqlError(strError, strSql));
    for (std::size_t i = nLevel + 1; i < levels.size(); ++i) lines = lines + levels[i];
    return lines;
}
