// SPDX-License-Identifier: MIT
// A connection in memory with a table and a handle on it, as a thread of a host has them. Without
// the doubles.
#pragma once

#include "support/connection.h"

#include <VornJsonDbApi.h>

#include <memory>
#include <string>
#include <utility>

class Store {
public:
    explicit Store(std::string strName = "kept")
        : strName_(std::move(strName)), pDb_(sqlite::opened(":memory:"))
    {
        jDefinition_[strName_]["member"]["id"]["cpptype"] = "int";
        jDefinition_[strName_]["member"]["value"]["cpptype"] = "Json::Value";
        strCreate_ = "create table " + strName_ + " (id integer, value text)";
        api_ = std::make_unique<VornJsonDbApi>(pDb_, strName_, jDefinition_, strCreate_);
    }
    ~Store()
    {
        api_.reset();
        sqlite3_close(pDb_);
    }
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    // Decodes a row, which takes all that the library keeps for a thread, and logs a failure.
    bool works() { return reads("[1,{\"a\":2}]") && -1 == api_->runSqlEx("nonsense"); }

    bool reads(const std::string& strJson)
    {
        sqlite::run(pDb_, "delete from " + strName_ + ";insert into " + strName_ + " values (1,'" +
                              strJson + "')");
        Json::Value jRequest;
        Json::Value jRecords;
        return 0 == api_->recList(jRequest, jRecords) && 1U == jRecords.size() &&
               !jRecords[0]["value"].isNull();
    }

    sqlite3* connection() const { return pDb_; }

private:
    std::string strName_;
    sqlite3* pDb_;
    Json::Value jDefinition_;
    std::string strCreate_;
    std::unique_ptr<VornJsonDbApi> api_;
};
