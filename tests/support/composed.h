// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Calls that append what they compose from JSON to a text.
#pragma once

#include "support/matrix.h"

#include <string>

struct Composed {
    std::string strOut;        // what is appended, even if the call fails
    std::string strEnd = "0";  // as endOf gives it
    Lines lines = {};
    int iFailMprintf = 0;  // the call of sqlite3_mprintf that runs out of memory
};

// A call of (Json::Value&, std::string&). It runs no SQL, leaves the value and the text so far
// alone, and returns every buffer to SQLite.
template <typename Call>
void expectComposed(const Composed& expected, const std::string& strJson, Call call)
{
    SCOPED_TRACE(strJson);
    Json::Value jValue = json(strJson);
    std::string strOut = "before";
    const sqlite3_int64 iUsed = sqlite3_memory_used();
    doubles::state().iFailMprintf = expected.iFailMprintf;
    EXPECT_EQ(expected.strEnd, endOf([&] { return call(jValue, strOut); }));
    EXPECT_EQ(0, doubles::state().iFailMprintf);
    EXPECT_EQ(iUsed, sqlite3_memory_used());
    EXPECT_EQ("before" + expected.strOut, strOut);
    EXPECT_EQ(expected.lines, takeLog());
    EXPECT_EQ(text(json(strJson)), text(jValue));
    EXPECT_EQ(Lines(), doubles::state().statements);
}
