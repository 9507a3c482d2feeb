// SPDX-License-Identifier: MIT
// The log lines byte for byte, and what they leave alone.

#include "support/rows.h"

#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>
#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fstream>

namespace {

using doubles::LogRecord;
using doubles::state;

class Log : public TableTest {
protected:
    // The number of the only line of a source file that holds strText.
    static std::string lineOf(const std::string& strFile, const std::string& strText)
    {
        std::ifstream file(VORN_SOURCES "/" + strFile);
        int iFound = 0;
        int iLine = 0;
        for (std::string strLine; std::getline(file, strLine);) {
            ++iLine;
            if (std::string::npos == strLine.find(strText)) continue;
            EXPECT_EQ(0, iFound) << strText << " stands twice in " << strFile;
            iFound = iLine;
        }
        EXPECT_NE(0, iFound) << strText << " is not in " << strFile;
        return std::to_string(iFound);
    }

    // A failed call of the class: a failed check, then a plain line.
    std::vector<LogRecord> failOfClass(bool blStdout, int iErrno)
    {
        blLogToStdout = blStdout;
        errno = iErrno;
        EXPECT_EQ(-1, table_.api.runSqlEx(""));
        EXPECT_EQ(iErrno, errno);
        return std::exchange(state().log, {});
    }

    // A failed call of the free functions: a failed check, then three plain lines.
    static std::vector<LogRecord> failOfUtil(bool blStdout, int iErrno, std::string strName)
    {
        blLogToStdout = blStdout;
        Json::Value jNone;
        errno = iErrno;
        VORN_JSON_DB::recType(jNone, strName);
        return std::exchange(state().log, {});
    }

    static void expectRecord(bool blStdout, const std::string& strText, const LogRecord& record)
    {
        EXPECT_EQ(strText, record.strText);
        EXPECT_EQ(!blStdout, record.blSyslog);
        EXPECT_EQ(blStdout ? -1 : LOG_ERR, record.iPriority);
    }

    Table table_{database_, R"({"a":{"cpptype":"string"}})", "a"};
    const std::string strPid_ = "(" + std::to_string(getpid()) + ")";
    const std::string strCheck_ = "VornJsonDbApi:" + lineOf("VornJsonDbApi/run_sql.cpp",
                                                            "if (FAILED(0 >= strSql.length()))");
    const std::string strFailure_ =
        "VornJsonDbApi:" +
        lineOf("VornJsonDbApi/run_sql.cpp", R"(LOG_PLAIN("i=%d,errno=%d, run sql failed,)");
};

TEST_F(Log, OnStandardOutputHasTheseForms)
{
    for (int iErrno : {0, ENOENT, EAGAIN}) {
        const std::string strErrno = strerror(iErrno);
        const auto lines = failOfClass(true, iErrno);
        ASSERT_EQ(2U, lines.size());
        expectRecord(true,
                     strPid_ + " " + strCheck_ + " (" + strCheck_ + ")(" + strErrno +
                         ")Failed [0 >= strSql.length()], err=" + strErrno + "\n\n",
                     lines[0]);
        expectRecord(true,
                     strPid_ + " " + strFailure_ + " i=0,errno=" + std::to_string(iErrno) +
                         ", run sql failed, error=Unknow Error!!, sql=\n",
                     lines[1]);
    }
}

TEST_F(Log, OfSyslogWithAnErrnoHasTheseForms)
{
    for (int iErrno : {ENOENT, EAGAIN}) {
        const std::string strErrno = "(" + std::string(strerror(iErrno)) + ")";
        const auto lines = failOfClass(false, iErrno);
        ASSERT_EQ(2U, lines.size());
        expectRecord(false,
                     strCheck_ + " " + strPid_ + strErrno + "(" + strCheck_ + ")" + strErrno +
                         "Failed [0 >= strSql.length()], err=" + strerror(iErrno) + "\n",
                     lines[0]);
        expectRecord(false,
                     strFailure_ + " " + strPid_ + strErrno + "i=0,errno=" +
                         std::to_string(iErrno) + ", run sql failed, error=Unknow Error!!, sql=",
                     lines[1]);
    }
}

TEST_F(Log, OfSyslogWithoutAnErrnoHasTheseForms)
{
    const auto lines = failOfClass(false, 0);
    ASSERT_EQ(2U, lines.size());
    expectRecord(false,
                 strCheck_ + " " + strPid_ + "(" + strCheck_ +
                     ")(Success)Failed [0 >= strSql.length()], err=Success\n",
                 lines[0]);
    expectRecord(
        false,
        strFailure_ + " " + strPid_ + "i=0,errno=0, run sql failed, error=Unknow Error!!, sql=",
        lines[1]);
}

TEST_F(Log, NamesTheFreeFunctionsUtil)
{
    const std::string strFile = "util/member_types.cpp";
    const std::string strCheck = "util:" + lineOf(strFile, "FAILED(jTableDef.empty())");
    const std::string strName = "util:" + lineOf(strFile, R"("strJsonName=%s")");
    const std::string strDefinition = "util:" + lineOf(strFile, R"("jTableDef=%s")");

    std::string strTable = freshName();
    auto lines = failOfUtil(true, 0, strTable);
    ASSERT_EQ(4U, lines.size());
    expectRecord(true,
                 strPid_ + " " + strCheck + " (" + strCheck +
                     ")(Success)Failed [jTableDef.empty()], err=Success\n\n",
                 lines[0]);
    expectRecord(true, strPid_ + " " + strName + " strJsonName=" + strTable + "\n", lines[1]);
    expectRecord(true, strPid_ + " " + strDefinition + " jTableDef=null\n", lines[2]);

    strTable = freshName();
    lines = failOfUtil(false, EPERM, strTable);
    ASSERT_EQ(4U, lines.size());
    const std::string strErrno = "(" + std::string(strerror(EPERM)) + ")";
    expectRecord(false,
                 strCheck + " " + strPid_ + strErrno + "(" + strCheck + ")" + strErrno +
                     "Failed [jTableDef.empty()], err=" + strerror(EPERM) + "\n",
                 lines[0]);
    expectRecord(false, strName + " " + strPid_ + strErrno + "strJsonName=" + strTable, lines[1]);
    expectRecord(false, strDefinition + " " + strPid_ + strErrno + "jTableDef=null", lines[2]);
}

TEST_F(Log, PlainFailedChecksOfTheConstructorShowNoErrno)
{
    const std::string strCheck =
        "VornJsonDbApi:" + lineOf("VornJsonDbApi/handle.cpp", "REPORT(strName.empty())");
    std::string strEmpty;
    struct Variant {
        bool blStdout;
        int iErrno;
        std::string strText;
    };
    for (const Variant& row :
         {Variant{true, ENOENT, strPid_ + " " + strCheck + " Failed [strName.empty()]\n"},
          {false, ENOENT,
           strCheck + " " + strPid_ + "(" + strerror(ENOENT) + ")Failed [strName.empty()]"},
          {false, 0, strCheck + " " + strPid_ + "Failed [strName.empty()]"}}) {
        blLogToStdout = row.blStdout;
        errno = row.iErrno;
        VornJsonDbApi api(database_.get(), strEmpty, table_.jDefinition, table_.strCreate);
        ASSERT_EQ(1U, state().log.size());
        expectRecord(row.blStdout, row.strText, state().log[0]);
        state().log.clear();
    }
}

// Rendering a record allocates, and an allocator may leave anything in errno.
TEST_F(Log, ShowsTheErrnoOfTheCheckThoughRenderingChangesIt)
{
    // The first look-up of a process makes the cache, before any check.
    VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    for (bool blStdout : {false, true}) {
        std::string strTable = freshName() + std::string(100, 'x');
        state().iErrnoOfNew = ENOMEM;
        Json::Value jNone;
        blLogToStdout = blStdout;
        errno = EPERM;
        VORN_JSON_DB::recType(jNone, strTable);
        state().iErrnoOfNew = 0;
        ASSERT_EQ(4U, state().log.size());
        for (const LogRecord& record : state().log) EXPECT_EQ(EPERM, record.iErrno);
        EXPECT_EQ(utilFailed("jTableDef.empty()"), takeLog()[0]);
    }
}

TEST_F(Log, LeavesErrnoAsItWas)
{
    for (bool blStdout : {false, true})
        for (int iErrno : {0, EPERM}) {
            blLogToStdout = blStdout;
            Json::Value jRecord = 5;
            VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
            errno = iErrno;
            EXPECT_EQ(-1, table_.api.checkJsonType(jRecord));
            EXPECT_EQ(iErrno, errno);
            EXPECT_EQ(Lines{failed("!jRecParam.isObject()")}, takeLog());
        }
}

TEST_F(Log, ReadsTheFlagsForEveryLine)
{
    blDebugOutput = true;
    state().exec = execOfStatus(SQLITE_BUSY, "database is locked");
    state().onSleep = [] {
        blLogToStdout = !blLogToStdout;
        blDebugOutput = 4 > state().sleeps.size();
    };
    EXPECT_EQ(-1, table_.api.runSqlEx("a text"));
    // Four traced attempts, and the failure after 500 turns.
    std::vector<bool> syslogs;
    for (const LogRecord& record : state().log) syslogs.push_back(record.blSyslog);
    EXPECT_EQ((std::vector<bool>{true, false, true, false, true}), syslogs);
    EXPECT_EQ(5U, takeLog().size());
}

TEST_F(Log, TakesNoTextOfOthersForAFormat)
{
    const std::string strHostile = "%n%s%d%%%5$s%m%*.*f\\n";
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        EXPECT_EQ(-1, table_.api.runSqlEx(strHostile));
        EXPECT_EQ(Lines{plain("i=0,errno=?, run sql failed, error=near \"%\": syntax error, sql=" +
                              strHostile)},
                  takeLog());
        Json::Value jRecord;
        jRecord[strHostile] = strHostile;
        jRecord["a"] = 5;
        EXPECT_EQ(-1, table_.api.checkJsonType(jRecord));
        EXPECT_EQ(Lines{error("type failed, strKey=a, jRecParam=" + text(jRecord))}, takeLog());
    }
    std::string strName = strHostile + freshName();
    Json::Value jDefinition;
    jDefinition[strHostile] = strHostile;
    VORN_JSON_DB::recType(jDefinition, strName);
    const Lines lines = takeLog();
    EXPECT_EQ(utilPlain("strJsonName=" + strName), lines[1]);
    EXPECT_EQ(utilPlain("jTableDef=" + text(jDefinition)), lines[2]);
}

TEST_F(Log, PrintsAnAbsentTextAsNull)
{
    blDebugOutput = true;
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        state().exec = execOfStatus(SQLITE_ERROR, nullptr);
        EXPECT_EQ(-1, table_.api.runSqlEx("a text"));
        EXPECT_EQ((Lines{plain("i=0,errno=?, run sql failed, error=Unknow Error!!, sql=a text"),
                         plain("run sql fail, err=(null)")}),
                  takeLog());
    }
}

TEST_F(Log, HoldsTextsOfAnyLength)
{
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        Json::Value jRecord;
        jRecord["a"] = 5;
        jRecord["b"] = std::string(3000000, 'x');
        EXPECT_EQ(-1, table_.api.checkJsonType(jRecord));
        ASSERT_EQ(1U, state().log.size());
        const std::string strTail =
            "type failed, strKey=a, jRecParam=" + text(jRecord) + (blStdout ? "\n\n" : "\n");
        const std::string strLine = state().log[0].strText;
        ASSERT_LT(strTail.size(), strLine.size());
        EXPECT_TRUE(strLine.substr(strLine.size() - strTail.size()) == strTail);
        state().log.clear();
    }
}

TEST_F(Log, HasANumberOfItsOwnInEachOperationThatNamesTheSqlError)
{
    database_.run("drop table " + table_.strName);
    blLogToStdout = true;  // the form without an errno
    Json::Value jRecord = json(R"({"a":"x"})");
    Json::Value jOut;
    std::string strWhere = "1";
    std::string strNonsense = "nonsense";
    VornJsonDbApi bad(database_.get(), table_.strName, table_.jDefinition, strNonsense);
    state().log.clear();
    const struct {
        const char* szFile;
        std::function<int()> call;
    } operations[] = {
        {"handle", [&] { return bad.tableCreate(); }},
        {"save", [&] { return table_.api.recSave(jRecord, true); }},
        {"list", [&] { return table_.api.recList(jRecord, jOut); }},
        {"update", [&] { return table_.api.recUpdateByWhere(jRecord, strWhere); }},
        {"delete", [&] { return table_.api.recDelete(jRecord); }},
    };
    for (const auto& operation : operations) {
        EXPECT_EQ(-1, operation.call());
        const std::string strLine =
            lineOf("VornJsonDbApi/" + std::string(operation.szFile) + ".cpp", "LOG_SQL_ERROR(");
        const std::string strStart = strPid_ + " VornJsonDbApi:" + strLine + " sql error, err=";
        EXPECT_EQ(1, std::count_if(state().log.begin(), state().log.end(),
                                   [&](const auto& record) {
                                       return 0 ==
                                              record.strText.compare(0, strStart.size(), strStart);
                                   }))
            << operation.szFile;
        state().log.clear();
    }
}

TEST_F(Log, NamesTheProcessThatWritesIt)
{
    const Lines lines = {failed("0 >= strSql.length()"),
                         plain("i=0,errno=?, run sql failed, error=Unknow Error!!, sql=")};
    EXPECT_EQ(-1, table_.api.runSqlEx(""));
    EXPECT_EQ(lines, takeLog());
    const pid_t child = fork();
    if (0 == child) {
        table_.api.runSqlEx("");
        _exit(lines == takeLog() ? 0 : 1);
    }
    int iStatus = -1;
    EXPECT_EQ(child, waitpid(child, &iStatus, 0));
    EXPECT_EQ(0, iStatus);
}

TEST_F(Log, IsWrittenByNothingButTheDoubledCalls)
{
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    failOfClass(true, 0);
    failOfClass(false, 0);
    failOfClass(false, ENOENT);
    EXPECT_EQ("", testing::internal::GetCapturedStdout());
    EXPECT_EQ("", testing::internal::GetCapturedStderr());
}

TEST_F(Log, IsSilentAboutSuccess)
{
    blDebugOutput = true;
    table_.create(R"({"a":"x"})");
    EXPECT_EQ(1, table_.api.runSqlEx("delete from " + table_.strName));
    EXPECT_EQ(Lines(), takeLog());
}

// Every double stands where the library calls.
TEST_F(Log, AndEveryOtherDoubleIsInPlace)
{
    EXPECT_EQ(2U, failOfClass(false, 0).size());
    EXPECT_EQ(2U, failOfClass(true, 0).size());

    state().statements.clear();
    EXPECT_EQ(0, table_.api.tableCreate());
    EXPECT_EQ(std::vector<std::string>{table_.strCreate}, takeStatements());

    state().changes = [] { return 77; };
    EXPECT_EQ(77, table_.api.runSqlEx("select 1"));

    // A value behind a "%" is formatted by SQLite.
    state().iFailMprintf = 1;
    std::string strSql = "'%%' ";
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_THROW(table_.api.SqlExpandMemberSymbol(strSql, jRecord), std::logic_error);
    EXPECT_EQ(0, state().iFailMprintf);
    EXPECT_EQ("'%%' ", strSql);

    state().exec = execOfStatus(SQLITE_BUSY, "database is locked");
    EXPECT_EQ(-1, table_.api.runSqlEx("a text"));
    EXPECT_EQ(500U, state().sleeps.size());
}

}  // namespace
