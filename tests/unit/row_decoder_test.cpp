// SPDX-License-Identifier: MIT
// The rows of a statement as records: every type word, and what stops a statement.

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

    Table table_{database_, kMembers, "s"};
    doubles::RowCallback callback_ = rowCallback(table_);
    Json::Value rows_;
};

// SQL values of each column, and the members that they become.
const char kDecoded[] = R"({
    "s":   {"'a b'": "a b", "''": "", "5": "5", "0.5": "0.5", "'%n%s'": "%n%s",
            "'{\"a\":1}'": "{\"a\":1}", "'\u00e9\u20ac'": "\u00e9\u20ac"},
    "i":   {"42": 42, "-7": -7, "'abc'": 0, "''": 0, "'  12x'": 12, "'+3'": 3, "'010'": 10,
            "'0x10'": 0, "2.9": 2, "2147483647": 2147483647, "2147483648": 2147483647,
            "-2147483648": -2147483648, "-2147483649": -2147483648,
            "'99999999999999999999'": 2147483647, "'-99999999999999999999'": -2147483648},
    "ui":  {"7": 7, "-7": -7, "2147483648": 2147483647, "4294967295": 2147483647},
    "ll":  {"999999999999999999": 999999999999999999, "1000000000000000000": 1000000000000000000,
            "9223372036854775807": 9223372036854775807, "'9223372036854775808'": 9223372036854775807,
            "'-9223372036854775808'": -9223372036854775808,
            "'-9223372036854775809'": -9223372036854775808,
            "'18446744073709551617'": 9223372036854775807, "'0000000000000000000000042'": 42,
            "' 8 apples'": 8, "'apples'": 0},
    "ull": {"4294967296": 4294967296, "'18446744073709551615'": 9223372036854775807, "-1": -1},
    "b":   {"1": true, "' 1 yes'": true, "'01'": true, "'1a'": true, "0": false, "2": false,
            "-1": false, "19": false, "'true'": false, "''": false, "4294967297": false,
            "'18446744073709551617'": false},
    "j":   {"'5'": 5, "'\"x\"'": "x", "'null'": null, "'true'": true, "'[1,[2.5,{}]]'": [1,[2.5,{}]],
            "'[NaN,Infinity,-Infinity]'": [NaN,Infinity,-Infinity], "'/* c */ [1 // d\n]'": [1]},
    "jo":  {"'{\"k\":{\"l\":[]}}'": {"k":{"l":[]}}, "'[1]'": [1]},
    "ja":  {"'[\"\u00e9\",-1]'": ["\u00e9",-1], "'{}'": {}}})";

// In the first rows after another column, as in the later ones, which are decoded in another way.
TEST_F(RowDecoder, ReadsEachTypeInItsOwnWay)
{
    const Json::Value jDecoded = json(kDecoded);
    for (const std::string& strColumn : jDecoded.getMemberNames())
        for (const std::string& strValue : jDecoded[strColumn].getMemberNames()) {
            EXPECT_EQ("[{}]",
                      rowsOf("select null as " + std::string("i" == strColumn ? "s" : "i")));
            std::string strSql = "select " + strValue + " as " + strColumn;
            Json::Value jRow;
            jRow[strColumn] = jDecoded[strColumn][strValue];
            Json::Value jRows;
            for (int i = 0; i < 4; ++i) {
                if (0 < i) strSql += " union all select " + strValue;
                jRows.append(jRow);
            }
            EXPECT_EQ(text(jRows), rowsOf(strSql));
        }
}

TEST_F(RowDecoder, HoldsIntegersAsSignedOnes)
{
    EXPECT_EQ(R"([{"i":7,"ll":7,"ui":7,"ull":7}])",
              rowsOf("select 7 as i, 7 as ui, 7 as ll, 7 as ull"));
    for (const Json::Value& jInteger : rows_[0]) EXPECT_EQ(Json::intValue, jInteger.type());
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
        const std::string strWord = jMembers[szName]["cpptype"].asString();
        EXPECT_EQ(statementStopped(fieldFailed(error("type error, strType=" + strWord)), strSql),
                  takeLog());
    }
    EXPECT_TRUE(rows_.isNull());
}

const std::string kUndeclared = failed("!jType.isMember(strName)");
const std::string kOfADouble = error("type error, strType=double");

TEST_F(RowDecoder, ShowsTheFailedColumnUnlessItIsTheFirst)
{
    struct Case {
        const char* szSql;
        std::string strFirst;
        std::size_t iColumn;
        const char* szName;
        const char* szValue;
    };
    for (const Case& row : {Case{"select 2.5 as d, 1 as i", kOfADouble, 0, "", ""},
                            {"select 1 as x", kUndeclared, 0, "", ""},
                            {"select 1+1", kUndeclared, 0, "", ""},
                            {"select null as x", kUndeclared, 0, "", ""},
                            {"select 'a' as S", kUndeclared, 0, "", ""},
                            {"select 1 as i, 'v%n' as \"x%s\"", kUndeclared, 1, "x%s", "v%n"},
                            {"select 1 as i, 2 as s, null as x", kUndeclared, 2, "x", "(null)"},
                            {"select 1 as i, 2.5 as d", kOfADouble, 1, "d", "2.5"}}) {
        EXPECT_EQ(-1, run(row.szSql));
        EXPECT_EQ(statementStopped(fieldFailed(row.strFirst), row.szSql, row.iColumn, row.szName,
                                   row.szValue),
                  takeLog());
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
    struct Case {
        const char* szBefore;
        const char* szSql;
        const char* szAfter;
    };
    const char kThree[] =
        "select 1 as i union all select 2; select 'a' as s; select 1 as i where 0";
    for (const Case& row : {Case{R"(["x"])", kThree, R"(["x",{"i":1},{"i":2},{"s":"a"}])"},
                            {"[]", "select 1 as i", R"([{"i":1}])"},
                            {"null", "select 1 as i where 0", "null"}}) {
        rows_ = json(row.szBefore);
        EXPECT_EQ(0, run(row.szSql));
        EXPECT_EQ(row.szAfter, text(rows_));
    }
}

TEST_F(RowDecoder, KeepsTheRowsBeforeAFailure)
{
    struct Case {
        std::string strSql;
        std::string strFirst;
        const char* szRows;
    };
    const std::string strBad = "select 1 as i; select 2 as i; no statement";
    for (const Case& row :
         {Case{"select 1 as i; select 2 as i; select 3 as x; select 4 as i", kUndeclared,
               R"([{"i":1},{"i":2}])"},
          {strBad, runFailedLine("near \"no\": syntax error", strBad), R"([{"i":1},{"i":2}])"},
          {"select 1 as i, null as d union all select 2, null union all select 3, 0.5", kOfADouble,
           R"([{"i":1},{"i":2}])"},
          {"select null as d union all select null union all select null union all select 1.5 "
           "union all select 2.5",
           kOfADouble, "[{},{},{}]"}}) {
        rows_ = Json::nullValue;
        EXPECT_EQ(-1, run(row.strSql));
        EXPECT_EQ(row.szRows, text(rows_)) << row.strSql;
        EXPECT_EQ(row.strFirst, takeLog()[0]);
    }
}

TEST_F(RowDecoder, AppendsTheRowsOfEveryAttempt)
{
    doubles::state().exec = execCalledLocked(2);
    EXPECT_EQ(R"([{"i":1},{"i":1},{"i":1}])", rowsOf("select 1 as i"));
}

TEST_F(RowDecoder, KeepsAMemberWhoseTextIsNoJson)
{
    for (const char* szText : {"", "{", "[1,", "nul", "{\"a\" 1}", "x", "\x01"}) {
        rowsOf("select '" + std::string(szText) + "' as j, 1 as i");
        ASSERT_EQ(1U, rows_.size());
        EXPECT_TRUE(rows_[0].isMember("j")) << szText;
        EXPECT_EQ(1, rows_[0]["i"].asInt());
    }
}

TEST_F(RowDecoder, MakesAMemberNullThatIsNestedTooDeep)
{
    for (std::size_t nLevels : {1000U, 1001U, 100000U}) {
        const std::string strNested = std::string(nLevels, '[') + std::string(nLevels, ']');
        EXPECT_EQ("[{\"i\":1,\"j\":" + (1000 < nLevels ? "null" : strNested) + "}]",
                  rowsOf("select '" + strNested + "' as j, 1 as i"));
        // The reader is in order afterwards.
        EXPECT_EQ(R"([{"j":[1]}])", rowsOf("select '[1]' as j"));
    }
}

// The first to ask for the types of a table is the decoder, which has no definition.
TEST_F(RowDecoder, SpoilsTheTypesOfATableThatNobodyAskedForBefore)
{
    Table other(database_, R"({"s":{"cpptype":"string"}})", "s");
    const std::string strSql = "select 'x' as s";
    EXPECT_EQ(-1, other.api.runSqlEx(strSql, callback_, &rows_));
    Lines lines = statementStopped(fieldFailed(kUndeclared), strSql);
    lines.insert(lines.begin(),
                 {utilFailed("jTableDef.empty()"), utilPlain("strJsonName=" + other.strName),
                  utilPlain("jTableDef=null"), utilPlain("jType={...}")});
    EXPECT_EQ(lines, takeLogWithoutTypes());
    EXPECT_TRUE(rows_.isNull());

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
