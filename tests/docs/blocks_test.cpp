// SPDX-License-Identifier: MIT
// Every block of code in the documentation is run by a test: this list says by which. A block that
// is not on it is run by nobody.

#include "support/markdown.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <map>
#include <regex>
#include <string>
#include <tuple>
#include <vector>

namespace {

// Page, section ("" for those of the whole page), language; how many.
using Blocks = std::map<std::tuple<std::string, std::string, std::string>, int>;

const Blocks kRun = {
    // examples/CMakeLists.txt, readme_host
    {{"README.md", "A host in 30 lines", "cpp"}, 1},
    {{"README.md", "A host in 30 lines", ""}, 1},
    // tests/install_ways.sh, by scripts/release/clean-root
    {{"README.md", "Install it", "sh"}, 1},
    {{"README.md", "By CMake", "sh"}, 2},
    {{"README.md", "By Debian packages", "sh"}, 3},
    {{"README.md", "A host that finds it", "cmake"}, 1},
    {{"README.md", "A host that finds it", "sh"}, 2},
    {{"README.md", "As a part of the host's own build", "cmake"}, 2},
    // tests/package_test.sh
    {{"examples/README.md", "Examples", "sh"}, 1},
    // limits_*_test.cpp, limits_test.cpp, faults/memory/memory_limits.cpp
    {{"docs/limits.md", "", "cpp"}, 7},
    {{"docs/limits.md", "", "json"}, 25},
    {{"docs/limits.md", "", "sql"}, 7},
    // docs_log_test.cpp
    {{"docs/log.md", "How to read a chain", "json"}, 1},
    {{"docs/log.md", "How to read a chain", "sql"}, 1},
    {{"docs/log.md", "Example: a duplicate", "json"}, 1},
    {{"docs/log.md", "Example: a duplicate", "log"}, 1},
    {{"docs/log.md", "Example: a row that cannot be read", "json"}, 1},
    {{"docs/log.md", "Example: a row that cannot be read", "log"}, 1},
    // docs_requests_test.cpp
    {{"docs/requests.md", "The sample table", "json"}, 1},
    {{"docs/requests.md", "The sample table", "sql"}, 1},
    {{"docs/requests.md", "The sample records", "json"}, 1},
    // docs_upgrading_test.cpp
    {{"docs/upgrading.md", "Rows in any JSON layout", "json"}, 6},
};

const std::string kProject = VORN_DOCS "/../";

std::vector<std::string> pages()
{
    std::vector<std::string> pages;
    for (const char* szFolder : {"", "bench/", "docs/", "examples/"})
        for (const auto& entry : std::filesystem::directory_iterator(kProject + szFolder))
            if (".md" == entry.path().extension())
                pages.push_back(szFolder + entry.path().filename().string());
    return pages;
}

TEST(DocsBlocks, AreAllRun)
{
    Blocks found;
    for (const std::string& strPage : pages()) {
        for (const MarkdownSection& candidate : readPage("../" + strPage)) {
            const bool blWhole = "docs/limits.md" == strPage;
            const std::string strSection = blWhole ? "" : candidate.strHeading;
            for (const MarkdownFence& block : candidate.fences)
                ++found[{strPage, strSection, block.strLanguage}];
        }
    }
    EXPECT_EQ(kRun, found);
}

// An indented block is a drawing, or a list of commands: of scripts, which are there.
TEST(DocsBlocks, NameScriptsThatExist)
{
    const std::regex command(R"((scripts/[\w-]+|\.ci/run))");
    std::size_t nCommands = 0;
    for (const std::string& strPage : pages()) {
        std::ifstream file(kProject + strPage);
        for (std::string strLine; std::getline(file, strLine);) {
            for (std::sregex_iterator it(strLine.begin(), strLine.end(), command), end; it != end;
                 ++it) {
                EXPECT_EQ(0, access((kProject + it->str()).c_str(), X_OK)) << it->str();
                ++nCommands;
            }
        }
    }
    EXPECT_LT(20U, nCommands);
}

}  // namespace
