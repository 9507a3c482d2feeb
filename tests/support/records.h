// SPDX-License-Identifier: MIT
// What the tests of listing, fetching, updating and deleting share: a table of three records, and
// the log lines that several operations end with.
#pragma once

#include "support/database.h"

#include <string>
#include <vector>

// The lines of a statement that SQLite refused, and of the operation that knows its text.
inline std::string runFailed(const std::string& strError, const std::string& strSql,
                             int iAttempts = 0)
{
    return plain("i=" + std::to_string(iAttempts) + ",errno=?, run sql failed, error=" + strError +
                 ", sql=" + strSql);
}

inline std::string sqlError(const std::string& strError, const std::string& strSql)
{
    return plain("sql error, err=" + strError + ", sql=" + strSql);
}

// What SQLite says of a condition that is not there.
inline constexpr char kNearParenthesis[] = "near \")\": syntax error";
inline constexpr char kNearWhere[] = "near \"WHERE\": syntax error";

// The checks below the operations.
inline const std::string kNoObjectOrNull =
    failed("jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue");
inline const std::string kFilterIsNoText = failed("!jRecParam[jmFieldName[i]].isString()");
inline const std::string kNoMemoryForText =
    failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))");
inline const std::string kNoMatchTerm =
    failed("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)");

class RecordsTest : public HostTest {
protected:
    static constexpr char kMembers[] = R"({"data": {"cpptype": "Json::objectValue"},
                                           "flag": {"cpptype": "bool"},
                                           "id":   {"cpptype": "int"},
                                           "name": {"cpptype": "string"},
                                           "tags": {"cpptype": "Json::arrayValue"}})";
    static constexpr char kColumns[] =
        "data text, flag integer, id integer primary key, name text unique, tags text";

    explicit RecordsTest(Database::Place place = Database::Place::kDefault)
        : database_(place), table_(database_, kMembers, kColumns)
    {
        database_.run("insert into " + table_.strName + " (id,name,flag,data,tags) values " +
                      R"((1,'Ann',1,'{"k":1}','[1]'),(2,'Bob',0,NULL,NULL),)" +
                      "(3,'O''Brien',1,NULL,NULL)");
    }

    // A SELECT of recList, with what stands behind the table's name and its blank.
    std::string select(const std::string& strTail) const
    {
        return "SELECT data,flag,id,name,tags FROM " + table_.strName + " " + strTail;
    }

    // "1Ann1,2Bob0,3O'Brien1"
    std::string contents()
    {
        return database_.value(
            "select coalesce(group_concat(id||name||flag), '') from (select * from " +
            table_.strName + " order by id)");
    }

    // Leaves the error text kStale in the handle, as an earlier failure would.
    void makeStale(const std::string& strSql = "nonsense")
    {
        EXPECT_EQ(-1, table_.api.runSqlEx(strSql));
        takeLog();
        takeStatements();
    }
    static constexpr char kStale[] = "near \"nonsense\": syntax error";

    // Leaves the text of a violated UNIQUE constraint, but no message.
    void makeStaleDuplicate()
    {
        makeStale("insert into " + table_.strName + " (id) values (1)");
        EXPECT_EQ("", table_.api.getErrMsg());
    }

    // Every statement finds the database locked, but for those after nAttempts.
    static void lock(int nAttempts)
    {
        doubles::state().exec = [nAttempts](sqlite3* pDb, const char* szSql,
                                            doubles::RowCallback callback, void* arg,
                                            char** errText) mutable {
            if (0 >= nAttempts--) return doubles::realExec(pDb, szSql, callback, arg, errText);
            *errText = doubles::errorText("database is locked");
            return SQLITE_BUSY;
        };
    }

    Database database_;
    Table table_;
};

// On a file, so that another connection can hold the lock.
class RecordsInFileTest : public RecordsTest {
protected:
    RecordsInFileTest() : RecordsTest(Database::Place::kFile)
    {
        EXPECT_EQ(SQLITE_OK, sqlite3_open(database_.path().c_str(), &pOther_));
        other("begin exclusive");
    }
    ~RecordsInFileTest() override { EXPECT_EQ(SQLITE_OK, sqlite3_close(pOther_)); }

    void other(const char* szSql)
    {
        EXPECT_EQ(SQLITE_OK, doubles::realExec(pOther_, szSql, nullptr, nullptr, nullptr));
    }

    // What 500 attempts at one statement leave behind.
    void expectEveryAttempt(const std::string& strSql)
    {
        EXPECT_EQ(std::vector<std::string>(500, strSql), takeStatements());
        EXPECT_EQ(std::vector<unsigned>(500, 10000), doubles::state().sleeps);
    }

private:
    sqlite3* pOther_ = nullptr;
};
