// SPDX-License-Identifier: MIT
// The database that the killed writer and the checker share, and what stands in it.
#pragma once

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <map>
#include <random>
#include <string>

// Revision by id. What a record holds follows from the two, and no revision is given twice.
using State = std::map<int, int>;

constexpr int kKinds = 7;
std::string kindOf(int iId);
// The members that a new revision changes, and the whole record.
Json::Value revision(int iRevision);
Json::Value record(int iId, int iRevision);

// A host's connection and its handle on the one table.
class Store {
public:
    explicit Store(const std::string& strPath);
    // False when a statement was left open.
    bool close();
    ~Store() { close(); }
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    VornJsonDbApi& api() { return api_; }
    sqlite3* connection() const { return pDb_; }
    // Statements of the host itself; false when SQLite refuses.
    bool run(const std::string& strSql);
    // The last column of the last row; SQLite's error text when it refuses.
    std::string value(const std::string& strSql);
    // Every record, as the library lists them. False when it fails.
    bool list(Json::Value& jRecords);

private:
    sqlite3* pDb_ = nullptr;
    std::string strName_ = "item";
    std::string strCreate_;
    Json::Value jDefinition_;
    VornJsonDbApi api_;
};
