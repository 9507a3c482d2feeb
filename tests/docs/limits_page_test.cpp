// SPDX-License-Identifier: MIT
// docs/limits.md names its tests.

#include "support/markdown.h"

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>
#include <regex>
#include <set>
#include <string>
#include <vector>

namespace {

// The tests of the suite that the section names.
std::vector<std::string> testsIn(const MarkdownSection& section, const std::string& strSuite)
{
    const std::regex name("`" + strSuite + R"(\.(\w+)`)");
    return {std::sregex_token_iterator(section.strText.begin(), section.strText.end(), name, 1),
            {}};
}

// Those that need a malloc of their own are in another program.
bool isMemoryTest(const std::string& strName)
{
    std::ifstream file(VORN_TEST_DATA "/../faults/memory/memory_limits.cpp");
    const std::string strSource{std::istreambuf_iterator<char>(file), {}};
    return std::string::npos != strSource.find("TEST(MemoryLimits, " + strName + ")");
}

// Every test that the page names is there, every test is on the page, and no section lacks one.
TEST(LimitsPage, NamesEveryTestOnce)
{
    std::multiset<std::string> named;
    for (const MarkdownSection& section : readPage("limits.md")) {
        const std::vector<std::string> here = testsIn(section, "Limits");
        const std::vector<std::string> ofMemory = testsIn(section, "MemoryLimits");
        named.insert(here.begin(), here.end());
        for (const std::string& strName : ofMemory) EXPECT_TRUE(isMemoryTest(strName)) << strName;
        EXPECT_EQ("Limits" == section.strHeading ? 0U : 1U, here.size() + ofMemory.size())
            << section.strHeading;
    }
    std::multiset<std::string> registered;
    const testing::UnitTest& tests = *testing::UnitTest::GetInstance();
    for (int i = 0; i < tests.total_test_suite_count(); ++i) {
        const testing::TestSuite& suite = *tests.GetTestSuite(i);
        if (std::string("Limits") != suite.name()) continue;
        for (int j = 0; j < suite.total_test_count(); ++j)
            registered.insert(suite.GetTestInfo(j)->name());
    }
    EXPECT_EQ(registered, named);
    EXPECT_EQ(25U, named.size());
}

}  // namespace
