// SPDX-License-Identifier: MIT
// SECURITY.md: its trust table names the attacks and the functions that are there.

#include "attacks.h"
#include "support/markdown.h"

#include <fstream>
#include <iterator>
#include <map>
#include <regex>
#include <set>

namespace {

std::vector<std::vector<std::string>> rows(const char* szHeading, std::size_t nRows)
{
    return table(readPage("../SECURITY.md"), szHeading, nRows).rows;
}

// The names of attacks in a cell.
std::set<std::string> attacksIn(const std::string& strCell)
{
    static const std::regex name("[a-z0-9_]+");
    return {std::sregex_token_iterator(strCell.begin(), strCell.end(), name), {}};
}

// The functions that a cell links to, with the text of their definitions in the linked file.
std::map<std::string, std::string> functionsIn(const std::string& strCell)
{
    static const std::regex link(R"(\[`([\w:]+)`\]\((examples/guarded/\w+\.cpp)\))");
    std::map<std::string, std::string> functions;
    for (std::sregex_iterator it(strCell.begin(), strCell.end(), link), end; it != end; ++it) {
        std::ifstream file(VORN_DOCS "/../" + it->str(2));
        const std::string strFile{std::istreambuf_iterator<char>(file), {}};
        const std::regex head("\n\\w[^\n;]*[ &]" + it->str(1) + "\\([^;{]*\\{");
        std::smatch found;
        EXPECT_TRUE(std::regex_search(strFile, found, head)) << it->str();
        const auto nHead = static_cast<std::size_t>(found.position());
        functions[it->str(1)] = strFile.substr(nHead, strFile.find("\n}", nHead) - nHead);
    }
    return functions;
}

// The reason for which the example refuses the first line, as it is in the sources, without the
// name of the member that it may begin with.
std::string refusal(const Attack& attack)
{
    World world(World::Layers::kBoth, attack.uMoreNotes);
    world.send(attack.strLines.substr(0, attack.strLines.find('\n')));
    const std::string strReason = world.answers.at(0)["refused"].asString();
    return std::regex_replace(std::regex_replace(strReason, std::regex("^\"\\w+\""), ""),
                              std::regex("\""), "\\\"");
}

TEST(SecurityPage, NamesEveryAttackOnceAndWhatStopsIt)
{
    std::multimap<std::string, Attack::Fence> named;
    for (const auto& row : rows("The trust table", 23)) {
        EXPECT_FALSE(attacksIn(row[3] + "," + row[4]).empty()) << row[0];
        for (const std::string& strName : attacksIn(row[3]))
            named.emplace(strName, Attack::Fence::kStops);
        for (const std::string& strName : attacksIn(row[4]))
            named.emplace(strName, Attack::Fence::kLetsThrough);
    }
    std::multimap<std::string, Attack::Fence> made;
    for (const Attack& attack : attacks()) made.emplace(attack.strName, attack.fence);
    EXPECT_EQ(made, named);
}

// The attack is refused by a function of its row, or its first line is not refused.
TEST(SecurityPage, LinksToTheFunctionThatRefuses)
{
    std::set<std::string> all;
    for (const auto& row : rows("The trust table", 23)) {
        SCOPED_TRACE(row[0]);
        const auto functions = functionsIn(row[2]);
        EXPECT_FALSE(functions.empty());
        for (const auto& function : functions) all.insert(function.first);
        const std::set<std::string> names = attacksIn(row[3] + "," + row[4]);
        for (const Attack& attack : attacks()) {
            if (0 == names.count(attack.strName)) continue;
            const std::string strReason = refusal(attack);
            EXPECT_EQ(Attack::Guard::kRefuses != attack.guard, strReason.empty()) << attack.strName;
            std::size_t nFound = 0;
            for (const auto& function : functions)
                nFound += std::string::npos != function.second.find(strReason);
            EXPECT_LT(0U, nFound) << attack.strName << ": " << strReason;
        }
    }
    EXPECT_EQ((std::set<std::string>{"checkDeclared", "checkIndexed", "checkKept", "checkKind",
                                     "checkList", "checkOneRecord", "checkPaging", "checkQuota",
                                     "checkRawFilter", "checkSaved", "checkSorting", "checkText",
                                     "limitRows", "openNotes", "readCodePoint", "readCommand",
                                     "readLine"}),
              all);
    for (const auto& row : rows("The fence", 5))
        EXPECT_EQ(1U, functionsIn(row[1]).size()) << row[0];
}

}  // namespace
