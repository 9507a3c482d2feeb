// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/types.md: every cell of every table is checked against SQLite.

#include "docs/calls.h"
#include "support/markdown.h"

#include <utility>

namespace {

using Cells = std::vector<std::string>;

// {"m":value}
std::string withM(const std::string& strValue)
{
    return R"({"m":)" + strValue + "}";
}

// A table of the members id and m, m in a column of the type given.
struct Sample {
    Sample(Database& where, const std::string& strWord, const std::string& strColumn = "")
        : database(where),
          table(where, R"({"id":{"cpptype":"string"},"m":{"cpptype":")" + strWord + R"("}})",
                "id text default 'x', m " + strColumn)
    {
    }

    // The value list of a record that holds m: the text between "VALUES (" and ")".
    std::string written(const std::string& strValue)
    {
        Json::Value jRecord = json(withM(strValue));
        std::string strSql;
        try {
            if (0 != api.SqlExpandMemberSymbol(strSql, jRecord)) return "error";
        } catch (const Json::LogicError&) {
            return "throws";
        }
        EXPECT_EQ(") ", strSql.substr(strSql.size() - 2));
        return strSql.substr(0, strSql.size() - 2);
    }

    // Replaces all rows.
    void insert(const std::string& strRow)
    {
        database.run("delete from " + table.strName);
        database.run("insert into " + table.strName + " " + strRow);
    }

    // What recList makes of m as recSave writes it, or, if recSave does not write it, of the same
    // value from another program.
    std::string readBack(const std::string& strValue)
    {
        std::string strLiteral = written(strValue);
        const Json::Value jValue = json(strValue);
        if ("error" == strLiteral || "throws" == strLiteral)
            strLiteral = jValue.isNumeric()  ? strValue
                         : jValue.isString() ? "'" + jValue.asString() + "'"
                                             : "'" + strValue + "'";
        insert("(m) values (" + strLiteral + ")");
        const std::string strRecords = listed(api);
        return "-1" == strRecords ? "error" : text(json(strRecords)[0]["m"]);
    }

    // The term of {"m":value} in a WHERE clause.
    std::string term(const std::string& strValue)
    {
        Json::Value jRequest = json(withM(strValue));
        std::string strSql;
        EXPECT_EQ(0, api.SqlExpandMemberList(jRequest, strSql, VORN_SQL_WHERE_TYPE_COMMA));
        return strSql;
    }

    // The term; "error" if SQLite refuses it, "nothing" if its list is empty.
    std::string termOfNull(const std::string& strValue)
    {
        insert("(m) values (null)");
        const std::string strRecords = listed(api, withM(strValue));
        if ("-1" == strRecords) return "error";
        EXPECT_EQ("[]", strRecords);
        return "m in ( )" == term(strValue) ? "nothing" : term(strValue);
    }

    // The result of recCreate or recSave, and whether a row was written even so.
    std::string wrote(const std::string& strValue, bool blCreate)
    {
        database.run("delete from " + table.strName);
        const std::string strResult =
            blCreate ? created(api, withM(strValue)) : saved(api, withM(strValue));
        const bool blWritten = "0" != database.value("select count(*) from " + table.strName);
        if ('{' == strResult[0]) return blWritten ? "0" : "0, not written";
        return strResult + (blWritten ? ", written" : "");
    }

    // The kinds of value that the type check accepts.
    std::string checked()
    {
        static const std::pair<const char*, const char*> kinds[] = {
            {"text", R"("5")"}, {"integer", "1.0"}, {"fraction", "1.5"}, {"bool", "false"},
            {"object", "{}"},   {"array", "[]"},    {"null", "null"}};
        std::string strKinds;
        for (const auto& [szKind, szValue] : kinds) {
            Json::Value jRecord = json(withM(szValue));
            if (0 == api.checkJsonType(jRecord))
                strKinds.append(strKinds.empty() ? "" : ", ").append(szKind);
        }
        return strKinds.empty() ? "nothing" : strKinds;
    }

    Database& database;
    Table table;
    VornJsonDbApi& api = table.api;
};

class TypesPage : public TableTest {
protected:
    TypesPage() { EXPECT_EQ(5U, tables_.size()); }

    const std::vector<MarkdownTable> tables_ = readPage("types.md").tables;
};

// The last row of the first table stands for any other word.
TEST_F(TypesPage, ListsEveryTypeWord)
{
    Cells words = matches(folderText("src"), R"re(\{"([^"]+)",\s*RowForm::)re");
    ASSERT_EQ(words.size() + 1, tables_[0].rows.size());
    for (std::size_t i = 0; i < words.size(); ++i) EXPECT_EQ(words[i], tables_[0].rows[i][0]);
}

TEST_F(TypesPage, DescribesEveryTypeWord)
{
    const std::size_t nWords = tables_[0].rows.size();
    ASSERT_EQ(nWords, tables_[1].rows.size());
    ASSERT_EQ(nWords, tables_[2].rows.size() + 1);
    for (std::size_t i = 0; i < nWords; ++i) {
        const std::string& strWord = tables_[0].rows[i][0];
        const std::string& strValue = tables_[0].rows[i][1];
        const std::string strList = "[" + strValue + "]";
        Sample sample(database_, strWord);
        EXPECT_EQ((Cells{strWord, strValue, sample.written(strValue), sample.readBack(strValue),
                         sample.checked(), sample.term(strValue), sample.term(strList)}),
                  tables_[0].rows[i]);

        const std::string strCreated = sample.wrote(strValue, true);
        const std::string strSaved = sample.wrote(strValue, false);
        sample.readBack(strValue);
        const std::string strRequest = withM('[' == strValue[0] ? strList : strValue);
        const std::string strRecords = listed(sample.api, strRequest);
        EXPECT_NE("[]", strRecords);
        const int iUpdated = updated(sample.api, strRequest, withM(strValue));
        EXPECT_EQ(
            (Cells{strWord, strCreated, strSaved, "-1" == strRecords ? strRecords : "0",
                   std::to_string(iUpdated), std::to_string(deleted(sample.api, strRequest))}),
            tables_[1].rows[i]);

        if (i < tables_[2].rows.size()) {
            EXPECT_EQ((Cells{strWord, sample.written("null"), sample.readBack("null"),
                             sample.termOfNull("null"), sample.termOfNull("[null]")}),
                      tables_[2].rows[i]);
        }
        EXPECT_EQ("-1", sample.wrote("null", true));
        // NULL in the column: absent, and found by the raw filter.
        sample.insert("(id) values ('n')");
        EXPECT_EQ(R"({"id":"n"})", found(sample.api, R"({"vornSqlWhereFilter":"m is null"})"));
        takeLog();
    }
}

TEST_F(TypesPage, RecommendsWordsThatWork)
{
    EXPECT_FALSE(tables_[3].rows.empty());
    for (const auto& row : tables_[3].rows) {
        SCOPED_TRACE(row[0]);
        Sample sample(database_, row[1], row[2]);
        sample.insert("(id) values ('other')");
        const std::string strRecord = text(json(R"({"id":"x","m":)" + row[3] + "}"));
        EXPECT_EQ(strRecord, created(sample.api, strRecord));
        EXPECT_EQ("[" + strRecord + "]", listed(sample.api, row[4]));
        EXPECT_EQ(row[5], 0 == updated(sample.api, row[4], withM(row[3])) ? "yes" : "no");
        // If a list cannot be updated, the whole record can be saved.
        EXPECT_EQ(strRecord, saved(sample.api, strRecord, false));
        takeLog();
    }
}

TEST_F(TypesPage, ShowsTheTraps)
{
    EXPECT_FALSE(tables_[4].rows.empty());
    for (const auto& row : tables_[4].rows) {
        SCOPED_TRACE(row[0] + " " + row[2]);
        Sample sample(database_, row[0], row[1]);
        EXPECT_EQ(row[3], sample.written(row[2]));
        // A cell "`A`, or `B` from SQLite 3.53 on" has two results.
        const auto parts = matches(row[4], "`(.*?)`.*`(.*?)`.* 3\\.([0-9]+)", {1, 2, 3});
        const bool blBefore =
            !parts.empty() && sqlite3_libversion_number() < 3000000 + 1000 * std::stoi(parts[2]);
        EXPECT_EQ(parts.empty() ? row[4] : parts[blBefore ? 0 : 1], sample.readBack(row[2]));
        takeLog();
    }
}

}  // namespace
