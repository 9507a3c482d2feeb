// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A host on SOCI, using jsoncpp as the hand-written host does. A record comes out of SOCI's row, or
// of a variable for each column.
#include "contenders/all.h"
#include "contenders/jsoncpp_text.h"
#include "contenders/prepared.h"

#include <soci/soci.h>
#include <soci/sqlite3/soci-sqlite3.h>

#include <utility>

namespace bench {

// What the statements read from and write to.
struct Row {
    int iDone = 0;
    std::string strGrp;
    int iId = 0;
    std::string strMeta;
    std::string strName;
    long long iQty = 0;
    std::string strTags;
};

namespace {

class Soci : public JsonContender<Json::Value> {
public:
    Soci(Columns columns, Prepare when) : columns_(columns), when_(when) {}

    sqlite3* connection() override
    {
        auto* pBackend = static_cast<soci::sqlite3_session_backend*>(session_.get_backend());
        return reinterpret_cast<sqlite3*>(pBackend->conn_);
    }

    void create(int id) override
    {
        const Json::Value& jRecord = record(id);
        in_.iDone = jRecord["done"].asBool() ? 1 : 0;
        in_.strGrp = jRecord["grp"].asString();
        in_.iId = jRecord["id"].asInt();
        in_.strMeta = text_.write(jRecord["meta"]);
        in_.strName = jRecord["name"].asString();
        in_.iQty = jRecord["qty"].asInt64();
        in_.strTags = text_.write(jRecord["tags"]);
        insert_.get().execute(true);
        result_ = only(stored_.get());
    }

    void fetch(int id) override
    {
        in_.iId = request(id)["id"].asInt();
        result_ = only(byId_.get());
    }

    void listGroup(int group) override
    {
        in_.strGrp = groupRequest(group)["grp"].asString();
        result_ = all(byGroup_.get());
    }

    void listAll() override { result_ = all(every_.get()); }

    void update(int id) override
    {
        in_.strName = change(id)["name"].asString();
        in_.iId = request(id)["id"].asInt();
        update_.get().execute(true);
    }

    void remove(int id) override
    {
        in_.iId = request(id)["id"].asInt();
        remove_.get().execute(true);
    }

private:
    using Statement = Prepared<soci::statement>;

    using Preparation = soci::details::prepare_temp_type;

    Preparation insertIn()
    {
        const std::string strSql = std::string("INSERT INTO task (") + kColumns +
                                   ") VALUES (:done,:grp,:id,:meta,:name,:qty,:tags)";
        return (session_.prepare << strSql, soci::use(in_.iDone), soci::use(in_.strGrp),
                soci::use(in_.iId), soci::use(in_.strMeta), soci::use(in_.strName),
                soci::use(in_.iQty), soci::use(in_.strTags));
    }

    Preparation intoOut(const char* szWhere)
    {
        const std::string strSql = std::string("SELECT ") + kColumns + " FROM task" + szWhere;
        if (Columns::kAsRow == columns_) return (session_.prepare << strSql, soci::into(row_));
        return (session_.prepare << strSql, soci::into(out_.iDone), soci::into(out_.strGrp),
                soci::into(out_.iId), soci::into(out_.strMeta), soci::into(out_.strName),
                soci::into(out_.iQty), soci::into(out_.strTags));
    }

    Json::Value row()
    {
        if (Columns::kAsRow == columns_)
            out_ = {row_.get<int>(0),         row_.get<std::string>(1), row_.get<int>(2),
                    row_.get<std::string>(3), row_.get<std::string>(4), row_.get<long long>(5),
                    row_.get<std::string>(6)};
        Json::Value jRow(Json::objectValue);
        jRow["done"] = 1 == out_.iDone;
        jRow["grp"] = out_.strGrp;
        jRow["id"] = out_.iId;
        text_.read(out_.strMeta, jRow["meta"]);
        jRow["name"] = out_.strName;
        jRow["qty"] = Json::Int64(out_.iQty);
        text_.read(out_.strTags, jRow["tags"]);
        return jRow;
    }

    Json::Value only(soci::statement& statement)
    {
        must(statement.execute(true), "one row");
        return row();
    }

    Json::Value all(soci::statement& statement)
    {
        Json::Value jRows(Json::arrayValue);
        statement.execute();
        while (statement.fetch()) jRows.append(row());
        return jRows;
    }

    static void makeTable(soci::session& session)
    {
        std::string strCreate = createStatement();
        // A value in a row is of the column's declared type, and INTEGER is an int.
        const std::string strQty = "qty INTEGER";
        strCreate.replace(strCreate.find(strQty), strQty.size(), "qty BIGINT");
        const std::string::size_type end = strCreate.find(';');
        session << strCreate.substr(0, end);
        session << strCreate.substr(end + 1);
    }

    struct Session : soci::session {
        Session() : soci::session(soci::sqlite3, ":memory:") { makeTable(*this); }
    };

    const Columns columns_;
    const Prepare when_;
    Session session_;
    Row in_;
    Row out_;
    soci::row row_;
    Statement insert_{when_, [this]() -> soci::statement { return insertIn(); }};
    Statement stored_{when_, [this]() -> soci::statement {
                          return intoOut(" WHERE rowid = last_insert_rowid()");
                      }};
    Statement byId_{when_, [this]() -> soci::statement {
                        return (intoOut(" WHERE id = :id"), soci::use(in_.iId));
                    }};
    Statement byGroup_{when_, [this]() -> soci::statement {
                           return (intoOut(" WHERE grp = :grp"), soci::use(in_.strGrp));
                       }};
    Statement every_{when_, [this]() -> soci::statement { return intoOut(""); }};
    Statement update_{when_, [this]() -> soci::statement {
                          return (session_.prepare << "UPDATE task SET name = :name WHERE id = :id",
                                  soci::use(in_.strName), soci::use(in_.iId));
                      }};
    Statement remove_{when_, [this]() -> soci::statement {
                          return (session_.prepare << "DELETE FROM task WHERE id = :id",
                                  soci::use(in_.iId));
                      }};
    JsoncppText text_;
};

}  // namespace

std::unique_ptr<Contender> makeSoci()
{
    return std::make_unique<Soci>(Columns::kAsRow, Prepare::kEachCall);
}

std::unique_ptr<Contender> makeSociVariables()
{
    return std::make_unique<Soci>(Columns::kAsVariables, Prepare::kEachCall);
}

std::unique_ptr<Contender> makeSociKept()
{
    return std::make_unique<Soci>(Columns::kAsVariables, Prepare::kOnce);
}

}  // namespace bench
