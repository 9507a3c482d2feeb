// SPDX-License-Identifier: MIT
// SECURITY.md: its trust table names the attacks and the functions that are there.

#include "attacks.h"
#include "support/markdown.h"

#include <algorithm>
#include <fstream>
#include <map>
#include <regex>
#include <set>

namespace {

MarkdownPage securityPage()
{
    return readPage("../SECURITY.md");
}

// The names of attacks in a cell.
std::set<std::string> attacksIn(const std::string& strCell)
{
    static const std::regex name("[a-z0-9_]+");
    return {std::sregex_token_iterator(strCell.begin(), strCell.end(), name), {}};
}

std::string lineOf(const std::string& strFile, int iLine)
{
    std::ifstream file(VORN_DOCS "/../examples/guarded/" + strFile);
    EXPECT_TRUE(file.is_open()) << strFile;
    std::string strLine;
    while (0 < iLine--) std::getline(file, strLine);
    return strLine;
}

// The functions that a text links to, after it was checked that each begins at its line.
std::set<std::string> functionsIn(const std::string& strText)
{
    static const std::regex link(R"(\[`([\w:]+)`\]\(examples/guarded/(\w+\.cpp)#L(\d+)\))");
    std::set<std::string> functions;
    for (std::sregex_iterator it(strText.begin(), strText.end(), link), end; it != end; ++it) {
        const std::string strLine = lineOf((*it)[2], std::stoi((*it)[3]));
        const std::regex definition("\\w.*[ &]" + it->str(1) + "\\(.*[^;]");
        EXPECT_TRUE(std::regex_match(strLine, definition)) << it->str(1) << ": " << strLine;
        functions.insert(it->str(1));
    }
    return functions;
}

TEST(SecurityPage, NamesEveryAttackOnceAndWhatStopsIt)
{
    std::map<std::string, Attack::Fence> named;
    for (const auto& row : table(securityPage(), "The trust table", 23).rows) {
        SCOPED_TRACE(row[0]);
        const auto stopped = attacksIn(row[3]);
        const auto letThrough = attacksIn(row[4]);
        EXPECT_FALSE(stopped.empty() && letThrough.empty());
        for (const std::string& strName : stopped)
            EXPECT_TRUE(named.emplace(strName, Attack::Fence::kStops).second) << strName;
        for (const std::string& strName : letThrough)
            EXPECT_TRUE(named.emplace(strName, Attack::Fence::kLetsThrough).second) << strName;
    }
    std::map<std::string, Attack::Fence> made;
    for (const Attack& attack : attacks()) made.emplace(attack.strName, attack.fence);
    EXPECT_EQ(made.size(), attacks().size());
    EXPECT_EQ(made, named);
}

TEST(SecurityPage, LinksToTheFunctionOfEveryRow)
{
    std::set<std::string> functions;
    for (const auto& row : table(securityPage(), "The trust table", 23).rows) {
        const auto found = functionsIn(row[2]);
        EXPECT_FALSE(found.empty()) << row[0];
        functions.insert(found.begin(), found.end());
    }
    EXPECT_EQ((std::set<std::string>{"checkDeclared", "checkIndexed", "checkKept", "checkKind",
                                     "checkList", "checkOneRecord", "checkPaging", "checkQuota",
                                     "checkRawFilter", "checkSaved", "checkSorting", "checkText",
                                     "limitRows", "openNotes", "readCommand", "readLine"}),
              functions);
    for (const auto& row : table(securityPage(), "The fence", 5).rows)
        EXPECT_EQ(1U, functionsIn(row[1]).size()) << row[0];
}

// Which function refused, by its reason.
const std::multimap<std::string, std::string>& reasons()
{
    static const std::multimap<std::string, std::string> all = {
        {"checkRawFilter", "SQL is not taken"},
        {"checkKind", "a member has a value of another kind"},
        {"checkList", "a list has one item"},
        {"checkText", "\"%\" and control characters are not allowed"},
        {"checkPaging", "\"limit\" and \"offset\" are whole numbers"},
        {"checkPaging", "\"limit\" is too large"},
        {"checkSorting", "\"sort_by\" is the name of a member"},
        {"checkSorting", "\"sort_direction\" is \"asc\" or \"desc\""},
        {"checkDeclared", "there is no such member"},
        {"checkOneRecord", "the request names one record by its id"},
        {"readCommand", "the command is no JSON object"},
        {"readCommand", "the command is nested too deep"},
        {"readCommand", "the command is too long"},
        {"readCommand", "the command holds too many values"},
        {"checkText", "a text is not UTF-8"},
        {"checkKept", "\"id\" cannot be set"},
        {"checkKept", "\"author\" cannot be set"},
        {"checkIndexed", "a list asks for an id or an author"},
        {"checkSaved", "the author has no such note"},
        {"checkQuota", "the author has too many notes"},
    };
    return all;
}

std::string refusal(const Attack& attack)
{
    World world(World::Layers::kBoth, attack.uMoreNotes);
    world.send(attack.lines.at(0));
    world.stop();
    return world.answers.at(0)["refused"].asString();
}

// The attack is refused by a function of its row and no other, or its first line is not refused.
TEST(SecurityPage, LinksToTheFunctionThatRefuses)
{
    const MarkdownTable page = table(securityPage(), "The trust table", 23);
    for (const Attack& attack : attacks()) {
        SCOPED_TRACE(attack.strName);
        for (const auto& row : page.rows) {
            if (0 == attacksIn(row[3] + "," + row[4]).count(attack.strName)) continue;
            const std::string strReason = refusal(attack);
            bool blFound = Attack::Guard::kRefuses != attack.guard && strReason.empty();
            for (const std::string& strFunction : functionsIn(row[2])) {
                const auto range = reasons().equal_range(strFunction);
                blFound = blFound || std::any_of(range.first, range.second, [&](const auto& pair) {
                              return pair.second == strReason;
                          });
            }
            EXPECT_TRUE(blFound) << row[2] << ": " << strReason;
        }
    }
}

}  // namespace
