// SPDX-License-Identifier: MIT
// Errors that waiting does not cure are tried once.

#include "support/figures.h"
#include "support/operations.h"
#include "support/records.h"

#include <sstream>

namespace {

// A connection to a file with the twelve records, opened with a parameter of a URI, and a second
// one of the same kind.
class OnceTest : public HostTest {
protected:
    explicit OnceTest(const char* szParameter = "")
        : strUri_("file:" + (owner_.run(recordsSql(kWithKeys)), owner_.path()) + "?" + szParameter)
    {
    }
    ~OnceTest() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }

    static std::string statementTriedOnce()
    {
        ++Figures::of("locks, errors tried once");
        return onlyStatement(1, 0);
    }

    // The operation fails with that error at its first attempt.
    void expectOnce(const Operation& operation, const std::string& strError)
    {
        SCOPED_TRACE(operation.szName);
        takeStatements();
        table_.api.setErrMsg("");
        Json::Value jOutput;
        EXPECT_EQ(-1, operation.run(database_, table_, jOutput));
        const std::string strSql = statementTriedOnce();
        EXPECT_EQ(operation.failure(table_, strError, strSql), takeLog());
        const bool blDuplicate = 0 == strError.find("UNIQUE") &&
                                 (operation.is("recCreate") || operation.is("recUpdateByFilter"));
        EXPECT_EQ(blDuplicate ? "DUPLICATE_PRIMARY_KEY" : "", table_.api.getErrMsg());
    }

    void expectWorking(const Operation& operation)
    {
        Json::Value jOutput;
        EXPECT_EQ(operation.iResult, operation.run(database_, table_, jOutput)) << operation.szName;
        EXPECT_EQ(Lines(), takeLog());
    }

    Database owner_{Database::Place::kFile};
    const std::string strUri_;
    Database database_{strUri_};
    Database other_{strUri_};
    Table table_{database_, "records", kMembers, kWithKeys};
};

// What causes an error, and what cures it.
struct Error {
    const char* szName;
    const char* szParameter;
    const char* szError;
    const char* szErrorOfReading;  // "" where reading works
    // Empty for all operations that would succeed.
    const char* szOperations;
    // The host's own SQL, before and afterwards.
    const char* szSql;
    const char* szCure;
    // Of the second connection, which is rolled back at the end.
    const char* szOther = "";
    bool blMakesTable = false;  // also for those that run the CREATE statement
};

constexpr char kNoTable[] = "no such table: records";
constexpr char kSchema[] = "database schema is locked: main";

const Error kErrors[] = {
    {"NotUnique", "", "UNIQUE constraint failed: records.id", "",
     "recCreate,recSave inserts,recUpdateByFilter",
     "insert into records values (50,'Eve','e',''), (90,'Fay','f','')",
     "delete from records where id in (50, 90)"},
    {"RefusedByATrigger", "", "no", "",
     "recDelete,recDeleteByName,recUpdateByWhere,recUpdateByFilter",
     "create trigger deleted before delete on records begin select raise(abort, 'no'); end;"
     "create trigger updated before update on records begin select raise(abort, 'no'); end",
     "drop trigger deleted; drop trigger updated"},
    {"MissingTable", "", kNoTable, kNoTable, "", "alter table records rename to away",
     "alter table away rename to records"},
    {"FullDatabase", "", "database or disk is full", "",
     "recCreate,recSave inserts,recSave replaces",
     "create trigger fill after insert on records begin"
     " update records set note = printf('%.99999c', 'x') where id = 1; end;"
     "pragma max_page_count = 1",
     "pragma max_page_count = 1000"},
    {"ReadOnlyFile", "mode=ro", "attempt to write a readonly database", "", "", "", "", "", true},
    {"LockedTableOfASharedCache", "cache=shared", "database table is locked",
     "database table is locked: records", "", "", "",
     "begin immediate; update records set note = 'x'"},
    {"LockedSchemaOfASharedCache", "cache=shared", kSchema, kSchema, "", "", "",
     "begin immediate; create table another (a)", true},
};

class TriedOnce : public OnceTest, public testing::WithParamInterface<Error> {
protected:
    TriedOnce() : OnceTest(GetParam().szParameter) {}
};

TEST_P(TriedOnce, ByEveryOperation)
{
    const Error& error = GetParam();
    std::vector<Operation> chosen;
    std::istringstream names(error.szOperations);
    for (std::string strName; std::getline(names, strName, ',');)
        chosen.push_back(operation(strName.c_str()));
    if (chosen.empty())
        for (const Operation& candidate : operations()) {
            const bool blMakes = candidate.is("constructor") || candidate.is("tableCreate");
            if (-1 != candidate.iResult && (error.blMakesTable || !blMakes))
                chosen.push_back(candidate);
        }
    database_.run(error.szSql);
    other_.run(error.szOther);
    std::vector<Operation> failing;
    for (const Operation& tested : chosen) {
        const char* szError = tested.blWrites ? error.szError : error.szErrorOfReading;
        if ('\0' == *szError) {
            expectWorking(tested);
            continue;
        }
        expectOnce(tested, szError);
        failing.push_back(tested);
    }
    if (!sqlite3_get_autocommit(other_.get())) other_.run("rollback");
    database_.run(error.szCure);
    if (std::string("ReadOnlyFile") != error.szName) expectWorking(failing.at(0));
}

INSTANTIATE_TEST_SUITE_P(Errors, TriedOnce, testing::ValuesIn(kErrors),
                         [](const auto& tested) { return std::string(tested.param.szName); });

TEST_F(OnceTest, AuthorizerRefusalIsTriedOnce)
{
    const auto refuse = [](void*, int, const char*, const char*, const char*, const char*) {
        return SQLITE_DENY;
    };
    sqlite3_set_authorizer(database_.get(), refuse, nullptr);
    for (const Operation& tested : operations()) expectOnce(tested, "not authorized");
    sqlite3_set_authorizer(database_.get(), nullptr, nullptr);
    expectWorking(operation("recGetOne"));
}

// A table cannot be dropped while the same connection reads.
TEST_F(OnceTest, DropDuringAHostsQueryIsTriedOnce)
{
    sqlite3_stmt* pReader = nullptr;
    ASSERT_EQ(SQLITE_OK,
              sqlite3_prepare_v2(database_.get(), "select * from records", -1, &pReader, nullptr));
    ASSERT_EQ(SQLITE_ROW, sqlite3_step(pReader));
    const char* const kStatements[][2] = {
        {"insert into records (id) values (5)", "NOT NULL constraint failed: records.note"},
        {"delete from records where", "incomplete input"},
        {"delete from records where id = = 1", "near \"=\": syntax error"},
        {"drop table records", "database table is locked"}};
    for (const auto& [szSql, szError] : kStatements) {
        EXPECT_EQ(-1, table_.api.runSqlEx(szSql));
        EXPECT_EQ(szSql, statementTriedOnce());
        EXPECT_EQ(Lines{runFailed(szError, szSql)}, takeLog());
    }
    sqlite3_finalize(pReader);
    EXPECT_LE(0, table_.api.runSqlEx("drop table records"));
    EXPECT_EQ("0", database_.value("select count(*) from sqlite_master"));
}

// SQLite looks for an interrupt in the loops of a statement.
TEST_F(OnceTest, InterruptIsTriedOnce)
{
    const auto interrupt = [](void* pDb) {
        sqlite3_interrupt(static_cast<sqlite3*>(pDb));
        return 0;
    };
    for (const char* szName : {"recList", "recUpdateByWhere", "recDelete"}) {
        const Rows before = database_.rows("select * from records");
        sqlite3_progress_handler(database_.get(), 1, interrupt, database_.get());
        Json::Value jOutput;
        EXPECT_EQ(-1, operation(szName).run(database_, table_, jOutput));
        sqlite3_progress_handler(database_.get(), 0, nullptr, nullptr);
        EXPECT_EQ(operation(szName).failure(table_, "interrupted", statementTriedOnce()),
                  takeLog());
        EXPECT_GT(static_cast<unsigned>(kRecords), jOutput.size());
        EXPECT_EQ(before, database_.rows("select * from records"));
    }
    expectWorking(operation("recDelete"));
}

// Kept: the words decide, whoever wrote them.
TEST_F(OnceTest, TriggerThatMentionsALockIsRetried)
{
    const std::string strError = "the database is locked away";
    database_.run("create trigger refuse before delete on records begin select raise(abort, '" +
                  strError + "'); end");
    Json::Value jOutput;
    EXPECT_EQ(-1, operation("recDeleteAll").run(database_, table_, jOutput));
    const std::string strSql = onlyStatement(500, 500);
    EXPECT_EQ(operation("recDeleteAll").failure(table_, strError, strSql, 500), takeLog());
}

}  // namespace
