// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// This library, called as its header says.
#include "contenders/all.h"

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <utility>

bool blLogToStdout = true;
bool blDebugOutput = false;

namespace bench {

namespace {

class Library : public JsonContender<Json::Value> {
public:
    Library() : pDb_(openInMemory()), api_(pDb_, strName_, jDefinition_, strCreate_) {}

    ~Library() override { sqlite3_close(pDb_); }

    sqlite3* connection() override { return pDb_; }

    void create(int id) override
    {
        Json::Value jStored;
        must(0 == api_.recCreate(record(id), jStored), "recCreate");
        result_ = std::move(jStored);
    }

    void fetch(int id) override
    {
        Json::Value jRecord;
        must(1 == api_.recGetOne(request(id), jRecord), "recGetOne");
        result_ = std::move(jRecord);
    }

    void listGroup(int group) override { list(groupRequest(group)); }

    void listAll() override
    {
        Json::Value jAll;
        list(jAll);
    }

    void update(int id) override
    {
        must(0 == api_.recUpdateByFilter(request(id), change(id)), "recUpdateByFilter");
    }

    void remove(int id) override { must(1 == api_.recDelete(request(id)), "recDelete"); }

private:
    void list(Json::Value& jRequest)
    {
        Json::Value jRecords(Json::arrayValue);
        must(0 == api_.recList(jRequest, jRecords), "recList");
        result_ = std::move(jRecords);
    }

    sqlite3* pDb_;
    std::string strName_ = kTable;
    Json::Value jDefinition_ = definition();
    std::string strCreate_ = createStatement();
    VornJsonDbApi api_;
};

}  // namespace

std::unique_ptr<Contender> makeLibrary()
{
    return std::make_unique<Library>();
}

}  // namespace bench
