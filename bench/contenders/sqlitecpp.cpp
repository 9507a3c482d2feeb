// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A host on SQLiteCpp, using jsoncpp as the hand-written host does.
#include "contenders/all.h"
#include "contenders/jsoncpp_text.h"
#include "contenders/prepared.h"

#include <SQLiteCpp/SQLiteCpp.h>

#include <utility>

namespace bench {

namespace {

class SqliteCpp : public JsonContender<Json::Value> {
public:
    explicit SqliteCpp(Prepare when) : when_(when) {}

    sqlite3* connection() override { return database_.getHandle(); }

    void create(int id) override
    {
        const Json::Value& jRecord = record(id);
        SQLite::Statement& insert = insert_.get();
        insert.bind(1, jRecord["done"].asBool() ? 1 : 0);
        insert.bind(2, jRecord["grp"].asString());
        insert.bind(3, jRecord["id"].asInt());
        insert.bind(4, text_.write(jRecord["meta"]));
        insert.bind(5, jRecord["name"].asString());
        insert.bind(6, static_cast<int64_t>(jRecord["qty"].asInt64()));
        insert.bind(7, text_.write(jRecord["tags"]));
        insert.exec();
        insert.reset();
        result_ = only(stored_.get());
    }

    void fetch(int id) override
    {
        SQLite::Statement& byId = byId_.get();
        byId.bind(1, request(id)["id"].asInt());
        result_ = only(byId);
    }

    void listGroup(int group) override
    {
        SQLite::Statement& byGroup = byGroup_.get();
        byGroup.bind(1, groupRequest(group)["grp"].asString());
        result_ = all(byGroup);
    }

    void listAll() override { result_ = all(every_.get()); }

    void update(int id) override
    {
        SQLite::Statement& statement = update_.get();
        statement.bind(1, change(id)["name"].asString());
        statement.bind(2, request(id)["id"].asInt());
        statement.exec();
        statement.reset();
    }

    void remove(int id) override
    {
        SQLite::Statement& statement = remove_.get();
        statement.bind(1, request(id)["id"].asInt());
        statement.exec();
        statement.reset();
    }

protected:
    SQLite::Database database_ = opened();

private:
    using Statement = Prepared<SQLite::Statement>;

    Statement prepared(const std::string& strSql)
    {
        return {when_, [this, strSql] { return SQLite::Statement(database_, strSql); }};
    }

    static SQLite::Database opened()
    {
        SQLite::Database database(":memory:", SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE);
        database.exec(createStatement());
        return database;
    }

    static std::string_view textOf(const SQLite::Column& column)
    {
        const char* szText = column.getText();
        return {szText, static_cast<std::size_t>(column.getBytes())};
    }

    Json::Value row(SQLite::Statement& statement)
    {
        Json::Value jRow(Json::objectValue);
        jRow["done"] = 1 == statement.getColumn(0).getInt();
        jRow["grp"] = jsonOf(textOf(statement.getColumn(1)));
        jRow["id"] = statement.getColumn(2).getInt();
        text_.read(textOf(statement.getColumn(3)), jRow["meta"]);
        jRow["name"] = jsonOf(textOf(statement.getColumn(4)));
        jRow["qty"] = Json::Int64(statement.getColumn(5).getInt64());
        text_.read(textOf(statement.getColumn(6)), jRow["tags"]);
        return jRow;
    }

    Json::Value only(SQLite::Statement& statement)
    {
        must(statement.executeStep(), "one row");
        Json::Value jRow = row(statement);
        statement.reset();
        return jRow;
    }

    Json::Value all(SQLite::Statement& statement)
    {
        Json::Value jRows(Json::arrayValue);
        while (statement.executeStep()) jRows.append(row(statement));
        statement.reset();
        return jRows;
    }

    const Prepare when_;
    const std::string select_ = std::string("SELECT ") + kColumns + " FROM task";
    Statement insert_ =
        prepared(std::string("INSERT INTO task (") + kColumns + ") VALUES (?,?,?,?,?,?,?)");
    Statement stored_ = prepared(select_ + " WHERE rowid = last_insert_rowid()");
    Statement byId_ = prepared(select_ + " WHERE id = ?");
    Statement byGroup_ = prepared(select_ + " WHERE grp = ?");
    Statement every_ = prepared(select_);
    Statement update_ = prepared("UPDATE task SET name = ? WHERE id = ?");
    Statement remove_ = prepared("DELETE FROM task WHERE id = ?");
    JsoncppText text_;
};

// Updates and deletes with Database::exec, as in SQLiteCpp's own examples.
class SqliteCppExec : public SqliteCpp {
public:
    SqliteCppExec() : SqliteCpp(Prepare::kEachCall) {}

    void update(int id) override
    {
        database_.exec("UPDATE task SET name='" + change(id)["name"].asString() +
                       "' WHERE id=" + std::to_string(request(id)["id"].asInt()));
    }

    void remove(int id) override
    {
        database_.exec("DELETE FROM task WHERE id=" + std::to_string(request(id)["id"].asInt()));
    }
};

}  // namespace

std::unique_ptr<Contender> makeSqliteCpp()
{
    return std::make_unique<SqliteCpp>(Prepare::kEachCall);
}

std::unique_ptr<Contender> makeSqliteCppExec()
{
    return std::make_unique<SqliteCppExec>();
}

std::unique_ptr<Contender> makeSqliteCppKept()
{
    return std::make_unique<SqliteCpp>(Prepare::kOnce);
}

}  // namespace bench
