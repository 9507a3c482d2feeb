// SPDX-License-Identifier: MIT
// A host that writes until it is killed. It tells its parent on kReport what it is about to do, and
// that it is done, and ends by itself only when something fails.
//
//     crash_writer DATABASE JOURNAL_MODE SEED LAST_REVISION    writes
//     crash_writer DATABASE JOURNAL_MODE                       opens the database and lists it

#include "crash/model.h"

#include <unistd.h>
#include <cstdlib>

namespace {

void report(const std::string& strText)
{
    const std::string strLine = strText + '\n';
    if (static_cast<ssize_t>(strLine.size()) != write(kReport, strLine.data(), strLine.size()))
        std::exit(4);
}

}  // namespace

int main(int argc, char** argv)
{
    if (3 != argc && 5 != argc) return 1;
    report("open");
    Store store(argv[1]);
    // A small cache, so that pages reach the database and its log before a transaction ends.
    const std::string strMode = argv[2];
    const std::string strSql =
        "pragma journal_mode=" + strMode + "; pragma cache_size=8; pragma wal_autocheckpoint=20";
    if (strMode + "20" != sqlite::value(store.connection(), strSql)) return 2;
    State state;
    Json::Value jRecords;
    if (!store.list(jRecords)) return 2;
    for (const Json::Value& jRecord : jRecords)
        state[jRecord["id"].asInt()] = jRecord["rev"].asInt();
    report("ready");
    if (3 == argc)
        for (;;) pause();

    std::mt19937 random(static_cast<unsigned>(std::strtoul(argv[3], nullptr, 10)));
    int iRevision = static_cast<int>(std::strtol(argv[4], nullptr, 10));
    for (;;) {
        const Operation operation = plan(state, random, iRevision);
        report("begin " + toLine(operation));
        if (!perform(store, operation)) return 3;
        report("done");
        state = after(state, operation);
    }
}
