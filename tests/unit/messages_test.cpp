// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Hosts search the log for its texts. data/messages.txt lists all of them: the library and its
// sources hold these and no others, and each but the guards is logged by some test. This catches a
// formatter, a linter or a renaming that changes one.

#include "support/doubles.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <regex>
#include <set>
#include <string>

namespace {

std::string contents(const std::filesystem::path& path)
{
    std::ifstream file(path, std::ios::binary);
    if (!file) ADD_FAILURE() << "cannot read " << path;
    return {std::istreambuf_iterator<char>(file), {}};
}

// The listed texts, except those below headings that begin with one of the words.
std::set<std::string> listedTexts(const std::string& strWithout)
{
    const std::regex heading("# (?!" + strWithout + ").*");
    std::set<std::string> texts;
    std::ifstream file(VORN_TEST_DATA "/messages.txt");
    bool blListed = false;
    for (std::string strLine; std::getline(file, strLine);)
        if (0 == strLine.find("# "))
            blListed = std::regex_match(strLine, heading);
        else if (blListed && !texts.insert(strLine).second)
            ADD_FAILURE() << "listed twice: " << strLine;
    return texts;
}

// An optimiser may leave out the guards, because it can prove that they never fail.
#ifdef __OPTIMIZE__
constexpr char kLeftOut[] = "guards";
#else
constexpr char kLeftOut[] = "nothing";
#endif

TEST(Messages, AreAllInTheLibrary)
{
    const std::set<std::string> texts = listedTexts(kLeftOut);
    EXPECT_LT(50U, texts.size());
    const std::string strLibrary = contents(VORN_LIBRARY);
    for (const std::string& strText : texts)
        EXPECT_NE(std::string::npos, strLibrary.find(strText + '\0')) << strText;
}

// The text between the parenthesis at nOpen and its counterpart.
std::string argumentsAt(const std::string& strCode, std::size_t nOpen)
{
    int iDepth = 0;
    bool blQuoted = false;
    for (std::size_t n = nOpen; n < strCode.size(); ++n) {
        if ('"' == strCode[n] && '\\' != strCode[n - 1]) blQuoted = !blQuoted;
        if (blQuoted) continue;
        if ('(' == strCode[n]) ++iDepth;
        if (')' == strCode[n] && 0 == --iDepth) return strCode.substr(nOpen + 1, n - nOpen - 1);
    }
    ADD_FAILURE() << "no end of " << strCode.substr(nOpen, 40);
    return std::string();
}

// The text that a call of a macro logs: its arguments as they are, or their first or last literals.
std::string textOf(const std::string& strMacro, const std::string& strArguments)
{
    if ("FAILED" == strMacro || "GUARDED" == strMacro || "REPORT" == strMacro) return strArguments;
    const std::string strLiteral = R"re("((?:[^"\\]|\\.)*)" ?)re";
    const bool blLast = std::string::npos != strMacro.find("_AS");
    const std::regex literals(blLast ? "(" + strLiteral + ")+$" : "^(" + strLiteral + ")+");
    std::smatch match;
    if (!std::regex_search(strArguments, match, literals)) return "no text in " + strArguments;
    const std::string strText = std::regex_replace(match.str(), std::regex(strLiteral), "$1");
    return std::regex_replace(strText, std::regex(R"(\\(.))"), "$1");
}

TEST(Messages, AreAllListed)
{
    const std::set<std::string> listed = listedTexts("nothing");
    static const std::regex macro(
        R"(\b(FAILED|FAILED_AS|GUARDED|GUARDED_SQL|REPORT|LOG_ERROR|LOG_PLAIN)\()");
    static const std::regex noCode(R"((^|\n) *(//|#)[^\n]*)");
    static const std::regex blanks(R"(\s+)");
    int iTexts = 0;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(VORN_SOURCES)) {
        if (!entry.is_regular_file()) continue;
        const std::string strCode =
            std::regex_replace(std::regex_replace(contents(entry.path()), noCode, ""), blanks, " ");
        for (std::sregex_iterator it(strCode.begin(), strCode.end(), macro), end; it != end; ++it) {
            const std::size_t nOpen = static_cast<std::size_t>(it->position() + it->length() - 1);
            const std::string strText = textOf((*it)[1], argumentsAt(strCode, nOpen));
            EXPECT_EQ(1U, listed.count(strText)) << "not listed: " << strText;
            ++iTexts;
        }
    }
    EXPECT_LT(50, iTexts);
}

// Whether the line shows the text: a condition in brackets, or a format with its values.
bool shows(const std::string& strLine, const std::string& strText)
{
    if (std::string::npos == strText.find("=%"))
        return std::string::npos != strLine.find("Failed [" + strText + "]");
    std::size_t nFound = 0;
    for (std::size_t n = 0;;) {
        const std::size_t nConversion = strText.find('%', n);
        nFound = strLine.find(strText.substr(n, nConversion - n), nFound);
        if (std::string::npos == nFound || std::string::npos == nConversion)
            return std::string::npos != nFound;
        nFound += nConversion - n;
        n = nConversion + 2;
    }
}

// The texts that no line has shown yet.
std::set<std::string> missing;

void strikeOut(const std::string& strLine)
{
    // Long lines are records; their texts come first.
    const std::string strFront = strLine.substr(0, 600);
    for (auto it = missing.begin(); it != missing.end();)
        it = shows(strFront, *it) ? missing.erase(it) : std::next(it);
}

// Only the whole suite in one process can tell.
class EveryMessage : public testing::Environment {
public:
    void SetUp() override
    {
        const auto& unitTest = *testing::UnitTest::GetInstance();
        if (unitTest.test_to_run_count() != unitTest.total_test_count()) return;
        missing = listedTexts("every failed check|guards|not log lines");
        ASSERT_LT(80U, missing.size());
        doubles::onEveryLine = strikeOut;
    }

    void TearDown() override
    {
        doubles::onEveryLine = nullptr;
        for (const std::string& strText : missing) ADD_FAILURE() << "never logged: " << strText;
    }
};

const testing::Environment* const pEveryMessage =
    testing::AddGlobalTestEnvironment(new EveryMessage);

}  // namespace
