// SPDX-License-Identifier: MIT
// docs/requests.md: every row of every table is run on the records that the page shows.

#include "support/database.h"
#include "support/markdown.h"

namespace {

class DocsRequests : public TableTest {
protected:
    DocsRequests()
    {
        Json::Value jDefinition = json(fence(page_, "The sample table", "json"));
        strName_ = jDefinition.getMemberNames().at(0);
        strCreate_ = fence(page_, "The sample table", "sql");
        pApi_ = std::make_unique<VornJsonDbApi>(database_.get(), strName_, jDefinition, strCreate_);
        for (Json::Value& jRecord : jRecords_) {
            Json::Value jStored;
            EXPECT_EQ(0, pApi_->recCreate(jRecord, jStored)) << text(jRecord);
        }
        EXPECT_EQ(Lines(), takeLog());
        takeStatements();
    }

    ~DocsRequests() override { takeLog(); }

    // The statement of the only call that reached SQLite, without its head.
    std::string takeStatement(const std::string& strHead)
    {
        const auto statements = takeStatements();
        if (statements.empty()) return "not run";
        EXPECT_EQ(1U, statements.size());
        EXPECT_EQ(strHead, statements[0].substr(0, strHead.size()));
        return statements[0].substr(strHead.size());
    }

    // What the column "Selected" says of a request.
    std::string selected(Json::Value jRequest)
    {
        Json::Value jRecords;
        try {
            if (-1 == pApi_->recList(jRequest, jRecords)) return "-1";
        } catch (const Json::LogicError&) {
            return "throws";
        }
        std::string strIds;
        for (const Json::Value& jRecord : jRecords) {
            EXPECT_EQ(text(jStored(jRecord["id"].asUInt())), text(jRecord));
            strIds.append(strIds.empty() ? "" : ", ").append(jRecord["id"].asString());
        }
        return strIds.empty() ? "none" : strIds;
    }

    void check(const std::string& strHeading, std::size_t nRows)
    {
        const MarkdownTable examples = table(page_, strHeading, nRows);
        EXPECT_EQ((std::vector<std::string>{"Request", "SQL after `FROM`", "Selected"}),
                  examples.header);
        for (const auto& row : examples.rows) {
            SCOPED_TRACE(row[0]);
            EXPECT_EQ(row[2], selected(json(row[0])));
            EXPECT_EQ(row[1], takeStatement("SELECT due,id,lang,lent,meta,pages,tags,title FROM "));
            EXPECT_EQ("-1" == row[2], !takeLog().empty());
        }
    }

    // The record of the page, completed by its defaults.
    Json::Value jStored(Json::ArrayIndex iId)
    {
        Json::Value jRecord = jRecords_[iId - 1];
        pApi_->fillDefaultValue(jRecord, false);
        return jRecord;
    }

    // Runs one row of "Other calls" and takes it back; the result.
    int call(const std::string& strCall, Json::Value jRequest)
    {
        Json::Value jValue = json(R"({"lent":true})");
        Json::Value jRecord;
        if ("recGetOne" == strCall) return pApi_->recGetOne(jRequest, jRecord);
        if ("recDelete" == strCall) return pApi_->recDelete(jRequest);
        if ("recDelete, all" == strCall) return pApi_->recDelete(jRequest, true);
        if ("recUpdateByFilter" == strCall) return pApi_->recUpdateByFilter(jRequest, jValue);
        ADD_FAILURE() << "unknown call " << strCall;
        return -2;
    }

    MarkdownPage page_ = readPage("requests.md");
    Json::Value jRecords_ = json(fence(page_, "The sample records", "json"));
    std::string strName_;
    std::string strCreate_;
    std::unique_ptr<VornJsonDbApi> pApi_;
};

TEST_F(DocsRequests, ThePageHasItsSampleTable)
{
    EXPECT_EQ("book", strName_);
    EXPECT_EQ(6U, jRecords_.size());
    EXPECT_EQ("6", database_.value("select count(*) from book"));
}

TEST_F(DocsRequests, EveryRecord)
{
    check("Every record", 2);
}

TEST_F(DocsRequests, AMemberEqualsAValue)
{
    check("A member equals a value", 9);
}

TEST_F(DocsRequests, AListOfOneItem)
{
    check("A list of one item", 6);
}

TEST_F(DocsRequests, SeveralMembers)
{
    check("Several members", 4);
}

TEST_F(DocsRequests, TheRawFilter)
{
    check("The raw filter", 15);
}

TEST_F(DocsRequests, TheRawFilterWithATextFromOutside)
{
    char* szFilter = sqlite3_mprintf("title like %Q", "Gulliver's%");
    Json::Value jRequest;
    jRequest["vornSqlWhereFilter"] = szFilter;
    sqlite3_free(szFilter);
    EXPECT_EQ("3", selected(jRequest));
}

TEST_F(DocsRequests, InsideJsonMembers)
{
    check("Inside JSON members", 5);
}

TEST_F(DocsRequests, Paging)
{
    check("Paging", 6);
}

TEST_F(DocsRequests, Sorting)
{
    check("Sorting", 9);
}

TEST_F(DocsRequests, WhatDoesNotDoWhatItSeemsToSay)
{
    check("Requests that do not do what they seem to say", 14);
}

TEST_F(DocsRequests, OtherCalls)
{
    for (const auto& row : table(page_, "Other calls", 11).rows) {
        SCOPED_TRACE(row[0] + " " + row[1]);
        database_.run("begin");
        EXPECT_EQ(row[3], std::to_string(call(row[0], json(row[1]))));
        EXPECT_EQ(row[2], takeStatement(""));
        EXPECT_EQ("-1" == row[3], !takeLog().empty());
        database_.run("rollback");
    }
}

TEST_F(DocsRequests, AnUpdateChangesWhatItsFilterSelects)
{
    database_.run("begin");
    EXPECT_EQ(0, call("recUpdateByFilter", json(R"({"vornSqlWhereFilter":"due is null"})")));
    EXPECT_EQ("6", database_.value("select count(*) from book where lent = 1"));
    database_.run("rollback");
}

// A table that the tests above do not know would be run by nobody.
TEST_F(DocsRequests, ThePageHasNoOtherTable)
{
    std::size_t nTables = 0;
    for (const MarkdownSection& candidate : page_) nTables += candidate.tables.size();
    EXPECT_EQ(10U, nTables);
}
}  // namespace
