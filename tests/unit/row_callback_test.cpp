// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The rows of a statement as records: every type word, and what stops a statement.

#include "support/rows.h"

#include <utility>

namespace {

using doubles::state;

const Row kRow = {{"s"}, {"7"}};
const std::string kUndeclared = failed("!jType.isMember(strName)");
const std::string kOfADouble = error("type error, strType=double");
const std::string kTypesAreNoObject = utilFailed("jType[strJsonName].type() != Json::objectValue");

class RowCallback : public DecoderTest {
protected:
    // The log of a row whose table has no types, from the check that asked for them onwards.
    static Lines undeclaredLines(const std::string& strCheck, const Table& table)
    {
        Lines lines = statementStopped(fieldFailed(kUndeclared));
        lines.insert(lines.begin(), {strCheck, utilPlain("strJsonName=" + table.strName),
                                     utilPlain("jTableDef=null"), utilPlain("jType={...}")});
        return lines;
    }
};

// SQL values of each column, and the members that they become.
const char kDecoded[] = R"({
    "s":   {"'a b'": "a b", "''": "", "5": "5", "0.5": "0.5", "'%n%s'": "%n%s",
            "'{\"a\":1}'": "{\"a\":1}", "'\u00e9\u20ac'": "\u00e9\u20ac"},
    "i":   {"42": 42, "-7": -7, "'abc'": 0, "''": 0, "'  12x'": 12, "'+3'": 3, "'010'": 10,
            "'0x10'": 0, "2.9": 2, "2147483647": 2147483647, "2147483648": 2147483647,
            "-2147483648": -2147483648, "-2147483649": -2147483648,
            "'99999999999999999999'": 2147483647, "'-99999999999999999999'": -2147483648},
    "ui":  {"7": 7, "-7": -7, "2147483648": 2147483647, "4294967295": 2147483647,
            "-2147483649": -2147483648},
    "ll":  {"999999999999999999": 999999999999999999, "1000000000000000000": 1000000000000000000,
            "9223372036854775807": 9223372036854775807,
            "'9223372036854775808'": 9223372036854775807,
            "'-9223372036854775808'": -9223372036854775808,
            "'-9223372036854775809'": -9223372036854775808,
            "'18446744073709551617'": 9223372036854775807, "'0000000000000000000000042'": 42,
            "' 8 apples'": 8, "'apples'": 0},
    "ull": {"4294967296": 4294967296, "'18446744073709551615'": 9223372036854775807, "-1": -1,
            "'-9223372036854775809'": -9223372036854775808},
    "b":   {"1": true, "' 1 yes'": true, "'01'": true, "'1a'": true, "0": false, "2": false,
            "-1": false, "19": false, "'true'": false, "''": false, "4294967297": false,
            "'18446744073709551617'": false},
    "j":   {"'5'": 5, "'\"x\"'": "x", "'null'": null, "'true'": true,
            "'[1,[2.5,{}]]'": [1,[2.5,{}]], "'[NaN,Infinity,-Infinity]'": [NaN,Infinity,-Infinity],
            "'/* c */ [1 // d\n]'": [1]},
    "jo":  {"'{\"k\":{\"l\":[]}}'": {"k":{"l":[]}}, "'[1]'": [1]},
    "ja":  {"'[\"\u00e9\",-1]'": ["\u00e9",-1], "'{}'": {}}})";

// In the first row after another column, and in later ones, which are decoded differently.
TEST_F(RowCallback, ReadsEachTypeInItsOwnWay)
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

TEST_F(RowCallback, StoresIntegersAsSigned)
{
    EXPECT_EQ(R"([{"i":7,"ll":7,"ui":7,"ull":7}])",
              rowsOf("select 7 as i, 7 as ui, 7 as ll, 7 as ull"));
    for (const Json::Value& jInteger : rows_[0]) EXPECT_EQ(Json::intValue, jInteger.type());
}

TEST_F(RowCallback, LeavesNullOutWhateverTheType)
{
    for (const std::string& strName : json(kMembers).getMemberNames())
        EXPECT_EQ("[{}]", rowsOf("select null as '" + strName + "'")) << strName;
    EXPECT_EQ(R"([{"i":1}])", rowsOf("select null as d, 1 as i, null as s"));
}

TEST_F(RowCallback, RefusesAValueOfAnyOtherType)
{
    const Json::Value jMembers = json(kMembers);
    for (const char* szName : {"u", "l", "ul", "f", "d", "uid", "t", "none", "case", "empty"}) {
        EXPECT_EQ("null", decoded({{{szName}, {"1"}}}));
        EXPECT_EQ(-1, iResult_);
        const std::string strWord = jMembers[szName]["cpptype"].asString();
        EXPECT_EQ(statementStopped(fieldFailed(error("type error, strType=" + strWord))),
                  takeLog());
    }
}

TEST_F(RowCallback, TakesTheLaterOfTwoColumnsOfTheSameName)
{
    EXPECT_EQ(R"([{"i":2}])", rowsOf("select 1 as i, 2 as i"));
    EXPECT_EQ(R"([{"i":1}])", rowsOf("select 1 as i, null as i"));
    EXPECT_EQ(R"([{"b":false}])", rowsOf("select 1 as b, 0 as b"));
    EXPECT_EQ(R"([{"jo":[]}])", rowsOf("select '{\"k\":1}' as jo, '[]' as jo"));
}

TEST_F(RowCallback, AppendsToWhatIsThere)
{
    EXPECT_EQ("null", rowsOf("select 1 as i where 0"));
    rows_ = json("[]");
    EXPECT_EQ(0, run("select 1 as i"));
    EXPECT_EQ(0, run("select 2 as i union all select 3; select 'a' as s; select 1 as i where 0"));
    EXPECT_EQ(R"([{"i":1},{"i":2},{"i":3},{"s":"a"}])", text(rows_));
    rows_ = json(R"(["x"])");
    EXPECT_EQ(0, run("select 1 as i"));
    EXPECT_EQ(R"(["x",{"i":1}])", text(rows_));
}

TEST_F(RowCallback, KeepsTheRowsBeforeAFailure)
{
    const std::string strBad = "select 1 as i; select 2 as i; no statement";
    using Case = std::pair<std::string, std::string>;
    for (const auto& [strSql, strFirst] :
         {Case{"select 1 as i; select 2 as i; select 3 as x; select 4 as i", kUndeclared},
          {strBad, runFailed("near \"no\": syntax error", strBad)},
          {"select 1 as i, null as d union all select 2, null union all select 3, 0.5", kOfADouble},
          {"select null as d, 1 as i union all select null, 2 union all select 1.5, 3",
           kOfADouble}}) {
        rows_ = Json::nullValue;
        EXPECT_EQ(-1, run(strSql));
        EXPECT_EQ(R"([{"i":1},{"i":2}])", text(rows_)) << strSql;
        EXPECT_EQ(strFirst, takeLog()[0]);
    }
}

TEST_F(RowCallback, AppendsTheRowsOfEveryAttempt)
{
    state().exec = execCalledLocked(2);
    EXPECT_EQ(R"([{"i":1},{"i":1},{"i":1}])", rowsOf("select 1 as i"));
}

TEST_F(RowCallback, KeepsAMemberWhoseTextIsNotJson)
{
    for (const char* szText : {"", "{", "[1,", "nul", "{\"a\" 1}", "x", "\x01"}) {
        rowsOf("select '" + std::string(szText) + "' as j, 1 as i");
        ASSERT_EQ(1U, rows_.size());
        EXPECT_TRUE(rows_[0].isMember("j")) << szText;
        EXPECT_EQ(1, rows_[0]["i"].asInt());
    }
}

TEST_F(RowCallback, MakesAMemberNullIfItIsNestedTooDeeply)
{
    for (std::size_t nLevels : {1000U, 1001U, 100000U}) {
        const std::string strNested = std::string(nLevels, '[') + std::string(nLevels, ']');
        EXPECT_EQ("[{\"i\":1,\"j\":" + (1000 < nLevels ? "null" : strNested) + "}]",
                  rowsOf("select '" + strNested + "' as j, 1 as i"));
        // The reader still works afterwards.
        EXPECT_EQ(R"([{"j":[1]}])", rowsOf("select '[1]' as j"));
    }
}

TEST_F(RowCallback, AppendsOnlyToAnArray)
{
    const std::string strStopped = runFailed("query aborted", "a text");
    state().exec = execOfRows({kRow});
    EXPECT_EQ(-1, table_.api.runSqlEx("a text", callback_, nullptr));
    EXPECT_EQ((Lines{failed("!pjRecArray"), strStopped}), takeLog());
    const std::string strNoArray =
        failed("pjRecArray->type() != Json::arrayValue && pjRecArray->type() != Json::nullValue");
    for (const char* szTarget : {"{}", R"({"a":1})", "5", R"("x")", "false", "0.5"}) {
        EXPECT_EQ(szTarget, decoded({kRow}, szTarget));
        EXPECT_EQ(-1, iResult_);
        EXPECT_EQ((Lines{strNoArray, strStopped}), takeLog());
    }
}

// The failed column is the last one.
TEST_F(RowCallback, ShowsTheFailedColumnUnlessItIsTheFirst)
{
    struct Case {
        Row row;
        Lines first;
    };
    const Lines noList = {failed("NULL == column_name || NULL == column_value")};
    const Lines noName = {failed("NULL == column_name[i]")};
    const Lines undeclared = fieldFailed(kUndeclared);
    const Lines ofADouble = fieldFailed(kOfADouble);
    for (const Case& row : {Case{{{"i"}, {}}, noList},
                            {{{}, {"1"}}, noList},
                            {{{nullptr}, {"7"}}, noName},
                            {{{"i", nullptr}, {"1", nullptr}}, noName},
                            {{{"i", nullptr}, {"1", "7"}}, noName},
                            {{{"x"}, {"1"}}, undeclared},
                            {{{"1+1"}, {"2"}}, undeclared},
                            {{{"x"}, {nullptr}}, undeclared},
                            {{{"S"}, {"a"}}, undeclared},
                            {{{"i", "x%s"}, {"1", "v%n"}}, undeclared},
                            {{{"i", "s", "x"}, {"1", "2", nullptr}}, undeclared},
                            {{{"d"}, {"2.5"}}, ofADouble},
                            {{{"i", "d"}, {"1", "2.5"}}, ofADouble}}) {
        const Lines lines = statementStopped(row.first, row.row);
        EXPECT_EQ("null", decoded({row.row}));
        EXPECT_EQ(-1, iResult_);
        EXPECT_EQ(lines, takeLog());
        EXPECT_EQ(R"([{"s":"7"},{"s":"7"},{"s":"7"}])", decoded({kRow, kRow, kRow, row.row, kRow}));
        EXPECT_EQ(lines, takeLog());
    }
}

// Two rows of one statement, as if SQLite went on after the first failed.
TEST_F(RowCallback, AsksForMissingTypesAtEveryRow)
{
    jTypes_ = Json::nullValue;
    state().exec = [](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                      char** errText) {
        for (Row row : {kRow, kRow}) EXPECT_EQ(-1, row.handTo(callback, arg));
        return End{SQLITE_ABORT, "query aborted"}.leaveIn(errText);
    };
    EXPECT_EQ("null", decoded(table_));
    Lines lines = undeclaredLines(kTypesAreNoObject, table_);
    const Lines ofOneRow(lines.begin(), lines.end() - 1);
    lines.insert(lines.begin(), ofOneRow.begin(), ofOneRow.end());
    EXPECT_EQ(lines, takeLogWithoutTypes());
}

// At positions that no row of the process has had before.
TEST_F(RowCallback, LooksUpANamelessColumnLikeAnyOther)
{
    for (std::size_t nOthers : {70U, 80U}) {
        const bool blDeclared = 80 == nOthers;
        if (blDeclared) jTypes_[""]["cpptype"] = "";
        Row row = {std::vector<const char*>(nOthers, "s"),
                   std::vector<const char*>(nOthers + 1, "x")};
        row.names.push_back("");
        EXPECT_EQ("null", decoded({row}));
        const std::string strFirst = blDeclared ? error("type error, strType=") : kUndeclared;
        EXPECT_EQ(statementStopped(fieldFailed(strFirst), row), takeLog());
    }
}

// The first to ask for a table's types is the decoder, which has no definition.
TEST_F(RowCallback, SpoilsTheTypesOfATableThatNobodyAskedForBefore)
{
    Table other(database_, R"({"s":{"cpptype":"string"}})", "s");
    state().exec = execOfRows({kRow});
    EXPECT_EQ("null", decoded(other));
    EXPECT_EQ(undeclaredLines(utilFailed("jTableDef.empty()"), other), takeLogWithoutTypes());
    EXPECT_TRUE(VORN_JSON_DB::recType(other.jDefinition, other.strName).isNull());
    EXPECT_EQ(utilFailed("jType[strJsonName].type() != Json::objectValue"), takeLog()[0]);
}

}  // namespace
