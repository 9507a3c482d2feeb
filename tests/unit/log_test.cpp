// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The log lines byte for byte, what they leave alone, and the memory that they take.

#include "support/rows.h"

#include <dlfcn.h>
#include <malloc.h>
#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>
#include <cerrno>
#include <cstdarg>
#include <cstring>
#include <regex>
#include <utility>

namespace {

using doubles::LogRecord;
using doubles::state;

// vasprintf: the next call fails; what it leaves in errno, 0 leaves errno alone.
bool blFailNextLine = false;
int iErrnoOfLine = 0;
auto* const pRealVasprintf =
    reinterpret_cast<int (*)(char**, const char*, va_list)>(dlsym(RTLD_NEXT, "vasprintf"));

}  // namespace

// The library calls this instead of the real one.
extern "C" __attribute__((format(printf, 2, 0))) int vasprintf(char** pszText, const char* szFormat,
                                                               va_list arguments) noexcept
{
    if (std::exchange(blFailNextLine, false)) return -1;
    const int iLength = pRealVasprintf(pszText, szFormat, arguments);
    if (0 != iErrnoOfLine) errno = iErrnoOfLine;
    return iLength;
}

// With _FORTIFY_SOURCE it calls this one.
extern "C" __attribute__((format(printf, 3, 0))) int __vasprintf_chk(char** pszText, int /*iFlag*/,
                                                                     const char* szFormat,
                                                                     va_list arguments) noexcept
{
    return vasprintf(pszText, szFormat, arguments);
}

namespace {

// The form of both families, in one of the variants of the log.
struct Form {
    bool blStdout;
    int iErrno;
    const char* szError;
    const char* szPlain;
};

const Form kForms[] = {
    {true, 0, "(PID) PLACE (PLACE)(ERRNO)TEXT, err=ERRNO\n\n", "(PID) PLACE TEXT\n"},
    {true, EAGAIN, "(PID) PLACE (PLACE)(ERRNO)TEXT, err=ERRNO\n\n", "(PID) PLACE TEXT\n"},
    {false, 0, "PLACE (PID)(PLACE)(ERRNO)TEXT, err=ERRNO\n", "PLACE (PID)TEXT"},
    {false, EAGAIN, "PLACE (PID)(ERRNO)(PLACE)(ERRNO)TEXT, err=ERRNO\n", "PLACE (PID)(ERRNO)TEXT"},
};

class Log : public TableTest {
protected:
    // The next line is the text in the form of its family, logged where the source is.
    static void expectNext(const Form& form, const char* szForm, const std::string& strComponent,
                           const std::string& strSource, const std::string& strText)
    {
        ASSERT_FALSE(state().log.empty()) << strText;
        const LogRecord record = state().log.front();
        state().log.erase(state().log.begin());
        const auto places = placesOf(strComponent, strSource);
        ASSERT_EQ(1U, places.size()) << strSource;
        const std::pair<const char*, std::string> parts[] = {{"PID", std::to_string(getpid())},
                                                             {"PLACE", *places.begin()},
                                                             {"ERRNO", strerror(form.iErrno)},
                                                             {"TEXT", strText}};
        std::string strExpected = szForm;
        for (const auto& [szName, strPart] : parts)
            for (std::size_t n; std::string::npos != (n = strExpected.find(szName));)
                strExpected.replace(n, strlen(szName), strPart);
        EXPECT_EQ(strExpected, record.strText);
        EXPECT_EQ(!form.blStdout, record.blSyslog);
        EXPECT_EQ(form.blStdout ? -1 : LOG_ERR, record.iPriority);
    }

    // A call that logs these lines.
    const Lines failure_ = {failed("0 >= strSql.length()"),
                            plain("i=0,errno=?, run sql failed, error=Unknow Error!!, sql=")};
    int fail() { return table_.api.runSqlEx(""); }

    Table table_{database_, R"({"a":{"cpptype":"string"}})", "a text"};
};

// The failed checks of the constructor are of the plain family.
TEST_F(Log, WritesEachFamilyInItsForms)
{
    const std::string strApi = "VornJsonDbApi";
    for (const Form& form : kForms) {
        blLogToStdout = form.blStdout;
        errno = form.iErrno;
        EXPECT_EQ(-1, fail());
        EXPECT_EQ(form.iErrno, errno);
        expectNext(form, form.szError, strApi, "FAILED(0 >= strSql.length())",
                   "Failed [0 >= strSql.length()]");
        expectNext(form, form.szPlain, strApi, R"("i=%d,errno=%d, run sql failed,)",
                   "i=0,errno=" + std::to_string(form.iErrno) +
                       ", run sql failed, error=Unknow Error!!, sql=");
        Json::Value jNone;
        std::string strName = freshName();
        VORN_JSON_DB::recType(jNone, strName);
        expectNext(form, form.szError, "util", "FAILED(jTableDef.empty())",
                   "Failed [jTableDef.empty()]");
        expectNext(form, form.szPlain, "util", R"("strJsonName=%s")", "strJsonName=" + strName);
        expectNext(form, form.szPlain, "util", R"("jTableDef=%s")", "jTableDef=null");
        state().log.clear();
        errno = form.iErrno;
        strName.clear();
        VornJsonDbApi api(database_.get(), strName, table_.jDefinition, table_.strCreate);
        expectNext(form, form.szPlain, strApi, "REPORT(strName.empty())",
                   "Failed [strName.empty()]");
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(Log, GivesEachOperationsSqlErrorItsOwnLineNumber)
{
    database_.run("drop table " + table_.strName);
    blLogToStdout = true;
    Json::Value jRecord = json(R"({"a":"x"})");
    Json::Value jOut;
    std::string strWhere = "1";
    std::string strNonsense = "nonsense";
    VornJsonDbApi bad(database_.get(), table_.strName, table_.jDefinition, strNonsense);
    state().log.clear();
    EXPECT_EQ(-1, bad.tableCreate());
    EXPECT_EQ(-1, table_.api.recSave(jRecord, true));
    EXPECT_EQ(-1, table_.api.recList(jRecord, jOut));
    EXPECT_EQ(-1, table_.api.recUpdateByWhere(jRecord, strWhere));
    EXPECT_EQ(-1, table_.api.recDelete(jRecord));
    std::multiset<std::string> places;
    static const std::regex sqlError(R"(^\(\d+\) (\S+) sql error, err=)");
    std::smatch match;
    for (const LogRecord& record : state().log)
        if (std::regex_search(record.strText, match, sqlError)) places.insert(match[1]);
    EXPECT_EQ(placesOf("VornJsonDbApi", "LOG_SQL_ERROR("), places);
}

// Rendering a record allocates, and so does formatting: both may leave anything in errno.
TEST_F(Log, ShowsTheErrnoOfTheCheckEvenIfComposingTheLineChangesIt)
{
    // The first look-up of a process makes the cache, before any check.
    VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    for (const Form& form : kForms) {
        std::string strTable = freshName() + std::string(100, 'x');
        Json::Value jNone;
        blLogToStdout = form.blStdout;
        state().iErrnoOfNew = ENOMEM;
        iErrnoOfLine = ENOTTY;
        errno = form.iErrno;
        VORN_JSON_DB::recType(jNone, strTable);
        state().iErrnoOfNew = iErrnoOfLine = 0;
        for (const LogRecord& record : state().log) EXPECT_EQ(form.iErrno, record.iErrno);
        const Lines lines = takeLog();
        ASSERT_EQ(4U, lines.size());
        EXPECT_EQ(utilFailed("jTableDef.empty()"), lines[0]);
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
    // Four traced attempts, and the failure after 500 of them.
    std::vector<bool> syslogs;
    for (const LogRecord& record : state().log) syslogs.push_back(record.blSyslog);
    EXPECT_EQ((std::vector<bool>{true, false, true, false, true}), syslogs);
    EXPECT_EQ(5U, takeLog().size());
}

TEST_F(Log, PrintsEveryTextAsItIs)
{
    const std::string strFormat = "%n%s%d%%%5$s%m%*.*f\\n";
    const std::string strRun = plain("i=0,errno=?, run sql failed, error=");
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        blDebugOutput = false;
        for (const std::string& strText : {strFormat, std::string(3000000, 'x')}) {
            Json::Value jRecord;
            jRecord["a"] = 5;
            jRecord[strText] = strText;
            EXPECT_EQ(-1, table_.api.checkJsonType(jRecord));
            EXPECT_TRUE(Lines{error("type failed, strKey=a, jRecParam=" + text(jRecord))} ==
                        takeLog());
            state().exec = execOfStatus(SQLITE_ERROR, strText.c_str());
            EXPECT_EQ(-1, table_.api.runSqlEx(strText));
            EXPECT_TRUE(Lines{strRun + strText + ", sql=" + strText} == takeLog());
        }
        std::string strName = strFormat + freshName();
        Json::Value jName = strFormat;
        VORN_JSON_DB::recType(jName, strName);
        const Lines lines = takeLog();
        EXPECT_EQ(utilPlain("strJsonName=" + strName), lines[1]);
        EXPECT_EQ(utilPlain("jTableDef=" + text(jName)), lines[2]);
        // SQLite may give no text.
        blDebugOutput = true;
        state().exec = execOfStatus(SQLITE_ERROR, nullptr);
        EXPECT_EQ(-1, table_.api.runSqlEx("a text"));
        EXPECT_EQ((Lines{strRun + "Unknow Error!!, sql=a text", plain("run sql fail, err=(null)")}),
                  takeLog());
    }
}

TEST_F(Log, NamesTheProcessThatWritesIt)
{
    EXPECT_EQ(-1, fail());
    EXPECT_EQ(failure_, takeLog());
    const pid_t child = fork();
    if (0 == child) _exit(-1 == fail() && failure_ == takeLog() ? 0 : 1);
    int iStatus = -1;
    EXPECT_EQ(child, waitpid(child, &iStatus, 0));
    EXPECT_EQ(0, iStatus);
}

TEST_F(Log, IsSilentAboutSuccess)
{
    blDebugOutput = true;
    table_.create(R"({"a":"x"})");
    EXPECT_EQ(1, table_.api.runSqlEx("delete from " + table_.strName));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(Log, DropsOnlyTheLineThatLacksMemory)
{
    blFailNextLine = true;
    errno = ENOENT;
    EXPECT_EQ(-1, fail());
    EXPECT_EQ(ENOENT, errno);
    EXPECT_FALSE(blFailNextLine);
    EXPECT_EQ(Lines{failure_[1]}, takeLog());
}

// A sanitizer counts memory differently; there its own leak check finds what this test looks for.
TEST_F(Log, ReleasesTheMemoryOfItsLines)
{
    Json::Value jRecord;
    jRecord["a"] = std::string(1000000, 'x');
    const auto bytesInUse = [] {
        const struct mallinfo2 info = mallinfo2();
        return info.uordblks + info.hblkhd;
    };
    std::size_t nBefore = 0;
    for (int i = 0; i < 20; ++i) {
        std::string strNoFilter;
        EXPECT_EQ(-1, table_.api.recUpdateByWhere(jRecord, strNoFilter));
        EXPECT_EQ(2U, std::exchange(state().log, {}).size());
        if (0 == i) nBefore = bytesInUse();
    }
    EXPECT_GT(nBefore + 2000000, bytesInUse());
}

}  // namespace
