// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// A host that takes records and requests from strangers: a command per line on standard input, an
/// answer per line on standard output. SECURITY.md says what becomes of attacks.
///
///     guarded DATABASE AUTHOR < commands.txt
///
/// host.h shows the commands. Whoever starts the program vouches for the author.
#include "host.h"

#include <iostream>

// The log goes to syslog: standard output is for the answers.
bool blLogToStdout = false;
bool blDebugOutput = false;

int main(int argc, char** argv)
{
    sqlite3* pDb = nullptr;
    if (3 != argc || SQLITE_OK != sqlite3_open(argv[1], &pDb)) {
        std::cerr << "usage: guarded DATABASE AUTHOR < commands\n";
        sqlite3_close(pDb);
        return 2;
    }
    bool blReady = false;
    {
        Host host(pDb, argv[2]);
        std::cerr << host.failure();
        blReady = host.failure().empty();
        std::string strLine;
        strLine.reserve(kMaxLine + 1);  // what it holds at most: reading needs no more
        while (blReady && readLine(std::cin, strLine)) host.serve(strLine, std::cout);
    }
    return SQLITE_OK == sqlite3_close(pDb) && blReady ? 0 : 1;
}
