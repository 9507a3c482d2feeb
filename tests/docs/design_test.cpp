// SPDX-License-Identifier: MIT
// docs/design.md names the test of every kept behaviour, and the guards.

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <regex>
#include <set>
#include <string>

namespace {

std::string contents(const char* szPath)
{
    std::ifstream file(szPath);
    return {std::istreambuf_iterator<char>(file), {}};
}

// "Suite.Name" of every test of this project.
std::set<std::string> writtenTests()
{
    static const std::regex test(R"(TEST(?:_[FP])?\((\w+), (\w+)\))");
    std::set<std::string> names;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(VORN_TEST_DATA "/..")) {
        if (".cpp" != entry.path().extension()) continue;
        const std::string strSource = contents(entry.path().c_str());
        for (std::sregex_iterator it(strSource.begin(), strSource.end(), test), end; it != end;
             ++it)
            names.insert((*it)[1].str() + "." + (*it)[2].str());
    }
    return names;
}

TEST(DesignPage, NamesTestsThatExist)
{
    const std::string strPage = contents(VORN_DOCS "/design.md");
    const std::set<std::string> tests = writtenTests();
    static const std::regex name(R"(`([A-Z][A-Za-z]+\.[A-Z][A-Za-z]+)`)");
    int iNames = 0;
    for (std::sregex_iterator it(strPage.begin(), strPage.end(), name), end; it != end; ++it) {
        EXPECT_EQ(1U, tests.count((*it)[1])) << (*it)[1];
        ++iNames;
    }
    EXPECT_LT(25, iNames);
}

TEST(DesignPage, ListsEveryGuard)
{
    const std::string strPage = contents(VORN_DOCS "/design.md");
    std::ifstream file(VORN_TEST_DATA "/messages.txt");
    bool blGuards = false;
    int iGuards = 0;
    for (std::string strLine; std::getline(file, strLine);) {
        if (0 == strLine.find("# ")) {
            blGuards = 0 == strLine.find("# guards");
        } else if (blGuards) {
            EXPECT_NE(std::string::npos, strPage.find("`" + strLine + "`")) << strLine;
            ++iGuards;
        }
    }
    EXPECT_LT(5, iGuards);
}

}  // namespace
