// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every block of code in the documentation is run, every section of docs/limits.md has a test of
// its own, and the tests, scripts and guards that pages name exist.

#include "docs/section_test.h"

#include <unistd.h>
#include <filesystem>
#include <map>

namespace {

std::vector<std::string> pages()
{
    std::vector<std::string> pages;
    for (const std::string strFolder : {"", "bench/", "contrib/scale-out/", "docs/", "examples/"})
        for (const auto& entry : std::filesystem::directory_iterator(VORN_DOCS "/../" + strFolder))
            if (".md" == entry.path().extension())
                pages.push_back(strFolder + entry.path().filename().string());
    return pages;
}

// Whether install_ways.sh runs the n-th block of its language below a heading of the README.
bool isRunByInstallWays(const std::string& strHeading, const std::string& strLanguage, int n)
{
    static const std::string strScript = fileText("tests/host/install_ways.sh");
    const std::string strWord = "sh" == strLanguage   ? ""
                                : strLanguage.empty() ? "\"\" "
                                                      : strLanguage + " ";
    const std::string strBlock = strHeading + "\" " + strWord + std::to_string(n);
    return std::string::npos != strScript.find(strBlock);
}

bool hasTest(const std::string& strSuite, const std::string& strTest)
{
    static const std::string strTests = folderText("tests");
    return std::string::npos != strTests.find("(" + strSuite + ", " + strTest + ")\n{");
}

// Whether a test includes the C++ of the section that names it.
bool isIncluded(const std::string& strPage, const std::string& strTest)
{
    static const std::string strTests = folderText("tests");
    return std::string::npos != strTests.find("#include \"" + strPage + "/" + strTest + ".inc\"\n");
}

// Pages whose sections with code name the test that runs it.
std::vector<std::string> recipePages()
{
    return {"backup", "changing-a-table",     "large-results", "operating",
            "speed",  "threads-and-processes"};
}

TEST(Documentation, HasNoBlockThatNoTestRuns)
{
    // The tests of these pages fail when there is a block that they do not know.
    std::set<std::string> known = {"docs/front.md", "docs/limits.md", "docs/log.md",
                                   "docs/requests.md", "docs/upgrading.md"};
    for (const std::string& strPage : recipePages()) known.insert("docs/" + strPage + ".md");
    for (const std::string& strPage : pages()) {
        if (0 != known.count(strPage)) continue;
        for (const MarkdownSection& section : readPage("../" + strPage).sections) {
            std::map<std::string, int> counts;
            for (const MarkdownBlock& block : section.blocks) {
                SCOPED_TRACE(strPage + ":\n" + block.strText);
                const int n = ++counts[block.strLanguage];
                // package_test.sh runs all shell blocks of this page.
                if ("examples/README.md" == strPage && "sh" == block.strLanguage) continue;
                EXPECT_EQ("README.md", strPage);
                EXPECT_PRED3(isRunByInstallWays, section.strHeading, block.strLanguage, n);
            }
        }
    }
}

// The fixture of these tests, SectionTest, sees whether they read the blocks that are no C++.
TEST(Documentation, HasATestForEachRecipe)
{
    for (const std::string& strPage : recipePages()) {
        std::size_t nTests = 0;
        for (const MarkdownSection& section : readPage(strPage + ".md").sections) {
            SCOPED_TRACE(strPage + ": " + section.strHeading);
            const auto test = matches(section.strText, R"(\nTest: `(\w+)\.(\w+)`\n)", {1, 2});
            if (test.empty() && section.blocks.empty()) continue;
            ASSERT_EQ(2U, test.size());
            EXPECT_PRED2(hasTest, test[0], test[1]);
            for (const MarkdownBlock& block : section.blocks)
                EXPECT_TRUE("cpp" != block.strLanguage || isIncluded(strPage, test[1]));
            ++nTests;
        }
        EXPECT_LT(0U, nTests) << strPage;
    }
}

// An indented block is a drawing, or a list of scripts to call.
TEST(Documentation, NamesScriptsThatExist)
{
    std::string strPages;
    for (const std::string& strPage : pages()) strPages += fileText(strPage);
    const auto commands = matches(
        strPages,
        R"((?:scripts/|contrib/scale-out/)(?:(?:dev|release)/)?[a-z][a-z-]*(?![\w./-])|\.ci/run)",
        {0});
    EXPECT_FALSE(commands.empty());
    for (const std::string& strCommand : commands)
        EXPECT_EQ(0, access((VORN_DOCS "/../" + strCommand).c_str(), X_OK)) << strCommand;
}

// The fixture of these tests looks for the section that names the test.
TEST(LimitsPage, NamesOneTestInEachSection)
{
    std::set<std::string> named;
    for (const MarkdownSection& section : pageOf("limits.md").sections) {
        SCOPED_TRACE(section.strHeading);
        const auto tests = matches(section.strText, R"(`((?:Memory)?Limits)\.(\w+)`)", {1, 2});
        if (tests.empty()) {
            // The introduction, with the table of the tests.
            EXPECT_TRUE(named.empty());
            EXPECT_TRUE(section.blocks.empty() || 2 == section.blocks.size());
            continue;
        }
        ASSERT_EQ(2U, tests.size());
        EXPECT_TRUE(named.insert(tests[1]).second);
        EXPECT_PRED2(hasTest, tests[0], tests[1]);
        for (const MarkdownBlock& block : section.blocks) {
            const bool blIncluded = isIncluded("limits", tests[1]);
            EXPECT_TRUE("cpp" == block.strLanguage ? blIncluded : "Limits" == tests[0]);
        }
    }
    EXPECT_FALSE(named.empty());
}

TEST(DesignPage, NamesTestsThatExist)
{
    const auto names =
        matches(fileText("docs/design.md"), "`([A-Z][A-Za-z]+)\\.([A-Z][A-Za-z]+)`", {1, 2});
    EXPECT_LT(50U, names.size());
    for (std::size_t i = 0; i < names.size(); i += 2) EXPECT_PRED2(hasTest, names[i], names[i + 1]);
}

TEST(DesignPage, ListsEveryGuard)
{
    const std::string strPage = fileText("docs/design.md");
    const std::string strMessages = fileText("tests/data/messages.txt");
    const std::size_t nGuards = strMessages.find("\n# guards");
    ASSERT_NE(std::string::npos, nGuards);
    const auto guards = matches(
        strMessages.substr(nGuards, strMessages.find("\n# ", nGuards + 1) - nGuards), "\n([^#].*)");
    EXPECT_LT(5U, guards.size());
    for (const std::string& strGuard : guards)
        EXPECT_NE(std::string::npos, strPage.find("`" + strGuard + "`")) << strGuard;
}

}  // namespace
