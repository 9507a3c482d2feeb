// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Owner of a text that SQLite allocated.
#pragma once

#include <sqlite3.h>

namespace vorn {

// Assignable from sqlite3_mprintf and comparable with NULL, so that the code of a check reads
// just as it is logged.
class SqliteText {
public:
    SqliteText() = default;
    explicit SqliteText(char* szText) : szText_(szText) {}
    ~SqliteText() { sqlite3_free(szText_); }
    SqliteText(const SqliteText&) = delete;
    SqliteText& operator=(const SqliteText&) = delete;

    SqliteText& operator=(char* szText)
    {
        sqlite3_free(szText_);
        szText_ = szText;
        return *this;
    }

    operator const char*() const { return szText_; }

    // For sqlite3_exec to put its error text into; what was held before is released.
    char** receive()
    {
        *this = nullptr;
        return &szText_;
    }

private:
    char* szText_ = nullptr;
};

}  // namespace vorn
