// SPDX-License-Identifier: MIT
/// @file
/// Two threads: the library is used from one thread at a time, all its handles together. A host of
/// several threads holds a mutex of its own around every call: one mutex for the whole process.
///
/// Prints how many messages each thread has stored through a handle of its own, and how many it
/// found to be there already.
#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <iostream>
#include <memory>
#include <mutex>
#include <thread>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

// One for all handles, whatever their tables and connections: what they share is the library's.
std::mutex libraryMutex;

// Runs a call, or several that belong together, while no other thread is in the library.
template <typename Calls>
auto locked(Calls calls)
{
    const std::lock_guard<std::mutex> lock(libraryMutex);
    return calls();
}

struct Sent {
    int iStored = 0;
    int iThereAlready = 0;
    int iFailed = 0;
};

// The work of a thread. Every fifth message is sent twice. The mutex is free between two messages;
// the message of a failure belongs to the call that failed, under the same lock.
void send(VornJsonDbApi& outbox, int iMessages, Sent& sent)
{
    for (int i = 0; i < iMessages; ++i) {
        Json::Value jMessage;
        Json::Value jStored;
        jMessage["id"] = i - (4 == i % 5 ? 1 : 0);
        jMessage["text"] = "message " + jMessage["id"].asString();
        locked([&] {
            outbox.setErrMsg("");
            if (0 == outbox.recCreate(jMessage, jStored))
                ++sent.iStored;
            else if ("DUPLICATE_PRIMARY_KEY" == outbox.getErrMsg())
                ++sent.iThereAlready;
            else
                ++sent.iFailed;
        });
    }
}

std::unique_ptr<VornJsonDbApi> openTable(sqlite3* pDb, std::string strName)
{
    std::string strCreate =
        "create table if not exists " + strName + " (id integer primary key, text text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
    jDefinition[strName]["member"]["text"]["cpptype"] = "string";
    return locked([&] {
        auto pApi = std::make_unique<VornJsonDbApi>(pDb, strName, jDefinition, strCreate);
        if (0 > pApi->tableCreate()) pApi.reset();
        return pApi;
    });
}

bool useTwoThreads(sqlite3* pDb)
{
    const auto pInvoices = openTable(pDb, "invoices");
    const auto pLetters = openTable(pDb, "letters");
    if (!pInvoices || !pLetters) return false;

    Sent invoices;
    Sent letters;
    std::thread first([&] { send(*pInvoices, 500, invoices); });
    std::thread second([&] { send(*pLetters, 300, letters); });
    first.join();
    second.join();  // from here on there is one thread, which destroys the handles

    for (const Sent& sent : {invoices, letters})
        std::cout << sent.iStored << " stored, " << sent.iThereAlready << " there already\n";
    return 0 == invoices.iFailed && 0 == letters.iFailed;
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    const bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb) && useTwoThreads(pDb);
    if (!blDone) std::cerr << "failed, see the log: " << sqlite3_errmsg(pDb) << '\n';
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
