// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// Two threads, each with a connection and handles of its own: they share nothing and need no lock.
///
/// Prints how many messages each thread has stored, and how many it found to be there already.
#include <VornJsonDbApi.h>

#include <functional>
#include <iostream>
#include <string>
#include <thread>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

struct Sent {
    int iStored = 0;
    int iThereAlready = 0;
    int iFailed = 0;
};

// Every fifth message is sent twice.
void send(VornJsonDbApi& outbox, int iMessages, Sent& sent)
{
    for (int i = 0; i < iMessages; ++i) {
        Json::Value jMessage;
        Json::Value jStored;
        jMessage["id"] = i - (4 == i % 5 ? 1 : 0);
        jMessage["text"] = "message " + jMessage["id"].asString();
        outbox.setErrMsg("");
        if (0 == outbox.recCreate(jMessage, jStored))
            ++sent.iStored;
        else if ("DUPLICATE_PRIMARY_KEY" == outbox.getErrMsg())
            ++sent.iThereAlready;
        else
            ++sent.iFailed;
    }
}

// The work of a thread. Both use the same table name, and so the same member types.
void work(int iMessages, Sent& sent)
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) sent.iFailed = iMessages;
    if (0 == sent.iFailed) {
        std::string strName = "outbox";
        std::string strCreate = "create table outbox (id integer primary key, text text)";
        Json::Value jDefinition;
        jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
        jDefinition[strName]["member"]["text"]["cpptype"] = "string";
        VornJsonDbApi outbox(pDb, strName, jDefinition, strCreate);
        send(outbox, iMessages, sent);
    }
    sqlite3_close(pDb);
}

}  // namespace

int main()
{
    Sent invoices;
    Sent letters;
    std::thread first(work, 500, std::ref(invoices));
    std::thread second(work, 300, std::ref(letters));
    first.join();
    second.join();

    for (const Sent& sent : {invoices, letters})
        std::cout << sent.iStored << " stored, " << sent.iThereAlready << " there already\n";
    return 0 == invoices.iFailed && 0 == letters.iFailed ? 0 : 1;
}
