// A host on SQLiteCpp, statements prepared once, with jsoncpp as the host by hand uses it.
#include "contenders/all.h"
#include "contenders/jsoncpp_text.h"

#include <SQLiteCpp/SQLiteCpp.h>

#include <utility>

namespace bench {

namespace {

class SqliteCpp : public JsonContender<Json::Value> {
public:
    SqliteCpp() = default;

    sqlite3* connection() override { return database_.getHandle(); }

    void create(int id) override
    {
        const Json::Value& jRecord = record(id);
        insert_.bind(1, jRecord["done"].asBool() ? 1 : 0);
        insert_.bind(2, jRecord["grp"].asString());
        insert_.bind(3, jRecord["id"].asInt());
        insert_.bind(4, text_.write(jRecord["meta"]));
        insert_.bind(5, jRecord["name"].asString());
        insert_.bind(6, static_cast<int64_t>(jRecord["qty"].asInt64()));
        insert_.bind(7, text_.write(jRecord["tags"]));
        insert_.exec();
        insert_.reset();
        result_ = only(stored_);
    }

    void fetch(int id) override
    {
        byId_.bind(1, request(id)["id"].asInt());
        result_ = only(byId_);
    }

    void listGroup(int group) override
    {
        byGroup_.bind(1, groupRequest(group)["grp"].asString());
        result_ = all(byGroup_);
    }

    void listAll() override { result_ = all(every_); }

    void update(int id) override
    {
        update_.bind(1, change(id)["name"].asString());
        update_.bind(2, request(id)["id"].asInt());
        update_.exec();
        update_.reset();
    }

    void remove(int id) override
    {
        remove_.bind(1, request(id)["id"].asInt());
        remove_.exec();
        remove_.reset();
    }

private:
    static SQLite::Database opened()
    {
        SQLite::Database database(":memory:", SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE);
        database.exec(createStatement());
        return database;
    }

    static Json::Value textOf(const SQLite::Column& column)
    {
        const char* pBegin = column.getText();
        return {pBegin, pBegin + column.getBytes()};
    }

    void read(const SQLite::Column& column, Json::Value& jValue)
    {
        const char* pBegin = column.getText();
        text_.read(pBegin, pBegin + column.getBytes(), jValue);
    }

    Json::Value row(SQLite::Statement& statement)
    {
        Json::Value jRow(Json::objectValue);
        jRow["done"] = 1 == statement.getColumn(0).getInt();
        jRow["grp"] = textOf(statement.getColumn(1));
        jRow["id"] = statement.getColumn(2).getInt();
        read(statement.getColumn(3), jRow["meta"]);
        jRow["name"] = textOf(statement.getColumn(4));
        jRow["qty"] = Json::Int64(statement.getColumn(5).getInt64());
        read(statement.getColumn(6), jRow["tags"]);
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

    const std::string select_ = std::string("SELECT ") + kColumns + " FROM task";
    SQLite::Database database_ = opened();
    SQLite::Statement insert_{
        database_, std::string("INSERT INTO task (") + kColumns + ") VALUES (?,?,?,?,?,?,?)"};
    SQLite::Statement stored_{database_, select_ + " WHERE rowid = last_insert_rowid()"};
    SQLite::Statement byId_{database_, select_ + " WHERE id = ?"};
    SQLite::Statement byGroup_{database_, select_ + " WHERE grp = ?"};
    SQLite::Statement every_{database_, select_};
    SQLite::Statement update_{database_, "UPDATE task SET name = ? WHERE id = ?"};
    SQLite::Statement remove_{database_, "DELETE FROM task WHERE id = ?"};
    JsoncppText text_;
};

}  // namespace

std::unique_ptr<Contender> makeSqliteCpp()
{
    return std::make_unique<SqliteCpp>();
}

}  // namespace bench
