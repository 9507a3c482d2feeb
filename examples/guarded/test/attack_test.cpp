// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every attack succeeds against a host without checks, and fails against the example. SECURITY.md
// names each, and whether it is refused.

#include "attacks.h"
#include "support/markdown.h"

#include <algorithm>

namespace {

using Kind = World::Kind;

class Attacked : public HostTest, public testing::WithParamInterface<std::size_t> {
protected:
    const Attack& attack_ = attacks()[GetParam()];
};

void expectAnnGoesOn(World& world)
{
    world.send(kAnn + create(R"({"body":"fine"})"));
    const Json::Value jAnswer = world.answers.back();
    EXPECT_EQ("fine", jAnswer["record"]["body"].asString()) << text(jAnswer);
    world.send(kAnn + erase(R"({"id":)" + text(jAnswer["record"]["id"]) + "}"));
    EXPECT_EQ(1, world.answers.back()["result"].asInt());
}

TEST_P(Attacked, SucceedsWhereNothingIsChecked)
{
    World world(Kind::kUnchecked, attack_.uMoreNotes);
    world.send(attack_.strLines);
    EXPECT_TRUE(attack_.worked(world));
}

TEST_P(Attacked, FailsAgainstTheExample)
{
    World world(Kind::kExample, attack_.uMoreNotes);
    world.send(attack_.strLines);
    EXPECT_FALSE(attack_.worked(world));
    EXPECT_FALSE(world.blThrown);
    for (const Json::Value& jAnswer : world.answers) EXPECT_FALSE(jAnswer.isMember("error"));
    expectAnnGoesOn(world);
    EXPECT_EQ(world.strBefore, world.contents());
    EXPECT_TRUE(doubles::state().log.empty());
}

INSTANTIATE_TEST_SUITE_P(Guarded, Attacked, testing::Range(std::size_t(0), attacks().size()),
                         [](const auto& attack) { return attacks()[attack.param].strName; });

// One name after the other, as often as they are there.
std::vector<std::string> namesIn(const std::string& strCells)
{
    std::vector<std::string> names = matches(strCells, "[a-z0-9_]+", {0});
    std::sort(names.begin(), names.end());
    return names;
}

class SecurityPage : public HostTest {};

TEST_F(SecurityPage, NamesEveryAttackOnce)
{
    std::string strNamed[2];
    for (const auto& row : table(readPage("../SECURITY.md"), "The trust table", 24).rows)
        for (const std::size_t i : {0U, 1U}) strNamed[i] += row[3 + i] + ",";
    std::string strMade[2];
    for (const Attack& attack : attacks()) {
        World world(Kind::kExample, attack.uMoreNotes);
        world.send(attack.strLines);
        strMade[world.answers.at(0).isMember("refused") ? 0 : 1] += attack.strName + ",";
    }
    for (const int i : {0, 1}) EXPECT_EQ(namesIn(strMade[i]), namesIn(strNamed[i]));
}

}  // namespace
