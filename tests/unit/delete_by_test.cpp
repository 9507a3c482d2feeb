// SPDX-License-Identifier: MIT
// Deleting by one value or a list of values of a text member.

#include "support/records.h"

namespace {

const std::string kNoKey = failed("!szKey || !szKey[0]");
const std::string kNoMember = failed("!jType.isMember(szKey)");
const std::string kNoTextMember = failed(R"(jType[szKey]["cpptype"].asString() != "string")");
const std::string kNotRun = failed("0 > (err = runSqlEx(strSqlRun))");
const std::string kNoDelete = failed("0 > (err = recDelete(jParam))");
const std::string kNoDeleteByArray = failed("0 > (err = recDeleteByArray(strVector, szKey))");

using Texts = std::vector<std::string>;

std::string arraySummary(const std::string& strKey, const std::string& strValues)
{
    return plain("recDeleteByArray failed, name=" + strKey + ", strVector=" + strValues);
}

std::string nameSummary(const std::string& strKey, const std::string& strValue)
{
    return plain("recDeleteByName failed, name=" + strKey + ", strValue=" + strValue);
}

class DeleteBy : public RecordsTest {
protected:
    int byArray(Texts texts, const char* szKey)
    {
        const Texts before = texts;
        const int iResult = table_.api.recDeleteByArray(texts, szKey);
        EXPECT_EQ(before, texts);
        return iResult;
    }

    int byName(std::string strValue, const char* szKey)
    {
        const std::string strBefore = strValue;
        const int iResult = table_.api.recDeleteByName(strValue, szKey);
        EXPECT_EQ(strBefore, strValue);
        return iResult;
    }

    std::string statement(const std::string& strItems) const
    {
        return "DELETE FROM " + table_.strName + "  WHERE  (name in (" + strItems + " ) );";
    }
};

TEST_F(DeleteBy, ComposesOneStatementAndCounts)
{
    const struct {
        Texts texts;
        const char* szItems;
        int iResult;
        const char* szContents;
    } cases[] = {
        {{"Bob"}, "'Bob'", 1, "1Ann1,3O'Brien1"},
        {{"O'Brien"}, "'O''Brien'", 1, "1Ann1,2Bob0"},
        {{"nobody"}, "'nobody'", 0, "1Ann1,2Bob0,3O'Brien1"},
        {{"bob"}, "'bob'", 0, "1Ann1,2Bob0,3O'Brien1"},
        {{""}, "''", 0, "1Ann1,2Bob0,3O'Brien1"},
        {{"%s%n"}, "'%s%n'", 0, "1Ann1,2Bob0,3O'Brien1"},
        // Kept: nothing stands between the items, so that two texts read as one.
        {{"Ann", "Bob"}, "'Ann''Bob'", 0, "1Ann1,2Bob0,3O'Brien1"},
        {{"O", "Brien"}, "'O''Brien'", 1, "1Ann1,2Bob0"},
        {{"Ann", "nobody"}, "'Ann''nobody'", 0, "1Ann1,2Bob0,3O'Brien1"},
    };
    for (const auto& row : cases) {
        database_.run("begin");
        EXPECT_EQ(row.iResult, byArray(row.texts, "name")) << row.szItems;
        EXPECT_EQ(Lines{statement(row.szItems)}, takeStatements());
        EXPECT_EQ(row.szContents, contents());
        database_.run("rollback");
        if (1 != row.texts.size() || row.texts[0].empty()) continue;

        database_.run("begin");
        EXPECT_EQ(row.iResult, byName(row.texts[0], "name")) << row.szItems;
        EXPECT_EQ(Lines{statement(row.szItems)}, takeStatements());
        EXPECT_EQ(row.szContents, contents());
        database_.run("rollback");
    }
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(DeleteBy, CountsEveryRowOfAValue)
{
    Table table(database_, R"({"k":{"cpptype":"string"}})", "k text");
    database_.run("insert into " + table.strName + " values ('a'),('a'),('b'),(''),(NULL)");
    Texts texts{"a"};
    EXPECT_EQ(2, table.api.recDeleteByArray(texts, "k"));
    EXPECT_EQ(0, table.api.recDeleteByArray(texts, "k"));
    texts = {""};
    EXPECT_EQ(1, table.api.recDeleteByArray(texts, "k"));
    EXPECT_EQ((Rows{{"b"}, {"NULL"}}), database_.rows("select k from " + table.strName));
}

TEST_F(DeleteBy, AValueEndsAtItsFirstNulByte)
{
    EXPECT_EQ(1, byName(std::string("Bob\0x", 5), "name"));
    EXPECT_EQ(Lines{statement("'Bob'")}, takeStatements());
    EXPECT_EQ("1Ann1,3O'Brien1", contents());
}

TEST_F(DeleteBy, TracesTheNumberOnce)
{
    blDebugOutput = true;
    EXPECT_EQ(1, byName("Bob", "name"));
    EXPECT_EQ(Lines{plain("delete rec number=1")}, takeLog());
    EXPECT_EQ(0, byArray({"Bob"}, "name"));
    EXPECT_EQ(Lines{plain("delete rec number=0")}, takeLog());
}

TEST_F(DeleteBy, RefusesAnEmptyListBeforeTheKeyIsLookedAt)
{
    const struct {
        const char* szKey;
        const char* szShown;
    } cases[] = {
        {"name", "name"}, {"id", "id"}, {"undeclared", "undeclared"}, {"", ""}, {nullptr, "(null)"},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, byArray({}, row.szKey)) << row.szShown;
        EXPECT_EQ((Lines{failed("0 >= strVector.size()"), arraySummary(row.szShown, "")}),
                  takeLog());
        EXPECT_EQ(-1, byName("", row.szKey)) << row.szShown;
        EXPECT_EQ((Lines{failed("strValue.empty()"), nameSummary(row.szShown, "")}), takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

TEST_F(DeleteBy, RefusesAKeyThatIsNoMember)
{
    const struct {
        const char* szKey;
        const char* szShown;
        const std::string& strLine;
    } cases[] = {
        {nullptr, "(null)", kNoKey},
        {"", "", kNoKey},
        {"undeclared", "undeclared", kNoMember},
        {"Name", "Name", kNoMember},
        {" name", " name", kNoMember},
        {"vornSqlWhereFilter", "vornSqlWhereFilter", kNoMember},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, byArray({"Ann", "Bob"}, row.szKey)) << row.szShown;
        EXPECT_EQ((Lines{row.strLine, arraySummary(row.szShown, "Ann,Bob")}), takeLog());
        EXPECT_EQ(-1, byName("Ann", row.szKey)) << row.szShown;
        // The one level alone: the list is not reached.
        EXPECT_EQ((Lines{row.strLine, nameSummary(row.szShown, "Ann")}), takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(DeleteBy, JoinsTheValuesOfTheSummaryByCommas)
{
    const struct {
        Texts texts;
        const char* szShown;
    } cases[] = {
        {{"a"}, "a"},       {{"a", "b", "c"}, "a,b,c"}, {{""}, ""},
        {{"", ""}, ","},    {{"a", "", "b"}, "a,,b"},   {{"a,b", "c d"}, "a,b,c d"},
        {{"%s%n"}, "%s%n"},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, byArray(row.texts, "undeclared"));
        EXPECT_EQ((Lines{kNoMember, arraySummary("undeclared", row.szShown)}), takeLog());
    }
    EXPECT_EQ(-1, byName("%s%n", "undeclared"));
    EXPECT_EQ((Lines{kNoMember, nameSummary("undeclared", "%s%n")}), takeLog());
}

TEST_F(DeleteBy, RefusesAKeyOfEveryOtherWord)
{
    Json::Value jMembers;
    std::string strColumns;
    for (const char* szWord :
         {"int", "unsigned int", "unsigned", "long", "unsigned long", "long long",
          "unsigned long long", "float", "double", "bool", "Json::Value", "Json::objectValue",
          "Json::arrayValue", "uid_t", "time_t", "String", "string ", "std::string", ""}) {
        const std::string strKey = "k" + std::to_string(jMembers.size());
        jMembers[strKey]["cpptype"] = szWord;
        strColumns += (strColumns.empty() ? "" : ",") + strKey;
    }
    Table table(database_, text(jMembers), strColumns);
    ASSERT_EQ(19U, jMembers.size());
    for (const std::string& strKey : jMembers.getMemberNames()) {
        Texts texts{"1", "2"};
        EXPECT_EQ(-1, table.api.recDeleteByArray(texts, strKey.c_str())) << strKey;
        EXPECT_EQ((Lines{kNoTextMember, arraySummary(strKey, "1,2")}), takeLog());
        std::string strValue = "1";
        EXPECT_EQ(-1, table.api.recDeleteByName(strValue, strKey.c_str())) << strKey;
        EXPECT_EQ((Lines{kNoTextMember, arraySummary(strKey, "1"), kNoDeleteByArray,
                         nameSummary(strKey, "1")}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(DeleteBy, AnEarlierErrorTextIsRepeatedByNoneOfTheChecks)
{
    makeStaleDuplicate();
    EXPECT_EQ(-1, byArray({}, "name"));
    EXPECT_EQ((Lines{failed("0 >= strVector.size()"), arraySummary("name", "")}), takeLog());
    EXPECT_EQ(-1, byName("1", "id"));
    EXPECT_EQ(
        (Lines{kNoTextMember, arraySummary("id", "1"), kNoDeleteByArray, nameSummary("id", "1")}),
        takeLog());
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(DeleteBy, LogsTheChainOfAllLevelsWhereTheTableIsGone)
{
    database_.run("drop table " + table_.strName);
    const std::string strError = "no such table: " + table_.strName;
    for (const bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        const std::string strOne = statement("'Bob'");
        EXPECT_EQ(-1, byName("Bob", "name"));
        EXPECT_EQ(
            (Lines{runFailed(strError, strOne), kNotRun, sqlError(strError, strOne), kNoDelete,
                   arraySummary("name", "Bob"), kNoDeleteByArray, nameSummary("name", "Bob")}),
            takeLog());
        const std::string strTwo = statement("'Ann''Bob'");
        EXPECT_EQ(-1, byArray({"Ann", "Bob"}, "name"));
        EXPECT_EQ((Lines{runFailed(strError, strTwo), kNotRun, sqlError(strError, strTwo),
                         kNoDelete, arraySummary("name", "Ann,Bob")}),
                  takeLog());
    }
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(DeleteBy, LogsTheChainOfAllLevelsWhereMemoryRunsOut)
{
    doubles::state().iFailMprintf = 1;
    EXPECT_EQ(-1, byName("Bob", "name"));
    EXPECT_EQ(
        (Lines{failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))"),
               failed("0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)"),
               failed("0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)"),
               kNoDelete, arraySummary("name", "Bob"), kNoDeleteByArray,
               nameSummary("name", "Bob")}),
        takeLog());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(DeleteBy, ANegativeCountIsAFailureAlthoughTheRowIsGone)
{
    doubles::state().changes = [] { return -7; };
    const std::string strSql = statement("'Bob'");
    EXPECT_EQ(-1, byName("Bob", "name"));
    EXPECT_EQ((Lines{runFailed("Unknow Error!!", strSql), kNotRun,
                     sqlError("Unknow Error!!", strSql), kNoDelete, arraySummary("name", "Bob"),
                     kNoDeleteByArray, nameSummary("name", "Bob")}),
              takeLog());
    EXPECT_EQ("1Ann1,3O'Brien1", contents());
}

TEST_F(DeleteBy, LooksUpTheMembersFirst)
{
    // A definition without the table: the look-up's own lines come before those of every check.
    std::string strOther = freshName();
    VornJsonDbApi api(database_.get(), strOther, table_.jDefinition, table_.strCreate);
    EXPECT_EQ(Lines(), takeLog());
    const auto takeLines = [] {
        Lines all = takeLog();
        // The types of every table so far.
        for (std::string& strLine : all)
            if (0 == strLine.compare(0, 14, "P util: jType=")) strLine.resize(14);
        return all;
    };
    const Lines diagnostics{utilPlain("strJsonName=" + strOther),
                            utilPlain("jTableDef=" + text(table_.jDefinition)),
                            utilPlain("jType=")};
    const auto expected = [&](const std::string& strFirst, const Lines& rest) {
        Lines all{utilFailed(strFirst)};
        all.insert(all.end(), diagnostics.begin(), diagnostics.end());
        all.insert(all.end(), rest.begin(), rest.end());
        return all;
    };
    Texts texts;
    EXPECT_EQ(-1, api.recDeleteByArray(texts, "name"));
    EXPECT_EQ(expected("!jTableDef.isMember(strJsonName)",
                       {failed("0 >= strVector.size()"), arraySummary("name", "")}),
              takeLines());
    const std::string strNull = "jType[strJsonName].type() != Json::objectValue";
    std::string strValue;
    EXPECT_EQ(-1, api.recDeleteByName(strValue, "name"));
    EXPECT_EQ(expected(strNull, {failed("strValue.empty()"), nameSummary("name", "")}),
              takeLines());
    strValue = "x";
    EXPECT_EQ(-1, api.recDeleteByName(strValue, "name"));
    EXPECT_EQ(expected(strNull, {kNoMember, nameSummary("name", "x")}), takeLines());
    texts = {"x"};
    EXPECT_EQ(-1, api.recDeleteByArray(texts, "name"));
    EXPECT_EQ(expected(strNull, {kNoMember, arraySummary("name", "x")}), takeLines());
}

class DeleteByLocked : public RecordsInFileTest {};

TEST_F(DeleteByLocked, LogsTheChainOfAllLevels)
{
    std::string strValue = "Bob";
    EXPECT_EQ(-1, table_.api.recDeleteByName(strValue, "name"));
    const std::string strSql = "DELETE FROM " + table_.strName + "  WHERE  (name in ('Bob' ) );";
    EXPECT_EQ((Lines{runFailed("database is locked", strSql, 500), kNotRun,
                     sqlError("database is locked", strSql), kNoDelete, arraySummary("name", "Bob"),
                     kNoDeleteByArray, nameSummary("name", "Bob")}),
              takeLog());
    expectEveryAttempt(strSql);
    other("commit");
    EXPECT_EQ(1, table_.api.recDeleteByName(strValue, "name"));
    EXPECT_EQ("1Ann1,3O'Brien1", contents());
}

}  // namespace
