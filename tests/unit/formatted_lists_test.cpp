// SPDX-License-Identifier: MIT
// Percent signs in stored values: every later value of the same list formats the text again.

#include "support/database.h"

namespace {

class FormattedLists : public TableTest {
protected:
    std::string values(Table& table, const char* szRecord)
    {
        Json::Value jRecord = json(szRecord);
        std::string strSql = "(";
        EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ(Lines(), takeLog());
        return strSql;
    }

    Table integer_{database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"int"}})", "a,b"};
    Table text_{database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"string"}})", "a,b"};
    Table float_{database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"double"}})", "a,b"};
    Table json_{database_, R"({"a":{"cpptype":"Json::objectValue"},"b":{"cpptype":"int"}})", "a,b"};
    Table three_{database_,
                 R"({"a":{"cpptype":"string"},"b":{"cpptype":"int"},"c":{"cpptype":"string"}})",
                 "a,b,c"};
};

// Kept: the text is never escaped between the values.
TEST_F(FormattedLists, ReadAPercentSignAsAConversion)
{
    const struct {
        Table& table;
        const char* szRecord;
        const char* szText;
    } cases[] = {
        {integer_, R"({"a":"100%","b":5})", "('100) "},
        {integer_, R"({"a":"100%d","b":5})", "('1005',0) "},
        {integer_, R"({"a":"100%%","b":5})", "('100%',5) "},
        {integer_, R"({"a":"%s","b":5})", "('',0) "},
        {integer_, R"({"a":"%n","b":5})", "('',0) "},
        {integer_, R"({"a":"%z","b":5})", "('',0) "},
        {integer_, R"({"a":"%Q","b":5})", "('NULL',0) "},
        {integer_, R"({"a":"%c","b":39})", "(''',0) "},
        {integer_, R"({"a":"%c","b":0})", "(') "},
        {integer_, R"({"a":"a% b","b":5})", "('a) "},
        {integer_, R"({"a":"50% discount","b":5})", "('50 5iscount',0) "},
        {text_, R"({"a":"%s","b":"x"})", "('x',NULL) "},
        {text_, R"({"a":"%Q","b":"it's"})", "(''it''s'',NULL) "},
        {text_, R"({"a":"%z","b":"x"})", "('x',NULL) "},
        {text_, R"({"a":"%d","b":"x"})", "('0',NULL) "},
        {text_, R"({"a":"a","b":"100%"})", "('a','100%') "},
        {text_, R"({"a":"100%%","b":"%d"})", "('100%','%d') "},
        {float_, R"({"a":"%f","b":1.5})", "('1.500000',0.000000) "},
        {float_, R"({"a":"%g","b":1.5})", "('1.5',0.000000) "},
        {float_, R"({"a":"%d","b":1.5})", "('0',0.000000) "},
        {json_, R"({"a":{"k%d":1},"b":5})", R"(('{"k5":1}',0) )"},
        {json_, R"({"a":{"k":"%"},"b":5})", R"(('{"k":") )"},
        {three_, R"({"a":"100%%%%","b":5,"c":"x"})", "('100%',5,'x') "},
        {three_, R"({"a":"100%%","b":5,"c":"x"})", "('100) "},
        {three_, R"({"a":"%%d","b":5,"c":"x"})", "('0',5,NULL) "},
        {three_, R"({"a":"%%s","b":5,"c":"x"})", "('x',5,NULL) "},
        {three_, R"({"a":"%d","b":5,"c":"x%"})", "('5',0,'x%') "},
        {three_, R"({"a":"%","b":5,"c":"x"})", "(','x') "},
        {three_, R"({"a":"%s","c":"x"})", "('x',NULL) "},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szRecord);
        EXPECT_EQ(c.szText, values(c.table, c.szRecord));
    }
}

TEST_F(FormattedLists, ReadAPercentSignOfTheStatementToo)
{
    Json::Value jRecord = json(R"({"a":"x","b":5})");
    const struct {
        const char* szPrefix;
        const char* szText;
    } cases[] = {
        {"%%%%(", "%('x',5) "}, {"%%(", ") "},           {"%s(", "x(NULL,5) "},
        {"%k", ",5) "},         {"100%", "100NULL,0) "},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szPrefix);
        std::string strSql = c.szPrefix;
        EXPECT_EQ(0, integer_.api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ(c.szText, strSql);
    }
}

TEST_F(FormattedLists, StoreAPercentSignInTheLastMember)
{
    EXPECT_EQ(json(R"({"a":"x","b":"100%s%n%z%"})"), text_.create(R"({"a":"x","b":"100%s%n%z%"})"));
}

TEST_F(FormattedLists, EndTheSaveWhereTheTextIsCut)
{
    Json::Value jRecord = json(R"({"a":"100%","b":5})");
    const Json::Value jBefore = jRecord;
    EXPECT_EQ(-1, integer_.api.recSave(jRecord, true));
    EXPECT_EQ(jBefore, jRecord);
    const std::string strSql = "INSERT INTO " + integer_.strName +
                               " (a,b) VALUES ('100) ;select * from " + integer_.strName +
                               " where rowid == last_insert_rowid();";
    EXPECT_EQ(std::vector<std::string>{strSql}, takeStatements());
    EXPECT_EQ(plain("sql error, err=unrecognized token: \"'100) ;select * from " +
                    integer_.strName + " where rowid == last_insert_rowid();\", sql=" + strSql),
              takeLog().back());
    EXPECT_EQ(json(R"({"a":"x","b":1})"), integer_.create(R"({"a":"x","b":1})"));
}

}  // namespace
