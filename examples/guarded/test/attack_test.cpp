// SPDX-License-Identifier: MIT
// Every attack reaches its aim at a host without checks, and at the example it does not.

#include "attacks.h"

// As GoogleTest shows it.
void PrintTo(const Attack& attack, std::ostream* pStream)
{
    *pStream << attack.strName;
}

namespace {

using Layers = World::Layers;

class Attacked : public HostTest, public testing::WithParamInterface<Attack> {
protected:
    // Sends the attack to a new world and stops that.
    void attack(World& world)
    {
        for (const std::string& strLine : GetParam().lines) world.send(strLine);
        world.stop();
    }

    static std::string contentsBefore(Layers layers)
    {
        World world(layers, GetParam().uMoreNotes);
        world.stop();
        return world.contents();
    }

    static void expectRefused(const World& world)
    {
        if (Attack::Guard::kRefuses != GetParam().guard) return;
        EXPECT_TRUE(world.answers.at(0).isMember("refused")) << text(world.answers[0]);
    }
};

TEST_P(Attacked, HostWithoutChecksIsHit)
{
    World world(Layers::kNone, GetParam().uMoreNotes);
    attack(world);
    EXPECT_TRUE(GetParam().worked(world));
}

TEST_P(Attacked, HostWithTheGuardAloneIsNot)
{
    const std::string strBefore = contentsBefore(Layers::kGuard);
    World world(Layers::kGuard, GetParam().uMoreNotes);
    attack(world);
    EXPECT_FALSE(GetParam().worked(world));
    EXPECT_EQ(strBefore, world.contents());
    expectRefused(world);
}

TEST_P(Attacked, HostWithTheFenceAloneIsHitOnlyWhereItIsSaid)
{
    const std::string strBefore = contentsBefore(Layers::kFence);
    World world(Layers::kFence, GetParam().uMoreNotes);
    attack(world);
    const bool blStopped = Attack::Fence::kStops == GetParam().fence;
    EXPECT_EQ(blStopped, !GetParam().worked(world));
    EXPECT_EQ("s3cr3t", world.value("select secret from vault"));
    // An update by itself is not wrong, but what the host makes of it later.
    if (blStopped && kHostSavesAgain != GetParam().lines.back()) {
        EXPECT_EQ(strBefore, world.contents());
    }
}

TEST_P(Attacked, GuardedHostIsNotAndGoesOn)
{
    const std::string strBefore = contentsBefore(Layers::kBoth);
    World world(Layers::kBoth, GetParam().uMoreNotes);
    for (const std::string& strLine : GetParam().lines) world.send(strLine);
    expectRefused(world);
    world.send(R"({"op":"create","record":{"text":"fine"}})");
    EXPECT_EQ(0, world.answers.back()["result"].asInt()) << text(world.answers.back());
    EXPECT_EQ("fine", world.answers.back()["record"]["text"].asString());
    const std::string strId = text(world.answers.back()["record"]["id"]);
    world.send(R"({"op":"delete","request":{"id":)" + strId + "}}");
    EXPECT_EQ(1, world.answers.back()["result"].asInt());

    world.stop();
    EXPECT_FALSE(GetParam().worked(world));
    EXPECT_FALSE(world.blThrown);
    EXPECT_EQ(strBefore, world.contents());
}

INSTANTIATE_TEST_SUITE_P(Guarded, Attacked, testing::ValuesIn(attacks()),
                         [](const auto& attack) { return attack.param.strName; });

}  // namespace
