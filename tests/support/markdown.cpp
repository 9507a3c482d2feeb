// SPDX-License-Identifier: MIT
#include "support/markdown.h"

#include <gtest/gtest.h>

#include <fstream>
#include <utility>

namespace {

std::string trimmed(const std::string& strText)
{
    const std::size_t iFirst = strText.find_first_not_of(' ');
    if (std::string::npos == iFirst) return std::string();
    return strText.substr(iFirst, strText.find_last_not_of(' ') - iFirst + 1);
}

// Without the backquotes of a cell that is code as a whole.
std::string bare(const std::string& strCell)
{
    const std::string strText = trimmed(strCell);
    const bool blCode = 2 < strText.size() && '`' == strText.front() && '`' == strText.back();
    return blCode ? strText.substr(1, strText.size() - 2) : strText;
}

// | a | `b \| c` |
std::vector<std::string> cells(const std::string& strLine)
{
    std::vector<std::string> cells;
    std::string strCell;
    for (std::size_t i = 1; i < strLine.size(); ++i) {
        if ('\\' == strLine[i] && i + 1 < strLine.size() && '|' == strLine[i + 1])
            strCell += strLine[++i];
        else if ('|' == strLine[i])
            cells.push_back(bare(std::exchange(strCell, {})));
        else
            strCell += strLine[i];
    }
    return cells;
}

bool beginsWith(const std::string& strLine, const char* szHead)
{
    return 0 == strLine.rfind(szHead, 0);
}

// One page, read line by line.
class Reader {
public:
    MarkdownPage page;

    void line(const std::string& strLine)
    {
        if (blFence_) return inFence(strLine);
        if (beginsWith(strLine, "#")) {
            page.emplace_back();
            page.back().strHeading = trimmed(strLine.substr(strLine.find_first_not_of('#')));
            blTable_ = false;
            return;
        }
        if (page.empty()) page.emplace_back();
        page.back().strText += strLine + "\n";
        if (beginsWith(strLine, "```")) {
            page.back().fences.push_back({strLine.substr(3), ""});
            blFence_ = true;
        }
        tableLine(strLine);
    }

private:
    bool blFence_ = false;
    bool blTable_ = false;

    void inFence(const std::string& strLine)
    {
        page.back().strText += strLine + "\n";
        if (beginsWith(strLine, "```"))
            blFence_ = false;
        else
            page.back().fences.back().strText += strLine + "\n";
    }

    void tableLine(const std::string& strLine)
    {
        if (!beginsWith(strLine, "|")) {
            blTable_ = false;
            return;
        }
        auto& tables = page.back().tables;
        if (!blTable_)
            tables.push_back({cells(strLine), {}});
        else if (!beginsWith(strLine, "|---"))
            tables.back().rows.push_back(cells(strLine));
        if (blTable_ && !tables.back().rows.empty()) {
            EXPECT_EQ(tables.back().header.size(), tables.back().rows.back().size()) << strLine;
            // A row that lacks cells still has them, so that a test may read it.
            tables.back().rows.back().resize(tables.back().header.size());
        }
        blTable_ = true;
    }
};

}  // namespace

MarkdownPage readPage(const std::string& strFile)
{
    std::ifstream file(std::string(VORN_DOCS) + "/" + strFile);
    EXPECT_TRUE(file.is_open()) << strFile;
    Reader reader;
    for (std::string strLine; std::getline(file, strLine);) reader.line(strLine);
    return reader.page;
}

MarkdownSection section(const MarkdownPage& page, const std::string& strHeading)
{
    MarkdownSection found;
    int iFound = 0;
    for (const MarkdownSection& candidate : page) {
        if (candidate.strHeading != strHeading) continue;
        found = candidate;
        ++iFound;
    }
    EXPECT_EQ(1, iFound) << strHeading;
    return found;
}

MarkdownTable table(const MarkdownPage& page, const std::string& strHeading, std::size_t nRows)
{
    const MarkdownSection found = section(page, strHeading);
    EXPECT_EQ(1U, found.tables.size()) << strHeading;
    if (found.tables.empty()) return {};
    EXPECT_EQ(nRows, found.tables[0].rows.size()) << strHeading;
    return found.tables[0];
}

std::string fence(const MarkdownPage& page, const std::string& strHeading,
                  const std::string& strLanguage)
{
    std::string strText;
    int iFound = 0;
    for (const MarkdownFence& candidate : section(page, strHeading).fences) {
        if (candidate.strLanguage != strLanguage) continue;
        strText = candidate.strText;
        ++iFound;
    }
    EXPECT_EQ(1, iFound) << strHeading << ", " << strLanguage;
    return strText;
}
