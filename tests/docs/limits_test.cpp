// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/limits.md, requests and records: each limit, and how to work around it.

#include "docs/limits_page.h"

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
    EXPECT_EQ("", ids(example(0)));
    std::vector<std::string> values = {"de", "fr"};
    EXPECT_EQ(0, api_.recDeleteByArray(values, "lang"));

    EXPECT_EQ("13", ids(example(1)));
    EXPECT_EQ(0, api_.runSqlEx("begin"));
    for (std::string& strValue : values) EXPECT_EQ(1, api_.recDeleteByName(strValue, "lang"));
    EXPECT_LE(0, api_.runSqlEx("commit"));
    EXPECT_EQ("2", ids());
}

TEST_F(Limits, SortByOrdersByAConstant)
{
    createThree(table_);
    EXPECT_EQ("123", ids(example(0)));
    EXPECT_EQ("321", ids(example(1)));
}

TEST_F(Limits, NumberConditionIsBareSql)
{
    createThree(table_);
    EXPECT_EQ("123", ids(example()));
    Json::Value jRequest = json(example());
    EXPECT_EQ(-1, api_.checkJsonType(jRequest));
    jRequest["id"] = 2;
    EXPECT_EQ(0, api_.checkJsonType(jRequest));
    EXPECT_EQ("2", ids(text(jRequest)));
}

TEST_F(Limits, MisspeltMemberIsIgnored)
{
    createThree(table_);
    EXPECT_EQ("123", ids(example()));
    EXPECT_EQ(-1, deleted(api_, example()));

    Json::Value& jDefinition = table_.jDefinition;
    std::string& strName = table_.strName;
    const auto unknownMember = [](const std::string& strKey) { return strKey; };
    const auto unknown = [&](const Json::Value& jRequest) -> std::string {
#include "limits/MisspeltMemberIsIgnored.inc"
        return "";
    };
    EXPECT_EQ("lagn", unknown(json(example())));
    EXPECT_EQ("", unknown(json(R"({"lang":"en"})")));

    EXPECT_EQ(3, deleted(api_, example(), true));
}

TEST_F(Limits, PercentBeforeOtherMembers)
{
    EXPECT_EQ(R"({"id":1,"lang":"50[\"a\"]","text":"x"})", created(api_, example(0)));
    EXPECT_EQ(Lines(), takeLog());
    // Six bytes become 4,096, and no width gives more.
    const std::size_t nBytes = json(example(1))["lang"].asString().size();
    EXPECT_EQ(nBytes / 6 * 4096, table_.create(example(1))["lang"].asString().size());
    EXPECT_EQ(4096U,
              table_.create(R"({"id":4,"lang":"%4097d","text":"x"})")["lang"].asString().size());
    EXPECT_EQ(text(json(example(2))), created(api_, example(2)));

    EXPECT_EQ(0, updated(api_, R"({"id":1})", R"({"lang":"50%s"})"));
    EXPECT_EQ(R"({"id":1,"lang":"50%s","text":"x"})", stored(1));
    EXPECT_EQ(0, updated(api_, R"({"lang":"50%s"})", R"({"id":1})"));
}

TEST_F(Limits, RecordNeedsItsLastMember)
{
    EXPECT_EQ("-1", saved(api_, example()));
    EXPECT_EQ("", ids());
    takeLog();
    Json::Value jRecord = json(example());
    jRecord["text"] = "";
    EXPECT_EQ(0, api_.recSave(jRecord, true));

    Table table(database_,
                R"({"a":{"cpptype":"int"},"z":{"cpptype":"string","cppDefaultValue":"last"}})",
                "a, z");
    Json::Value jShort = json(R"({"a":1})");
    EXPECT_EQ(0, table.api.fillDefaultValue(jShort, false));
    EXPECT_EQ(0, table.api.recSave(jShort, true));
    EXPECT_EQ(R"({"a":1,"z":"last"})", created(table.api, R"({"a":1})"));
}

TEST_F(Limits, ReplaceResetsMembersLeftOut)
{
    const std::string strOld = R"({"id":1,"lang":"de","tags":["a"],"text":"old"})";
    EXPECT_EQ(strOld, created(api_, strOld));
    EXPECT_EQ(R"({"id":1,"lang":"xx","text":"new"})", saved(api_, example(), false));

    EXPECT_EQ(strOld, saved(api_, strOld, false));
    Json::Value jWhole = json(stored(1));
    jWhole["text"] = "new";
    EXPECT_EQ(0, api_.recSave(jWhole, false));
    EXPECT_EQ(R"({"id":1,"lang":"de","tags":["a"],"text":"new"})", stored(1));

    EXPECT_EQ(0, updated(api_, R"({"id":1})", R"({"text":"newer"})"));
    EXPECT_EQ(R"({"id":1,"lang":"de","tags":["a"],"text":"newer"})", stored(1));
}

TEST_F(Limits, ArrayMemberIsNotUpdatedByFilter)
{
    table_.create(R"({"id":1,"tags":["a"],"text":"x"})");
    EXPECT_EQ(-1, updated(api_, R"({"id":1})", example()));
    Json::Value jValue = json(example());
    std::string strWhere = "id=1";
    EXPECT_EQ(-1, api_.recUpdateByWhere(jValue, strWhere));
    Json::Value jWhole = json(stored(1));
    EXPECT_EQ(R"(["a"])", text(jWhole["tags"]));

    jWhole["tags"] = jValue["tags"];
    EXPECT_EQ(0, api_.recSave(jWhole, false));
    EXPECT_EQ(R"({"id":1,"lang":"en","tags":["b"],"text":"x"})", stored(1));
}

TEST_F(Limits, MinusOneDoesNotMeanNotWritten)
{
    const struct {
        const char* szWord;
        const char* szColumns;
        const char* szTrigger;
    } cases[] = {
        {"int", "id integer primary key) without rowid --", ""},
        {"int", "id integer primary key, undeclared default 'x'", ""},
        {"int", "id integer primary key", "update $ set id = new.id + 10;"},
        {"int", "id integer primary key", "delete from $;"},
        {"double", "id real", ""},
    };
    for (const auto& row : cases) {
        SCOPED_TRACE(std::string(row.szWord) + " " + row.szColumns + " " + row.szTrigger);
        Table table(database_, std::string(R"({"id":{"cpptype":")") + row.szWord + R"("}})",
                    row.szColumns);
        if ('\0' != row.szTrigger[0])
            database_.run(replaced(
                std::string("create trigger g$ after insert on $ begin ") + row.szTrigger + " end",
                R"(\$)", table.strName));
        const bool blDeletes = 'd' == row.szTrigger[0];
        const std::string strCount = "select count(*) from " + table.strName;
        EXPECT_EQ("-1", saved(table.api, R"({"id":1})"));
        EXPECT_EQ(blDeletes ? "0" : "1", database_.value(strCount));

        EXPECT_LE(0, table.api.runSqlEx(example(0, "sql")));
        EXPECT_EQ("-1", saved(table.api, R"({"id":2})"));
        EXPECT_LE(0, table.api.runSqlEx("rollback"));
        EXPECT_EQ(blDeletes ? "0" : "1", database_.value(strCount));
        takeLog();
    }
}

TEST_F(Limits, OnConflictIgnoreHandsBackAnEarlierRow)
{
    const std::string strEarlier = R"({"id":3,"lang":"fr","tags":[],"text":"c"})";
    const std::string strSent = R"({"id":1,"text":"other"})";
    Table table(database_, strMembers_, example(0, "sql"));
    createThree(table);
    EXPECT_EQ(strEarlier, created(table.api, strSent));

    createThree(table_);
    database_.run("create trigger g" + table_.strName + " before insert on " + table_.strName +
                  " when new.text = 'other' begin select raise(ignore); end");
    EXPECT_EQ(strEarlier, created(api_, strSent));
    EXPECT_EQ("-1", created(api_, R"({"id":1,"text":"without the trigger"})"));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", api_.getErrMsg());
}

TEST_F(Limits, GetOneReadsEveryMatch)
{
    for (int i = 1; i <= 50; ++i) table_.create(R"({"id":)" + std::to_string(i) + R"(,"text":""})");
    int iRows = 0;
    const auto count = [](unsigned, void* pRows, void*, void*) {
        return ++*static_cast<int*>(pRows);
    };
    sqlite3_trace_v2(database_.get(), SQLITE_TRACE_ROW, count, &iRows);
    EXPECT_EQ(R"({"id":1,"lang":"en","tags":[],"text":""})", found(api_, example(0)));
    EXPECT_EQ(50, iRows);
    EXPECT_EQ(R"({"id":1,"lang":"en","tags":[],"text":""})", found(api_, example(1)));
    EXPECT_EQ(51, iRows);
}

TEST_F(Limits, DuplicateMessageStays)
{
    createThree(table_);
    const std::string strDuplicate = R"({"id":1,"text":"x"})";
    const std::string strBad = R"({"id":"one","text":"x"})";
    EXPECT_EQ("-1", created(api_, strDuplicate));
    table_.create(R"({"id":4,"text":"x"})");
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", api_.getErrMsg());

    EXPECT_EQ("-1", created(api_, strDuplicate));
    api_.setErrMsg("");
    EXPECT_EQ("-1", created(api_, strBad));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", api_.getErrMsg());

    VornJsonDbApi& task = api_;
#include "limits/DuplicateMessageStays.inc"
    EXPECT_EQ("-1", created(api_, strBad));
    EXPECT_EQ("", api_.getErrMsg());
}

TEST_F(Limits, LogLinesCarryWholeRecords)
{
    const auto logged = [] {
        std::string strLog;
        for (const std::string& strLine : takeLog()) strLog += strLine + "\n";
        return strLog;
    };
    Json::Value jRecord = table_.create(example());
    EXPECT_EQ("-1", created(api_, example()));
    EXPECT_NE(std::string::npos, logged().find("secret"));
    jRecord["text"] = "c2VjcmV0";  // as the host's cipher gives it
    EXPECT_EQ("-1", created(api_, text(jRecord)));
    EXPECT_EQ(std::string::npos, logged().find("secret"));

    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"double"}})", "a, b");
    std::string strForged = "x\nroot logged in";
    std::vector<std::string> values = {strForged};
    EXPECT_EQ(-1, api_.recDeleteByName(strForged, "none"));
    EXPECT_EQ(-1, api_.recDeleteByArray(values, strForged.c_str()));
    database_.run("insert into " + table.strName + " values (1, '" + strForged + "')");
    EXPECT_EQ("-1", listed(table.api));
    const std::string strLog = logged();
    for (const char* szHead : {"strValue=", "name=", "strVector=", "column_value[1]="})
        EXPECT_NE(std::string::npos, strLog.find(szHead + strForged)) << szHead;
}
