// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// Counting what a host does: SQLite reports each statement and each changed row to functions of
/// the host, which prints slow statements and gives the counters as Prometheus reads them.
///
/// Prints each statement with its time, a failed call with its log, and the counters. See
/// docs/operating.md for what the numbers mean.
#include <VornJsonDbApi.h>

#include <atomic>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <locale>
#include <sstream>
#include <string>

bool blLogToStdout = true;  // as in a container without syslog
bool blDebugOutput = false;

namespace {

struct Counters {
    std::int64_t nSlow = 100000000;  // statements that take as many nanoseconds are printed
    std::atomic<std::int64_t> nStatements{0};
    std::atomic<std::int64_t> nNanoseconds{0};
    std::atomic<std::int64_t> nScanned{0};  // rows that were read because no index could be used
    std::atomic<std::int64_t> nInserted{0};
    std::atomic<std::int64_t> nUpdated{0};
    std::atomic<std::int64_t> nDeleted{0};
    std::atomic<std::int64_t> nFailed{0};  // calls that returned -1: counted by the host
};

int statementEnded(unsigned, void* pCounters, void* pStatement, void* pNanoseconds)
{
    Counters& counters = *static_cast<Counters*>(pCounters);
    sqlite3_stmt* pEnded = static_cast<sqlite3_stmt*>(pStatement);
    const std::int64_t nNanoseconds = *static_cast<std::int64_t*>(pNanoseconds);
    ++counters.nStatements;
    counters.nNanoseconds += nNanoseconds;
    counters.nScanned += sqlite3_stmt_status(pEnded, SQLITE_STMTSTATUS_FULLSCAN_STEP, 0);
    if (counters.nSlow > nNanoseconds) return 0;
    // Up to the first string, because strings may be secret or very long.
    const char* szSql = sqlite3_sql(pEnded);
    const int iMilliseconds = static_cast<int>(nNanoseconds / 1000000);
    const int iLength = static_cast<int>(strcspn(szSql, "'"));
    fprintf(stderr, "statement, %d ms: %.*s\n", iMilliseconds, iLength, szSql);
    return 0;
}

void rowChanged(void* pCounters, int iOperation, const char*, const char*, sqlite3_int64)
{
    Counters& counters = *static_cast<Counters*>(pCounters);
    if (SQLITE_INSERT == iOperation) ++counters.nInserted;
    if (SQLITE_UPDATE == iOperation) ++counters.nUpdated;
    if (SQLITE_DELETE == iOperation) ++counters.nDeleted;
}

void watch(sqlite3* pDb, Counters& counters)
{
    sqlite3_trace_v2(pDb, SQLITE_TRACE_PROFILE, statementEnded, &counters);
    sqlite3_update_hook(pDb, rowChanged, &counters);
}

std::string prometheusText(const Counters& counters)
{
    std::ostringstream text;
    const auto add = [&text](const char* szName, double dValue) {
        text << "# TYPE " << szName << " counter\n" << szName << ' ' << dValue << '\n';
    };
    text.imbue(std::locale::classic());
    text.precision(15);
    add("host_statements_total", static_cast<double>(counters.nStatements));
    add("host_statement_seconds_total", static_cast<double>(counters.nNanoseconds) / 1e9);
    add("host_rows_scanned_total", static_cast<double>(counters.nScanned));
    add("host_rows_inserted_total", static_cast<double>(counters.nInserted));
    add("host_rows_updated_total", static_cast<double>(counters.nUpdated));
    add("host_rows_deleted_total", static_cast<double>(counters.nDeleted));
    add("host_calls_failed_total", static_cast<double>(counters.nFailed));
    return text.str();
}

bool useTasks(sqlite3* pDb, Counters& counters)
{
    std::string strName = "task";
    std::string strCreate = "create table if not exists task (id integer primary key, name text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
    jDefinition[strName]["member"]["name"]["cpptype"] = "string";
    VornJsonDbApi task(pDb, strName, jDefinition, strCreate);

    // The second is there already.
    Json::Value jTask;
    Json::Value jStored;
    jTask["id"] = 1;
    jTask["name"] = "water the plants";
    for (int i = 0; i < 2; ++i) {
        errno = 0;  // log lines show it, whoever set it
        if (0 > task.recCreate(jTask, jStored)) ++counters.nFailed;
    }

    jTask["name"] = "feed the cat";
    Json::Value jNamed;
    jNamed["name"] = "feed the cat";
    Json::Value jTasks;
    if (0 > task.recSave(jTask, false) || 0 > task.recList(jNamed, jTasks)) return false;

    const int iDeleted = task.recDeleteAll();  // SQLite reports none of these rows
    counters.nDeleted += iDeleted;
    return 1 == iDeleted;
}

}  // namespace

int main()
{
    setvbuf(stdout, nullptr, _IOLBF, BUFSIZ);  // each line at once, even into a pipe

    Counters counters;
    counters.nSlow = 0;  // prints every statement
    sqlite3* pDb = nullptr;
    bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb);
    if (blDone) watch(pDb, counters);
    blDone = blDone && useTasks(pDb, counters);
    printf("%s", prometheusText(counters).c_str());
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
