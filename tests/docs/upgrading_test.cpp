// SPDX-License-Identifier: MIT
// docs/upgrading.md: rows in every JSON layout of the page are read back as the same record.

#include "docs/calls.h"
#include "support/markdown.h"

#include <set>

namespace {

class UpgradingPage : public TableTest {
protected:
    UpgradingPage()
    {
        // The layouts, of which the first is the library's, and two requests.
        for (const MarkdownBlock& block : readPage("upgrading.md").blocks)
            layouts_.push_back(block.strText);
        EXPECT_LT(4U, layouts_.size());
        strByText_ = layouts_.at(layouts_.size() - 2);
        strByValue_ = layouts_.back();
        layouts_.resize(layouts_.size() - 2);
        for (const std::string& strLayout : layouts_) insert(strLayout);
    }

    // As another program would write the row.
    void insert(const std::string& strText)
    {
        database_.run("insert into " + table_.strName + " (data) values ('" + strText + "')");
    }

    // The ids of the rows that a request selects; each is the same record.
    std::string selected(const std::string& strRequest = "null")
    {
        std::string strIds;
        for (const Json::Value& jRecord : json(listed(table_.api, strRequest))) {
            EXPECT_EQ(text(json(layouts_[0])), text(jRecord["data"]));
            strIds += jRecord["id"].asString();
        }
        EXPECT_EQ(Lines(), takeLog());
        return strIds;
    }

    Rows rows() { return database_.rows("select data from " + table_.strName + " order by id"); }

    std::vector<std::string> layouts_;
    std::string strByText_;
    std::string strByValue_;
    Table table_{database_, R"({"data":{"cpptype":"Json::objectValue"},"id":{"cpptype":"int"}})",
                 "id integer primary key, data text"};
};

TEST_F(UpgradingPage, ShowsOnlyLayoutsThatCanBeRead)
{
    EXPECT_EQ("1234", selected());
    Rows expected;
    for (const std::string& strLayout : layouts_) expected.push_back({strLayout});
    EXPECT_EQ(expected, rows());
    EXPECT_EQ(4U, std::set<std::string>(layouts_.begin(), layouts_.end()).size());

    for (const std::string& strLayout : layouts_) insert(replaced(strLayout, "\n", "\r\n"));
    EXPECT_EQ("12345678", selected());
}

TEST_F(UpgradingPage, ShowsHowRowsAreFoundAndSaved)
{
    EXPECT_EQ("", selected(strByText_));
    EXPECT_EQ("123", selected(strByValue_));  // not the one with comments
    EXPECT_NE(std::string::npos, layouts_[3].find("//"));
    for (const Json::Value& jRecord : json(listed(table_.api)))
        EXPECT_EQ(text(jRecord), saved(table_.api, text(jRecord), false));
    EXPECT_EQ(Rows(4, rows().at(0)), rows());
    EXPECT_EQ("1234", selected(strByText_));
}

}  // namespace
