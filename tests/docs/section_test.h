// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A test of a section takes its examples from the section of its page that names it.
#pragma once

#include "docs/calls.h"
#include "support/markdown.h"

#include <map>
#include <set>

// A page of docs/, read once.
inline const MarkdownPage& pageOf(const std::string& strFile)
{
    static std::map<std::string, MarkdownPage> pages;
    const auto [it, blNew] = pages.try_emplace(strFile);
    if (blNew) it->second = readPage(strFile);
    return it->second;
}

class SectionTest : public HostTest {
protected:
    // The page has a section that names the test, as `Suite.Name`.
    explicit SectionTest(const std::string& strFile) : section_(ownSection(pageOf(strFile))) {}

    // Every example of the section has been read; tests include the C++ at compile time.
    ~SectionTest() override
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

    const MarkdownSection& section() const { return section_; }

private:
    static const MarkdownSection& ownSection(const MarkdownPage& page)
    {
        const testing::TestInfo& test = *testing::UnitTest::GetInstance()->current_test_info();
        const std::string strTest =
            std::string("`") + test.test_suite_name() + "." + test.name() + "`";
        for (const MarkdownSection& section : page.sections)
            if (std::string::npos != section.strText.find(strTest)) return section;
        ADD_FAILURE() << "The page does not name " << strTest;
        return page.sections[0];
    }

    const MarkdownSection& section_;
    std::set<const MarkdownBlock*> read_;
};
