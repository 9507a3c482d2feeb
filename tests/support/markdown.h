// SPDX-License-Identifier: MIT
// The documentation as test data: sections, fenced blocks and tables of a Markdown page.
#pragma once

#include <string>
#include <vector>

struct MarkdownFence {
    std::string strLanguage;
    std::string strText;
};

struct MarkdownTable {
    std::vector<std::string> header;
    std::vector<std::vector<std::string>> rows;
};

// What stands between a heading and the next one.
struct MarkdownSection {
    std::string strHeading;
    std::string strText;  // everything, as it stands
    std::vector<MarkdownFence> fences;
    std::vector<MarkdownTable> tables;
};

using MarkdownPage = std::vector<MarkdownSection>;

// Reads a page of docs/. A cell is without its backquotes, with "|" for "\|". The test fails when
// there is no such page, or a row has not as many cells as its header.
MarkdownPage readPage(const std::string& strFile);

// The section of that heading; the test fails when there is none, or the page has two of them.
MarkdownSection section(const MarkdownPage& page, const std::string& strHeading);

// The only table of the section of that heading. The test fails when the number of its rows is
// not the one expected, so that a table that is not found is no success.
MarkdownTable table(const MarkdownPage& page, const std::string& strHeading, std::size_t nRows);

// The only block of that language in the section of that heading.
std::string fence(const MarkdownPage& page, const std::string& strHeading,
                  const std::string& strLanguage);
