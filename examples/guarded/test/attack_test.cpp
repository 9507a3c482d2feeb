// SPDX-License-Identifier: MIT
// Every attack succeeds against a host without checks, and fails against the example. The trust
// table of SECURITY.md names every attack, and functions that exist.

#include "attacks.h"
#include "support/markdown.h"

#include <algorithm>
#include <map>
#include <set>

namespace {

using Layers = World::Layers;

class Attacked : public HostTest, public testing::WithParamInterface<std::size_t> {};

void expectGoesOn(World& world)
{
    world.send(create(R"({"text":"fine"})"));
    const Json::Value jAnswer = world.answers.back();
    EXPECT_EQ(0, jAnswer["result"].asInt()) << text(jAnswer);
    EXPECT_EQ("fine", jAnswer["record"]["text"].asString());
    world.send(erase(R"({"id":)" + text(jAnswer["record"]["id"]) + "}"));
    EXPECT_EQ(1, world.answers.back()["result"].asInt());
}

TEST_P(Attacked, IsHitOnlyWhereNothingStopsTheAttack)
{
    const Attack& attack = attacks()[GetParam()];
    for (const Layers layers : {Layers::kNone, Layers::kGuard, Layers::kFence, Layers::kBoth}) {
        SCOPED_TRACE(static_cast<int>(layers));
        doubles::state().log.clear();
        World world(layers, attack.uMoreNotes);
        world.send(attack.strLines);
        const bool blGuard = Layers::kGuard == layers || Layers::kBoth == layers;
        if (blGuard && Attack::Guard::kRefuses == attack.guard) {
            EXPECT_TRUE(world.answers.at(0).isMember("refused")) << text(world.answers[0]);
        }
        if (Layers::kBoth == layers) {
            EXPECT_FALSE(world.blThrown);
            expectGoesOn(world);
        }
        world.stop();
        const bool blHit =
            !blGuard && (Layers::kNone == layers || Attack::Fence::kLetsThrough == attack.fence);
        EXPECT_EQ(blHit, attack.worked(world));
        if (Layers::kNone == layers) continue;
        EXPECT_EQ("s3cr3t", world.database.value("select secret from vault"));
        // The update itself does no harm, but what the host makes of it later does.
        if (!blHit && (blGuard || std::string::npos == attack.strLines.find(kHostSavesAgain))) {
            EXPECT_EQ(world.strBefore, world.contents());
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, Attacked, testing::Range(std::size_t(0), attacks().size()),
                         [](const auto& attack) { return attacks()[attack.param].strName; });

std::vector<std::vector<std::string>> rows(const char* szHeading, std::size_t nRows)
{
    return table(readPage("../SECURITY.md"), szHeading, nRows).rows;
}

std::vector<std::string> attacksIn(const std::string& strCell)
{
    return matches(strCell, "[a-z0-9_]+", {0});
}

// The functions that a cell links to, with the text of their definitions in the linked file.
std::map<std::string, std::string> functionsIn(const std::string& strCell)
{
    std::map<std::string, std::string> functions;
    const auto links = matches(strCell, R"(\[`([\w:]+)`\]\((examples/guarded/\w+\.cpp)\))", {1, 2});
    for (std::size_t i = 0; i < links.size(); i += 2) {
        const auto definitions =
            matches(fileText(links[i + 1]),
                    "\n\\w[^\n;]*[ &]" + links[i] + R"(\([^;{]*\{\n(?:[^}\n][^\n]*\n|\n)*\})", {0});
        EXPECT_EQ(1U, definitions.size()) << links[i];
        functions[links[i]] = definitions.empty() ? "" : definitions[0];
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
    return replaced(replaced(strReason, "^\"\\w+\"", ""), "\"", "\\\"");
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
        const auto names = attacksIn(row[3] + "," + row[4]);
        for (const Attack& attack : attacks()) {
            if (0 == std::count(names.begin(), names.end(), attack.strName)) continue;
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
