// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/markdown.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <regex>
#include <sstream>

namespace {

const std::string kProject = VORN_DOCS "/../";

const std::regex& compiled(const std::string& strPattern)
{
    static std::map<std::string, std::regex> patterns;
    return patterns.try_emplace(strPattern, strPattern).first->second;
}

// "| a | `b \| c` |" has the cells "a" and "b | c".
std::vector<std::string> cellsOf(const std::string& strLine)
{
    std::vector<std::string> cells = matches(strLine.substr(1), R"( *((?:\\\||[^|])*?) *\|)");
    for (std::string& strCell : cells)
        strCell = replaced(replaced(strCell, "^`(.+)`$", "$1"), R"(\\\|)", "|");
    return cells;
}

}  // namespace

std::string fileText(const std::string& strFile)
{
    std::ifstream file(kProject + strFile);
    EXPECT_TRUE(file.is_open()) << strFile;
    return {std::istreambuf_iterator<char>(file), {}};
}

std::string folderText(const std::string& strFolder)
{
    std::string strText;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(kProject + strFolder))
        if (entry.is_regular_file())
            strText += fileText(std::filesystem::relative(entry.path(), kProject));
    return strText;
}

std::vector<std::string> matches(const std::string& strText, const std::string& strPattern,
                                 const std::vector<int>& groups)
{
    const std::regex& pattern = compiled(strPattern);
    return {std::sregex_token_iterator(strText.begin(), strText.end(), pattern, groups), {}};
}

std::string replaced(const std::string& strText, const std::string& strPattern,
                     const std::string& strBy)
{
    return std::regex_replace(strText, compiled(strPattern), strBy);
}

MarkdownPage readPage(const std::string& strFile)
{
    MarkdownPage page;
    page.sections.emplace_back();
    bool blBlock = false;
    bool blTable = false;
    std::istringstream lines(fileText("docs/" + strFile));
    for (std::string strLine; std::getline(lines, strLine);) {
        const bool blMark = 0 == strLine.rfind("```", 0);
        const bool blRow = !blBlock && 0 == strLine.rfind('|', 0);
        if (!blBlock && 0 == strLine.rfind('#', 0))
            page.sections.push_back({replaced(strLine, "^#+ *", ""), "", {}, {}});
        MarkdownSection& section = page.sections.back();
        section.strText += strLine + "\n";
        if (blMark && !blBlock) section.blocks.push_back({strLine.substr(3), ""});
        if (!blMark && blBlock) section.blocks.back().strText += strLine + "\n";
        if (blRow && !blTable) {
            section.tables.push_back({cellsOf(strLine), {}});
        } else if (blRow && 0 != strLine.rfind("|---", 0)) {
            MarkdownTable& table = section.tables.back();
            table.rows.push_back(cellsOf(strLine));
            EXPECT_EQ(table.header.size(), table.rows.back().size()) << strLine;
            table.rows.back().resize(table.header.size());
        }
        blBlock = blBlock != blMark;
        blTable = blRow;
    }
    EXPECT_FALSE(blBlock) << strFile << ": the last block does not end";
    for (const MarkdownSection& section : page.sections) {
        page.blocks.insert(page.blocks.end(), section.blocks.begin(), section.blocks.end());
        page.tables.insert(page.tables.end(), section.tables.begin(), section.tables.end());
    }
    return page;
}

MarkdownTable table(const MarkdownPage& page, const std::string& strHeading, std::size_t nRows)
{
    for (const MarkdownSection& section : page.sections) {
        if (section.strHeading != strHeading || 1 != section.tables.size()) continue;
        EXPECT_EQ(nRows, section.tables[0].rows.size()) << strHeading;
        return section.tables[0];
    }
    ADD_FAILURE() << "no table: " << strHeading;
    return {};
}
