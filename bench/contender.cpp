// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "contender.h"

#include "contenders/all.h"

namespace bench {

const std::vector<ContenderEntry>& contenders()
{
    static const std::vector<ContenderEntry> entries = {
        {"library", "this library", makeLibrary},
        {"floor", "the floor", makeFloor},
        {"capi", "C API by hand, jsoncpp, kept", makeCApi},
#ifdef BENCH_NLOHMANN
        {"nlohmann", "C API by hand, nlohmann::json, kept", makeNlohmann},
#endif
#ifdef BENCH_SQLITECPP
        {"sqlitecpp", "SQLiteCpp, jsoncpp", makeSqliteCpp},
        {"sqlitecpp-exec", "SQLiteCpp, jsoncpp, exec", makeSqliteCppExec},
        {"sqlitecpp-kept", "SQLiteCpp, jsoncpp, kept", makeSqliteCppKept},
#endif
#ifdef BENCH_SOCI
        {"soci", "SOCI, jsoncpp, row", makeSoci},
        {"soci-variables", "SOCI, jsoncpp, variables", makeSociVariables},
        {"soci-kept", "SOCI, jsoncpp, variables, kept", makeSociKept},
#endif
#ifdef BENCH_POCO
        {"poco", "Poco::Data, Poco::JSON, record set", makePoco},
        {"poco-variables", "Poco::Data, Poco::JSON, variables", makePocoVariables},
        {"poco-kept", "Poco::Data, Poco::JSON, variables, kept", makePocoKept},
#endif
        {"sqljson", "SQLite's JSON functions, jsoncpp, kept", makeSqlJson},
    };
    return entries;
}

std::unique_ptr<Contender> makeContender(const std::string& strName)
{
    for (const ContenderEntry& entry : contenders())
        if (strName == entry.szName) return entry.make();
    must(false, ("no contender " + strName).c_str());
    return nullptr;
}

const std::vector<OperationEntry>& operations()
{
    static const std::vector<OperationEntry> entries = {
        {"create", Operation::kCreate}, {"fetch", Operation::kFetch},
        {"group", Operation::kGroup},   {"list", Operation::kList},
        {"update", Operation::kUpdate}, {"delete", Operation::kDelete},
    };
    return entries;
}

Operation operationOf(const std::string& strName)
{
    for (const OperationEntry& entry : operations())
        if (strName == entry.szName) return entry.operation;
    must(false, ("no operation " + strName).c_str());
    return Operation::kCreate;
}

int callCount(Operation operation, int rows)
{
    switch (operation) {
    case Operation::kGroup: return rows / kGroupSize;
    case Operation::kList: return 1;
    case Operation::kCreate:
    case Operation::kFetch:
    case Operation::kUpdate:
    case Operation::kDelete: break;
    }
    return rows;
}

void call(Contender& contender, Operation operation, int i)
{
    switch (operation) {
    case Operation::kCreate: contender.create(i + 1); break;
    case Operation::kFetch: contender.fetch(i + 1); break;
    case Operation::kGroup: contender.listGroup(i); break;
    case Operation::kList: contender.listAll(); break;
    case Operation::kUpdate: contender.update(i + 1); break;
    case Operation::kDelete: contender.remove(i + 1); break;
    }
}

std::unique_ptr<Contender> setUp(const std::string& strName, Operation operation, int rows)
{
    std::unique_ptr<Contender> contender = makeContender(strName);
    // A list of all rows has no input, and its tables may be large.
    if (Operation::kList != operation) contender->makeInput(rows);
    if (Operation::kCreate != operation) fill(contender->connection(), rows);
    return contender;
}

}  // namespace bench
