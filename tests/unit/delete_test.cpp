// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Deletes by a condition object, of everything, and by the values of a text member.

#include "support/record_calls.h"

namespace {

using Texts = std::vector<std::string>;

const std::string kNoTextMember = failed(R"(jType[szKey]["cpptype"].asString() != "string")");

class Delete : public RecordsTest {};

TEST_F(Delete, ComposesOneStatementAndCounts)
{
    const struct {
        const char* szRequest;
        const char* szTerms;
        int iResult;
        const char* szContents;
    } cases[] = {
        {R"({"id":1})", "id=1", 1, "2Bob0,3O'Brien1"},
        {R"({"id":9})", "id=9", 0, kBefore},
        {R"({"flag":true})", "flag=1", 2, "2Bob0"},
        {R"({"flag":true,"id":3})", "flag=1 and id=3", 1, "1Ann1,2Bob0"},
        {R"({"name":"O'Brien"})", "name='O''Brien'", 1, "1Ann1,2Bob0"},
        {R"({"name":["Bob"]})", "name in ('Bob' )", 1, "1Ann1,3O'Brien1"},
        {R"({"id":[1]})", "id in (1 )", 1, "2Bob0,3O'Brien1"},
        {R"({"name":["Ann","Bob"]})", "name in ('Ann''Bob' )", 0, kBefore},
        {R"({"data":{"k":1}})", R"(data='{"k":1}')", 1, "2Bob0,3O'Brien1"},
        {R"({"vornSqlWhereFilter":"id > 1"})", " id > 1 ", 2, "1Ann1"},
        {R"({"vornSqlWhereFilter":"1"})", " 1 ", 3, ""},
        // Kept: sorting and paging are ignored here.
        {R"({"flag":true,"limit":1,"offset":1,"sort_by":5})", "flag=1", 2, "2Bob0"},
        {R"({"id":2,"undeclared":1})", "id=2", 1, "1Ann1,3O'Brien1"},
    };
    // A condition counts whatever the flag says.
    for (const bool blDeleteAll : {false, true})
        for (const auto& row : cases)
            expectContents(remove(row.szRequest, blDeleteAll), row.iResult,
                           std::string("DELETE FROM $  WHERE  (") + row.szTerms + " );",
                           row.szContents);
}

TEST_F(Delete, DeletesEverythingOnlyWhenAllowed)
{
    for (const char* szRequest : {"{}", R"({"undeclared":1})", R"({"limit":1,"sort_by":"id"})"}) {
        expectFailure(remove(szRequest), {failed("strSql.empty()")});
        expectContents(remove(szRequest, true), 3, "DELETE FROM $ ;", "");
    }
    expectContents(removeAll(), 3, "DELETE FROM $ ;", "");
    database_.run("delete from " + table_.strName);
    expectContents(removeAll(), 0, "DELETE FROM $ ;", "");
}

TEST_F(Delete, FailsWhenTheRequestIsBad)
{
    for (const bool blDeleteAll : {false, true}) {
        for (const char* szRequest : {"null", R"("x")", R"("")", "[]", "[1]", R"([{"id":1}])", "5",
                                      "0", "1.5", "true", "false"})
            expectFailure(remove(szRequest, blDeleteAll),
                          {failed("jRecParam.type() != Json::objectValue")});
        for (const std::string strFilter : {"5", "null", "[]", "{}", "true"})
            expectFailure(remove(R"({"vornSqlWhereFilter":)" + strFilter + "}", blDeleteAll),
                          {kFilterIsNoText, kNoRequestConditions});
        for (const char* szRequest : {R"({"flag":"x"})", R"({"flag":[{}]})", R"({"name":{}})",
                                      R"({"id":{}})", R"({"id":[[]],"name":[{}]})"})
            expectThrow(remove(szRequest, blDeleteAll));
    }
}

TEST_F(Delete, FailsWhenMemoryRunsOut)
{
    prepare_ = [] { doubles::state().iFailMprintf = 1; };
    for (const bool blDeleteAll : {false, true})
        expectFailure(remove(R"({"name":"Ann"})", blDeleteAll),
                      kNoMemoryForText + Lines{kNoRequestConditions});
    for (const Words& call : {removeByArray({"Bob"}, "name"), removeByName("Bob", "name")})
        expectFailure(call, kNoMemoryForItem + Lines{kNoRequestConditions}, 0);
}

TEST_F(Delete, FailsWhenSqliteRefuses)
{
    const struct {
        const char* szRequest;
        const char* szTerms;
        const char* szError;
    } cases[] = {
        {R"({"tags":[]})", "", kNearParenthesis},
        {R"({"id":1,"tags":[]})", "id=1 and ", kNearParenthesis},
        {R"({"vornSqlWhereFilter":""})", "  ", kNearParenthesis},
        {R"({"id":null})", "id=", kNearParenthesis},
        {R"({"vornSqlWhereFilter":"absent"})", " absent ", "no such column: absent"},
    };
    for (const auto& row : cases)
        expectSqlFailure(remove(row.szRequest, true),
                         std::string("DELETE FROM $  WHERE  (") + row.szTerms + " );", row.szError);
    // This is the text of a duplicate, but a delete sets no message for the host.
    database_.run("create trigger keep before delete on " + table_.strName +
                  " when old.id = 3 begin select raise(abort, 'UNIQUE constraint failed'); end");
    expectSqlFailure(removeAll(), "DELETE FROM $ ;", "UNIQUE constraint failed");
}

class DeleteBy : public RecordsTest {};

TEST_F(DeleteBy, ComposesOneStatementAndCounts)
{
    const struct {
        Texts texts;
        const char* szItems;
        int iResult;
        const char* szContents;
    } cases[] = {
        {{"Bob"}, "'Bob'", 1, "1Ann1,3O'Brien1"},
        {{std::string("Bob\0x", 5)}, "'Bob'", 1, "1Ann1,3O'Brien1"},
        {{"O'Brien"}, "'O''Brien'", 1, "1Ann1,2Bob0"},
        {{"bob"}, "'bob'", 0, kBefore},
        {{""}, "''", 0, kBefore},
        {{"%s%n"}, "'%s%n'", 0, kBefore},
        // Kept: nothing separates the items, so that two texts read as one.
        {{"Ann", "Bob"}, "'Ann''Bob'", 0, kBefore},
        {{"O", "Brien"}, "'O''Brien'", 1, "1Ann1,2Bob0"},
    };
    for (const auto& row : cases) {
        const std::string strSql =
            std::string("DELETE FROM $  WHERE  (name in (") + row.szItems + " ) );";
        expectContents(removeByArray(row.texts, "name"), row.iResult, strSql, row.szContents);
        if (1 == row.texts.size() && !row.texts[0].empty())
            expectContents(removeByName(row.texts[0], "name"), row.iResult, strSql, row.szContents);
    }
    Table table(database_, R"({"k":{"cpptype":"string"}})", "k text");
    database_.run("insert into " + table.strName + " values ('a'),('a'),('b'),(''),(NULL)");
    pTable_ = &table;
    expectContents(removeByArray({"a"}, "k"), 2, kAnySql, "b,,NULL");
    expectContents(removeByName("a", "k"), 2, kAnySql, "b,,NULL");
    expectContents(removeByArray({""}, "k"), 1, kAnySql, "a,a,b,NULL");
}

TEST_F(DeleteBy, RefusesAnEmptyListBeforeTheKey)
{
    for (const char* szKey : {"name", "id", "undeclared", "", static_cast<const char*>(nullptr)}) {
        expectFailure(removeByArray({}, szKey), {failed("0 >= strVector.size()")});
        expectFailure(removeByName("", szKey), {failed("strValue.empty()")});
    }
}

// recDeleteByName fails before it reaches the list.
TEST_F(DeleteBy, RefusesAKeyThatIsNotAMember)
{
    for (const char* szKey : {static_cast<const char*>(nullptr), "", "undeclared", "Name", " name",
                              "vornSqlWhereFilter"}) {
        const Lines causes = {failed(nullptr == szKey || !szKey[0] ? "!szKey || !szKey[0]"
                                                                   : "!jType.isMember(szKey)")};
        expectFailure(removeByName("%s%n", szKey), causes);
        for (const Texts& texts : {Texts{"a"},
                                   {"a", "b", "c"},
                                   {""},
                                   {"", ""},
                                   {"a", "", "b"},
                                   {"a,b", "c d"},
                                   {"%s%n"}})
            expectFailure(removeByArray(texts, szKey), causes);
    }
}

TEST_F(DeleteBy, RefusesAKeyOfAnyOtherWord)
{
    Json::Value jMembers;
    for (const char* szWord :
         {"int", "unsigned int", "unsigned", "long", "unsigned long", "long long",
          "unsigned long long", "float", "double", "bool", "Json::Value", "Json::objectValue",
          "Json::arrayValue", "uid_t", "time_t", "String", "string ", "std::string", ""})
        jMembers["k" + std::to_string(jMembers.size())]["cpptype"] = szWord;
    Table table(database_, text(jMembers), "k0");
    pTable_ = &table;
    for (const std::string& strKey : jMembers.getMemberNames()) {
        expectFailure(removeByArray({"1", "2"}, strKey.c_str()), {kNoTextMember});
        expectFailure(removeByName("1", strKey.c_str()), {kNoTextMember}, 1);
    }
}

// The log lines of looking up missing types come before those of any check.
TEST_F(DeleteBy, LooksUpTheMembersFirst)
{
    VORN_JSON_DB::recType(table_.jDefinition, table_.strName) = json("[1]");
    Texts none;
    std::string strEmpty;
    for (const bool blByName : {false, true}) {
        EXPECT_EQ(-1, blByName ? table_.api.recDeleteByName(strEmpty, "name")
                               : table_.api.recDeleteByArray(none, "name"));
        Lines lines = takeLog();
        ASSERT_EQ(6U, lines.size());
        EXPECT_EQ(utilFailed("jType[strJsonName].type() != Json::objectValue"), lines[0]);
        EXPECT_EQ(failed(blByName ? "strValue.empty()" : "0 >= strVector.size()"), lines[4]);
    }
}

}  // namespace
