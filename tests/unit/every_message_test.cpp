// SPDX-License-Identifier: MIT
// Every text of data/messages.txt is logged by some test, except the guards. It can only be told
// when the whole suite runs in one process.

#include "support/doubles.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <regex>
#include <string>
#include <vector>

namespace {

// A text that no line has had yet, as it stands in a line.
struct Missing {
    std::string strText;
    std::regex pattern;
};

std::vector<Missing>& missing()
{
    static std::vector<Missing> texts;
    return texts;
}

// Formats become patterns; conditions stand between brackets.
std::regex patternOf(const std::string& strText)
{
    static const std::regex special(R"([.^$|()\[\]{}*+?\\])");
    static const std::regex conversion("%[sd]");
    const std::string strPlain = std::regex_replace(strText, special, R"(\$&)");
    const bool blFormat = std::regex_search(strText, conversion) &&
                          std::string::npos == strText.find("sqlite3_mprintf") &&
                          std::string::npos == strText.find("strftime");
    if (!blFormat) return std::regex(R"(Failed \[)" + strPlain + R"(\])");
    return std::regex(std::regex_replace(strPlain, conversion, R"([\s\S]*)"));
}

void strikeOut(const std::string& strLine)
{
    // Long lines are records; their texts stand in front.
    const std::string strFront = strLine.substr(0, 600);
    auto& texts = missing();
    texts.erase(std::remove_if(
                    texts.begin(), texts.end(),
                    [&](const Missing& text) { return std::regex_search(strFront, text.pattern); }),
                texts.end());
}

bool isWholeSuite()
{
    const auto& unitTest = *testing::UnitTest::GetInstance();
    return unitTest.test_to_run_count() == unitTest.total_test_count();
}

class EveryMessage : public testing::Environment {
public:
    void SetUp() override
    {
        if (!isWholeSuite()) return;
        std::ifstream file(VORN_TEST_DATA "/messages.txt");
        for (std::string strLine; std::getline(file, strLine);) {
            if (0 == strLine.find("# guards")) break;
            if (0 == strLine.find("# ") || std::string::npos != strLine.find("err=%m")) continue;
            missing().push_back({strLine, patternOf(strLine)});
        }
        ASSERT_LT(80U, missing().size());
        doubles::onEveryLine = strikeOut;
    }

    void TearDown() override
    {
        doubles::onEveryLine = nullptr;
        for (const Missing& text : missing()) ADD_FAILURE() << "never logged: " << text.strText;
    }
};

const testing::Environment* const pEveryMessage =
    testing::AddGlobalTestEnvironment(new EveryMessage);

}  // namespace
