// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/requests.md: every row of every table is run on the records of the page.

#include "docs/calls.h"
#include "support/markdown.h"

#include <set>

namespace {

constexpr char kHead[] = "SELECT due,id,lang,lent,meta,pages,tags,title FROM ";

class RequestsPage : public TableTest {
protected:
    // The statement of the only call that reached SQLite.
    std::string takeStatement()
    {
        const auto statements = takeStatements();
        EXPECT_GE(1U, statements.size());
        return statements.empty() ? "not run" : statements[0];
    }

    // The records of a cell with ids; "-1" and "throws" are results of the call.
    std::string expected(const std::string& strCell)
    {
        if ("-1" == strCell || "throws" == strCell) return strCell;
        Json::Value jExpected(Json::arrayValue);
        for (const std::string& strId : matches(strCell, "[0-9]+", {0}))
            jExpected.append(jRecords_[std::stoi(strId) - 1]);
        EXPECT_TRUE(!jExpected.empty() || "none" == strCell) << strCell;
        return text(jExpected);
    }

    int call(const std::string& strCall, const std::string& strRequest)
    {
        Json::Value jRequest = json(strRequest);
        Json::Value jRecord;
        if ("recGetOne" == strCall) return api_.recGetOne(jRequest, jRecord);
        if ("recUpdateByFilter" == strCall) return updated(api_, strRequest, R"({"lent":true})");
        EXPECT_EQ(0U, strCall.find("recDelete"));
        return deleted(api_, strRequest, "recDelete" != strCall);
    }

    const MarkdownPage page_ = readPage("requests.md");
    const std::vector<MarkdownBlock>& blocks_ = page_.blocks;
    Json::Value jDefinition_ = json(blocks_.at(0).strText);
    std::string strCreate_ = blocks_.at(1).strText;
    Json::Value jRecords_ = json(blocks_.at(2).strText);
    std::string strName_ = jDefinition_.getMemberNames().at(0);
    VornJsonDbApi api_{database_.get(), strName_, jDefinition_, strCreate_};
};

TEST_F(RequestsPage, ShowsWhatEachRequestDoes)
{
    ASSERT_EQ(3U, blocks_.size());
    for (Json::Value& jRecord : jRecords_) {
        EXPECT_NE("-1", created(api_, text(jRecord))) << text(jRecord);
        api_.fillDefaultValue(jRecord, false);
    }
    takeStatements();
    std::set<std::size_t> columns;
    for (const MarkdownTable& table : page_.tables) {
        columns.insert(table.header.size());
        for (const auto& row : table.rows) {
            SCOPED_TRACE(row[0] + " " + row[1]);
            const std::string& strResult = row.back();
            database_.run("begin");
            if (3 == row.size())
                EXPECT_EQ(expected(strResult), listed(api_, row[0]));
            else
                EXPECT_EQ(strResult, std::to_string(call(row[0], row[1])));
            const std::string strHead = 3 == row.size() && "not run" != row[1] ? kHead : "";
            EXPECT_EQ(strHead + row[row.size() - 2], takeStatement());
            EXPECT_EQ("-1" == strResult, !takeLog().empty());
            database_.run("rollback");
        }
    }
    EXPECT_EQ((std::set<std::size_t>{3, 4}), columns);
}

}  // namespace
