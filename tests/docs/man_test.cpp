// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// man/: the page of the class has every declaration of the header, and the other one says the same
// as the guides, which are run.

#include "support/database.h"
#include "support/markdown.h"

#include <algorithm>
#include <set>

namespace {

std::vector<std::string> sorted(std::vector<std::string> texts)
{
    EXPECT_FALSE(texts.empty());
    std::sort(texts.begin(), texts.end());
    return texts;
}

// A section of the page of the class.
std::string sectionOf(const std::string& strName)
{
    const std::string strPage = fileText("man/VornJsonDbApi.3");
    const std::size_t nBegin = strPage.find(".Sh " + strName + "\n");
    EXPECT_NE(std::string::npos, nBegin) << strName;
    return strPage.substr(nBegin, strPage.find("\n.Sh ", nBegin) + 1 - nBegin);
}

// The functions that a text declares, without blanks.
std::vector<std::string> declarationsOf(const std::string& strText)
{
    return sorted(matches(replaced(strText, "\\s", ""), "([^;{}]+\\([^;]*\\));"));
}

TEST(ManClassPage, HasEveryDeclarationOfTheHeader)
{
    std::string strHeader = fileText("include/VornJsonDbApi.h");
    strHeader = replaced(strHeader, "\n#.*|//.*|public:|VORN_JSON_DB_EXPORT", "");
    strHeader.erase(strHeader.find("private:"));

    std::string strPage = sectionOf("SYNOPSIS");
    strPage = replaced(strPage, "(\n\\.Ft (.*))?\n\\.Fo (VORN_JSON_DB::)?(.*)", ";$2 $4(");
    strPage = replaced(strPage, "\n\\.Fa \"(.*)\"", "$1,");
    strPage = replaced(strPage, ",?\n\\.Fc", ");");
    EXPECT_EQ(declarationsOf(strHeader), declarationsOf(strPage));
}

// By its name and those of its parameters.
TEST(ManClassPage, DescribesEveryFunction)
{
    const std::string strCalls = replaced(
        sectionOf("SYNOPSIS"), R"re(\n\.Fa ".*?(\w+)(\)\(.*\))?( = \w+)?"(?=\n))re", " $1");
    EXPECT_EQ(sorted(matches(strCalls, "\n\\.Fo (.*)")),
              sorted(matches(sectionOf("DESCRIPTION"), "\n\\.It Fn (.*)")));
}

TEST(ManClassPage, ShowsTheHostOfTheReadme)
{
    const std::string strHost = replaced(sectionOf("EXAMPLES"), R"(\\e)", "\\");
    const auto blocks = readPage("../README.md").blocks;
    EXPECT_TRUE(std::any_of(blocks.begin(), blocks.end(), [&](const MarkdownBlock& block) {
        return "cpp" == block.strLanguage && std::string::npos != strHost.find(block.strText);
    }));
}

TEST(ManGeneralPage, ShowsADefinitionThatTheLibraryReads)
{
    Json::Value jDefinition =
        json(matches(fileText("man/vornjsondb.7"), "\n(\\{\"[^.]*)\\.Ed").at(0));
    std::string strName = jDefinition.getMemberNames().at(0);
    const Json::Value& jTypes = VORN_JSON_DB::recType(jDefinition, strName);
    EXPECT_FALSE(jTypes.empty());
    EXPECT_EQ(jDefinition[strName]["member"], jTypes);
}

TEST(ManGeneralPage, AgreesWithTheGuideOnEveryTypeWord)
{
    std::vector<std::string> inTheGuide;
    const auto words = readPage("types.md").tables.at(0).rows;
    for (const auto& row : words) {
        inTheGuide.push_back(&row == &words.back() ? "" : row[0]);
        for (std::size_t i : {2U, 3U}) inTheGuide.push_back("error" == row[i] ? "\\-" : "yes");
        inTheGuide.push_back(row[4]);
    }
    EXPECT_EQ(inTheGuide,
              matches(fileText("man/vornjsondb.7"),
                      R"re(\.It (?:Li "?([^"\n]+?)"?|[^"\n]+) Ta (\S+) Ta (\S+) Ta (\S+)\n)re",
                      {1, 2, 3, 4}));
}

TEST(ManGeneralPage, TakesItsRequestsFromTheGuide)
{
    std::set<std::string> inTheGuide;
    for (const MarkdownTable& table : readPage("requests.md").tables)
        for (const auto& row : table.rows) inTheGuide.insert(row[0] + " " + row[1]);

    const auto requests =
        matches(fileText("man/vornjsondb.7"), R"re(\.It Li (\{.*\}) Ta Li "(.*)"\n)re", {1, 2});
    EXPECT_FALSE(requests.empty());
    for (std::size_t i = 0; i < requests.size(); i += 2) {
        const std::string strBook = '(' == requests[i + 1][0] ? " book  WHERE  " : " book  ";
        EXPECT_EQ(1U, inTheGuide.count(requests[i] + strBook + requests[i + 1] + ";"))
            << requests[i];
    }
}

TEST(ManGeneralPage, HasTheFormsOfTheLogLines)
{
    std::vector<std::string> inTheGuide;
    const auto forms = readPage("log.md").tables.at(0).rows;
    for (const auto& row : forms) inTheGuide.push_back(row.back());
    EXPECT_EQ(inTheGuide, matches(fileText("man/vornjsondb.7"), R"re(\.Li "(.*TEXT)"\n)re"));
}

}  // namespace
