// SPDX-License-Identifier: MIT
// docs/limits.md: a test takes its examples from the section that names it.
#pragma once

#include "docs/calls.h"
#include "support/markdown.h"

#include <set>

inline const MarkdownPage& limitsPage()
{
    static const MarkdownPage page = readPage("limits.md");
    return page;
}

class Limits : public HostTest {
protected:
    // Every example of the section has been read; tests include the C++ at compile time.
    ~Limits() override
    {
        takeLog();
        for (const MarkdownBlock& block : section_.blocks)
            EXPECT_TRUE("cpp" == block.strLanguage || 0 != read_.count(&block)) << block.strText;
    }

    // The n-th block of the language.
    std::string example(std::size_t n = 0, const std::string& strLanguage = "json")
    {
        for (const MarkdownBlock& block : section_.blocks) {
            if (block.strLanguage != strLanguage || 0 != n--) continue;
            read_.insert(&block);
            return block.strText;
        }
        ADD_FAILURE() << "The section has no such block of " << strLanguage;
        return "null";
    }

    // The ids of the records that recList gives, like "123".
    std::string ids(const std::string& strRequest = "null")
    {
        const std::string strRecords = listed(api_, strRequest);
        if ("-1" == strRecords) return strRecords;
        std::string strIds;
        for (const std::string& strId : matches(strRecords, "\"id\":([0-9]+)")) strIds += strId;
        return strIds;
    }

    std::string stored(int iId) { return found(api_, R"({"id":)" + std::to_string(iId) + "}"); }

private:
    static const MarkdownSection& ownSection()
    {
        const std::string strTest = std::string("`Limits.") +
                                    testing::UnitTest::GetInstance()->current_test_info()->name() +
                                    "`";
        for (const MarkdownSection& section : limitsPage().sections)
            if (std::string::npos != section.strText.find(strTest)) return section;
        ADD_FAILURE() << "limits.md does not name " << strTest;
        return limitsPage().sections[0];
    }

    const MarkdownSection& section_ = ownSection();
    std::set<const MarkdownBlock*> read_;

protected:
    // The table that the page begins with, in a file, so that a second connection can be opened.
    Database database_{Database::Place::kFile};
    const std::string strMembers_ = limitsPage().blocks.at(0).strText;
    Table table_{database_, strMembers_, limitsPage().blocks.at(1).strText};
    VornJsonDbApi& api_ = table_.api;
};
