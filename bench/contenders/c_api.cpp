// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A hand-written host on the C API: statements prepared once, values bound, columns read by their
// types, jsoncpp with a reader and a writer that are kept.
#include "contenders/all.h"
#include "contenders/jsoncpp_text.h"
#include "contenders/statement.h"

#include <utility>

namespace bench {

namespace {

class CApi : public JsonContender<Json::Value> {
public:
    sqlite3* connection() override { return database_.get(); }

    void create(int id) override
    {
        const Json::Value& jRecord = record(id);
        const std::string strMeta = text_.write(jRecord["meta"]);
        const std::string strTags = text_.write(jRecord["tags"]);
        Statement& insert = statements_.insert;
        insert.bind(1, jRecord["done"].asBool() ? 1 : 0);
        bindText(insert, 2, jRecord["grp"]);
        insert.bind(3, jRecord["id"].asInt());
        insert.bind(4, strMeta);
        bindText(insert, 5, jRecord["name"]);
        insert.bind(6, static_cast<long long>(jRecord["qty"].asInt64()));
        insert.bind(7, strTags);
        insert.runOnce();
        result_ = only(statements_.stored);
    }

    void fetch(int id) override
    {
        statements_.byId.bind(1, request(id)["id"].asInt());
        result_ = only(statements_.byId);
    }

    void listGroup(int group) override
    {
        bindText(statements_.byGroup, 1, groupRequest(group)["grp"]);
        result_ = all(statements_.byGroup);
    }

    void listAll() override { result_ = all(statements_.every); }

    void update(int id) override
    {
        bindText(statements_.update, 1, change(id)["name"]);
        statements_.update.bind(2, request(id)["id"].asInt());
        statements_.update.runOnce();
    }

    void remove(int id) override
    {
        statements_.remove.bind(1, request(id)["id"].asInt());
        statements_.remove.runOnce();
    }

private:
    static void bindText(Statement& statement, int i, const Json::Value& jText)
    {
        const char* pBegin = nullptr;
        const char* pEnd = nullptr;
        jText.getString(&pBegin, &pEnd);
        statement.bind(i, pBegin, pEnd);
    }

    Json::Value row(Statement& statement)
    {
        Json::Value jRow(Json::objectValue);
        jRow["done"] = 1 == statement.integer(0);
        jRow["grp"] = jsonOf(statement.text(1));
        jRow["id"] = statement.integer(2);
        text_.read(statement.text(3), jRow["meta"]);
        jRow["name"] = jsonOf(statement.text(4));
        jRow["qty"] = Json::Int64(statement.integer64(5));
        text_.read(statement.text(6), jRow["tags"]);
        return jRow;
    }

    Json::Value only(Statement& statement)
    {
        must(statement.step(), "one row");
        Json::Value jRow = row(statement);
        statement.reset();
        return jRow;
    }

    Json::Value all(Statement& statement)
    {
        Json::Value jRows(Json::arrayValue);
        while (statement.step()) jRows.append(row(statement));
        statement.reset();
        return jRows;
    }

    TaskDatabase database_;
    TaskStatements statements_{database_.get()};
    JsoncppText text_;
};

}  // namespace

std::unique_ptr<Contender> makeCApi()
{
    return std::make_unique<CApi>();
}

}  // namespace bench
