// SPDX-License-Identifier: MIT
// docs/limits.md, requests and records: each limit, and its way around.

#include "support/limits.h"

#include <algorithm>

namespace {

void createThree(Table& table)
{
    table.create(R"({"id":1,"lang":"de","text":"a"})");
    table.create(R"({"id":2,"lang":"en","text":"b"})");
    table.create(R"({"id":3,"lang":"fr","text":"c"})");
}

}  // namespace

TEST_F(Limits, ListItemsGlueTogether)
{
    createThree(table_);
    takeStatements();
    EXPECT_EQ("", ids(jExample(0)));
    EXPECT_EQ(
        "SELECT id,lang,tags,text FROM " + table_.strName + "  WHERE  (lang in ('de''fr' ) );",
        takeStatements().at(0));
    std::vector<std::string> values = {"de", "fr"};
    EXPECT_EQ(0, table_.api.recDeleteByArray(values, "lang"));

    EXPECT_EQ("1,3", ids(jExample(1)));
    EXPECT_EQ(0, table_.api.runSqlEx("begin"));
    for (std::string& strValue : values)
        EXPECT_EQ(1, table_.api.recDeleteByName(strValue, "lang")) << strValue;
    EXPECT_LE(0, table_.api.runSqlEx("commit"));
    EXPECT_EQ("2", ids(Json::nullValue));
}

TEST_F(Limits, SortByOrdersByAConstant)
{
    createThree(table_);
    takeStatements();
    EXPECT_EQ("1,2,3", ids(jExample(0)));
    EXPECT_EQ("SELECT id,lang,tags,text FROM " + table_.strName + "  order by 'lang' DESC;",
              takeStatements().at(0));
    EXPECT_EQ("3,2,1", ids(jExample(1)));
}

TEST_F(Limits, NumberConditionIsBareSql)
{
    createThree(table_);
    EXPECT_EQ("1,2,3", ids(jExample()));
    Json::Value jRequest = jExample();
    EXPECT_EQ(-1, table_.api.checkJsonType(jRequest));
    jRequest["id"] = 2;
    EXPECT_EQ(0, table_.api.checkJsonType(jRequest));
    EXPECT_EQ("2", ids(jRequest));
}

TEST_F(Limits, MisspeltMemberIsIgnored)
{
    createThree(table_);
    Json::Value jMisspelt = jExample();
    EXPECT_EQ("1,2,3", ids(jMisspelt));
    EXPECT_EQ(-1, table_.api.recDelete(jMisspelt));

    Json::Value& jDefinition = table_.jDefinition;
    std::string& strName = table_.strName;
    const auto unknownMember = [](const std::string& strKey) { return strKey; };
    const auto unknown = [&](const Json::Value& jRequest) -> std::string {
#include "limits/MisspeltMemberIsIgnored.inc"
        return "";
    };
    EXPECT_EQ("lagn", unknown(jMisspelt));
    EXPECT_EQ("", unknown(json(R"({"lang":"en"})")));

    EXPECT_EQ(3, table_.api.recDelete(jMisspelt, true));
}

TEST_F(Limits, PercentBeforeOtherMembers)
{
    EXPECT_EQ(R"({"id":1,"lang":"50[\"a\"]","text":"x"})", text(table_.create(text(jExample(0)))));
    EXPECT_EQ(Lines(), takeLog());
    // Six bytes become 4,096, and nothing more does.
    const Json::Value jWide = jExample(1);
    const std::size_t nBytes = jWide["lang"].asString().size();
    EXPECT_EQ(nBytes / 6 * 4096, table_.create(text(jWide))["lang"].asString().size());
    EXPECT_EQ(4096U,
              table_.create(R"({"id":4,"lang":"%4097d","text":"x"})")["lang"].asString().size());
    EXPECT_EQ(text(jExample(2)), text(table_.create(text(jExample(2)))));

    Json::Value jFilter = json(R"({"id":1})");
    Json::Value jValue = json(R"({"lang":"50%s"})");
    EXPECT_EQ(0, table_.api.recUpdateByFilter(jFilter, jValue));
    EXPECT_EQ(R"({"id":1,"lang":"50%s","text":"x"})", stored(1));
    EXPECT_EQ(0, table_.api.recUpdateByFilter(jValue, jFilter));
}

TEST_F(Limits, RecordNeedsItsLastMember)
{
    Json::Value jRecord = jExample();
    EXPECT_EQ(-1, table_.api.recSave(jRecord, true));
    EXPECT_EQ("0", database_.value("select count(*) from " + table_.strName));
    takeLog();
    jRecord["text"] = "";
    EXPECT_EQ(0, table_.api.recSave(jRecord, true));

    Table table(database_,
                R"({"a":{"cpptype":"int"},"z":{"cpptype":"string","cppDefaultValue":"last"}})",
                "a, z");
    Json::Value jShort = json(R"({"a":1})");
    EXPECT_EQ(0, table.api.fillDefaultValue(jShort, false));
    EXPECT_EQ(0, table.api.recSave(jShort, true));
    EXPECT_EQ(R"({"a":1,"z":"last"})", text(table.create(R"({"a":1})")));
}

TEST_F(Limits, ReplaceResetsMembersLeftOut)
{
    table_.create(R"({"id":1,"lang":"de","tags":["a"],"text":"old"})");
    Json::Value jRecord = jExample();
    EXPECT_EQ(0, table_.api.recSave(jRecord, false));
    EXPECT_EQ(R"({"id":1,"lang":"xx","text":"new"})", text(jRecord));

    jRecord = json(R"({"id":1,"lang":"de","tags":["a"],"text":"old"})");
    EXPECT_EQ(0, table_.api.recSave(jRecord, false));
    Json::Value jRequest = json(R"({"id":1})");
    Json::Value jWhole;
    EXPECT_EQ(1, table_.api.recGetOne(jRequest, jWhole));
    jWhole["text"] = "new";
    EXPECT_EQ(0, table_.api.recSave(jWhole, false));
    EXPECT_EQ(R"({"id":1,"lang":"de","tags":["a"],"text":"new"})", stored(1));

    Json::Value jValue = json(R"({"text":"newer"})");
    EXPECT_EQ(0, table_.api.recUpdateByFilter(jRequest, jValue));
    EXPECT_EQ(R"({"id":1,"lang":"de","tags":["a"],"text":"newer"})", stored(1));
}

TEST_F(Limits, ArrayMemberIsNotUpdatedByFilter)
{
    table_.create(R"({"id":1,"tags":["a"],"text":"x"})");
    Json::Value jRequest = json(R"({"id":1})");
    Json::Value jValue = jExample();
    takeStatements();
    EXPECT_EQ(-1, table_.api.recUpdateByFilter(jRequest, jValue));
    EXPECT_EQ("UPDATE " + table_.strName + R"( SET tags in ('"b"' ) WHERE  (id=1 );)",
              takeStatements().at(0));
    std::string strWhere = "id=1";
    EXPECT_EQ(-1, table_.api.recUpdateByWhere(jValue, strWhere));
    EXPECT_EQ(R"(["a"])", column("tags"));

    Json::Value jWhole;
    EXPECT_EQ(1, table_.api.recGetOne(jRequest, jWhole));
    jWhole["tags"] = jValue["tags"];
    EXPECT_EQ(0, table_.api.recSave(jWhole, false));
    EXPECT_EQ(R"({"id":1,"lang":"en","tags":["b"],"text":"x"})", stored(1));
}

TEST_F(Limits, MinusOneDoesNotMeanNotWritten)
{
    struct Case {
        const char* szName;
        const char* szWord;
        const char* szColumns;
        const char* szTrigger;
    };
    const Case cases[] = {
        {"without rowid", "int", "id integer primary key) without rowid --", ""},
        {"undeclared column", "int", "id integer primary key, other text default 'x'", ""},
        {"moving trigger", "int", "id integer primary key",
         "create trigger %t after insert on % begin update % set id = new.id + 10; end"},
        {"unreadable word", "double", "id real", ""},
    };
    for (const Case& row : cases) {
        SCOPED_TRACE(row.szName);
        Table table(database_, std::string(R"({"id":{"cpptype":")") + row.szWord + R"("}})",
                    row.szColumns);
        std::string strTrigger = row.szTrigger;
        for (std::size_t i = 0; std::string::npos != (i = strTrigger.find('%', i));)
            strTrigger.replace(i, 1, table.strName);
        database_.run(strTrigger);
        const std::string strCount = "select count(*) from " + table.strName;

        Json::Value jRecord = json(R"({"id":1})");
        EXPECT_EQ(-1, table.api.recSave(jRecord, true));
        EXPECT_EQ("1", database_.value(strCount));

        database_.run("delete from " + table.strName);
        EXPECT_LE(0, table.api.runSqlEx(sqlExample()));
        EXPECT_EQ(-1, table.api.recSave(jRecord, true));
        EXPECT_LE(0, table.api.runSqlEx("rollback"));
        EXPECT_EQ("0", database_.value(strCount));
        takeLog();
    }
}

TEST_F(Limits, OnConflictIgnoreHandsBackAnEarlierRow)
{
    Table table(database_, text(table_.jDefinition[table_.strName]["member"]), sqlExample());
    createThree(table);
    Json::Value jSent = json(R"({"id":1,"text":"other"})");
    Json::Value jStored;
    EXPECT_EQ(0, table.api.recCreate(jSent, jStored));
    EXPECT_EQ(R"({"id":3,"lang":"fr","tags":[],"text":"c"})", text(jStored));
    EXPECT_NE(jSent["id"].asInt(), jStored["id"].asInt());

    createThree(table_);
    database_.run("create trigger g" + table_.strName + " before insert on " + table_.strName +
                  " when new.text = 'other' begin select raise(ignore); end");
    EXPECT_EQ(0, table_.api.recCreate(jSent, jStored));
    EXPECT_EQ(R"({"id":3,"lang":"fr","tags":[],"text":"c"})", text(jStored));

    jSent["text"] = "without the trigger";
    EXPECT_EQ(-1, table_.api.recCreate(jSent, jStored));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());
}

namespace {

int iRowsRead = 0;
doubles::RowCallback pCountedCallback = nullptr;

// Counts the rows that reach the library's callback.
int countingExec(sqlite3* pDb, const char* szSql, doubles::RowCallback callback, void* arg,
                 char** errText)
{
    iRowsRead = 0;
    pCountedCallback = callback;
    const auto count = [](void* pArg, int nColumns, char** values, char** names) {
        ++iRowsRead;
        return pCountedCallback(pArg, nColumns, values, names);
    };
    return doubles::realExec(pDb, szSql, count, arg, errText);
}

}  // namespace

TEST_F(Limits, GetOneReadsEveryMatch)
{
    for (int i = 1; i <= 50; ++i) table_.create(R"({"id":)" + std::to_string(i) + R"(,"text":""})");
    doubles::state().exec = countingExec;
    for (std::size_t n : {0U, 1U}) {
        Json::Value jRequest = jExample(n);
        Json::Value jRecord;
        EXPECT_EQ(1, table_.api.recGetOne(jRequest, jRecord));
        EXPECT_EQ(1, jRecord["id"].asInt());
        EXPECT_EQ(0 == n ? 50 : 1, iRowsRead) << n;
    }
}

TEST_F(Limits, DuplicateMessageStays)
{
    createThree(table_);
    Json::Value jDuplicate = json(R"({"id":1,"text":"x"})");
    Json::Value jFresh = json(R"({"id":4,"text":"x"})");
    Json::Value jBad = json(R"({"id":"one","text":"x"})");
    Json::Value jStored;
    EXPECT_EQ(-1, table_.api.recCreate(jDuplicate, jStored));
    EXPECT_EQ(0, table_.api.recCreate(jFresh, jStored));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());

    EXPECT_EQ(-1, table_.api.recCreate(jDuplicate, jStored));
    table_.api.setErrMsg("");
    EXPECT_EQ(-1, table_.api.recCreate(jBad, jStored));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());

    VornJsonDbApi& task = table_.api;
#include "limits/DuplicateMessageStays.inc"
    EXPECT_EQ(-1, table_.api.recCreate(jBad, jStored));
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(Limits, LogLinesCarryWholeRecords)
{
    Json::Value jRecord = jExample();
    Json::Value jStored;
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jStored));
    const auto logged = [&](const std::string& strText) {
        const Lines lines = takeLog();
        EXPECT_FALSE(lines.empty());
        return std::count_if(lines.begin(), lines.end(), [&](const std::string& strLine) {
            return std::string::npos != strLine.find(strText);
        });
    };
    EXPECT_EQ(-1, table_.api.recCreate(jRecord, jStored));
    EXPECT_LT(0, logged("secret"));

    jRecord["text"] = "c2VjcmV0";  // as the host's cipher gives it
    EXPECT_EQ(-1, table_.api.recCreate(jRecord, jStored));
    EXPECT_EQ(0, logged("secret"));

    std::string strForged = "x\nroot logged in";
    std::string strValue = "x";
    std::vector<std::string> values = {strForged};
    EXPECT_EQ(-1, table_.api.recDeleteByName(strForged, "none"));
    EXPECT_LT(0, logged("strValue=" + strForged));
    EXPECT_EQ(-1, table_.api.recDeleteByName(strValue, strForged.c_str()));
    EXPECT_LT(0, logged("name=" + strForged));
    EXPECT_EQ(-1, table_.api.recDeleteByArray(values, "none"));
    EXPECT_LT(0, logged(strForged));
    EXPECT_EQ(-1, table_.api.recDeleteByArray(values, strForged.c_str()));
    EXPECT_LT(0, logged("name=" + strForged));
    Table stored(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"double"}})", "a, b");
    database_.run("insert into " + stored.strName + " values (1, '" + strForged + "')");
    Json::Value jRequest;
    Json::Value jRecords;
    EXPECT_EQ(-1, stored.api.recList(jRequest, jRecords));
    EXPECT_LT(0, logged("column_value[1]=" + strForged));
}
