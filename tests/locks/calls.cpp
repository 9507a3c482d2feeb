// SPDX-License-Identifier: MIT
#include "locks/calls.h"

#include "support/records.h"

#include <stdexcept>

namespace {

const char kRecord[] = R"({"id":9,"name":"Zoe","note":"none"})";

int tableCreate(Table& table)
{
    return table.api.tableCreate();
}

Lines ofTableCreate(Table&, const std::string& strError, const std::string& strSql)
{
    return {error("create table failed, sql=" + strSql), sqlError(strError, strSql)};
}

int recCreate(Table& table)
{
    Json::Value jRecord = json(R"({"id":9,"name":"Zoe"})");
    Json::Value jStored;
    const int iResult = table.api.recCreate(jRecord, jStored);
    EXPECT_EQ(0 == iResult ? kRecord : "null", text(jStored));
    return iResult;
}

Lines ofSave(Table& table, const char* szCreate, const std::string& strError,
             const std::string& strSql)
{
    return {failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
            plain(std::string("blCreate=") + szCreate + ", jRecInOut=" + kRecord),
            plain("jType=" + text(VORN_JSON_DB::recType(table.jDefinition, table.strName))),
            sqlError(strError, strSql)};
}

Lines ofCreate(Table& table, const std::string& strError, const std::string& strSql)
{
    Lines lines = ofSave(table, "1", strError, strSql);
    lines.push_back(failed("0 > recSave(jParam, true)"));
    lines.push_back(plain(std::string("call create rec, rec=") + kRecord));
    return lines;
}

int recSave(Table& table)
{
    Json::Value jRecord = json(kRecord);
    return table.api.recSave(jRecord, false);
}

Lines ofReplace(Table& table, const std::string& strError, const std::string& strSql)
{
    return ofSave(table, "0", strError, strSql);
}

int recList(Table& table)
{
    Json::Value jRequest;
    Json::Value jRecords(Json::arrayValue);
    const int iResult = table.api.recList(jRequest, jRecords);
    EXPECT_EQ(0 == iResult ? 3U : 0U, jRecords.size());
    return iResult;
}

Lines ofList(Table&, const std::string& strError, const std::string& strSql)
{
    return {failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
            plain("jRecParam=null"), sqlError(strError, strSql)};
}

int recGetOne(Table& table)
{
    Json::Value jRequest;
    Json::Value jRecord;
    return table.api.recGetOne(jRequest, jRecord);
}

Lines ofGetOne(Table& table, const std::string& strError, const std::string& strSql)
{
    Lines lines = ofList(table, strError, strSql);
    lines.push_back(failed("0 > recList(jRecParam, jRecArray)"));
    return lines;
}

int recUpdateByWhere(Table& table)
{
    Json::Value jRecord = json(kRecord);
    std::string strWhere = "id=2";
    return table.api.recUpdateByWhere(jRecord, strWhere);
}

Lines ofUpdate(Table&, const std::string& strError, const std::string& strSql)
{
    return {failed("0 > runSqlEx(strSql, NULL, NULL)"), plain(std::string("jRecIn=") + kRecord),
            sqlError(strError, strSql)};
}

int recUpdateByFilter(Table& table)
{
    Json::Value jRecord = json(kRecord);
    Json::Value jFilter = json(R"({"id":2})");
    return table.api.recUpdateByFilter(jFilter, jRecord);
}

Lines ofUpdateByFilter(Table& table, const std::string& strError, const std::string& strSql)
{
    Lines lines = ofUpdate(table, strError, strSql);
    lines.push_back(failed("0 > recUpdateByWhere(jParamIn, strSql)"));
    lines.push_back(plain(std::string("recUpdateByFilter failed, jParamIn=") + kRecord));
    return lines;
}

int recDeleteAll(Table& table)
{
    return table.api.recDeleteAll();
}

Lines ofDelete(Table&, const std::string& strError, const std::string& strSql)
{
    return {failed("0 > (err = runSqlEx(strSqlRun))"), sqlError(strError, strSql)};
}

int recDeleteByName(Table& table)
{
    std::string strName = "Bob";
    return table.api.recDeleteByName(strName, "name");
}

Lines ofDeleteByName(Table& table, const std::string& strError, const std::string& strSql)
{
    Lines lines = ofDelete(table, strError, strSql);
    lines.push_back(failed("0 > (err = recDelete(jParam))"));
    lines.push_back(plain("recDeleteByArray failed, name=name, strVector=Bob"));
    lines.push_back(failed("0 > (err = recDeleteByArray(strVector, szKey))"));
    lines.push_back(plain("recDeleteByName failed, name=name, strValue=Bob"));
    return lines;
}

}  // namespace

void addRecords(Database& database, const std::string& strTable)
{
    database.run("insert into " + strTable + " values (1,'Ann','a'),(2,'Bob','b'),(3,'Cid','c')");
}

const std::vector<Call>& calls()
{
    static const std::vector<Call> all = {
        {"tableCreate", false, 0, tableCreate, ofTableCreate},
        {"recCreate", true, 0, recCreate, ofCreate},
        {"recSave", true, 0, recSave, ofReplace},
        {"recList", false, 0, recList, ofList},
        {"recGetOne", false, 1, recGetOne, ofGetOne},
        {"recUpdateByWhere", true, 0, recUpdateByWhere, ofUpdate},
        {"recUpdateByFilter", true, 0, recUpdateByFilter, ofUpdateByFilter},
        {"recDeleteAll", true, 3, recDeleteAll, ofDelete},
        {"recDeleteByName", true, 1, recDeleteByName, ofDeleteByName},
    };
    return all;
}

const Call& call(const std::string& strName)
{
    for (const Call& candidate : calls())
        if (strName == candidate.szName) return candidate;
    throw std::invalid_argument(strName);
}

Lines failure(const Call& call, Table& table, const std::string& strError,
              const std::string& strSql, int nRetries)
{
    Lines lines = call.context(table, strError, strSql);
    lines.insert(lines.begin(), runFailed(strError, strSql, nRetries));
    return lines;
}
