// SPDX-License-Identifier: MIT
// docs/types.md: every cell of every table is run on SQLite.

#include "docs/calls.h"
#include "support/markdown.h"

#include <utility>

namespace {

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
    ~Sample() { takeLog(); }
    Sample(const Sample&) = delete;
    Sample& operator=(const Sample&) = delete;

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

    // Writes m as recSave would, or past the library where it cannot write the value.
    void store(const std::string& strValue)
    {
        std::string strLiteral = written(strValue);
        const Json::Value jValue = json(strValue);
        if ("error" == strLiteral || "throws" == strLiteral)
            strLiteral = jValue.isNumeric()  ? strValue
                         : jValue.isString() ? "'" + jValue.asString() + "'"
                                             : "'" + strValue + "'";
        insert("(m) values (" + strLiteral + ")");
    }

    void insert(const std::string& strRow)
    {
        database.run("delete from " + table.strName);
        database.run("insert into " + table.strName + " " + strRow);
    }

    std::string readBack()
    {
        const std::string strRecords = listed(api);
        return "-1" == strRecords ? "error" : text(json(strRecords)[0].get("m", "absent"));
    }

    // The term of {"m":value} in a WHERE clause.
    std::string term(const std::string& strValue)
    {
        Json::Value jRequest = json(withM(strValue));
        std::string strSql;
        EXPECT_EQ(0, api.SqlExpandMemberList(jRequest, strSql, VORN_SQL_WHERE_TYPE_COMMA));
        return strSql;
    }

    // The term; "error" where SQLite refuses it, "nothing" where its list is empty.
    std::string outcome(const std::string& strValue)
    {
        if ("-1" == listed(api, withM(strValue))) return "error";
        if ("m in ( )" != term(strValue)) return term(strValue);
        insert("(m) values (0), (''), (null)");
        EXPECT_EQ("[]", listed(api, withM(strValue)));
        return "nothing";
    }

    // The result of recCreate or recSave, and whether a row was written all the same.
    std::string wrote(const std::string& strValue, bool blCreate)
    {
        const std::string strResult =
            blCreate ? created(api, withM(strValue)) : saved(api, withM(strValue));
        const bool blWritten = "0" != database.value("select count(*) from " + table.strName);
        database.run("delete from " + table.strName);
        if ('{' == strResult[0]) return blWritten ? "0" : "0, not written";
        return strResult + (blWritten ? ", written" : "");
    }

    // The kinds of value that the type check accepts.
    std::string checked()
    {
        static const std::pair<const char*, const char*> kinds[] = {
            {"text", R"(["5",""])"},  {"integer", "[1,-1,1.0]"}, {"fraction", "[1.5]"},
            {"bool", "[true,false]"}, {"object", "[{}]"},        {"array", "[[]]"},
            {"null", "[null]"}};
        std::string strAccepted;
        for (const auto& [szKind, szValues] : kinds) {
            Json::ArrayIndex nAccepted = 0;
            for (const Json::Value& jValue : json(szValues)) {
                Json::Value jRecord;
                jRecord["m"] = jValue;
                nAccepted += 0 == api.checkJsonType(jRecord);
            }
            EXPECT_TRUE(0 == nAccepted || json(szValues).size() == nAccepted) << szKind;
            if (0 != nAccepted) strAccepted.append(strAccepted.empty() ? "" : ", ").append(szKind);
        }
        return strAccepted.empty() ? "nothing" : strAccepted;
    }

    Database& database;
    Table table;
    VornJsonDbApi& api = table.api;
};

class DocsTypes : public TableTest {
protected:
    DocsTypes() { EXPECT_EQ(5U, tables_.size()); }
    ~DocsTypes() override { takeLog(); }

    const std::vector<MarkdownTable> tables_ = tablesOf(readPage("types.md"));
    const std::vector<std::vector<std::string>>& words_ = tables_.at(0).rows;
};

// And a row for any other word at the end.
TEST_F(DocsTypes, ListEveryWordOfTheLibrary)
{
    std::vector<std::string> onThePage;
    for (const auto& word : words_) onThePage.push_back(word[0]);
    onThePage.pop_back();
    EXPECT_EQ(matches(folderText("src"), R"re(\{"([^"]+)",\s*Decode::)re"), onThePage);
    EXPECT_FALSE(onThePage.empty());
}

TEST_F(DocsTypes, DoWhatTheFirstTableSays)
{
    for (const auto& row : words_) {
        SCOPED_TRACE(row[0]);
        Sample sample(database_, row[0]);
        EXPECT_EQ(row[2], sample.written(row[1]));
        sample.store(row[1]);
        EXPECT_EQ(row[3], sample.readBack());
        EXPECT_EQ(row[4], sample.checked());
        EXPECT_EQ(row[5], sample.term(row[1]));
        EXPECT_EQ(row[6], sample.term("[" + row[1] + "]"));

        // NULL in the column: absent, and found by the raw filter.
        sample.insert("(id) values ('n')");
        EXPECT_EQ(R"("absent")", sample.readBack());
        EXPECT_EQ(R"({"id":"n"})", found(sample.api, R"({"vornSqlWhereFilter":"m is null"})"));
    }
}

TEST_F(DocsTypes, GiveEachCallItsResult)
{
    ASSERT_EQ(words_.size(), tables_[1].rows.size());
    for (std::size_t i = 0; i < words_.size(); ++i) {
        const auto& row = tables_[1].rows[i];
        SCOPED_TRACE(row[0]);
        EXPECT_EQ(words_[i][0], row[0]);
        const std::string& strValue = words_[i][1];
        Sample sample(database_, row[0]);
        EXPECT_EQ(row[1], sample.wrote(strValue, true));
        EXPECT_EQ(row[2], sample.wrote(strValue, false));

        sample.store(strValue);
        const std::string strRequest = withM('[' == strValue[0] ? "[" + strValue + "]" : strValue);
        const std::string strRecords = listed(sample.api, strRequest);
        EXPECT_EQ(row[3], "-1" == strRecords ? strRecords : "0");
        EXPECT_NE("[]", strRecords);
        EXPECT_EQ(row[4], std::to_string(updated(sample.api, strRequest, withM(strValue))));
        EXPECT_EQ(row[5], std::to_string(deleted(sample.api, strRequest)));
    }
}

TEST_F(DocsTypes, MakeOfNullWhatTheTableSays)
{
    ASSERT_EQ(words_.size(), tables_[2].rows.size() + 1);
    for (std::size_t i = 0; i + 1 < words_.size(); ++i) {
        const auto& row = tables_[2].rows[i];
        SCOPED_TRACE(row[0]);
        EXPECT_EQ(words_[i][0], row[0]);
        Sample sample(database_, row[0]);
        EXPECT_EQ(row[1], sample.written("null"));
        EXPECT_EQ(row[3], sample.outcome("null"));
        EXPECT_EQ(row[4], sample.outcome("[null]"));
        sample.store("null");
        EXPECT_EQ(row[2], sample.readBack());
        database_.run("delete from " + sample.table.strName);
        EXPECT_EQ("-1", sample.wrote("null", true));
    }
}

TEST_F(DocsTypes, KeepWhatTheyAreChosenFor)
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
        // Where a list cannot be updated, the whole record can be saved.
        EXPECT_EQ(strRecord, saved(sample.api, strRecord, false));
    }
}

// Of a cell "`A`, or `B` from SQLite 3.53 on" what the SQLite at hand does: A or B.
std::string byVersion(const std::string& strCell)
{
    const auto parts = matches(strCell, "`(.*?)`.*`(.*?)`.* 3\\.([0-9]+)", {1, 2, 3});
    if (parts.empty()) return strCell;
    const bool blBefore = sqlite3_libversion_number() < 3000000 + 1000 * std::stoi(parts[2]);
    return parts[blBefore ? 0 : 1];
}

TEST_F(DocsTypes, HaveTheTrapsOfTheLastTable)
{
    EXPECT_FALSE(tables_[4].rows.empty());
    for (const auto& row : tables_[4].rows) {
        SCOPED_TRACE(row[0] + " " + row[2]);
        Sample sample(database_, row[0], row[1]);
        EXPECT_EQ(row[3], sample.written(row[2]));
        sample.store(row[2]);
        EXPECT_EQ(byVersion(row[4]), sample.readBack());
    }
}

TEST_F(DocsTypes, AreNotCheckedBySave)
{
    Table table(database_, R"({"m":{"cpptype":"int"}})", "m integer");
    EXPECT_THROW(saved(table.api, R"({"m":"5"})"), Json::LogicError);
    EXPECT_EQ("[]", listed(table.api));
}

}  // namespace
