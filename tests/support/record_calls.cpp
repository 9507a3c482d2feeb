// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/record_calls.h"

#include "support/rows.h"

#include <algorithm>

RecordsTest::RecordsTest()
{
    database_.run("insert into " + table_.strName + " values (1,'Ann',1,'{\"k\":1}','[1]')," +
                  "(2,'Bob',0,NULL,NULL),(3,'O''Brien',1,NULL,NULL)");
}

const char* RecordsTest::record(char cId)
{
    if ('1' == cId) return R"({"data":{"k":1},"flag":true,"id":1,"name":"Ann","tags":[1]})";
    return '2' == cId ? R"({"flag":false,"id":2,"name":"Bob"})"
                      : R"({"flag":true,"id":3,"name":"O'Brien"})";
}

std::string RecordsTest::listed(const std::string& strIds)
{
    std::string strArray = "[7";
    for (const char cId : strIds) strArray.append(",").append(record(cId));
    return strArray + "]";
}

Words RecordsTest::removeByArray(const std::vector<std::string>& texts, const char* szKey)
{
    Json::Value jTexts(Json::arrayValue);
    for (const std::string& strText : texts) jTexts.append(strText);
    return Words{"recDeleteByArray", text(jTexts)} + (szKey ? Words{szKey} : Words{});
}

Words RecordsTest::removeByName(const std::string& strValue, const char* szKey)
{
    return Words{"recDeleteByName", strValue} + (szKey ? Words{szKey} : Words{});
}

void RecordsTest::lock(std::size_t nAttempts)
{
    nRetries_ = nAttempts;
    prepare_ = [nAttempts] {
        doubles::state().exec = [nLeft = nAttempts](sqlite3* pDb, const char* szSql,
                                                    doubles::RowCallback callback, void* arg,
                                                    char** errText) mutable {
            if (0 == nLeft) return doubles::realExec(pDb, szSql, callback, arg, errText);
            --nLeft;
            return End{SQLITE_BUSY, "database is locked"}.leaveIn(errText);
        };
    };
}

std::string RecordsTest::contents()
{
    std::string strContents;
    for (std::vector<std::string> row : rows()) {
        if (pTable_ == &table_) row.resize(3);
        strContents += strContents.empty() ? "" : ",";
        for (const std::string& strValue : row) strContents += strValue;
    }
    return strContents;
}

// Makes the handle hold that error text, or none.
void RecordsTest::hold(const std::string& strError)
{
    doubles::state().exec = strError.empty() ? execOfStatus(SQLITE_OK, nullptr)
                                             : execOfStatus(SQLITE_ERROR, strError.c_str());
    pTable_->api.runSqlEx("an earlier statement");
    doubles::reset();
}

Lines RecordsTest::expectedLog(const Words& call, const Outcome& outcome,
                               const std::string& strHeld)
{
    Lines lines;
    for (std::size_t i = 0; blDebugOutput && i < nRetries_; ++i)
        lines.push_back(plain("retry, i=" + std::to_string(i) + ", errno=?, run sql failed, " +
                              "error=database is locked, sql=" + outcome.strSql));
    if (-1 != outcome.iResult) {
        if (isRemoval(call) && blDebugOutput && 0 <= outcome.iResult)
            lines.push_back(plain("delete rec number=" + std::to_string(outcome.iResult)));
        return lines;
    }
    const bool blSaves = "recSave" == call[0] || "recCreate" == call[0];
    const std::vector<Lines> levels = levelsOf(
        call[0], argumentsOf(call),
        blSaves ? VORN_JSON_DB::recType(pTable_->jDefinition, pTable_->strName) : Json::Value());
    lines = lines + outcome.causes;
    if (!outcome.strError.empty()) {
        lines.push_back(runFailed(strHeld, outcome.strSql, nRetries_));
        if (blDebugOutput)
            lines.push_back(
                plain("run sql fail, err=" + ("Unknow Error!!" == strHeld ? "(null)" : strHeld)));
        lines.push_back(levels[0][0]);
    }
    return lines + restOf(levels, std::min(outcome.nLevel, levels.size() - 1), strHeld,
                          outcome.strSql + outcome.strComposed);
}

void RecordsTest::expectOnce(const Words& call, const Outcome& outcome,
                             const std::string& strEarlier)
{
    VornJsonDbApi& api = pTable_->api;
    const Rows before = rows();
    hold(strEarlier);
    api.setErrMsg("the host's");
    prepare_();
    const Ended ended = called(api, call);
    const Lines log = takeLog();
    const Lines statements = takeStatements();
    const std::vector<unsigned> sleeps = doubles::state().sleeps;
    doubles::reset();

    const std::string strHeld = in(outcome.strSql.empty() ? strEarlier : outcome.strError);
    EXPECT_EQ(kThrows == outcome.iResult ? "T" : std::to_string(outcome.iResult), ended.strEnd);
    Lines expected = expectedLog(call, outcome, strHeld);
    for (std::string& strLine : expected) strLine = in(strLine);
    EXPECT_EQ(expected, log);
    EXPECT_EQ(text(nullptr == outcome.szOut ? ended.jBefore : json(outcome.szOut)),
              text(ended.jOut));
    EXPECT_EQ(outcome.strSql.empty() ? 0 : std::min<std::size_t>(nRetries_ + 1, 500),
              statements.size());
    EXPECT_EQ(std::vector<unsigned>(nRetries_, 10000), sleeps);
    for (const std::string& strSql : statements)
        EXPECT_EQ(kAnySql == outcome.strSql ? strSql : in(outcome.strSql), strSql);
    const bool blDuplicate = std::string::npos != strHeld.find("UNIQUE constraint failed");
    const bool blTells = "recCreate" == call[0] || "recUpdateByFilter" == call[0];
    EXPECT_EQ(
        "-1" == ended.strEnd && blTells && blDuplicate ? "DUPLICATE_PRIMARY_KEY" : "the host's",
        api.getErrMsg());
    const std::string strContents = contents();
    EXPECT_EQ(nullptr == outcome.szContents ? strContents : outcome.szContents, strContents);
    if (0 > outcome.iResult) {
        EXPECT_EQ(blWritten_, before != rows()) << "whether the table was changed";
    }

    // The error text that it holds now, as a request of a wrong kind shows it.
    Json::Value jNoRequest;
    EXPECT_EQ(-1, api.recDelete(jNoRequest));
    Lines held{failed("jRecParam.type() != Json::objectValue")};
    if (!strHeld.empty()) held.push_back(sqlError(strHeld, ""));
    EXPECT_EQ(held, takeLog());
}

void RecordsTest::expect(const Words& call, const Outcome& outcome)
{
    const struct {
        const char* szEarlier;  // what the handle holds from an earlier call
        bool blDebug;
        bool blStdout;
    } hosts[] = {{"", false, false},
                 {"an earlier error", true, false},
                 {"UNIQUE constraint failed: an earlier one", false, true}};
    for (const auto& host : hosts) {
        SCOPED_TRACE(testing::PrintToString(call) + "; held before: " + host.szEarlier);
        blDebugOutput = host.blDebug;
        blLogToStdout = host.blStdout;
        database_.run("begin");
        expectOnce(call, outcome, host.szEarlier);
        database_.run("rollback");
    }
    blDebugOutput = blLogToStdout = false;
}
