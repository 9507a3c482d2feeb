// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/changing-a-table.md: the ladder, climbed by processes that are killed at every point of it,
// and what handles see before and after.

#include "docs/recipe_page.h"

#include <sys/wait.h>
#include <csignal>
#include <functional>
#include <iostream>
#include <thread>

namespace {

#include "changing-a-table/Ladder.inc"

const std::string kOldMembers =
    R"({"id":{"cpptype":"long long"},"name":{"cpptype":"string"},"prio":{"cpptype":"string"}})";

class ChangingATable : public RecipePage {
protected:
    ChangingATable() : RecipePage("changing-a-table.md") {}

    // A database that is older than the ladder, as the library wrote it.
    void makeOld(const std::string& strFile, int nRecords = 3)
    {
        Database database(strFile);
        database.run("pragma synchronous=off; pragma page_size=512");
        Table note = restarted(database, kOldMembers);
        const char* const words[] = {"high", "normal", "low"};
        for (int i = 1; i <= nRecords; ++i)
            note.create(R"({"name":"note )" + std::to_string(i) + R"(","prio":")" + words[i % 3] +
                        R"("})");
    }

    // A handle of a host that has just started: the types are those of its definition.
    static Table restarted(Database& database, const std::string& strMembers)
    {
        std::string strName = "note";
        Json::Value jDefinition;
        jDefinition[strName]["member"] = json(strMembers);
        VORN_JSON_DB::recType(jDefinition, strName) = jDefinition[strName]["member"];
        return Table(database, strName, strMembers, "id integer primary key, name text, prio text");
    }

    static std::string listAnew(Database& database, const std::string& strMembers)
    {
        Table note = restarted(database, strMembers);
        return listed(note.api);
    }

    void climbTo(Database& database, int iVersion)
    {
        for (int i = version(database.get()); i < iVersion; ++i)
            EXPECT_EQ(1, takeStep(database.get()));
    }

    // Everything in the database.
    static Rows contents(Database& database)
    {
        return database.rows("select sql from sqlite_master") +
               database.rows("select * from note order by id") +
               database.rows("pragma user_version") + database.rows("pragma integrity_check");
    }

    const std::string strFile_ = path("store.db");
    const std::string strMembers_ = readPage("changing-a-table.md").blocks.at(1).strText;
};

// Counts down to the kill.
int iLeft = 0;

int countDown()
{
    if (0 == --iLeft) kill(getpid(), SIGKILL);
    return 0;
}

// Whether a process that climbs was killed at its n-th statement, or after n times 50 of SQLite's
// instructions. It leaves the pages of open transactions in the file.
bool isKilled(const std::string& strFile, bool blStatement, int n)
{
    const pid_t pid = fork();
    if (0 == pid) {
        sqlite3* pDb = nullptr;
        if (SQLITE_OK != sqlite3_open(strFile.c_str(), &pDb)) _exit(2);
        if (!run(pDb, "pragma synchronous=off; pragma cache_size=1")) _exit(3);
        iLeft = n;
        const auto onStatement = [](unsigned, void*, void*, void*) { return countDown(); };
        const auto onInstruction = [](void*) { return countDown(); };
        if (blStatement)
            sqlite3_trace_v2(pDb, SQLITE_TRACE_STMT, onStatement, nullptr);
        else
            sqlite3_progress_handler(pDb, 50, onInstruction, nullptr);
        _exit(climb(pDb) ? 0 : 1);
    }
    int iStatus = 0;
    EXPECT_EQ(pid, waitpid(pid, &iStatus, 0));
    EXPECT_TRUE(WIFSIGNALED(iStatus) || 0 == iStatus) << iStatus;
    return WIFSIGNALED(iStatus);
}

}  // namespace

TEST_F(ChangingATable, Ladder)
{
    const std::string strOld = path("old.db");
    makeOld(strOld, 60);
    for (const char* szMode : {"delete", "wal"}) {
        SCOPED_TRACE(szMode);
        Database(strOld).run(std::string("pragma journal_mode=") + szMode);
        const auto copyOld = [&] {
            for (const char* szEnd : {"", "-journal", "-wal", "-shm"})
                std::filesystem::remove(strFile_ + szEnd);
            std::filesystem::copy_file(strOld, strFile_);
        };
        copyOld();
        Rows expected;
        std::string strRecords;
        {
            Database database(strFile_);
            EXPECT_TRUE(climb(database.get()));
            EXPECT_TRUE(climb(database.get()));
            expected = contents(database);
            strRecords = listAnew(database, strMembers_);
        }
        EXPECT_EQ(60U, json(strRecords).size());

        std::set<int> versions;
        int iJournals = 0;
        for (const bool blStatement : {true, false})
            for (int n = 1; copyOld(), isKilled(strFile_, blStatement, n); ++n) {
                SCOPED_TRACE((blStatement ? "statement " : "instruction ") + std::to_string(n));
                std::error_code error;
                const auto nJournal = std::filesystem::file_size(strFile_ + "-journal", error);
                iJournals += !error && 0 < nJournal;
                Database database(strFile_);
                database.run("pragma synchronous=off");
                versions.insert(version(database.get()));
                EXPECT_TRUE(climb(database.get()));
                EXPECT_EQ(expected, contents(database));
                EXPECT_EQ(strRecords, listAnew(database, strMembers_));
            }
        EXPECT_EQ((std::set<int>{0, 1, 2, 3, 4}), versions);
        EXPECT_EQ(std::string("delete") == szMode, 10 < iJournals);

        // Two hosts at once.
        copyOld();
        const auto climbAlone = [this] {
            doubles::state().blReallySleep = true;
            Database database(strFile_);
            EXPECT_TRUE(climb(database.get()));
        };
        std::thread other(climbAlone);
        climbAlone();
        other.join();
        Database database(strFile_);
        EXPECT_EQ(expected, contents(database));

        // The database of a newer host, and a step that fails.
        database.run("pragma user_version=5");
        EXPECT_FALSE(climb(database.get()));
        database.run("pragma user_version=2");
        EXPECT_FALSE(climb(database.get()));
        EXPECT_EQ(2, version(database.get()));
        EXPECT_NE(0, sqlite3_get_autocommit(database.get()));
    }
}

TEST_F(ChangingATable, TheHandleAfterTheLadder)
{
    std::string strName = "note";
    Json::Value jDefinition;
    jDefinition[strName]["member"] = json(example());
    VORN_JSON_DB::recType(jDefinition, strName) = jDefinition[strName]["member"];
    const auto open = [&](sqlite3* pDb) {
#include "changing-a-table/TheHandleAfterTheLadder.inc"
        EXPECT_EQ(R"({"done":false,"id":1,"prio":1,"title":"new"})",
                  created(note, R"({"title":"new"})"));
        return true;
    };
    Database database(strFile_);
    EXPECT_TRUE(open(database.get()));
    database.run("drop table note");
    EXPECT_FALSE(open(database.get()));
    EXPECT_NE(std::string::npos, takeLog().at(0).find("no such table: note"));
}

TEST_F(ChangingATable, StopTheOldHostsFirst)
{
    makeOld(strFile_);
    Database database(strFile_);
    Table old = restarted(database, kOldMembers);
    const std::string strRecords = listed(old.api);
    climbTo(database, 2);
    EXPECT_EQ(strRecords, listed(old.api));
    EXPECT_EQ("-1", created(old.api, R"({"id":7,"name":"seven","prio":"low"})"));
    EXPECT_EQ("1", database.value("select count(*) from note where id = 7"));
    takeLog();

    // A new host, started too early.
    Table early = restarted(database, strMembers_);
    EXPECT_EQ("-1", listed(early.api));
    EXPECT_NE(std::string::npos, takeLog().at(0).find("no such column: title"));

    // A new handle in an old process.
    EXPECT_EQ(strRecords.substr(0, 9), listAnew(database, kOldMembers).substr(0, 9));
    climbTo(database, 4);
    Table late(database, "note", strMembers_, "id");
    EXPECT_EQ("-1", listed(late.api));
    EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog().at(0));
    EXPECT_EQ(4U, json(listAnew(database, strMembers_)).size());
}

TEST_F(ChangingATable, ANewColumn)
{
    makeOld(strFile_, 1);
    Database database(strFile_);
    climbTo(database, 2);
    const std::string strWith = kOldMembers.substr(0, kOldMembers.size() - 1);
    Table note =
        restarted(database, strWith + R"(,"done":{"cpptype":"bool","cppDefaultValue":false}})");
    EXPECT_EQ(R"([{"done":false,"id":1,"name":"note 1","prio":"normal"}])", listed(note.api));
    EXPECT_EQ(R"({"done":false,"id":2,"name":"new","prio":"low"})",
              created(note.api, R"({"name":"new","prio":"low"})"));

    // Without a default, under a name that sorts last.
    database.run("alter table note add column zone text");
    const std::string strDone =
        strWith + R"(,"done":{"cpptype":"bool"},"zone":{"cpptype":"string")";
    const std::string strNew = R"({"done":true,"name":"new","prio":"low"})";
    Table last = restarted(database, strDone + "}}");
    EXPECT_EQ(R"({"done":false,"id":1,"name":"note 1","prio":"normal"})",
              found(last.api, R"({"id":1})"));
    EXPECT_EQ("-1", created(last.api, strNew));
    takeLog();
    Table given = restarted(database, strDone + R"(,"cppDefaultValue":"north"}})");
    EXPECT_EQ(R"({"done":true,"id":3,"name":"new","prio":"low","zone":"north"})",
              created(given.api, strNew));
}

TEST_F(ChangingATable, ANewName)
{
    makeOld(strFile_);
    Database database(strFile_);
    climbTo(database, 2);
    database.run(
        "create index note_name on note (name);"
        "create view names as select name from note");
    climbTo(database, 3);
    EXPECT_EQ("CREATE INDEX note_name on note (title)",
              database.value("select sql from sqlite_master where name = 'note_name'"));
    EXPECT_EQ(3U, database.rows("select * from names").size());

    // A view hinders the next step.
    EXPECT_FALSE(climb(database.get()));
    EXPECT_EQ(3, version(database.get()));
    database.run("drop view names");
    climbTo(database, 4);
    EXPECT_EQ(Rows(), database.rows("select * from sqlite_master where type = 'index'"));
    Table note = restarted(database, strMembers_);
    EXPECT_EQ(3U, json(listed(note.api, R"({"name":"note 2"})")).size());
    EXPECT_EQ(1U, json(listed(note.api, R"({"title":"note 2"})")).size());
    EXPECT_EQ(R"({"done":false,"id":4,"prio":1,"title":"a"})",
              created(note.api, R"({"name":"lost","title":"a"})"));
}

TEST_F(ChangingATable, AnotherTypeWord)
{
    makeOld(strFile_);
    Database database(strFile_);
    const auto prios = [&] {
        std::string strPrios;
        for (const Json::Value& jRecord : json(listAnew(database, strMembers_)))
            strPrios += text(jRecord["prio"]);
        return strPrios;
    };
    climbTo(database, 3);
    EXPECT_EQ("000", prios());
    climbTo(database, 4);
    EXPECT_EQ("102", prios());
    EXPECT_EQ("integer", database.value("select distinct typeof(prio) from note"));

    Database text(path("text.db"));
    text.run(
        "create table note (id integer primary key, title text, prio text, done integer);"
        "insert into note (title, prio) values ('a', 9), ('b', 10)");
    Table note = restarted(text, strMembers_);
    const std::string strOrdered =
        listed(note.api, R"({"vornSqlWhereFilter":"1) order by (prio"})");
    EXPECT_EQ(R"([{"id":2,"prio":10,"title":"b"},{"id":1,"prio":9,"title":"a"}])", strOrdered);
}
