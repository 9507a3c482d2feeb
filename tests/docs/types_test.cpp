// SPDX-License-Identifier: MIT
// docs/types.md: every cell of every table is run on SQLite.

#include "support/database.h"
#include "support/markdown.h"

#include <regex>

namespace {

// A table of its own for each row: the members id and m, m in a column of the type given.
struct Sample {
    Sample(Database& where, const std::string& strWord, const std::string& strColumn = "")
        : database(where),
          table(where, R"({"id":{"cpptype":"string"},"m":{"cpptype":")" + strWord + R"("}})",
                "id text default 'x', m " + strColumn)
    {
    }

    // The log is looked at elsewhere; a new table expects it empty.
    ~Sample() { takeLog(); }
    Sample(const Sample&) = delete;
    Sample& operator=(const Sample&) = delete;

    // The value list of a record that holds m: what stands between "VALUES (" and ")".
    std::string written(const Json::Value& jValue)
    {
        Json::Value jRecord;
        jRecord["m"] = jValue;
        std::string strSql = "(";
        try {
            if (0 != table.api.SqlExpandMemberSymbol(strSql, jRecord)) return "error";
        } catch (const Json::LogicError&) {
            return "throws";
        }
        EXPECT_EQ(") ", strSql.substr(strSql.size() - 2));
        return strSql.substr(1, strSql.size() - 3);
    }

    // Writes m as recSave would, whatever recSave thinks of the row, or past the library where it
    // cannot write the value.
    void store(const Json::Value& jValue)
    {
        std::string strLiteral = written(jValue);
        if ("error" == strLiteral || "throws" == strLiteral)
            strLiteral = jValue.isNumeric()  ? text(jValue)
                         : jValue.isString() ? "'" + jValue.asString() + "'"
                                             : "'" + text(jValue) + "'";
        database.run("insert into " + table.strName + " (m) values (" + strLiteral + ")");
    }

    std::string readBack()
    {
        Json::Value jRequest;
        Json::Value jRecords;
        if (0 != table.api.recList(jRequest, jRecords)) return "error";
        return text(jRecords[0].get("m", "absent"));
    }

    // The term of {"m":value} in a WHERE clause, or what SQLite makes of it.
    std::string term(const Json::Value& jValue)
    {
        Json::Value jRequest;
        jRequest["m"] = jValue;
        std::string strSql;
        EXPECT_EQ(0, table.api.SqlExpandMemberList(jRequest, strSql, VORN_SQL_WHERE_TYPE_COMMA));
        return strSql;
    }

    int rows() { return std::stoi(database.value("select count(*) from " + table.strName)); }

    Database& database;
    Table table;
};

Json::Value listOf(const Json::Value& jItem)
{
    Json::Value jList(Json::arrayValue);
    jList.append(jItem);
    return jList;
}

class DocsTypes : public TableTest {
protected:
    ~DocsTypes() override { takeLog(); }

    MarkdownPage page_ = readPage("types.md");
};

// Which kinds of value the type check accepts.
std::string accepted(Table& table)
{
    struct Kind {
        const char* szName;
        std::vector<const char*> values;
    };
    static const std::vector<Kind> kinds = {
        {"text", {R"("5")", R"("")"}},
        {"integer", {"1", "-1", "1.0"}},
        {"fraction", {"1.5"}},
        {"bool", {"true", "false"}},
        {"object", {"{}"}},
        {"array", {"[]"}},
        {"null", {"null"}},
    };
    std::string strAccepted;
    for (const Kind& kind : kinds) {
        std::size_t nAccepted = 0;
        for (const char* szValue : kind.values) {
            Json::Value jRecord;
            jRecord["m"] = json(szValue);
            nAccepted += 0 == table.api.checkJsonType(jRecord) ? 1 : 0;
        }
        if (0 == nAccepted) continue;
        strAccepted.append(strAccepted.empty() ? "" : ", ").append(kind.szName);
        if (kind.values.size() != nAccepted) strAccepted += ", not all";
    }
    return strAccepted.empty() ? "nothing" : strAccepted;
}

TEST_F(DocsTypes, TheWords)
{
    for (const auto& row : table(page_, "The words", 17).rows) {
        SCOPED_TRACE(row[0]);
        Sample sample(database_, row[0]);
        const Json::Value jValue = json(row[1]);
        EXPECT_EQ(row[2], sample.written(jValue));
        sample.store(jValue);
        EXPECT_EQ(row[3], sample.readBack());
        EXPECT_EQ(row[4], accepted(sample.table));
        EXPECT_EQ(row[5], sample.term(jValue));
        EXPECT_EQ(row[6], sample.term(listOf(jValue)));
    }
}

// The result of a call on a record with the value, and whether the row was written.
std::string saved(Sample& sample, const Json::Value& jValue, bool blCreate)
{
    Json::Value jRecord;
    jRecord["m"] = jValue;
    Json::Value jStored;
    const int iResult = blCreate ? sample.table.api.recCreate(jRecord, jStored)
                                 : sample.table.api.recSave(jRecord, true);
    const bool blWritten = 0 != sample.rows();
    sample.database.run("delete from " + sample.table.strName);
    if (0 == iResult) return blWritten ? "0" : "0, not written";
    return std::to_string(iResult) + (blWritten ? ", written" : "");
}

TEST_F(DocsTypes, WhatTheCallsMakeOfEachWord)
{
    const MarkdownTable words = table(page_, "The words", 17);
    const MarkdownTable calls = table(page_, "What the calls make of each word", 17);
    for (std::size_t i = 0; i < calls.rows.size(); ++i) {
        const auto& row = calls.rows[i];
        SCOPED_TRACE(row[0]);
        ASSERT_EQ(words.rows[i][0], row[0]);
        const Json::Value jValue = json(words.rows[i][1]);
        Sample sample(database_, row[0]);
        EXPECT_EQ(row[1], saved(sample, jValue, true));
        EXPECT_EQ(row[2], saved(sample, jValue, false));

        sample.store(jValue);
        Json::Value jRequest;
        jRequest["m"] = jValue.isArray() ? listOf(jValue) : jValue;
        Json::Value jRecords;
        EXPECT_EQ(row[3], std::to_string(sample.table.api.recList(jRequest, jRecords)));
        EXPECT_EQ("0" == row[3] ? 1U : 0U, jRecords.size());
        Json::Value jNew;
        jNew["m"] = jValue;
        EXPECT_EQ(row[4], std::to_string(sample.table.api.recUpdateByFilter(jRequest, jNew)));
        EXPECT_EQ(row[5], std::to_string(sample.table.api.recDelete(jRequest)));
    }
}

TEST_F(DocsTypes, NullInAColumnIsAbsentAndFoundByTheRawFilter)
{
    for (const auto& row : table(page_, "The words", 17).rows) {
        SCOPED_TRACE(row[0]);
        Sample sample(database_, row[0]);
        database_.run("insert into " + sample.table.strName + " (id) values ('n')");
        EXPECT_EQ("\"absent\"", sample.readBack());
        Json::Value jRequest = json(R"({"vornSqlWhereFilter":"m is null"})");
        Json::Value jRecord;
        EXPECT_EQ(1, sample.table.api.recGetOne(jRequest, jRecord));
        EXPECT_EQ(R"({"id":"n"})", text(jRecord));
    }
}

TEST_F(DocsTypes, AMemberLeftOutIsWrittenAsNull)
{
    Table table(database_, R"({"m":{"cpptype":"double"},"z":{"cpptype":"string"}})", "m, z");
    Json::Value jRecord = json(R"({"z":"x"})");
    EXPECT_EQ(0, table.api.recSave(jRecord, true));
    EXPECT_EQ((Rows{{"NULL", "x"}}), database_.rows("select m, z from " + table.strName));
    EXPECT_EQ(R"({"z":"x"})", text(jRecord));
}

// The term of a condition; "error" where SQLite refuses it, "nothing" where its list is empty.
std::string outcome(Sample& sample, const Json::Value& jValue)
{
    const std::string strTerm = sample.term(jValue);
    Json::Value jRequest;
    jRequest["m"] = jValue;
    Json::Value jRecords;
    if (0 != sample.table.api.recList(jRequest, jRecords)) return "error";
    if ("m in ( )" != strTerm) return strTerm;
    const std::string& strName = sample.table.strName;
    sample.database.run("insert into " + strName + " (m) values (0), (''), (null)");
    EXPECT_EQ("0", sample.database.value("select count(*) from " + strName + " where " + strTerm));
    return "nothing";
}

TEST_F(DocsTypes, Null)
{
    for (const auto& row : table(page_, "Null", 16).rows) {
        SCOPED_TRACE(row[0]);
        Sample sample(database_, row[0]);
        EXPECT_EQ(row[1], sample.written(Json::nullValue));
        EXPECT_EQ(row[3], outcome(sample, Json::nullValue));
        EXPECT_EQ(row[4], outcome(sample, listOf(Json::nullValue)));
        database_.run("delete from " + sample.table.strName);
        sample.store(Json::nullValue);
        EXPECT_EQ(row[2], sample.readBack());
        database_.run("delete from " + sample.table.strName);
        EXPECT_EQ("-1", saved(sample, Json::nullValue, true));
    }
}

TEST_F(DocsTypes, WhichWordToChoose)
{
    for (const auto& row : table(page_, "Which word to choose", 12).rows) {
        SCOPED_TRACE(row[0]);
        Sample sample(database_, row[1], row[2]);
        VornJsonDbApi& api = sample.table.api;
        database_.run("insert into " + sample.table.strName + " (id) values ('other')");
        Json::Value jRecord;
        jRecord["id"] = "x";
        jRecord["m"] = json(row[3]);
        // The record again, as it is stored.
        Json::Value jStored;
        EXPECT_EQ(0, api.recCreate(jRecord, jStored));
        EXPECT_EQ(text(jRecord), text(jStored));
        Json::Value jRequest = json(row[4]);
        Json::Value jFound;
        EXPECT_EQ(0, api.recList(jRequest, jFound));
        EXPECT_EQ(text(listOf(jRecord)), text(jFound));
        Json::Value jNew;
        jNew["m"] = jRecord["m"];
        EXPECT_EQ(row[5], 0 == api.recUpdateByFilter(jRequest, jNew) ? "yes" : "no");
        // Where a list cannot be updated, the whole record can be saved.
        EXPECT_EQ(0, api.recSave(jRecord, false));
    }
}

// Of a cell "`A`, or `B` from SQLite 3.53 on" what the SQLite at hand does: A or B.
std::string byVersion(const std::string& strCell)
{
    std::smatch parts;
    static const std::regex versions("`(.*)`, or `(.*)` from SQLite 3\\.([0-9]+) on");
    if (!std::regex_match(strCell, parts, versions)) return strCell;
    const bool blBefore = sqlite3_libversion_number() < 3000000 + 1000 * std::stoi(parts[3]);
    return blBefore ? parts[1] : parts[2];
}

TEST_F(DocsTypes, Traps)
{
    for (const auto& row : table(page_, "Traps", 15).rows) {
        SCOPED_TRACE(row[0] + " " + row[2]);
        Sample sample(database_, row[0], row[1]);
        const Json::Value jValue = json(row[2]);
        EXPECT_EQ(row[3], sample.written(jValue));
        EXPECT_NE("", row[5]);
        sample.store(jValue);
        EXPECT_EQ(byVersion(row[4]), sample.readBack());
    }
}

TEST_F(DocsTypes, SaveDoesNotCheck)
{
    Table texts(database_, R"({"m":{"cpptype":"string"}})", "m text");
    Json::Value jNumber = json(R"({"m":5})");
    EXPECT_EQ(0, texts.api.recSave(jNumber, true));
    EXPECT_EQ(R"({"m":"5"})", text(jNumber));

    Table numbers(database_, R"({"m":{"cpptype":"int"}})", "m integer");
    Json::Value jText = json(R"({"m":"5"})");
    EXPECT_THROW(numbers.api.recSave(jText, true), Json::LogicError);
    EXPECT_EQ("0", database_.value("select count(*) from " + numbers.strName));
}

TEST_F(DocsTypes, ARefusedDefaultMakesEveryCreateFail)
{
    Table table(database_,
                R"({"m":{"cpptype":"double","cppDefaultValue":0.5},"z":{"cpptype":"string"}})",
                "m, z");
    Json::Value jRecord = json(R"({"z":"x"})");
    Json::Value jStored;
    EXPECT_EQ(-1, table.api.recCreate(jRecord, jStored));
    EXPECT_EQ("0", database_.value("select count(*) from " + table.strName));
}

// A table that the tests above do not know would be run by nobody.
TEST_F(DocsTypes, ThePageHasNoOtherTable)
{
    std::size_t nTables = 0;
    for (const MarkdownSection& candidate : page_) nTables += candidate.tables.size();
    EXPECT_EQ(5U, nTables);
}
}  // namespace
