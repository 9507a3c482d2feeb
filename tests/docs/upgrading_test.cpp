// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/upgrading.md: rows in every JSON layout of the page are read back as the same record.

#include "docs/calls.h"
#include "support/markdown.h"

#include <set>

namespace {

using UpgradingPage = TableTest;

TEST_F(UpgradingPage, ShowsLayoutsThatAreReadFoundAndSaved)
{
    // The layouts, of which the first is the library's, and two requests.
    const auto blocks = readPage("upgrading.md").blocks;
    ASSERT_EQ(6U, blocks.size());
    const std::string& strByText = blocks[4].strText;
    const std::string& strByValue = blocks[5].strText;
    Table table(database_, R"({"data":{"cpptype":"Json::objectValue"},"id":{"cpptype":"int"}})",
                "id integer primary key, data text");
    const std::string strSelect = "select data from " + table.strName + " order by id";
    // The ids of the rows that a request selects; each is the same record.
    const auto selected = [&](const std::string& strRequest = "null") {
        std::string strIds;
        for (const Json::Value& jRecord : json(listed(table.api, strRequest))) {
            EXPECT_EQ(text(json(blocks[0].strText)), text(jRecord["data"]));
            strIds += jRecord["id"].asString();
        }
        EXPECT_EQ(Lines(), takeLog());
        return strIds;
    };

    // As another program would write the rows.
    Rows layouts;
    for (const char* szLineEnd : {"\n", "\r\n"})
        for (std::size_t i = 0; i < 4; ++i) {
            layouts.push_back({replaced(blocks[i].strText, "\n", szLineEnd)});
            database_.run("insert into " + table.strName + " (data) values ('" + layouts.back()[0] +
                          "')");
        }
    EXPECT_EQ(8U, (std::set<Rows::value_type>(layouts.begin(), layouts.end()).size()));
    EXPECT_EQ("12345678", selected());
    EXPECT_EQ(layouts, database_.rows(strSelect));
    EXPECT_EQ("", selected(strByText));
    EXPECT_EQ("123567", selected(strByValue));  // not those with comments
    EXPECT_NE(std::string::npos, blocks[3].strText.find("//"));

    for (const Json::Value& jRecord : json(listed(table.api)))
        EXPECT_EQ(text(jRecord), saved(table.api, text(jRecord), false));
    EXPECT_EQ(Rows(8, database_.rows(strSelect).at(0)), database_.rows(strSelect));
    EXPECT_EQ("12345678", selected(strByText));
}

}  // namespace
