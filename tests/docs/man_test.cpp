// SPDX-License-Identifier: MIT
// man/: the manual page of the class has every declaration of the header, and the other one says
// the same as the guides, which are run.

#include "support/database.h"
#include "support/markdown.h"

#include <cctype>
#include <fstream>
#include <regex>
#include <set>

namespace {

Lines linesOf(const char* szPath)
{
    std::ifstream file(szPath);
    EXPECT_TRUE(file.is_open()) << szPath;
    Lines lines;
    for (std::string strLine; std::getline(file, strLine);) lines.push_back(strLine);
    return lines;
}

Lines classPage()
{
    return linesOf(VORN_DOCS "/../man/VornJsonDbApi.3");
}

Lines generalPage()
{
    return linesOf(VORN_DOCS "/../man/vornjsondb.7");
}

// The lines of a section.
Lines sectionOf(const Lines& page, const std::string& strName)
{
    Lines lines;
    bool blInside = false;
    for (const std::string& strLine : page) {
        if (0 == strLine.find(".Sh ")) blInside = ".Sh " + strName == strLine;
        if (blInside) lines.push_back(strLine);
    }
    EXPECT_LT(1U, lines.size()) << strName;
    return lines;
}

std::string withoutBlanks(const std::string& strText)
{
    std::string strOut;
    for (char c : strText)
        if (!isspace(static_cast<unsigned char>(c))) strOut += c;
    return strOut;
}

// The argument of a macro, without quotes.
std::string argumentOf(const std::string& strLine)
{
    const std::string strArgument = strLine.substr(4);
    const bool blQuoted = '"' == strArgument.front();
    return blQuoted ? strArgument.substr(1, strArgument.size() - 2) : strArgument;
}

// A function of the synopsis.
struct Function {
    std::string strDeclaration;  // as in the header, without blanks
    std::string strCall;         // its name, and those of its parameters
};

std::vector<Function> functionsOfThePage()
{
    static const std::regex parameter(R"((\w+)(\)\(.*\))?( = \w+)?$)");
    static const std::regex scope("^VORN_JSON_DB::");
    std::vector<Function> functions;
    std::string strResult;
    std::string strName;
    std::string strParameters;
    std::string strCall;
    for (const std::string& strLine : sectionOf(classPage(), "SYNOPSIS")) {
        const std::string strMacro = strLine.substr(0, 4);
        if (".Ft " == strMacro) {
            strResult = argumentOf(strLine);
        } else if (".Fo " == strMacro) {
            strCall = argumentOf(strLine);
            strName = std::regex_replace(strCall, scope, "");
        } else if (".Fa " == strMacro) {
            const std::string strParameter = argumentOf(strLine);
            std::smatch match;
            EXPECT_TRUE(std::regex_search(strParameter, match, parameter)) << strParameter;
            strParameters += (strParameters.empty() ? "" : ",") + strParameter;
            strCall += " " + match[1].str();
        } else if (".Fc" == strMacro) {
            functions.push_back(
                {withoutBlanks(strResult + strName + "(" + strParameters + ")"), strCall});
            strResult.clear();
            strParameters.clear();
        }
    }
    return functions;
}

// The declarations of the header, without blanks.
std::multiset<std::string> declarationsOfTheHeader()
{
    std::string strCode;
    for (const std::string& strLine : linesOf(VORN_SOURCES "/../include/VornJsonDbApi.h"))
        if ('#' != strLine.c_str()[0]) strCode += strLine.substr(0, strLine.find("//")) + " ";
    strCode.erase(strCode.find("private:"));
    strCode = std::regex_replace(strCode, std::regex("[^;]*\\{|public:|VORN_JSON_DB_EXPORT"), "");

    std::multiset<std::string> declarations;
    static const std::regex declaration("[^;]*\\([^;]*\\) *;");
    for (std::sregex_iterator it(strCode.begin(), strCode.end(), declaration), end; it != end;
         ++it) {
        const std::string strDeclaration = withoutBlanks(it->str());
        declarations.insert(strDeclaration.substr(0, strDeclaration.size() - 1));
    }
    return declarations;
}

std::multiset<std::string> itemsOf(const Lines& page, const std::regex& item)
{
    std::multiset<std::string> items;
    std::smatch match;
    for (const std::string& strLine : page)
        if (std::regex_match(strLine, match, item)) items.insert(match[1]);
    return items;
}

TEST(ManClassPage, HasEveryDeclarationOfTheHeader)
{
    std::multiset<std::string> onThePage;
    for (const Function& function : functionsOfThePage()) onThePage.insert(function.strDeclaration);
    EXPECT_LT(25U, onThePage.size());
    EXPECT_EQ(declarationsOfTheHeader(), onThePage);
}

TEST(ManClassPage, DescribesEveryFunction)
{
    std::multiset<std::string> calls;
    for (const Function& function : functionsOfThePage()) calls.insert(function.strCall);
    EXPECT_EQ(calls, itemsOf(sectionOf(classPage(), "DESCRIPTION"), std::regex("\\.It Fn (.*)")));
}

TEST(ManClassPage, ShowsTheHostOfTheReadme)
{
    std::string strHost;
    for (const std::string& strLine : sectionOf(classPage(), "EXAMPLES"))
        if (strLine.empty() || '.' != strLine[0]) strHost += strLine + "\n";
    strHost = std::regex_replace(strHost, std::regex(R"(\\e)"), "\\");
    const std::string strReadme = fence(readPage("../README.md"), "A host in 30 lines", "cpp");
    EXPECT_EQ(strReadme, strHost.substr(0, strReadme.size()));
}

TEST(ManGeneralPage, ShowsADefinitionThatIsRead)
{
    std::string strDefinition;
    for (const std::string& strLine : generalPage())
        if (0 == strLine.find('{') || 0 == strLine.find("    \"")) strDefinition += strLine;
    Json::Value jDefinition = json(strDefinition);
    std::string strName = "errand";
    const Json::Value& jTypes = VORN_JSON_DB::recType(jDefinition, strName);
    EXPECT_EQ(jDefinition["errand"]["member"], jTypes);
    EXPECT_EQ(2U, jTypes.size());
}

TEST(ManGeneralPage, SaysOfEveryTypeWordWhatTheGuideSays)
{
    std::set<std::string> onThePage;
    for (const std::string& strLine : generalPage()) {
        std::smatch match;
        static const std::regex row(R"re(\.It (?:Li )?"?([^"]+)"? Ta (\S+) Ta (\S+) Ta (\S+))re");
        if (std::regex_match(strLine, match, row) && "Sy word" != match[1])
            onThePage.insert(match[1].str() + "|" + match[2].str() + "|" + match[3].str() + "|" +
                             match[4].str());
    }
    std::set<std::string> inTheGuide;
    for (const auto& row : table(readPage("types.md"), "The words", 17).rows) {
        const auto works = [](const std::string& strCell) {
            return "error" == strCell ? "\\-" : "yes";
        };
        inTheGuide.insert(row[0] + "|" + works(row[2]) + "|" + works(row[3]) + "|" + row[4]);
    }
    EXPECT_EQ(inTheGuide, onThePage);
}

TEST(ManGeneralPage, NamesEveryTypeWordOfTheLibrary)
{
    const auto items =
        itemsOf(generalPage(), std::regex(R"re(\.It Li "?([^"]+?)"? Ta .* Ta .*)re"));
    int iWords = 0;
    for (const std::string& strLine : linesOf(VORN_SOURCES "/util/type_words.h")) {
        std::smatch match;
        if (!std::regex_search(strLine, match, std::regex(R"re(^    \{"([^"]+)",)re"))) continue;
        EXPECT_EQ(1U, items.count(match[1])) << match[1];
        ++iWords;
    }
    EXPECT_EQ(16, iWords);
}

TEST(ManGeneralPage, HasTheRequestsOfTheGuide)
{
    std::set<std::string> inTheGuide;
    for (const MarkdownSection& part : readPage("requests.md"))
        for (const MarkdownTable& table : part.tables)
            for (const auto& row : table.rows) inTheGuide.insert(row[0] + " " + row[1]);

    int iRequests = 0;
    for (const std::string& strLine : generalPage()) {
        std::smatch match;
        if (!std::regex_match(strLine, match, std::regex(R"re(\.It Li (\{.*\}) Ta Li "(.*)")re")))
            continue;
        const std::string strWhere = '(' == match[2].str()[0] ? "WHERE  " : "";
        EXPECT_EQ(1U,
                  inTheGuide.count(match[1].str() + " book  " + strWhere + match[2].str() + ";"))
            << strLine;
        ++iRequests;
    }
    EXPECT_EQ(7, iRequests);
}

TEST(ManGeneralPage, HasTheFormsOfTheLog)
{
    const auto forms = itemsOf(generalPage(), std::regex(R"re(\.Li "(.*TEXT)")re"));
    std::multiset<std::string> inTheGuide;
    for (const auto& row : table(readPage("log.md"), "The forms", 6).rows)
        inTheGuide.insert(row[2]);
    EXPECT_EQ(inTheGuide, forms);
}

}  // namespace
