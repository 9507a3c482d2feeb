// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Errors that waiting does not cure are tried once.

#include "support/figures.h"
#include "support/operations.h"

#include <sstream>

namespace {

using Hook = void (*)(sqlite3* pDb, bool blSet);

void refuseEverything(sqlite3* pDb, bool blSet)
{
    const auto refuse = [](void*, int, const char*, const char*, const char*, const char*) {
        return SQLITE_DENY;
    };
    sqlite3_set_authorizer(pDb, blSet ? +refuse : nullptr, nullptr);
}

// SQLite looks for an interrupt in the loops of a statement.
void interruptLoops(sqlite3* pDb, bool blSet)
{
    const auto interrupt = [](void* pRunning) {
        sqlite3_interrupt(static_cast<sqlite3*>(pRunning));
        return 0;
    };
    sqlite3_progress_handler(pDb, 1, blSet ? +interrupt : nullptr, pDb);
}

// What causes an error, and what cures it.
struct Error {
    const char* szName;
    const char* szError;
    const char* szErrorOfReading;  // "" where reading works
    const char* szOperations;      // "" for all, but those that make a table only if told to
    // The host's own SQL, before and afterwards.
    const char* szSql;
    const char* szCure;
    bool blMakesTable = false;
    const char* szParameter = "";
    // The second connection's SQL, which is rolled back at the end.
    const char* szOther = "";
    Hook hook = [](sqlite3*, bool) {};
};

constexpr char kNoTable[] = "no such table: records";
constexpr char kSchema[] = "database schema is locked: main";

const Error kErrors[] = {
    {"NotUnique", "UNIQUE constraint failed: records.id", "",
     "recCreate,recSave inserts,recUpdateByFilter",
     "insert into records values (50,'Eve','e',''), (90,'Fay','f','')",
     "delete from records where id in (50, 90)"},
    {"RefusedByATrigger", "no", "", "recDelete,recDeleteByName,recUpdateByWhere,recUpdateByFilter",
     "create trigger deleted before delete on records begin select raise(abort, 'no'); end;"
     "create trigger updated before update on records begin select raise(abort, 'no'); end",
     "drop trigger deleted; drop trigger updated"},
    {"MissingTable", kNoTable, kNoTable, "", "alter table records rename to away",
     "alter table away rename to records"},
    {"FullDatabase", "database or disk is full", "", "recCreate,recSave inserts,recSave replaces",
     "create trigger fill after insert on records begin"
     " update records set note = printf('%.99999c', 'x') where id = 1; end;"
     "pragma max_page_count = 1",
     "pragma max_page_count = 1000"},
    {"ReadOnlyFile", "attempt to write a readonly database", "", "", "", "", true, "mode=ro"},
    {"LockedTableOfASharedCache", "database table is locked", "database table is locked: records",
     "", "", "", false, "cache=shared", "begin immediate; update records set note = 'x'"},
    {"LockedSchemaOfASharedCache", kSchema, kSchema, "", "", "", true, "cache=shared",
     "begin immediate; create table another (a)"},
    {"RefusedByTheAuthorizer", "not authorized", "not authorized", "", "", "", true, "", "",
     refuseEverything},
    {"Interrupted", "interrupted", "interrupted", "recList,recUpdateByWhere,recDelete", "", "",
     false, "", "", interruptLoops},
};

// A connection to a file with the twelve records, opened with a parameter of a URI, and a second
// one of the same kind.
class TriedOnce : public HostTest, public testing::WithParamInterface<Error> {
protected:
    ~TriedOnce() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }

    // The operation fails with that error at its first attempt.
    void expectOnce(const Operation& operation, const std::string& strError)
    {
        SCOPED_TRACE(operation.szName);
        takeStatements();
        table_.api.setErrMsg("");
        Json::Value jOutput;
        EXPECT_EQ(-1, operation.run(database_, table_, jOutput));
        EXPECT_EQ(operation.failure(table_, strError, onlyStatement(1, 0)), takeLog());
        const bool blDuplicate = 0 == strError.find("UNIQUE") &&
                                 (operation.is("recCreate") || operation.is("recUpdateByFilter"));
        EXPECT_EQ(blDuplicate ? "DUPLICATE_PRIMARY_KEY" : "", table_.api.getErrMsg());
        ++Figures::of("locks, errors tried once");
    }

    void expectWorking(const Operation& operation)
    {
        Json::Value jOutput;
        EXPECT_EQ(operation.iResult, operation.run(database_, table_, jOutput)) << operation.szName;
        EXPECT_EQ(Lines(), takeLog());
    }

    Database owner_{Database::Place::kFile};
    const std::string strUri_ =
        "file:" + (owner_.run(recordsSql(kWithKeys)), owner_.path()) + "?" + GetParam().szParameter;
    Database database_{strUri_};
    Database other_{strUri_};
    Table table_{database_, "records", kMembers, kWithKeys};
};

TEST_P(TriedOnce, ByEveryOperation)
{
    const Error& error = GetParam();
    std::vector<Operation> chosen;
    std::istringstream names(error.szOperations);
    for (std::string strName; std::getline(names, strName, ',');)
        chosen.push_back(operation(strName.c_str()));
    if (chosen.empty())
        for (const Operation& candidate : operations())
            if (error.blMakesTable || !(candidate.is("constructor") || candidate.is("tableCreate")))
                chosen.push_back(candidate);
    const Rows before = database_.rows("select * from records");
    database_.run(error.szSql);
    other_.run(error.szOther);
    error.hook(database_.get(), true);
    for (const Operation& tested : chosen) {
        const std::string strError = tested.blWrites ? error.szError : error.szErrorOfReading;
        if (strError.empty())
            expectWorking(tested);
        else
            expectOnce(tested, strError);
    }
    error.hook(database_.get(), false);
    if (!sqlite3_get_autocommit(other_.get())) other_.run("rollback");
    database_.run(error.szCure);
    EXPECT_EQ(before, database_.rows("select * from records"));
    if (std::string("ReadOnlyFile") != error.szName) expectWorking(chosen.back());
}

INSTANTIATE_TEST_SUITE_P(Errors, TriedOnce, testing::ValuesIn(kErrors),
                         [](const auto& tested) { return std::string(tested.param.szName); });

}  // namespace
