// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Whether all contenders do the same work: each operation's results are the same records, and the
// tables are the same afterwards. The floor runs the very statements of the library instead.
#include "contender.h"

#include <sqlite3.h>

#include <cstdio>

namespace {

using bench::Operation;

constexpr int kRows = 40;

// What is left after an operation.
struct Outcome {
    std::vector<Json::Value> results;
    std::string strTable;
    std::string strStatements;
};

int appendStatement(unsigned, void* pOutcome, void* pStatement, void* pText)
{
    static_cast<void>(pStatement);
    static_cast<Outcome*>(pOutcome)->strStatements.append(static_cast<const char*>(pText)) += '\n';
    return 0;
}

Outcome outcomeOf(const char* szContender, Operation operation)
{
    Outcome outcome;
    const std::unique_ptr<bench::Contender> contender = bench::setUp(szContender, operation, kRows);
    sqlite3_trace_v2(contender->connection(), SQLITE_TRACE_STMT, appendStatement, &outcome);
    for (int i = 0; i < bench::callCount(operation, kRows); ++i) {
        bench::call(*contender, operation, i);
        outcome.results.push_back(contender->result());
    }
    sqlite3_trace_v2(contender->connection(), 0, nullptr, nullptr);
    outcome.strTable = bench::tableText(contender->connection());
    return outcome;
}

// The records that the operation has to return, made without any contender.
std::vector<Json::Value> expectedResults(Operation operation)
{
    const auto records = [](int first, int last) {
        Json::Value jRecords(Json::arrayValue);
        for (int id = first; id <= last; ++id) jRecords.append(bench::record(id));
        return jRecords;
    };
    std::vector<Json::Value> results;
    for (int i = 0; i < bench::callCount(operation, kRows); ++i) {
        switch (operation) {
        case Operation::kCreate:
        case Operation::kFetch: results.push_back(bench::record(i + 1)); break;
        case Operation::kGroup:
            results.push_back(
                records(i * bench::kGroupSize + 1, i * bench::kGroupSize + bench::kGroupSize));
            break;
        case Operation::kList: results.push_back(records(1, kRows)); break;
        case Operation::kUpdate:
        case Operation::kDelete: results.emplace_back(); break;
        }
    }
    return results;
}

int failures = 0;

void expect(bool blHolds, const char* szContender, const char* szOperation, const char* szWhat)
{
    if (blHolds) return;
    ++failures;
    printf("%s, %s: %s\n", szContender, szOperation, szWhat);
}

// The contenders and the operations as JSON, for the scripts.
void printLists()
{
    Json::Value jLists;
    for (const bench::ContenderEntry& contender : bench::contenders()) {
        Json::Value jContender;
        jContender["name"] = contender.szName;
        jContender["title"] = contender.szTitle;
        jLists["contenders"].append(jContender);
    }
    for (const bench::OperationEntry& operation : bench::operations())
        jLists["operations"].append(operation.szName);
    printf("%s\n", bench::toText(jLists).c_str());
}

}  // namespace

int main(int argc, char** argv)
{
    if (2 == argc && std::string("--lists") == argv[1]) {
        printLists();
        return 0;
    }
    for (const bench::OperationEntry& entry : bench::operations()) {
        const Outcome library = outcomeOf("library", entry.operation);
        const std::vector<Json::Value> expected = expectedResults(entry.operation);
        for (const bench::ContenderEntry& contender : bench::contenders()) {
            const auto check = [&](bool blHolds, const char* szWhat) {
                expect(blHolds, contender.szName, entry.szName, szWhat);
            };
            const Outcome outcome = outcomeOf(contender.szName, entry.operation);
            check(outcome.strTable == library.strTable, "the table differs from the library's");
            check(!outcome.strStatements.empty(), "no statement was seen");
            if (std::string("floor") == contender.szName)
                check(outcome.strStatements == library.strStatements,
                      "the statements differ from the library's");
            else
                check(outcome.results == expected, "the results differ from the records");
        }
    }
    printf("%zu contenders, %zu operations, %d differences\n", bench::contenders().size(),
           bench::operations().size(), failures);
    return 0 == failures ? 0 : 1;
}
