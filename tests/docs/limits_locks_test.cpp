// SPDX-License-Identifier: MIT
// docs/limits.md, other connections: locks, what waiting costs, and what a retry does.

#include "support/limits.h"

#include <cerrno>
#include <utility>

namespace {

// A second connection to a database file.
class Other {
public:
    explicit Other(const Database& database)
    {
        EXPECT_EQ(SQLITE_OK, sqlite3_open(database.path().c_str(), &pDb_));
    }
    ~Other() { EXPECT_EQ(SQLITE_OK, sqlite3_close(pDb_)); }
    Other(const Other&) = delete;
    Other& operator=(const Other&) = delete;

    int run(const char* szSql) { return doubles::realExec(pDb_, szSql, nullptr, nullptr, nullptr); }

private:
    sqlite3* pDb_ = nullptr;
};

constexpr char kMembers[] = R"({"id":{"cpptype":"int"},"text":{"cpptype":"string"}})";
constexpr char kColumns[] = "id integer primary key, text text";

using doubles::state;

// The other connection comes between the INSERT of the first attempt and the SELECT that reads the
// row back, and locks the database until the second attempt.
class LockBetween {
public:
    explicit LockBetween(Other& other) : other_(other)
    {
        state().exec = [this](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                              void* arg, char** errText) {
            const std::string strSql = szSql;
            const std::size_t nInsert = strSql.find(";select") + 1;
            if (0 == nInsert || 1 < ++iAttempts) {
                if (0 != nInsert) other_.run("rollback");
                return doubles::realExec(pDb, szSql, callback, arg, errText);
            }
            const std::string strInsert = strSql.substr(0, nInsert);
            EXPECT_EQ(SQLITE_OK,
                      doubles::realExec(pDb, strInsert.c_str(), nullptr, nullptr, nullptr));
            iLocked = other_.run("begin exclusive");
            return doubles::realExec(pDb, szSql + nInsert, callback, arg, errText);
        };
    }
    ~LockBetween() { state().exec = nullptr; }
    LockBetween(const LockBetween&) = delete;
    LockBetween& operator=(const LockBetween&) = delete;

    int iAttempts = 0;
    int iLocked = SQLITE_OK;  // what the other connection's lock gave

private:
    Other& other_;
};

// The library's records of these tests.
Json::Value listed(Table& table)
{
    Json::Value jRequest;
    Json::Value jRecords(Json::arrayValue);
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    return jRecords;
}

}  // namespace

TEST_F(Limits, LockedCallBlocks)
{
    Database database(Database::Place::kFile);
    Table table(database, kMembers, kColumns);
    Other other(database);
    EXPECT_EQ(SQLITE_OK, other.run("begin exclusive"));
    Json::Value jRequest;
    Json::Value jRecords;
    EXPECT_EQ(-1, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(std::vector<unsigned>(500, 10000), state().sleeps);

    // What the host set to wait on the connection is asked in each attempt.
    int iAsked = 0;
    const auto giveUp = [](void* pAsked, int) {
        ++*static_cast<int*>(pAsked);
        return 0;
    };
    EXPECT_EQ(SQLITE_OK, sqlite3_busy_handler(database.get(), giveUp, &iAsked));
    EXPECT_EQ(-1, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(500, iAsked);

    // The host's own attempt is answered at once, and what follows it does not wait.
    state().sleeps.clear();
    const auto begin = [&] {
        return doubles::realExec(database.get(), sqlExample().c_str(), nullptr, nullptr, nullptr);
    };
    EXPECT_EQ(SQLITE_BUSY, begin());
    EXPECT_EQ(SQLITE_OK, other.run("rollback"));
    EXPECT_EQ(SQLITE_OK, begin());
    EXPECT_NE(SQLITE_OK, other.run("begin exclusive"));
    table.create(R"({"id":1,"text":"x"})");
    EXPECT_LE(0, table.api.runSqlEx("commit"));

    // In WAL mode a reader does not wait for a writer.
    EXPECT_EQ("wal", database.value("pragma journal_mode=wal"));
    EXPECT_EQ(SQLITE_OK, other.run(sqlExample().c_str()));
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(1U, jRecords.size());
    EXPECT_EQ(std::vector<unsigned>(), state().sleeps);
    EXPECT_EQ(SQLITE_OK, other.run("rollback"));
}

TEST_F(Limits, RetryRunsTheWholeTextAgain)
{
    Database database(Database::Place::kFile);
    Table table(database, kMembers, kColumns);
    Other other(database);
    const std::string strCount = "select count(*) from " + table.strName;
    Json::Value jRecord = jExample();
    {
        const LockBetween lock(other);
        EXPECT_EQ(0, table.api.recSave(jRecord, true));
        EXPECT_EQ(SQLITE_OK, lock.iLocked);
        EXPECT_EQ(2, lock.iAttempts);
        EXPECT_EQ("2", database.value(strCount));
    }
    database.run("delete from " + table.strName);
    const LockBetween lock(other);
    EXPECT_LE(0, table.api.runSqlEx(sqlExample()));
    jRecord = jExample();
    EXPECT_EQ(0, table.api.recSave(jRecord, true));
    EXPECT_LE(0, table.api.runSqlEx("commit"));
    EXPECT_EQ(SQLITE_BUSY, lock.iLocked);
    EXPECT_EQ(1, lock.iAttempts);
    EXPECT_EQ("1", database.value(strCount));
}

TEST_F(Limits, DuplicateMayBeYourOwnRecord)
{
    Database database(Database::Place::kFile);
    Table table(database, kMembers, kColumns);
    Other other(database);
    Json::Value jRecord = jExample();
    Json::Value jStored;
    {
        const LockBetween lock(other);
        EXPECT_EQ(-1, table.api.recCreate(jRecord, jStored));
        EXPECT_EQ(2, lock.iAttempts);
    }
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table.api.getErrMsg());
    EXPECT_EQ("[" + text(jRecord) + "]", text(listed(table)));
    const std::string strLine = takeLog().at(0);
    EXPECT_NE(std::string::npos, strLine.find("i=1,errno=")) << strLine;

    database.run("delete from " + table.strName);
    table.api.setErrMsg("");
    const LockBetween lock(other);
    EXPECT_LE(0, table.api.runSqlEx(sqlExample()));
    EXPECT_EQ(0, table.api.recCreate(jRecord, jStored));
    EXPECT_LE(0, table.api.runSqlEx("commit"));
    EXPECT_EQ(SQLITE_BUSY, lock.iLocked);
    EXPECT_EQ("", table.api.getErrMsg());
    EXPECT_EQ("[" + text(jRecord) + "]", text(listed(table)));
}

namespace {

// How often a call of the test has waited.
std::size_t waits()
{
    return std::exchange(state().sleeps, {}).size();
}

// The page's way to end a wait, while it lasts.
class Running {
public:
    explicit Running(sqlite3* pDb) : pRunning_(started(pDb)) {}
    ~Running() { sqlite3_finalize(pRunning_); }
    Running(const Running&) = delete;
    Running& operator=(const Running&) = delete;

    void reset() { sqlite3_reset(pRunning_); }

private:
    static sqlite3_stmt* started(sqlite3* pDb)
    {
#include "limits/WhatWaitingCosts.inc"
        return pRunning;
    }

    sqlite3_stmt* pRunning_;
};

}  // namespace

TEST_F(Limits, WhatWaitingCosts)
{
    Database database(Database::Place::kFile);
    Table table(database, kMembers, kColumns);
    Other other(database);
    Json::Value jRequest;
    Json::Value jRecords;
    Json::Value jRecord = json(R"({"text":"x"})");
    Json::Value jStored;
    EXPECT_EQ(SQLITE_OK, other.run("begin exclusive"));

    // A signal that ends each sleep makes no difference to their number.
    state().onSleep = [] { errno = EINTR; };
    EXPECT_EQ(-1, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(500U, waits());
    takeLog();

    // A constructor waits, although the table is there.
    VornJsonDbApi second(database.get(), table.strName, table.jDefinition, table.strCreate);
    EXPECT_EQ(500U, waits());
    EXPECT_LT(0U, takeLog().size());

    // One interrupt between two attempts does nothing, unless a statement is running.
    state().onSleep = [&database] {
        if (3 == state().sleeps.size()) sqlite3_interrupt(database.get());
    };
    EXPECT_EQ(-1, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(500U, waits());
    {
        Running running(database.get());
        for (int i = 0; i < 2; ++i) {
            takeLog();
            EXPECT_EQ(-1, table.api.recList(jRequest, jRecords));
            // The interrupt lasts until that statement is reset.
            EXPECT_EQ(0 == i ? 3U : 0U, waits());
            EXPECT_NE(std::string::npos, takeLog().at(0).find("error=interrupted"));
        }
        running.reset();
        state().onSleep = nullptr;
        EXPECT_EQ(SQLITE_OK, other.run("rollback"));
        EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    }

    // Whoever waits and succeeds is told by trace lines alone.
    for (bool blDebug : {false, true}) {
        blDebugOutput = blDebug;
        EXPECT_EQ(SQLITE_OK, other.run("begin exclusive"));
        state().onSleep = [&other] {
            if (3 == state().sleeps.size()) other.run("rollback");
        };
        EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
        EXPECT_EQ(3U, waits());
        EXPECT_EQ(blDebug ? 3U : 0U, takeLog().size());
    }
    blDebugOutput = false;
    state().onSleep = nullptr;

    // A snapshot that is old by the time of the first write.
    EXPECT_EQ("wal", database.value("pragma journal_mode=wal"));
    const std::string strOther = "insert into " + table.strName + " (text) values ('other')";
    EXPECT_LE(0, table.api.runSqlEx("begin"));
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(SQLITE_OK, other.run(strOther.c_str()));
    EXPECT_EQ(-1, table.api.recCreate(jRecord, jStored));
    EXPECT_EQ(SQLITE_BUSY_SNAPSHOT, sqlite3_extended_errcode(database.get()));
    EXPECT_EQ(500U, waits());
    EXPECT_LE(0, table.api.runSqlEx("rollback"));

    EXPECT_LE(0, table.api.runSqlEx(sqlExample()));
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(SQLITE_BUSY, other.run(strOther.c_str()));
    EXPECT_EQ(0, table.api.recCreate(jRecord, jStored));
    EXPECT_LE(0, table.api.runSqlEx("commit"));
    EXPECT_EQ(0U, waits());
}
