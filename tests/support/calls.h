// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every function of the library by name, with arguments from JSON, for tests that put each of them
// through the same trouble.
#pragma once

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <optional>
#include <string>
#include <vector>

// What a host holds for one call. The call itself allocates nothing of its own.
struct Call {
    using Function = int (*)(Call& call);

    // The function that the first word of a case's name stands for.
    static Function function(const std::string& strCase);
    // Its arguments in their order, such as "first >second": members of the arguments below, with
    // ">" before an output. A "record" is "first", with "flag" where it is given.
    static const char* parameters(const std::string& strCase);

    // Takes the members "first", "second", "text", "key", "vector", "flag", "number" and "now";
    // those that are left out become empty, and the key a null pointer.
    void setArguments(const Json::Value& jArguments);
    // What has become of them.
    Json::Value arguments() const;

    // The constructor's arguments, and the handle that it makes.
    sqlite3* pDb = nullptr;
    std::string strTable;
    Json::Value jDefinition;
    std::string strCreate;
    std::optional<VornJsonDbApi> made;

    VornJsonDbApi* pApi = nullptr;
    // JSON objects, texts and the rest as the functions take them, in this order.
    Json::Value jFirst;
    Json::Value jSecond;
    std::string strText;
    std::string strKey;
    const char* key() const { return blKey ? strKey.c_str() : nullptr; }
    bool blKey = false;
    std::vector<std::string> strVector;
    bool blFlag = false;  // runSqlEx: with a callback; SqlExpandMemberName: for a record
    int iNumber = 0;      // a kind of time or list; getTimeAfterNow writes text unless it is 0
    long now = 0;         // also the number of rows that a callback was called with
    const Json::Value* pjResult = nullptr;  // what recType referred to
};
