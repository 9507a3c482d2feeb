// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The same hand-written host on the C API, with nlohmann::json in place of jsoncpp.
#include "contenders/all.h"
#include "contenders/statement.h"

#include <nlohmann/json.hpp>

#include <utility>

namespace bench {

using Nlohmann = nlohmann::json;

template <>
struct JsonLibrary<Nlohmann> {
    static Nlohmann fromText(const std::string& strText) { return Nlohmann::parse(strText); }
    static std::string toText(const Nlohmann& value) { return value.dump(); }
};

namespace {

class NlohmannHost : public JsonContender<Nlohmann> {
public:
    sqlite3* connection() override { return database_.get(); }

    void create(int id) override
    {
        const Nlohmann& rec = record(id);
        const std::string strMeta = rec["meta"].dump();
        const std::string strTags = rec["tags"].dump();
        Statement& insert = statements_.insert;
        insert.bind(1, rec["done"].get<bool>() ? 1 : 0);
        insert.bind(2, textOf(rec["grp"]));
        insert.bind(3, rec["id"].get<int>());
        insert.bind(4, strMeta);
        insert.bind(5, textOf(rec["name"]));
        insert.bind(6, rec["qty"].get<long long>());
        insert.bind(7, strTags);
        insert.runOnce();
        result_ = only(statements_.stored);
    }

    void fetch(int id) override
    {
        statements_.byId.bind(1, request(id)["id"].get<int>());
        result_ = only(statements_.byId);
    }

    void listGroup(int group) override
    {
        statements_.byGroup.bind(1, textOf(groupRequest(group)["grp"]));
        result_ = all(statements_.byGroup);
    }

    void listAll() override { result_ = all(statements_.every); }

    void update(int id) override
    {
        statements_.update.bind(1, textOf(change(id)["name"]));
        statements_.update.bind(2, request(id)["id"].get<int>());
        statements_.update.runOnce();
    }

    void remove(int id) override
    {
        statements_.remove.bind(1, request(id)["id"].get<int>());
        statements_.remove.runOnce();
    }

private:
    static const std::string& textOf(const Nlohmann& value)
    {
        return value.get_ref<const std::string&>();
    }

    static Nlohmann row(Statement& statement)
    {
        Nlohmann rec = Nlohmann::object();
        rec["done"] = 1 == statement.integer(0);
        rec["grp"] = std::string(statement.text(1));
        rec["id"] = statement.integer(2);
        rec["meta"] = Nlohmann::parse(statement.text(3));
        rec["name"] = std::string(statement.text(4));
        rec["qty"] = statement.integer64(5);
        rec["tags"] = Nlohmann::parse(statement.text(6));
        return rec;
    }

    static Nlohmann only(Statement& statement)
    {
        must(statement.step(), "one row");
        Nlohmann rec = row(statement);
        statement.reset();
        return rec;
    }

    static Nlohmann all(Statement& statement)
    {
        Nlohmann rows = Nlohmann::array();
        while (statement.step()) rows.push_back(row(statement));
        statement.reset();
        return rows;
    }

    TaskDatabase database_;
    TaskStatements statements_{database_.get()};
};

}  // namespace

std::unique_ptr<Contender> makeNlohmann()
{
    return std::make_unique<NlohmannHost>();
}

}  // namespace bench
