// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// Duplicate keys: how a host tells a record that already exists from one that failed otherwise.
///
/// Each call has a transaction around it. Otherwise a call that meets the lock of another
/// connection after its INSERT runs the INSERT again, and reports as a duplicate the record it has
/// just written.
///
/// Prints what became of each user: stored, there already by its id or its mail address, or
/// refused because of its type. Its last two lines show why the message has to be cleared first.
#include <VornJsonDbApi.h>

#include <iostream>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

// Begins a transaction, in which nobody else can lock the database, and forgets earlier duplicates:
// the message, and the handle's last SQL error, which a successful statement clears. Otherwise a
// later failure of another kind would be called a duplicate, too.
bool begin(VornJsonDbApi& user)
{
    user.setErrMsg("");
    return 0 <= user.runSqlEx("begin immediate");
}

bool end(VornJsonDbApi& user, int iResult)
{
    return 0 <= user.runSqlEx(0 <= iResult ? "commit" : "rollback");
}

const char* outcome(VornJsonDbApi& user, int iResult)
{
    if (0 <= iResult) return "stored";
    return "DUPLICATE_PRIMARY_KEY" == user.getErrMsg() ? "there already" : "refused";
}

bool create(VornJsonDbApi& user, const Json::Value& jId, const char* szMail)
{
    if (!begin(user)) return false;
    Json::Value jUser;
    Json::Value jStored;
    jUser["id"] = jId;
    jUser["mail"] = szMail;
    const int iResult = user.recCreate(jUser, jStored);
    std::cout << "create " << szMail << ": " << outcome(user, iResult) << '\n';
    return end(user, iResult);
}

bool changeMail(VornJsonDbApi& user, int iId, const char* szMail)
{
    if (!begin(user)) return false;
    Json::Value jFilter;
    Json::Value jValues;
    jFilter["id"] = iId;
    jValues["mail"] = szMail;
    const int iResult = user.recUpdateByFilter(jFilter, jValues);
    std::cout << "change to " << szMail << ": " << outcome(user, iResult) << '\n';
    return end(user, iResult);
}

bool useUsers(sqlite3* pDb)
{
    std::string strName = "user";
    std::string strCreate =
        "create table if not exists user (id integer primary key, mail text unique)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
    jDefinition[strName]["member"]["mail"]["cpptype"] = "string";
    VornJsonDbApi user(pDb, strName, jDefinition, strCreate);
    if (0 > user.tableCreate()) return false;

    // The message is the same for the primary key and for any other column that is unique.
    if (!create(user, 1, "ada@example.org") || !create(user, 2, "bob@example.org") ||
        !create(user, 1, "cleo@example.org") || !create(user, 3, "ada@example.org") ||
        !create(user, "3", "dora@example.org") || !changeMail(user, 2, "ada@example.org"))
        return false;

    // Nothing but setErrMsg() clears the message: it stays after a success.
    Json::Value jUser;
    Json::Value jStored;
    jUser["id"] = 3;
    jUser["mail"] = "cleo@example.org";
    if (0 > user.recCreate(jUser, jStored)) return false;
    std::cout << "after a success: '" << user.getErrMsg() << "'\n";
    user.setErrMsg("");
    std::cout << "when cleared: '" << user.getErrMsg() << "'\n";
    return true;
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    const bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb) && useUsers(pDb);
    if (!blDone) std::cerr << "failed, see the log: " << sqlite3_errmsg(pDb) << '\n';
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
