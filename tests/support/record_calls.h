// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A table of three records, the calls of the record operations, and all that a call results in.
#pragma once

#include "support/matrix.h"
#include "support/records.h"

#include <functional>
#include <string>
#include <vector>

class RecordsTest : public HostTest {
protected:
    static constexpr char kBefore[] = "1Ann1,2Bob0,3O'Brien1";
    static constexpr char kAnySql[] = "*";
    // The level of an operation itself, above those of the operations that it calls.
    static constexpr std::size_t kOutermost = static_cast<std::size_t>(-1);
    static constexpr int kThrows = -99;

    // The statement of a save: strValues ends in ") " if the list closes.
    static std::string saved(bool blCreate, const std::string& strColumns,
                             const std::string& strValues)
    {
        return (blCreate ? "INSERT" : "REPLACE") + (" INTO $ (" + strColumns) + ") VALUES (" +
               strValues + ";select * from $ where rowid == last_insert_rowid();";
    }

    // What every listing begins with.
    static std::string select(const std::string& strTail)
    {
        return "SELECT data,flag,id,name,tags FROM $ " + strTail;
    }

    static Words save(const std::string& strRecord, bool blCreate)
    {
        return {"recSave", strRecord, blCreate ? "insert" : "replace"};
    }
    static Words create(const std::string& strRecord)
    {
        return {"recCreate", strRecord, R"({"left":"over"})"};
    }
    static Words list(const std::string& strRequest, const std::string& strArray = "[7]")
    {
        return {"recList", strRequest, strArray};
    }
    static Words get(const std::string& strRequest, const std::string& strOut = "null")
    {
        return {"recGetOne", strRequest, strOut};
    }
    static Words updateByWhere(const std::string& strRecord, const std::string& strWhere)
    {
        return {"recUpdateByWhere", strRecord, strWhere};
    }
    static Words updateByFilter(const std::string& strFilter, const std::string& strValues)
    {
        return {"recUpdateByFilter", strFilter, strValues};
    }
    static Words remove(const std::string& strRequest, bool blDeleteAll = false)
    {
        return {"recDelete", strRequest, blDeleteAll ? "all" : "some"};
    }
    static Words removeAll() { return {"recDeleteAll"}; }
    static Words removeByArray(const std::vector<std::string>& texts, const char* szKey);
    static Words removeByName(const std::string& strValue, const char* szKey);
    static bool isRemoval(const Words& call) { return 0 == call[0].find("recDelete"); }

    // The outcome of a call; "$" is the name of the table.
    struct Outcome {
        int iResult = -1;
        std::string strSql = "";           // the statement that is run; empty for none
        const char* szOut = nullptr;       // the output; null if it is left alone
        const char* szContents = nullptr;  // see contents(); null if they are not checked
        std::string strError = "";         // of the statement
        Lines causes = {};                 // the lines before those of the failed level
        std::size_t nLevel = kOutermost;
        std::string strComposed = "";  // of a statement that is not run, as a line shows it
    };

    // Makes the call in a transaction that is rolled back, once for each kind of earlier error text
    // that the handle may hold, with debug lines and on standard output as well, and checks the
    // result, the output, the arguments, the statements, the whole log, the message, the error text
    // that the handle holds afterwards, and that a failure leaves the table alone (but for
    // blWritten_).
    void expect(const Words& call, const Outcome& outcome);

    // expect() for a call that gives an output, one that changes the table, one that fails without
    // SQL, one that fails after its statement (strError is empty if SQLite accepted it), and one
    // that passes on the exception of an accessor.
    void expectOutput(const Words& call, int iResult, const std::string& strSql,
                      const std::string& strOut)
    {
        expect(call, {iResult, strSql, strOut.c_str()});
    }
    void expectContents(const Words& call, int iResult, const std::string& strSql,
                        const std::string& strContents)
    {
        expect(call, {iResult, strSql, nullptr, strContents.c_str()});
    }
    void expectFailure(const Words& call, const Lines& causes, std::size_t nLevel = kOutermost,
                       const std::string& strComposed = "")
    {
        expect(call, {-1, "", nullptr, nullptr, "", causes, nLevel, strComposed});
    }
    void expectSqlFailure(const Words& call, const std::string& strSql, const std::string& strError,
                          const Lines& causes = {})
    {
        expect(call, {-1, strSql, nullptr, nullptr, strError, causes, 0});
    }
    void expectThrow(const Words& call) { expect(call, {kThrows}); }

    // "1Ann1,2Bob0,3O'Brien1", or all columns of another table.
    std::string contents();

    // What one record of the table looks like, and the array [7] with the records of these ids.
    static const char* record(char cId);
    static std::string listed(const std::string& strIds);

    // The statement finds the database locked nAttempts times.
    void lock(std::size_t nAttempts);

    Database database_;
    Table table_{database_,
                 R"({"data":{"cpptype":"Json::objectValue"},"flag":{"cpptype":"bool"},
                     "id":{"cpptype":"int"},"name":{"cpptype":"string"},
                     "tags":{"cpptype":"Json::arrayValue"}})",
                 "id integer primary key, name text unique, flag integer, data text, tags text"};
    // The table that calls work on.
    Table* pTable_ = &table_;
    // Runs just before the call, to set the doubles.
    std::function<void()> prepare_ = [] {};
    // The retries of the statement.
    std::size_t nRetries_ = 0;
    // Whether failing calls change the table anyway.
    bool blWritten_ = false;

    RecordsTest();

private:
    std::string in(const std::string& strText) { return replaced(strText, '$', pTable_->strName); }
    Rows rows() { return database_.rows("select * from " + pTable_->strName); }
    void hold(const std::string& strError);
    Lines expectedLog(const Words& call, const Outcome& outcome, const std::string& strHeld);
    void expectOnce(const Words& call, const Outcome& outcome, const std::string& strEarlier);
};

// Checks that several operations have in common.
inline const std::string kNoObjectOrNull =
    failed("jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue");
inline const std::string kFilterIsNoText = failed("!jRecParam[jmFieldName[i]].isString()");
inline const std::string kNoRequestConditions =
    failed("0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)");
// The lines when memory runs out for a text, or for an item of a list.
inline const Lines kNoMemoryForText = {
    failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))"),
    failed("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)")};
inline const Lines kNoMemoryForItem = {
    failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))"),
    failed("0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)")};
