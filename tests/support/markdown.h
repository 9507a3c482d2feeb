// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The documentation as test data: texts of the project, and the sections, blocks of code and tables
// of a Markdown page.
#pragma once

#include <string>
#include <vector>

// A file of the project, and all files below one of its folders. The test fails if there is none.
std::string fileText(const std::string& strFile);
std::string folderText(const std::string& strFolder);

// The given groups of every match of a pattern, and the text with every match replaced.
std::vector<std::string> matches(const std::string& strText, const std::string& strPattern,
                                 const std::vector<int>& groups = {1});
std::string replaced(const std::string& strText, const std::string& strPattern,
                     const std::string& strBy);

struct MarkdownBlock {
    std::string strLanguage;
    std::string strText;
};

// Cells come without their backquotes, and with "|" for "\|".
struct MarkdownTable {
    std::vector<std::string> header;
    std::vector<std::vector<std::string>> rows;
};

// A heading and what follows it, up to the next heading.
struct MarkdownSection {
    std::string strHeading;
    std::string strText;
    std::vector<MarkdownBlock> blocks;
    std::vector<MarkdownTable> tables;
};

// All sections, blocks and tables, each in the order of the page.
struct MarkdownPage {
    std::vector<MarkdownSection> sections;
    std::vector<MarkdownBlock> blocks;
    std::vector<MarkdownTable> tables;
};

// Reads a page of docs/. The test fails when a row has more or fewer cells than its header.
MarkdownPage readPage(const std::string& strFile);

// The only table below a heading. The test fails when it has another number of rows.
MarkdownTable table(const MarkdownPage& page, const std::string& strHeading, std::size_t nRows);
