// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Another program that holds a lock: lock_holder FILE SQL runs the text, says "held", and commits
// when it is told to or left alone (a byte or the end of its input). Then it says "released".

#include "support/connection.h"

#include <iostream>

int main(int argc, char** argv)
{
    if (3 != argc) return 2;
    sqlite3* const pDb = sqlite::opened(argv[1]);
    sqlite::run(pDb, argv[2]);
    std::cout << "held" << std::endl;
    std::cin.get();
    sqlite::run(pDb, "commit");
    std::cout << "released" << std::endl;
    return SQLITE_OK == sqlite3_close(pDb) && std::cout ? 0 : 1;
}
