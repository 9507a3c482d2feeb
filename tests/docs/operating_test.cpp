// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/operating.md: what a host counts, what it prints of its statements, and its log.

#include "docs/section_test.h"

#include <sys/wait.h>
#include <unistd.h>
#include <atomic>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <locale>
#include <sstream>

namespace {

#include "operating/Statements.inc"
// The blocks build on each other.
#include "operating/ChangedRows.inc"
#include "operating/LogOfAContainer.inc"
#include "operating/Prometheus.inc"
#include "operating/SizeOfTheLog.inc"

// The clock of SQLite's connections that are opened through this VFS.
sqlite3_int64 nMilliseconds = 1;

const char* vfsWithOwnClock()
{
    static sqlite3_vfs vfs = *sqlite3_vfs_find(nullptr);
    vfs.zName = "own_clock";
    vfs.xCurrentTimeInt64 = [](sqlite3_vfs*, sqlite3_int64* pNow) {
        *pNow = nMilliseconds;
        return SQLITE_OK;
    };
    sqlite3_vfs_register(&vfs, 0);
    return vfs.zName;
}

class Operating : public SectionTest {
protected:
    Operating() : SectionTest("operating.md")
    {
        watch(database_.get(), counters_);
        // A condition that takes 150 ms.
        const auto late = [](sqlite3_context* pContext, int, sqlite3_value**) {
            nMilliseconds += 150;
            sqlite3_result_int(pContext, 1);
        };
        EXPECT_EQ(SQLITE_OK, sqlite3_create_function(database_.get(), "late", 0, SQLITE_UTF8,
                                                     nullptr, late, nullptr, nullptr));
    }
    ~Operating() override
    {
        sqlite3_trace_v2(database_.get(), 0, nullptr, nullptr);
        std::filesystem::remove(strFile_);
    }

    // Inserted, updated and deleted since the last call.
    std::vector<std::int64_t> changed()
    {
        return {counters_.nInserted.exchange(0), counters_.nUpdated.exchange(0),
                counters_.nDeleted.exchange(0)};
    }

    std::int64_t statements() { return counters_.nStatements.exchange(0); }

    // The blocks of the section are also those of the example, whose output is tested.
    void expectInExample()
    {
        const std::string strExample = fileText("examples/operated.cpp");
        EXPECT_NE(std::string::npos, strExample.find(section().blocks.at(0).strText));
    }

    const std::string strFile_ = Database(Database::Place::kFile).path();
    Database database_{strFile_, vfsWithOwnClock()};
    Table table_{database_, R"({"id":{"cpptype":"long long"},"text":{"cpptype":"string"}})",
                 "id integer primary key, text text"};
    VornJsonDbApi& api_ = table_.api;
    Counters counters_;
};

const std::string kLate = R"x({"text":"secret","vornSqlWhereFilter":"late()"})x";

}  // namespace

TEST_F(Operating, Statements)
{
    expectInExample();
    testing::internal::CaptureStderr();
    table_.create(R"({"id":1,"text":"secret"})");
    EXPECT_EQ(2, statements());
    EXPECT_EQ(0, counters_.nNanoseconds);
    EXPECT_EQ("", testing::internal::GetCapturedStderr());

    testing::internal::CaptureStderr();
    EXPECT_NE("[]", listed(api_, kLate));
    EXPECT_EQ(1, statements());
    EXPECT_EQ(150000000, counters_.nNanoseconds);
    EXPECT_EQ("statement, 150 ms: SELECT id,text FROM " + table_.strName + "  WHERE  (text=\n",
              testing::internal::GetCapturedStderr());

    // Each attempt of a call that waits.
    Database other(strFile_);
    other.run("begin exclusive");
    EXPECT_EQ("-1", listed(api_));
    EXPECT_EQ(500, statements());
    other.run("rollback");

    // The steps from row to row, where no index leads to the right ones.
    counters_.nScanned = 0;
    table_.create(R"({"id":2,"text":"b"})");
    EXPECT_NE("[]", listed(api_, R"({"id":2})"));
    EXPECT_EQ(0, counters_.nScanned);
    EXPECT_NE("[]", listed(api_, R"({"text":"b"})"));
    EXPECT_EQ(1, counters_.nScanned);
}

TEST_F(Operating, ChangedRows)
{
    expectInExample();
    using Changes = std::vector<std::int64_t>;
    table_.create(R"({"id":1,"text":"a"})");
    EXPECT_EQ((Changes{1, 0, 0}), changed());
    EXPECT_NE("-1", saved(api_, R"({"id":1,"text":"b"})", false));
    EXPECT_EQ((Changes{1, 0, 0}), changed());
    EXPECT_EQ(0, updated(api_, R"({"id":1})", R"({"text":"c"})"));
    EXPECT_EQ((Changes{0, 1, 0}), changed());
    EXPECT_EQ(1, deleted(api_, R"({"id":1})"));
    EXPECT_EQ((Changes{0, 0, 1}), changed());

    table_.create(R"({"id":1,"text":"a"})");
    table_.create(R"({"id":2,"text":"a"})");
    EXPECT_EQ((Changes{2, 0, 0}), changed());
    EXPECT_LE(0, api_.runSqlEx("begin"));
    EXPECT_EQ(2, api_.recDeleteAll());
    EXPECT_EQ((Changes{0, 0, 0}), changed());
    EXPECT_LE(0, api_.runSqlEx("rollback"));
    EXPECT_LE(0, api_.runSqlEx("begin"));
    EXPECT_EQ(2, deleted(api_, example()));
    EXPECT_LE(0, api_.runSqlEx("rollback"));
    EXPECT_EQ((Changes{0, 0, 2}), changed());

    database_.run("create table bare (id integer primary key) without rowid");
    database_.run("insert into bare values (1)");
    EXPECT_EQ((Changes{0, 0, 0}), changed());
    Database(strFile_).run("delete from " + table_.strName + " where id = 1");
    EXPECT_EQ((Changes{0, 0, 0}), changed());
}

TEST_F(Operating, Prometheus)
{
    expectInExample();
    table_.create(R"({"id":1,"text":"secret"})");
    testing::internal::CaptureStderr();
    listed(api_, kLate);
    testing::internal::GetCapturedStderr();
    counters_.nStatements = 123456789012;
    counters_.nFailed = 3;
    const std::string strFile = strFile_ + ".prom";
    EXPECT_TRUE(publish(strFile, counters_));
    EXPECT_FALSE(std::filesystem::exists(strFile + ".new"));
    EXPECT_FALSE(publish("/dev/null/none", counters_));
    std::ifstream file(strFile);
    const std::string strText{std::istreambuf_iterator<char>(file), {}};
    std::filesystem::remove(strFile);
    EXPECT_EQ(prometheusText(counters_), strText);

    // The text format: a comment with the type of each name, then the name and the number.
    EXPECT_EQ("", replaced(strText, "# TYPE (host_[a-z_]+_total) counter\n\\1 [0-9.]+\n", ""));
    for (const std::string strLine :
         {"statements_total 123456789012", "statement_seconds_total 0.15", "rows_inserted_total 1",
          "rows_deleted_total 0", "calls_failed_total 3"})
        EXPECT_NE(std::string::npos, strText.find("\nhost_" + strLine + "\n")) << strLine;
}

TEST_F(Operating, SlowStatements)
{
    database_.run("create table task (id integer primary key, text text)");
    const std::string strPlan = example(0, "sql");
    EXPECT_EQ(0U, database_.rows(strPlan).at(0).at(3).find("SCAN")) << strPlan;
    database_.run("create index task_text on task (text)");
    EXPECT_EQ(0U, database_.rows(strPlan).at(0).at(3).find("SEARCH")) << strPlan;
}

TEST_F(Operating, SizeOfTheLog)
{
    const std::string strText(100000, 'x');
    Json::Value jRecord = json(R"({"id":1,"text":")" + strText + "\"}");
    EXPECT_EQ(1, createNew(api_, jRecord));
    EXPECT_EQ(0, createNew(api_, jRecord));
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("1", database_.value("select count(*) from " + table_.strName));
    EXPECT_TRUE(sqlite3_get_autocommit(database_.get()));

    // A record of the wrong type fails, and leaves no transaction open.
    Json::Value jWrong = json(R"({"id":2,"text":7})");
    EXPECT_EQ(-1, createNew(api_, jWrong));
    EXPECT_TRUE(sqlite3_get_autocommit(database_.get()));
    EXPECT_FALSE(takeLog().empty());

    // The duplicate itself.
    Json::Value jStored;
    EXPECT_EQ(-1, api_.recCreate(jRecord, jStored));
    std::size_t nTimes = 0;
    for (const std::string& strLine : takeLog())
        nTimes += std::string::npos != strLine.find(strText);
    EXPECT_EQ(4U, nTimes);

    // The pipe, with a host that prints a short line and a long one.
    const std::string strFolder = strFile_ + ".d";
    std::filesystem::create_directory(strFolder);
    std::ofstream(strFolder + "/host") << "#!/bin/sh\necho short\nprintf %0400d 0\n";
    std::filesystem::permissions(strFolder + "/host", std::filesystem::perms::owner_all);
    FILE* pPipe = popen(("cd " + strFolder + " && " + example(0, "sh")).c_str(), "r");
    ASSERT_NE(nullptr, pPipe);
    char szPrinted[1000] = "";
    const std::size_t nPrinted = fread(szPrinted, 1, sizeof(szPrinted), pPipe);
    EXPECT_EQ(0, pclose(pPipe));
    std::filesystem::remove_all(strFolder);
    EXPECT_EQ("short\n" + std::string(300, '0') + "...", std::string(szPrinted, nPrinted));
}

TEST_F(Operating, LogOfAContainer)
{
    chooseLog(strFile_.c_str());
    EXPECT_FALSE(blLogToStdout);

    // Without a syslog, a line is in the pipe although the process was killed.
    int pipes[2];
    ASSERT_EQ(0, pipe(pipes));
    fflush(stdout);
    const pid_t child = fork();
    if (0 == child) {
        dup2(pipes[1], STDOUT_FILENO);
        chooseLog((strFile_ + ".none").c_str());
        if (blLogToStdout) fputs("a line of the log\n", stdout);
        kill(getpid(), SIGKILL);
    }
    close(pipes[1]);
    char szLine[100] = "";
    EXPECT_LE(0, read(pipes[0], szLine, sizeof(szLine) - 1));
    close(pipes[0]);
    EXPECT_EQ(child, waitpid(child, nullptr, 0));
    EXPECT_STREQ("a line of the log\n", szLine);
}
