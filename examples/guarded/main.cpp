// SPDX-License-Identifier: MIT
/// @file
/// A host that takes records and requests from strangers: a command per line on standard input, an
/// answer per line on standard output. SECURITY.md says what is checked where.
///
///     guarded DATABASE < commands.txt
///
/// host.h shows the commands, guard.cpp what is refused before the library is called, and fence.cpp
/// what SQLite refuses while it runs.
#include "guard.h"
#include "host.h"

#include <iostream>

// The log goes to syslog: standard output is for the answers.
bool blLogToStdout = false;
bool blDebugOutput = false;

int main(int argc, char** argv)
{
    sqlite3* pDb = nullptr;
    if (2 != argc || SQLITE_OK != sqlite3_open(argv[1], &pDb)) {
        std::cerr << "usage: guarded DATABASE < commands\n";
        sqlite3_close(pDb);
        return 2;
    }
    {
        Host host(pDb);
        std::string strLine;
        strLine.reserve(guard::kMaxLine + 1);  // what it holds at most: reading needs no more
        while (guard::readLine(std::cin, strLine)) host.serve(strLine, std::cout);
    }
    return SQLITE_OK == sqlite3_close(pDb) ? 0 : 1;
}
