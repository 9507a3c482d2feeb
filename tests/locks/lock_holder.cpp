// SPDX-License-Identifier: MIT
// Another program that holds a lock: lock_holder FILE SQL runs the text, says "held", and commits
// when it is told to or left alone (a byte or the end of its input). Then it says "released".

#include <sqlite3.h>

#include <unistd.h>
#include <cstdio>
#include <string_view>

namespace {

bool run(sqlite3* pDb, const char* szSql)
{
    if (SQLITE_OK == sqlite3_exec(pDb, szSql, nullptr, nullptr, nullptr)) return true;
    fprintf(stderr, "lock_holder: %s: %s\n", szSql, sqlite3_errmsg(pDb));
    return false;
}

bool say(std::string_view text)
{
    return static_cast<ssize_t>(text.size()) == write(STDOUT_FILENO, text.data(), text.size());
}

bool hold(sqlite3* pDb, const char* szSql)
{
    if (!run(pDb, szSql) || !say("held\n")) return false;
    char c;
    while (0 > read(STDIN_FILENO, &c, 1)) {
    }
    return run(pDb, "commit") && say("released\n");
}

}  // namespace

int main(int argc, char** argv)
{
    sqlite3* pDb = nullptr;
    if (3 != argc || SQLITE_OK != sqlite3_open(argv[1], &pDb)) return 2;
    const bool blDone = hold(pDb, argv[2]);
    return SQLITE_OK == sqlite3_close(pDb) && blDone ? 0 : 1;
}
