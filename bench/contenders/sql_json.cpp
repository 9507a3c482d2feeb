// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A host that lets SQLite's JSON functions take records apart and put them together, and jsoncpp
// read and write each record as one text.
#include "contenders/all.h"
#include "contenders/jsoncpp_text.h"
#include "contenders/statement.h"

namespace bench {

namespace {

constexpr char kInsert[] =
    "INSERT INTO task (done,grp,id,meta,name,qty,tags) SELECT ?1->>'done',?1->>'grp',?1->>'id',"
    "?1->'meta',?1->>'name',?1->>'qty',?1->'tags'";

const std::string kSelect =
    "SELECT json_object('done',json(iif(done = 1,'true','false')),'grp',grp,'id',id,"
    "'meta',json(meta),'name',name,'qty',qty,'tags',json(tags)) FROM task";

class SqlJson : public JsonContender<Json::Value> {
public:
    sqlite3* connection() override { return database_.get(); }

    void create(int id) override
    {
        runOn(insert_, record(id));
        result_ = only(stored_);
    }

    void fetch(int id) override
    {
        const std::string strRequest = text_.write(request(id));
        byId_.bind(1, strRequest);
        result_ = only(byId_);
    }

    void listGroup(int group) override
    {
        const std::string strRequest = text_.write(groupRequest(group));
        byGroup_.bind(1, strRequest);
        result_ = all(byGroup_);
    }

    void listAll() override { result_ = all(every_); }

    void update(int id) override
    {
        const std::string strRequest = text_.write(request(id));
        update_.bind(2, strRequest);
        runOn(update_, change(id));
    }

    void remove(int id) override { runOn(remove_, request(id)); }

private:
    void runOn(Statement& statement, const Json::Value& jFirst)
    {
        const std::string strFirst = text_.write(jFirst);
        statement.bind(1, strFirst);
        statement.runOnce();
    }

    Json::Value row(Statement& statement)
    {
        Json::Value jRow;
        text_.read(statement.text(0), jRow);
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
    Statement insert_{database_.get(), kInsert};
    Statement stored_{database_.get(), kSelect + " WHERE rowid = last_insert_rowid()"};
    Statement byId_{database_.get(), kSelect + " WHERE id = ?1->>'id'"};
    Statement byGroup_{database_.get(), kSelect + " WHERE grp = ?1->>'grp'"};
    Statement every_{database_.get(), kSelect};
    Statement update_{database_.get(), "UPDATE task SET name = ?1->>'name' WHERE id = ?2->>'id'"};
    Statement remove_{database_.get(), "DELETE FROM task WHERE id = ?1->>'id'"};
    JsoncppText text_;
};

}  // namespace

std::unique_ptr<Contender> makeSqlJson()
{
    return std::make_unique<SqlJson>();
}

}  // namespace bench
