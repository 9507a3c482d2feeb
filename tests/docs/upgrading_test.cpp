// SPDX-License-Identifier: MIT
// docs/upgrading.md: rows in every JSON layout that the page shows are read back as the same
// record.

#include "support/database.h"
#include "support/markdown.h"

namespace {

class DocsUpgrading : public TableTest {
protected:
    DocsUpgrading()
    {
        for (const MarkdownFence& block : section(page_, "Rows in any JSON layout").fences)
            blocks_.push_back(block.strText);
        // The layouts, and two requests.
        EXPECT_EQ(6U, blocks_.size());
        blocks_.resize(6);
        jValue_ = json(blocks_[0]);
        for (int i = 0; i < kLayouts; ++i) insert(i, blocks_[static_cast<std::size_t>(i)]);
    }

    // A row as another program would write it.
    void insert(int iId, const std::string& strText)
    {
        char* szSql = sqlite3_mprintf("insert into %s values (%d,%Q)", table_.strName.c_str(), iId,
                                      strText.c_str());
        database_.run(szSql);
        sqlite3_free(szSql);
    }

    std::string stored(int iId)
    {
        return database_.value("select data from " + table_.strName +
                               " where id=" + std::to_string(iId));
    }

    Json::Value records(Json::Value jRequest)
    {
        Json::Value jRecords(Json::arrayValue);
        EXPECT_EQ(0, table_.api.recList(jRequest, jRecords));
        EXPECT_EQ(Lines(), takeLog());
        return jRecords;
    }

    static constexpr int kLayouts = 4;
    MarkdownPage page_ = readPage("upgrading.md");
    std::vector<std::string> blocks_;
    Json::Value jValue_;
    Table table_{database_, R"({"data":{"cpptype":"Json::objectValue"},"id":{"cpptype":"int"}})",
                 "id integer primary key, data text"};
};

TEST_F(DocsUpgrading, ReadsEveryLayout)
{
    const Json::Value jRecords = records(Json::nullValue);
    ASSERT_EQ(Json::ArrayIndex{kLayouts}, jRecords.size());
    for (const Json::Value& jRecord : jRecords) {
        EXPECT_EQ(jValue_, jRecord["data"]) << stored(jRecord["id"].asInt());
        EXPECT_EQ(text(jValue_), text(jRecord["data"]));
    }
}

TEST_F(DocsUpgrading, ReadsLinesThatEndInCrLf)
{
    for (int i = 0; i < kLayouts; ++i) {
        std::string strText;
        for (char c : blocks_[static_cast<std::size_t>(i)])
            strText += '\n' == c ? "\r\n" : std::string(1, c);
        insert(10 + i, strText);
        EXPECT_EQ(jValue_, records(json(R"({"id":)" + std::to_string(10 + i) + "}"))[0]["data"])
            << strText;
    }
}

// What the page calls layouts are different texts, with the features that it names.
TEST_F(DocsUpgrading, ShowsLayoutsThatDiffer)
{
    for (int i = 0; i < kLayouts; ++i) {
        EXPECT_EQ(blocks_[static_cast<std::size_t>(i)], stored(i));
        EXPECT_EQ('\n', stored(i).back());
        for (int j = 0; j < i; ++j) EXPECT_NE(stored(j), stored(i));
    }
    EXPECT_NE(std::string::npos, stored(1).find("\n    "));
    EXPECT_NE(std::string::npos, stored(2).find("\\ud83d\\ude00"));
    EXPECT_NE(std::string::npos, stored(3).find("//"));
    EXPECT_NE(std::string::npos, stored(3).find("/*"));
}

TEST_F(DocsUpgrading, ReadingKeepsTheLayoutAndSavingWritesOurs)
{
    Json::Value jRecords = records(Json::nullValue);
    EXPECT_EQ(blocks_[1], stored(1));
    for (Json::Value& jRecord : jRecords) {
        EXPECT_EQ(0, table_.api.recSave(jRecord, false));
        EXPECT_EQ(jValue_, jRecord["data"]);
    }
    for (int i = 0; i < kLayouts; ++i) EXPECT_EQ(stored(0), stored(i));
    EXPECT_EQ(Json::ArrayIndex{kLayouts}, records(json(blocks_[4])).size());
}

TEST_F(DocsUpgrading, EqualityComparesTheText)
{
    EXPECT_EQ(0U, records(json(blocks_[4])).size());
}

TEST_F(DocsUpgrading, JsonFunctionsFindAllButComments)
{
    const Json::Value jRecords = records(json(blocks_[5]));
    ASSERT_EQ(3U, jRecords.size());
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(i, jRecords[static_cast<Json::ArrayIndex>(i)]["id"].asInt());
}

}  // namespace
