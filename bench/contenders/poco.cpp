// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A host on Poco::Data with Poco::JSON. A record comes out of a record set, or of a variable for
// each column.
#include "contenders/all.h"
#include "contenders/prepared.h"

#include <Poco/Data/RecordSet.h>
#include <Poco/Data/SQLite/Connector.h>
#include <Poco/Data/SQLite/Utility.h>
#include <Poco/Data/Session.h>
#include <Poco/Data/Statement.h>
#include <Poco/JSON/Array.h>
#include <Poco/JSON/Object.h>
#include <Poco/JSON/Parser.h>
#include <Poco/JSON/Stringifier.h>

#include <sstream>

namespace bench {

using Poco::Data::RecordSet;
using Poco::Data::Keywords::into;
using Poco::Data::Keywords::range;
using Poco::Data::Keywords::use;
using Poco::Dynamic::Var;
using Poco::JSON::Array;
using Poco::JSON::Object;

template <>
struct JsonLibrary<Var> {
    static Var fromText(const std::string& strText) { return Poco::JSON::Parser().parse(strText); }
    static std::string toText(const Var& value)
    {
        if (value.isEmpty()) return "null";
        std::ostringstream stream;
        Poco::JSON::Stringifier::stringify(value, stream);
        return stream.str();
    }
};

namespace {

// What the statements read from and write to.
struct Row {
    int iDone = 0;
    std::string strGrp;
    int iId = 0;
    std::string strMeta;
    std::string strName;
    Poco::Int64 iQty = 0;
    std::string strTags;
};

class PocoHost : public JsonContender<Var> {
public:
    PocoHost(Columns columns, Prepare when) : columns_(columns), when_(when) {}

    sqlite3* connection() override { return Poco::Data::SQLite::Utility::dbHandle(session_); }

    void create(int id) override
    {
        const Object& rec = *record(id).extract<Object::Ptr>();
        in_.iDone = rec.getValue<bool>("done") ? 1 : 0;
        in_.strGrp = rec.getValue<std::string>("grp");
        in_.iId = rec.getValue<int>("id");
        in_.strMeta = text(rec.get("meta"));
        in_.strName = rec.getValue<std::string>("name");
        in_.iQty = rec.getValue<Poco::Int64>("qty");
        in_.strTags = text(rec.get("tags"));
        insert_.get().execute();
        result_ = only(stored_.get());
    }

    void fetch(int id) override
    {
        in_.iId = idOf(id);
        result_ = only(byId_.get());
    }

    void listGroup(int group) override
    {
        in_.strGrp = groupRequest(group).extract<Object::Ptr>()->getValue<std::string>("grp");
        result_ = all(byGroup_.get());
    }

    void listAll() override { result_ = all(every_.get()); }

    void update(int id) override
    {
        in_.strName = change(id).extract<Object::Ptr>()->getValue<std::string>("name");
        in_.iId = idOf(id);
        update_.get().execute();
    }

    void remove(int id) override
    {
        in_.iId = idOf(id);
        remove_.get().execute();
    }

private:
    using PocoStatement = Poco::Data::Statement;
    using Statement = Prepared<PocoStatement>;

    static Poco::Data::Session opened()
    {
        Poco::Data::SQLite::Connector::registerConnector();
        Poco::Data::Session session("SQLite", ":memory:");
        bench::run(Poco::Data::SQLite::Utility::dbHandle(session), createStatement());
        return session;
    }

    int idOf(int id) { return request(id).extract<Object::Ptr>()->getValue<int>("id"); }

    std::string text(const Var& value)
    {
        stream_.str({});
        Poco::JSON::Stringifier::stringify(value, stream_);
        return stream_.str();
    }

    Var parsed(const std::string& strText)
    {
        parser_.reset();
        return parser_.parse(strText);
    }

    PocoStatement select(const std::string& strWhere)
    {
        const std::string strSql = std::string("SELECT ") + kColumns + " FROM task" + strWhere;
        if (Columns::kAsRow == columns_) return session_ << strSql;
        // One row for each execution, as long as there are some.
        return (session_ << strSql, into(out_.iDone), into(out_.strGrp), into(out_.iId),
                into(out_.strMeta), into(out_.strName), into(out_.iQty), into(out_.strTags),
                range(0, 1));
    }

    Object::Ptr row()
    {
        Object::Ptr rec = new Object;
        rec->set("done", 1 == out_.iDone);
        rec->set("grp", out_.strGrp);
        rec->set("id", out_.iId);
        rec->set("meta", parsed(out_.strMeta));
        rec->set("name", out_.strName);
        rec->set("qty", out_.iQty);
        rec->set("tags", parsed(out_.strTags));
        return rec;
    }

    Object::Ptr row(RecordSet& columns, std::size_t i)
    {
        // A value in a record set is of the column's declared type, and INTEGER is of 64 bits.
        out_ = {static_cast<int>(columns.value<Poco::Int64>(0, i)),
                columns.value<std::string>(1, i),
                static_cast<int>(columns.value<Poco::Int64>(2, i)),
                columns.value<std::string>(3, i),
                columns.value<std::string>(4, i),
                columns.value<Poco::Int64>(5, i),
                columns.value<std::string>(6, i)};
        return row();
    }

    Var only(PocoStatement& statement)
    {
        must(1 == statement.execute(), "one row");
        if (Columns::kAsVariables == columns_) return row();
        RecordSet columns(statement);
        return row(columns, 0);
    }

    Var all(PocoStatement& statement)
    {
        Array::Ptr rows = new Array;
        if (Columns::kAsRow == columns_) {
            statement.execute();
            RecordSet columns(statement);
            for (std::size_t i = 0; i < columns.rowCount(); ++i) rows->add(row(columns, i));
            return rows;
        }
        do {
            if (1 == statement.execute()) rows->add(row());
        } while (!statement.done());
        return rows;
    }

    const Columns columns_;
    const Prepare when_;
    Poco::Data::Session session_ = opened();
    Row in_;
    Row out_;
    Statement insert_{when_, [this]() -> PocoStatement {
                          return (session_ << std::string("INSERT INTO task (") + kColumns +
                                                  ") VALUES (?,?,?,?,?,?,?)",
                                  use(in_.iDone), use(in_.strGrp), use(in_.iId), use(in_.strMeta),
                                  use(in_.strName), use(in_.iQty), use(in_.strTags));
                      }};
    Statement stored_{when_, [this] { return select(" WHERE rowid = last_insert_rowid()"); }};
    Statement byId_{when_,
                    [this]() -> PocoStatement { return (select(" WHERE id = ?"), use(in_.iId)); }};
    Statement byGroup_{
        when_, [this]() -> PocoStatement { return (select(" WHERE grp = ?"), use(in_.strGrp)); }};
    Statement every_{when_, [this] { return select(""); }};
    Statement update_{when_, [this]() -> PocoStatement {
                          return (session_ << "UPDATE task SET name = ? WHERE id = ?",
                                  use(in_.strName), use(in_.iId));
                      }};
    Statement remove_{when_, [this]() -> PocoStatement {
                          return (session_ << "DELETE FROM task WHERE id = ?", use(in_.iId));
                      }};
    Poco::JSON::Parser parser_;
    std::ostringstream stream_;
};

}  // namespace

std::unique_ptr<Contender> makePoco()
{
    return std::make_unique<PocoHost>(Columns::kAsRow, Prepare::kEachCall);
}

std::unique_ptr<Contender> makePocoVariables()
{
    return std::make_unique<PocoHost>(Columns::kAsVariables, Prepare::kEachCall);
}

std::unique_ptr<Contender> makePocoKept()
{
    return std::make_unique<PocoHost>(Columns::kAsVariables, Prepare::kOnce);
}

}  // namespace bench
