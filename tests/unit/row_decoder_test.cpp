// SPDX-License-Identifier: MIT
// Result rows as records: every type word, and what stops a statement. Rows that SQLite itself
// never hands out stand in strange_rows_test.cpp.

#include "support/rows.h"

namespace {

const char kMembers[] = R"({
    "s": {"cpptype": "string"}, "i": {"cpptype": "int"}, "ui": {"cpptype": "unsigned int"},
    "u": {"cpptype": "unsigned"}, "l": {"cpptype": "long"}, "ul": {"cpptype": "unsigned long"},
    "ll": {"cpptype": "long long"}, "ull": {"cpptype": "unsigned long long"},
    "f": {"cpptype": "float"}, "d": {"cpptype": "double"}, "b": {"cpptype": "bool"},
    "j": {"cpptype": "Json::Value"}, "jo": {"cpptype": "Json::objectValue"},
    "ja": {"cpptype": "Json::arrayValue"}, "uid": {"cpptype": "uid_t"},
    "t": {"cpptype": "time_t"}, "none": {"cpptype": "no such word"}, "case": {"cpptype": "Int"},
    "empty": {"cpptype": ""}})";

class RowDecoder : public TableTest {
protected:
    int run(const std::string& strSql) { return table_.api.runSqlEx(strSql, callback_, &rows_); }

    // The rows of a statement that succeeds.
    std::string rowsOf(const std::string& strSql)
    {
        rows_ = Json::nullValue;
        EXPECT_EQ(0, run(strSql)) << strSql;
        EXPECT_EQ(Lines(), takeLog()) << strSql;
        return text(rows_);
    }

    // The lines of a statement whose first column stops it.
    static Lines stopped(const std::string& strLine, const std::string& strSql)
    {
        return {strLine,
                failed("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))"),
                failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)"),
                plain("i=0,errno=?, run sql failed, error=query aborted, sql=" + strSql)};
    }

    Table table_{database_, kMembers, "s"};
    doubles::RowCallback callback_ = rowCallback(table_);
    Json::Value rows_;
};

struct Decoded {
    const char* szColumn;
    const char* szSqlValue;
    const char* szRow;
};

const Decoded kDecoded[] = {
    {"s", "'a b'", R"({"s":"a b"})"},
    {"s", "''", R"({"s":""})"},
    {"s", "5", R"({"s":"5"})"},
    {"s", "0.5", R"({"s":"0.5"})"},
    {"s", "'%n%s'", R"({"s":"%n%s"})"},
    {"s", "'{\"a\":1}'", R"({"s":"{\"a\":1}"})"},
    {"s", "'\xC3\xA9\xE2\x82\xAC'", "{\"s\":\"\xC3\xA9\xE2\x82\xAC\"}"},
    {"i", "42", R"({"i":42})"},
    {"i", "-7", R"({"i":-7})"},
    {"i", "2147483647", R"({"i":2147483647})"},
    {"i", "2147483648", R"({"i":2147483647})"},
    {"i", "-2147483648", R"({"i":-2147483648})"},
    {"i", "-2147483649", R"({"i":-2147483648})"},
    {"i", "'99999999999999999999'", R"({"i":2147483647})"},
    {"i", "'-99999999999999999999'", R"({"i":-2147483648})"},
    {"i", "'abc'", R"({"i":0})"},
    {"i", "''", R"({"i":0})"},
    {"i", "'  12x'", R"({"i":12})"},
    {"i", "'+3'", R"({"i":3})"},
    {"i", "'010'", R"({"i":10})"},
    {"i", "'0x10'", R"({"i":0})"},
    {"i", "2.9", R"({"i":2})"},
    {"ui", "7", R"({"ui":7})"},
    {"ui", "-7", R"({"ui":-7})"},
    {"ui", "2147483648", R"({"ui":2147483647})"},
    {"ui", "4294967295", R"({"ui":2147483647})"},
    {"ll", "999999999999999999", R"({"ll":999999999999999999})"},
    {"ll", "1000000000000000000", R"({"ll":1000000000000000000})"},
    {"ll", "9223372036854775807", R"({"ll":9223372036854775807})"},
    {"ll", "'9223372036854775808'", R"({"ll":9223372036854775807})"},
    {"ll", "'-9223372036854775808'", R"({"ll":-9223372036854775808})"},
    {"ll", "'-9223372036854775809'", R"({"ll":-9223372036854775808})"},
    {"ll", "'18446744073709551617'", R"({"ll":9223372036854775807})"},
    {"ll", "'0000000000000000000000042'", R"({"ll":42})"},
    {"ll", "' 8 apples'", R"({"ll":8})"},
    {"ll", "'apples'", R"({"ll":0})"},
    {"ull", "4294967296", R"({"ull":4294967296})"},
    {"ull", "'18446744073709551615'", R"({"ull":9223372036854775807})"},
    {"ull", "-1", R"({"ull":-1})"},
    {"b", "1", R"({"b":true})"},
    {"b", "0", R"({"b":false})"},
    {"b", "2", R"({"b":false})"},
    {"b", "-1", R"({"b":false})"},
    {"b", "'true'", R"({"b":false})"},
    {"b", "''", R"({"b":false})"},
    {"b", "' 1 yes'", R"({"b":true})"},
    {"b", "'01'", R"({"b":true})"},
    {"b", "19", R"({"b":false})"},
    {"b", "'1a'", R"({"b":true})"},
    {"b", "4294967297", R"({"b":false})"},
    {"b", "'18446744073709551617'", R"({"b":false})"},
    {"j", "'5'", R"({"j":5})"},
    {"j", "'\"x\"'", R"({"j":"x"})"},
    {"j", "'null'", R"({"j":null})"},
    {"j", "'true'", R"({"j":true})"},
    {"j", "'[1,[2.5,{}]]'", R"({"j":[1,[2.5,{}]]})"},
    {"j", "'[NaN,Infinity,-Infinity]'", R"({"j":[NaN,Infinity,-Infinity]})"},
    {"j", "'/* c */ [1 // d\n]'", R"({"j":[1]})"},
    {"jo", "'{\"k\":{\"l\":[]}}'", R"({"jo":{"k":{"l":[]}}})"},
    {"jo", "'[1]'", R"({"jo":[1]})"},
    {"ja", "'[\"\xC3\xA9\",-1]'", "{\"ja\":[\"\xC3\xA9\",-1]}"},
    {"ja", "'{}'", R"({"ja":{}})"},
};

// In the first rows behind another column as in the later ones, which are decoded in another way.
TEST_F(RowDecoder, ReadsEachTypeInItsOwnWay)
{
    for (const Decoded& row : kDecoded) {
        const char* szOther = std::string("i") == row.szColumn ? "s" : "i";
        EXPECT_EQ("[{}]", rowsOf(std::string("select null as ") + szOther));
        const std::string strAgain = " union all select " + std::string(row.szSqlValue);
        const std::string strRow = row.szRow;
        EXPECT_EQ("[" + strRow + "," + strRow + "," + strRow + "," + strRow + "]",
                  rowsOf("select " + std::string(row.szSqlValue) + " as " + row.szColumn +
                         strAgain + strAgain + strAgain))
            << row.szColumn << " " << row.szSqlValue;
    }
}

TEST_F(RowDecoder, HoldsIntegersAsSignedOnes)
{
    rowsOf("select 7 as i, 7 as ui, 7 as ll, 7 as ull");
    for (const char* szName : {"i", "ui", "ll", "ull"})
        EXPECT_EQ(Json::intValue, rows_[0][szName].type()) << szName;
}

TEST_F(RowDecoder, LeavesNullOutWhateverTheType)
{
    for (const std::string& strName : json(kMembers).getMemberNames())
        EXPECT_EQ("[{}]", rowsOf("select null as '" + strName + "'")) << strName;
    EXPECT_EQ(R"([{"i":1}])", rowsOf("select null as d, 1 as i, null as s"));
}

TEST_F(RowDecoder, RefusesAValueOfAnyOtherType)
{
    const Json::Value jMembers = json(kMembers);
    for (const char* szName : {"u", "l", "ul", "f", "d", "uid", "t", "none", "case", "empty"}) {
        const std::string strSql = std::string("select 1 as '") + szName + "'";
        EXPECT_EQ(-1, run(strSql)) << szName;
        EXPECT_EQ(
            stopped(error("type error, strType=" + jMembers[szName]["cpptype"].asString()), strSql),
            takeLog());
    }
    EXPECT_TRUE(rows_.isNull());
}

TEST_F(RowDecoder, RefusesAColumnThatIsNotDeclared)
{
    for (const char* szSql :
         {"select 1 as x", "select 1+1", "select null as x", "select 'a' as S"}) {
        EXPECT_EQ(-1, run(szSql));
        EXPECT_EQ(stopped(failed("!jType.isMember(strName)"), szSql), takeLog());
    }
}

TEST_F(RowDecoder, ShowsTheFailedColumnUnlessItIsTheFirst)
{
    struct Case {
        const char* szSql;
        std::string strFirst;
        const char* szName;
        const char* szValue;
    };
    for (const Case& row :
         {Case{"select 1 as i, 'v%n' as \"x%s\"", failed("!jType.isMember(strName)"),
               "column_name[1]=x%s", "column_value[1]=v%n"},
          {"select 1 as i, 2 as s, null as x", failed("!jType.isMember(strName)"),
           "column_name[2]=x", "column_value[2]=(null)"},
          {"select 1 as i, 2.5 as d", error("type error, strType=double"), "column_name[1]=d",
           "column_value[1]=2.5"}}) {
        EXPECT_EQ(-1, run(row.szSql));
        Lines lines = stopped(row.strFirst, row.szSql);
        lines.insert(lines.begin() + 2, {plain(row.szName), plain(row.szValue)});
        EXPECT_EQ(lines, takeLog());
    }
}

TEST_F(RowDecoder, TakesTheLaterOfTwoColumnsOfOneName)
{
    EXPECT_EQ(R"([{"i":2}])", rowsOf("select 1 as i, 2 as i"));
    EXPECT_EQ(R"([{"i":1}])", rowsOf("select 1 as i, null as i"));
    EXPECT_EQ(R"([{"b":false}])", rowsOf("select 1 as b, 0 as b"));
    EXPECT_EQ(R"([{"jo":[]}])", rowsOf("select '{\"k\":1}' as jo, '[]' as jo"));
}

TEST_F(RowDecoder, AppendsToWhatIsThere)
{
    rows_ = json(R"(["x"])");
    EXPECT_EQ(0, run("select 1 as i union all select 2; select 'a' as s; select 1 as i where 0"));
    EXPECT_EQ(R"(["x",{"i":1},{"i":2},{"s":"a"}])", text(rows_));
    rows_ = Json::Value(Json::arrayValue);
    EXPECT_EQ(0, run("select 1 as i"));
    EXPECT_EQ(R"([{"i":1}])", text(rows_));
}

TEST_F(RowDecoder, LeavesNullWhereThereIsNoRow)
{
    EXPECT_EQ(0, run("select 1 as i where 0"));
    EXPECT_TRUE(rows_.isNull());
}

TEST_F(RowDecoder, KeepsTheRowsBeforeAFailure)
{
    for (const char* szSql :
         {"select 1 as i; select 2 as i; select 3 as x; select 4 as i",
          "select 1 as i; select 2 as i; no statement",
          "select 1 as i, null as d union all select 2, null union all select 3, 0.5"}) {
        rows_ = Json::nullValue;
        EXPECT_EQ(-1, run(szSql));
        EXPECT_EQ(R"([{"i":1},{"i":2}])", text(rows_)) << szSql;
    }
}

TEST_F(RowDecoder, RefusesAValueBehindRowsOfNullsToo)
{
    EXPECT_EQ(-1, run("select null as d union all select null union all select null"
                      " union all select 1.5 union all select 2.5"));
    EXPECT_EQ(error("type error, strType=double"), takeLog()[0]);
    EXPECT_EQ("[{},{},{}]", text(rows_));
}

TEST_F(RowDecoder, AppendsTheRowsOfEveryAttempt)
{
    doubles::state().exec = [i = 0](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                                    void* arg, char** errText) mutable {
        const int iStatus = doubles::realExec(pDb, szSql, callback, arg, errText);
        if (1 < i++) return iStatus;
        *errText = doubles::errorText("database is locked");
        return SQLITE_BUSY;
    };
    EXPECT_EQ(0, run("select 1 as i"));
    EXPECT_EQ(R"([{"i":1},{"i":1},{"i":1}])", text(rows_));
}

TEST_F(RowDecoder, KeepsAMemberWhoseTextIsNoJson)
{
    for (const char* szText : {"", "{", "[1,", "nul", "{\"a\" 1}", "x", "\x01"}) {
        const std::string strQuoted = "'" + std::string(szText) + "'";
        rows_ = Json::nullValue;
        EXPECT_EQ(0, run("select " + strQuoted + " as j, 1 as i")) << szText;
        ASSERT_EQ(1U, rows_.size());
        EXPECT_TRUE(rows_[0].isMember("j")) << szText;
        EXPECT_EQ(1, rows_[0]["i"].asInt());
    }
    EXPECT_EQ(Lines(), takeLog());
}

std::string nested(std::size_t nLevels)
{
    return std::string(nLevels, '[') + std::string(nLevels, ']');
}

TEST_F(RowDecoder, MakesAMemberNullThatIsNestedTooDeep)
{
    EXPECT_EQ("[{\"j\":" + nested(1000) + "}]", rowsOf("select '" + nested(1000) + "' as j"));
    for (std::size_t nLevels : {1001U, 100000U}) {
        EXPECT_EQ(R"([{"i":1,"j":null}])", rowsOf("select '" + nested(nLevels) + "' as j, 1 as i"));
        // The reader is in order afterwards.
        EXPECT_EQ(R"([{"j":[1]}])", rowsOf("select '[1]' as j"));
    }
}

// The first to ask for the types of a table is the decoder, which has no definition.
TEST_F(RowDecoder, SpoilsTheTypesOfATableThatNobodyAskedForBefore)
{
    Table other(database_, R"({"s":{"cpptype":"string"}})", "s");
    Json::Value jRows;
    const std::string strSql = "select 'x' as s";
    EXPECT_EQ(-1, other.api.runSqlEx(strSql, callback_, &jRows));
    Lines lines = takeLog();
    ASSERT_EQ(8U, lines.size());
    EXPECT_EQ(utilFailed("jTableDef.empty()"), lines[0]);
    EXPECT_EQ(utilPlain("strJsonName=" + other.strName), lines[1]);
    EXPECT_EQ(utilPlain("jTableDef=null"), lines[2]);
    EXPECT_EQ(0U, lines[3].find(utilPlain("jType={")));
    lines.erase(lines.begin(), lines.begin() + 4);
    EXPECT_EQ(stopped(failed("!jType.isMember(strName)"), strSql), lines);
    EXPECT_TRUE(jRows.isNull());

    EXPECT_TRUE(VORN_JSON_DB::recType(other.jDefinition, other.strName).isNull());
    EXPECT_EQ(utilFailed("jType[strJsonName].type() != Json::objectValue"), takeLog()[0]);
}

TEST_F(RowDecoder, UsesTheTypesOfTheTableThatRanLast)
{
    Table other(database_, R"({"s":{"cpptype":"int"}})", "s");
    VORN_JSON_DB::recType(other.jDefinition, other.strName);
    EXPECT_EQ(0, other.api.runSqlEx("select 5 as s", callback_, &rows_));
    EXPECT_EQ(0, run("select 5 as s"));
    EXPECT_EQ(R"([{"s":5},{"s":"5"}])", text(rows_));
}

}  // namespace
