// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// creators PROCESSES SECONDS: so many processes create records on one file at once, with a rollback
// journal and then in WAL. Every text is written once, so no call may say duplicate. The file must
// hold every record that was acknowledged, and none of a call that failed. The program starts
// itself:
//
//     creators --create DATABASE PROCESS SECONDS

#include "support/child.h"
#include "support/connection.h"

#include <VornJsonTable.h>

#include <unistd.h>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <iterator>
#include <set>
#include <sstream>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

using Clock = std::chrono::steady_clock;
using Texts = std::set<std::string>;

constexpr char kTable[] = "created";

std::string textOf(int iProcess, int iCall)
{
    return "100% of '" + std::to_string(iProcess) + "', " + std::to_string(iCall);
}

// Reports "ready" and, after a byte from the parent and so many seconds, the number of calls, the
// longest one in microseconds and the calls that met a lock until the end. Whatever else goes wrong
// is reported in words instead.
int beCreator(const std::string& strFile, int iProcess, double dSeconds)
{
    sqlite3* const pDb = sqlite::opened(strFile);
    Json::Value jDefinition;
    jDefinition[kTable]["member"]["id"]["cpptype"] = "long long";
    jDefinition[kTable]["member"]["text"]["cpptype"] = "string";
    VornJsonTable table(pDb, kTable, jDefinition,
                        "create table if not exists created (id integer primary key, "
                        "text text unique)");
    std::cout << (table.reason().empty() ? "ready" : table.reason()) << std::endl;
    std::cin.get();

    const auto end = Clock::now() + std::chrono::duration<double>(dSeconds);
    int nCalls = 0;
    Clock::duration longest{};
    std::string strLocked;
    for (auto begin = Clock::now(); begin < end; ++nCalls) {
        Json::Value jRecord;
        Json::Value jStored;
        jRecord["text"] = textOf(iProcess, nCalls);
        const int iResult = table.create(jRecord, jStored);
        longest = std::max(longest, Clock::now() - begin);
        begin = Clock::now();
        if (0 == iResult && jRecord["text"] == jStored["text"]) continue;
        if (VornJsonTable::Cause::kLocked != table.cause()) {
            std::cout << "process " << iProcess << ", call " << nCalls << ": " << table.reason()
                      << std::endl;
            return 1;
        }
        strLocked += " " + std::to_string(nCalls);
    }
    std::cout << nCalls << ' '
              << std::chrono::duration_cast<std::chrono::microseconds>(longest).count() << strLocked
              << std::endl;
    return SQLITE_OK == sqlite3_close(pDb) ? 0 : 1;
}

struct Outcome {
    Texts acknowledged;
    std::size_t nFewest = SIZE_MAX;  // acknowledged of a process
    long long nLocked = 0;
    long long iLongest = 0;
    int nWrong = 0;  // processes

    void add(int iProcess, const std::string& strReport)
    {
        std::istringstream report(strReport);
        int nCalls = 0;
        long long iMicroseconds = 0;
        if (!(report >> nCalls >> iMicroseconds)) {
            std::cout << strReport << '\n';
            ++nWrong;
            return;
        }
        const std::set<int> locked{std::istream_iterator<int>(report), {}};
        for (int i = 0; i < nCalls; ++i)
            if (0 == locked.count(i)) acknowledged.insert(textOf(iProcess, i));
        nFewest = std::min(nFewest, static_cast<std::size_t>(nCalls) - locked.size());
        nLocked += static_cast<long long>(locked.size());
        iLongest = std::max(iLongest, iMicroseconds);
    }
};

Outcome runCreators(const std::string& strFile, int nProcesses, const std::string& strSeconds)
{
    std::vector<std::unique_ptr<Child>> children;
    for (int i = 0; i < nProcesses; ++i) {
        children.push_back(
            std::make_unique<Child>(std::vector<std::string>{"/proc/self/exe", "--create", strFile,
                                                             std::to_string(i), strSeconds},
                                    STDOUT_FILENO));
        const std::string strReady = children.back()->line();
        if ("ready" != strReady) std::cout << strReady << '\n';
    }
    for (const auto& child : children) child->write("\n");
    Outcome outcome;
    for (int i = 0; i < nProcesses; ++i) {
        const auto& child = children[static_cast<std::size_t>(i)];
        outcome.add(i, child->line());
        if (0 != child->finish()) ++outcome.nWrong;
    }
    return outcome;
}

Texts textsIn(const std::string& strFile)
{
    sqlite3* const pDb = sqlite::opened(strFile);
    std::istringstream lines(sqlite::value(pDb, "select group_concat(text,char(10)) from created"));
    Texts texts;
    for (std::string strLine; std::getline(lines, strLine);) texts.insert(strLine);
    if ("ok" != sqlite::value(pDb, "pragma integrity_check")) texts.clear();
    sqlite3_close(pDb);
    return texts;
}

// How many of the texts the others do not contain.
std::size_t missing(const Texts& texts, const Texts& others)
{
    Texts rest;
    std::set_difference(texts.begin(), texts.end(), others.begin(), others.end(),
                        std::inserter(rest, rest.end()));
    return rest.size();
}

// False if something is wrong.
bool check(const std::string& strFile, const std::string& strJournal, int nProcesses,
           const std::string& strSeconds)
{
    sqlite3* const pDb = sqlite::opened(strFile);
    sqlite::run(pDb, "pragma journal_mode=" + strJournal);
    sqlite::run(pDb, "create table created (id integer primary key, text text unique)");
    sqlite3_close(pDb);
    const Outcome outcome = runCreators(strFile, nProcesses, strSeconds);
    const Texts stored = textsIn(strFile);
    const std::size_t nLost = missing(outcome.acknowledged, stored);
    const std::size_t nLeft = missing(stored, outcome.acknowledged);
    const auto show = [&](const char* szName, auto number) {
        std::cout << "figure: creators, " << strJournal << ", " << szName << " = " << number
                  << '\n';
    };
    show("processes", nProcesses);
    show("acknowledged", outcome.acknowledged.size());
    show("fewest of a process", outcome.nFewest);
    show("locked until the end", outcome.nLocked);
    show("longest call in milliseconds", outcome.iLongest / 1000);
    show("lost", nLost);
    show("left by calls that failed", nLeft);
    show("processes that went wrong", outcome.nWrong);
    return 0 == nLost + nLeft && 0 == outcome.nWrong && !stored.empty();
}

}  // namespace

int main(int argc, char** argv)
{
    if (5 == argc) return beCreator(argv[2], std::stoi(argv[3]), std::stod(argv[4]));
    if (3 != argc) {
        std::cerr << "usage: creators PROCESSES SECONDS\n";
        return 2;
    }
    std::string strFolder = "creators-XXXXXX";
    if (nullptr == mkdtemp(strFolder.data())) std::abort();
    bool blGood = true;
    for (const char* szJournal : {"delete", "wal"})
        blGood =
            check(strFolder + "/" + szJournal, szJournal, std::stoi(argv[1]), argv[2]) && blGood;
    if (blGood) std::filesystem::remove_all(strFolder);
    if (!blGood) std::cout << "see " << strFolder << '\n';
    return blGood ? 0 : 1;
}
