// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The floor of the library's interface: the texts that it composes, ready made, each run through
// sqlite3_exec with a callback that throws the rows away. Nothing is decoded. bench_check compares
// the texts with the library's.
#include "contenders/all.h"

#include <sqlite3.h>

namespace bench {

namespace {

int throwAway(void*, int, char**, char**)
{
    return 0;
}

std::string quoted(const std::string& strText)
{
    char* szQuoted = sqlite3_mprintf("%Q", strText.c_str());
    const std::string strQuoted = szQuoted;
    sqlite3_free(szQuoted);
    return strQuoted;
}

std::string select(const std::string& strWhere)
{
    return std::string("SELECT ") + kColumns + " FROM task " + strWhere + ";";
}

std::string byId(int id)
{
    return " WHERE  (id=" + std::to_string(id) + " )";
}

std::string insert(int id)
{
    const Json::Value jRecord = record(id);
    return std::string("INSERT INTO task (") + kColumns + ") VALUES (" +
           std::to_string(jRecord["done"].asInt()) + "," + quoted(jRecord["grp"].asString()) + "," +
           std::to_string(id) + "," + quoted(toText(jRecord["meta"])) + "," +
           quoted(jRecord["name"].asString()) + "," + std::to_string(jRecord["qty"].asInt64()) +
           "," + quoted(toText(jRecord["tags"])) +
           ") ;select * from task where rowid == last_insert_rowid();";
}

class Floor : public Contender {
public:
    Floor() : pDb_(openInMemory()) { bench::run(pDb_, createStatement()); }
    ~Floor() override { sqlite3_close(pDb_); }

    sqlite3* connection() override { return pDb_; }

    void makeInput(int rows) override
    {
        for (int id = 1; id <= rows; ++id) {
            creates_.push_back(insert(id));
            fetches_.push_back(select(byId(id)));
            updates_.push_back("UPDATE task SET name=" + quoted(newName(id)) +
                               " WHERE  (id=" + std::to_string(id) + " );");
            removes_.push_back("DELETE FROM task " + byId(id) + ";");
        }
        for (int group = 0; group < rows / kGroupSize; ++group)
            groups_.push_back(select(" WHERE  (grp=" + quoted(groupName(group)) + " )"));
    }

    void create(int id) override { runAt(creates_, id - 1); }
    void fetch(int id) override { runAt(fetches_, id - 1); }
    void listGroup(int group) override { runAt(groups_, group); }
    void listAll() override { run(strAll_); }
    void update(int id) override { runAt(updates_, id - 1); }
    void remove(int id) override { runAt(removes_, id - 1); }

    Json::Value result() const override { return {}; }
    void dropResult() override {}

private:
    using Texts = std::vector<std::string>;

    void runAt(const Texts& texts, int i) { run(texts[static_cast<std::size_t>(i)]); }

    void run(const std::string& strSql)
    {
        must(SQLITE_OK == sqlite3_exec(pDb_, strSql.c_str(), throwAway, nullptr, nullptr),
             strSql.c_str());
    }

    sqlite3* pDb_;
    const std::string strAll_ = select("");
    Texts creates_;
    Texts fetches_;
    Texts groups_;
    Texts updates_;
    Texts removes_;
};

}  // namespace

std::unique_ptr<Contender> makeFloor()
{
    return std::make_unique<Floor>();
}

}  // namespace bench
