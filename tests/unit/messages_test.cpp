// SPDX-License-Identifier: MIT
// Hosts read the log by its texts: data/messages.txt holds each of them, and the library none else.
// A formatter, a linter or a renaming that touches one is found here.

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>
#include <vector>

namespace {

std::string contents(const std::filesystem::path& path)
{
    std::ifstream file(path, std::ios::binary);
    if (!file) ADD_FAILURE() << "cannot read " << path;
    return {std::istreambuf_iterator<char>(file), {}};
}

std::vector<std::string> linesOf(const std::filesystem::path& path)
{
    std::ifstream file(path);
    std::vector<std::string> lines;
    for (std::string strLine; std::getline(file, strLine);) lines.push_back(strLine);
    return lines;
}

// An optimiser may leave out the guards, which it can prove not to fail.
#ifdef __OPTIMIZE__
constexpr bool kGuardsStay = false;
#else
constexpr bool kGuardsStay = true;
#endif

std::set<std::string> listedTexts(bool blGuards = true)
{
    std::set<std::string> texts;
    bool blListed = true;
    for (const std::string& strLine : linesOf(VORN_TEST_DATA "/messages.txt")) {
        if (0 == strLine.find("# ")) blListed = blGuards || 0 != strLine.find("# guards");
        if (!blListed || strLine.empty() || 0 == strLine.find("# ")) continue;
        EXPECT_TRUE(texts.insert(strLine).second) << "listed twice: " << strLine;
    }
    return texts;
}

// Without comments and macro definitions; one line.
std::string codeOf(const std::filesystem::path& path)
{
    std::string strCode;
    for (const std::string& strLine : linesOf(path)) {
        const std::size_t nStart = strLine.find_first_not_of(' ');
        if (std::string::npos == nStart) continue;
        if (0 == strLine.compare(nStart, 2, "//") || '#' == strLine[nStart]) continue;
        strCode += strLine.substr(nStart) + " ";
    }
    return strCode;
}

// The arguments of the macro call whose opening parenthesis is at nOpen.
std::vector<std::string> argumentsAt(const std::string& strCode, std::size_t nOpen)
{
    std::vector<std::string> arguments(1);
    int iDepth = 0;
    bool blQuoted = false;
    for (std::size_t n = nOpen + 1; n < strCode.size(); ++n) {
        const char c = strCode[n];
        if ('"' == c && '\\' != strCode[n - 1]) blQuoted = !blQuoted;
        if (!blQuoted) {
            if (')' == c && 0 == iDepth) return arguments;
            if (',' == c && 0 == iDepth) {
                arguments.emplace_back();
                continue;
            }
            if ('(' == c) ++iDepth;
            if (')' == c) --iDepth;
        }
        arguments.back() += c;
    }
    ADD_FAILURE() << "no end of " << strCode.substr(nOpen, 40);
    return arguments;
}

// The arguments again as one text, blanks as the preprocessor leaves them.
std::string asPreprocessed(const std::vector<std::string>& arguments)
{
    std::string strOut;
    for (const std::string& strArgument : arguments) {
        if (!strOut.empty()) strOut += ",";
        for (char c : strArgument)
            if (' ' != c || strOut.empty() || ' ' != strOut.back()) strOut += c;
    }
    while (!strOut.empty() && ' ' == strOut.back()) strOut.pop_back();
    return strOut;
}

// What the string literals of an argument amount to.
std::string literal(const std::string& strArgument)
{
    std::string strOut;
    bool blQuoted = false;
    for (std::size_t n = 0; n < strArgument.size(); ++n) {
        if (blQuoted && '\\' == strArgument[n])
            strOut += strArgument[++n];
        else if ('"' == strArgument[n])
            blQuoted = !blQuoted;
        else if (blQuoted)
            strOut += strArgument[n];
    }
    return strOut;
}

// The texts of all calls of a macro.
template <typename TextOf>
void collect(const std::string& strCode, const std::string& strMacro, TextOf textOf,
             std::set<std::string>& texts)
{
    for (std::size_t n = 0; std::string::npos != (n = strCode.find(strMacro + "(", n)); ++n) {
        if (0 < n && (isalnum(static_cast<unsigned char>(strCode[n - 1])) || '_' == strCode[n - 1]))
            continue;
        texts.insert(textOf(argumentsAt(strCode, n + strMacro.size())));
    }
}

std::set<std::string> textsInSources()
{
    using Arguments = std::vector<std::string>;
    const auto format = [](const Arguments& arguments) { return literal(arguments[0]); };
    const auto text = [](const Arguments& arguments) { return literal(arguments.back()); };
    std::set<std::string> texts;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(VORN_SOURCES)) {
        const std::string strEnd = entry.path().extension();
        if (".cpp" != strEnd && ".h" != strEnd) continue;
        const std::string strCode = codeOf(entry.path());
        collect(strCode, "FAILED", asPreprocessed, texts);
        collect(strCode, "REPORT", asPreprocessed, texts);
        collect(strCode, "FAILED_AS", text, texts);
        collect(strCode, "LOG_ERROR", format, texts);
        collect(strCode, "LOG_PLAIN", format, texts);
    }
    return texts;
}

TEST(Messages, OfTheListStandInTheLibrary)
{
    const std::string strLibrary = contents(VORN_LIBRARY);
    const std::set<std::string> texts = listedTexts(kGuardsStay);
    EXPECT_LT(50U, texts.size());
    for (const std::string& strText : texts)
        EXPECT_NE(std::string::npos, strLibrary.find(strText + '\0')) << strText;
}

TEST(Messages, OfTheSourcesStandInTheList)
{
    const std::set<std::string> listed = listedTexts();
    const std::set<std::string> texts = textsInSources();
    EXPECT_LT(50U, texts.size());
    for (const std::string& strText : texts)
        EXPECT_EQ(1U, listed.count(strText)) << "not listed: " << strText;
}

}  // namespace
