// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Any number of threads, a connection each: what a thread sees is what it would see alone.

#include "in_threads.h"
#include "support/calls.h"
#include "support/rows.h"

#include <atomic>
#include <new>
#include <random>
#include <utility>

namespace {

const char kMembers[] = R"({"id":{"cpptype":"int"},
                            "name":{"cpptype":"string","cppDefaultValue":"none"},
                            "note":{"cpptype":"string"},
                            "tags":{"cpptype":"Json::objectValue","cppDefaultValue":{}}})";
const char kColumns[] = "id integer primary key, name text unique, note text, tags text";

// Calls of every function; # is a number. Many of them fail, and log what they found.
const char* const kCalls[] = {
    R"(recCreate {"id":#,"name":"n#"})",
    R"(recCreate {"id":#,"name":"n#","note":"%q","tags":{"k":[#,{"l":0.5}]}})",
    R"(recCreate {"name":5})",
    R"(recCreate {"id":"x"})",
    R"(recSave {"id":#,"name":"s#","note":"x","tags":{}} insert)",
    R"(recSave {"id":#,"name":"r#","tags":{"a":"b"}})",
    R"(recSave {"id":#})",
    "recList {}",
    R"(recList {"sort_by":"id","limit":3,"offset":#})",
    R"~(recList {"vornSqlWhereFilter":"other()"})~",
    R"(recList {"name":["n1"]} {})",
    R"(recList {"vornSqlWhereFilter":"no_column=#"})",
    R"(recGetOne {"id":#})",
    R"(recGetOne {"name":{}})",
    R"(recUpdateByWhere {"note":"w#"} id=#)",
    R"(recUpdateByWhere {"note":"w#"} nonsense)",
    R"(recUpdateByFilter {"id":#} {"name":"n#"})",
    R"(recUpdateByFilter {"id":#} {"note":"by","tags":{"deep":[[[#]]]}})",
    R"(recDelete {"id":#})",
    "recDelete {}",
    R"(recDeleteByArray ["n#"] name)",
    "recDeleteByName n# id",
    "runSqlEx select(#)",
    "runSqlEx nonsense",
    "fillDefaultValue {} fill",
    "fillDefaultValue {} check",
    R"(checkJsonType {"id":1.5})",
    "SqlExpandMemberName",
    R"(SqlExpandMemberSymbol before {"name":"%d","note":"#"})",
    R"(SqlExpandMemberList {"id":#,"name":"x"} before 1)",
    R"(SqlMakeByMatchField name "x#")",
    R"(SqlMakeByListField name ["x#"])",
    R"(VectorParamToJson ["x"] name)",
    R"(SqlFilterConditionFromJson {"limit":#})",
    R"(jsonCopyMember {"a":1} {"b":#} overwrite)",
    "convert2ReadableTime",
    "tableCreate",
};

// A host's thread: a database with two tables, and an SQL function that reads the second one while
// a statement of the first runs.
class Worker {
public:
    Worker(unsigned uSeed, std::string strPrefix, Database::Place place = Database::Place::kDefault)
        : strPrefix_(std::move(strPrefix)), random_(uSeed), database_(place)
    {
        const auto readOther = [](sqlite3_context* pContext, int, sqlite3_value**) {
            auto* const pOther = static_cast<VornJsonDbApi*>(sqlite3_user_data(pContext));
            try {
                Json::Value jRequest;
                Json::Value jRecord(Json::objectValue);
                sqlite3_result_int(pContext, 0 <= pOther->recGetOne(jRequest, jRecord));
            } catch (const std::bad_alloc&) {
                sqlite3_result_error_nomem(pContext);
            }
        };
        EXPECT_EQ(SQLITE_OK, sqlite3_create_function(database_.get(), "other", 0, SQLITE_UTF8,
                                                     &other_.api, readOther, nullptr, nullptr));
        other_.create(R"({"a":7})");
        takeLog();
        doubles::state().statements.clear();
    }

    // A host that has asked for its types may change them, so the library reads them again and
    // again.
    Worker& askForTypes()
    {
        VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
        return *this;
    }

    // All that the host sees of so many calls: a name of its own looks like any other thread's.
    std::string transcript(int nCalls)
    {
        std::string strAll;
        for (int i = 0; i < nCalls; ++i) {
            if (0 == i % 50) useNewName(i, strAll);
            const Words call = split(numbered(kCalls[random_() % std::size(kCalls)]), ' ');
            const Ended ended = called(table_.api, call);
            strAll += call[0] + " " + ended.whole() + "\n";
            addSeen(strAll);
        }
        for (std::size_t n = 0; std::string::npos != (n = strAll.find(strPrefix_, n));)
            strAll.replace(n, strPrefix_.size(), "$");
        return strAll;
    }

    // Makes the call, whose n-th allocation fails. True if it had fewer of them.
    bool endsWithoutMemory(const char* szCall, int n)
    {
        const Words words = split(numbered(szCall), ' ');
        Call call;
        call.pApi = &table_.api;
        call.setArguments(argumentsOf(words));
        const auto function = Call::function(words[0]);
        doubles::state().iFailNew = n;
        try {
            function(call);
        } catch (const std::exception&) {
        }
        const bool blReached = 0 == std::exchange(doubles::state().iFailNew, 0);
        doubles::state().log.clear();
        return !blReached;
    }

private:
    // A table that nobody knew, with a definition that may be bad, and stays so.
    void useNewName(int i, std::string& strAll)
    {
        const char* const definitions[] = {R"({"$":{"member":{"a":{"cpptype":"int"}}}})",
                                           R"({"$":{"member":{"a":{"cpptype":"int"},"b":{}}}})",
                                           "null", R"({"$":{}})"};
        std::string strName = strPrefix_ + std::to_string(i);
        for (unsigned u = 0; u < 2; ++u) {
            Json::Value jDefinition =
                json(replaced(definitions[random_() % std::size(definitions)], '$', strName));
            strAll += "recType " + text(VORN_JSON_DB::recType(jDefinition, strName)) + "\n";
            addSeen(strAll);
        }
    }

    void addSeen(std::string& strAll)
    {
        strAll += table_.api.getErrMsg() + "\n";
        for (const std::string& strSql : std::exchange(doubles::state().statements, {}))
            strAll += strSql + "\n";
        for (const std::string& strLine : takeLogWithoutTypes()) strAll += strLine + "\n";
    }

    std::string numbered(std::string strCall)
    {
        return replaced(strCall, '#', std::to_string(random_() % 9));
    }

    std::string strPrefix_;
    std::mt19937 random_;
    Database database_;
    Table table_{database_, strPrefix_ + "table", kMembers, kColumns};
    Table other_{database_, strPrefix_ + "other", R"({"a":{"cpptype":"int"}})", "a"};
};

class Threads : public HostTest {
protected:
    static std::string freshPrefix() { return freshName() + "_"; }
};

TEST_F(Threads, SeeWhatTheyWouldSeeAlone)
{
    const int nCalls = 300 * kMore;
    for (const auto place : {Database::Place::kDefault, Database::Place::kFile}) {
        std::vector<std::string> alone;
        for (int i = 0; i < kThreads; ++i)
            alone.push_back(Worker(static_cast<unsigned>(i), freshPrefix(), place)
                                .askForTypes()
                                .transcript(nCalls));
        inThreads(kThreads, [&](int i) {
            EXPECT_EQ(alone[static_cast<std::size_t>(i)],
                      Worker(static_cast<unsigned>(i), freshPrefix(), place).transcript(nCalls));
        });
    }
    printf("figure: threads, calls compared with those made alone = %d\n", 2 * kThreads * nCalls);
}

// The same while one thread finds no memory, at each allocation in turn, and in it afterwards.
TEST_F(Threads, AreNotDisturbedByALackOfMemoryInAnother)
{
    const int nCalls = 100 * kMore;
    const auto worker = [&](int i) { return Worker(static_cast<unsigned>(i), freshPrefix()); };
    const std::string strAlone = worker(1).transcript(nCalls);
    std::atomic<int> iFaults{0};
    inThreads(kThreads, [&](int i) {
        if (0 == i) {
            Worker victim = worker(0);
            for (const char* szCall : kCalls)
                for (int n = 1; !victim.endsWithoutMemory(szCall, n); ++n) ++iFaults;
        }
        EXPECT_EQ(strAlone, worker(1).transcript(nCalls));
    });
    printf("figure: threads, allocations that fail beside others = %d\n", iFaults.load());
}

// Connection and handles, used by one thread at a time, may move to another between two calls.
TEST_F(Threads, MayHandAConnectionOn)
{
    constexpr int kTurns = 200;
    Worker worker(5, freshPrefix());
    Worker reference(5, freshPrefix());
    std::vector<std::string> seen(kTurns);
    std::atomic<int> iTurn{0};
    inThreads(kThreads, [&](int i) {
        for (int n = i; n < kTurns; n += kThreads) {
            while (iTurn != n) std::this_thread::yield();
            seen[static_cast<std::size_t>(n)] = worker.transcript(1);
            ++iTurn;
        }
    });
    for (const std::string& strSeen : seen) EXPECT_EQ(reference.transcript(1), strSeen);
}

}  // namespace
