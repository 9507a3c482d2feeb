// SPDX-License-Identifier: MIT
// Every attack reaches its aim at a host without checks, and at the example it does not.

#include "attacks.h"

namespace {

using Layers = World::Layers;

class Attacked : public HostTest, public testing::WithParamInterface<std::size_t> {
protected:
    // Sends the attack to a new world and looks at it afterwards.
    void attack(Layers layers, bool blHit)
    {
        World world(layers, attack_.uMoreNotes);
        world.send(attack_.strLines);
        const bool blGuard = Layers::kGuard == layers || Layers::kBoth == layers;
        if (blGuard && Attack::Guard::kRefuses == attack_.guard) {
            EXPECT_TRUE(world.answers.at(0).isMember("refused")) << text(world.answers[0]);
        }
        if (Layers::kBoth == layers) {
            EXPECT_FALSE(world.blThrown);
            expectGoesOn(world);
        }
        world.stop();
        EXPECT_EQ(blHit, attack_.worked(world));
        if (Layers::kNone == layers) return;
        EXPECT_EQ("s3cr3t", world.database.value("select secret from vault"));
        // An update by itself is not wrong, but what the host makes of it later.
        if (!blHit && (blGuard || std::string::npos == attack_.strLines.find(kHostSavesAgain))) {
            EXPECT_EQ(world.strBefore, world.contents());
        }
    }

    static void expectGoesOn(World& world)
    {
        world.send(create(R"({"text":"fine"})"));
        const Json::Value jAnswer = world.answers.back();
        EXPECT_EQ(0, jAnswer["result"].asInt()) << text(jAnswer);
        EXPECT_EQ("fine", jAnswer["record"]["text"].asString());
        world.send(erase(R"({"id":)" + text(jAnswer["record"]["id"]) + "}"));
        EXPECT_EQ(1, world.answers.back()["result"].asInt());
    }

    const Attack& attack_ = attacks()[GetParam()];
};

TEST_P(Attacked, HostWithoutChecksIsHit)
{
    attack(Layers::kNone, true);
}

TEST_P(Attacked, HostWithTheGuardAloneIsNot)
{
    attack(Layers::kGuard, false);
}

TEST_P(Attacked, HostWithTheFenceAloneIsHitOnlyWhereItIsSaid)
{
    attack(Layers::kFence, Attack::Fence::kLetsThrough == attack_.fence);
}

TEST_P(Attacked, GuardedHostIsNotAndGoesOn)
{
    attack(Layers::kBoth, false);
}

INSTANTIATE_TEST_SUITE_P(Guarded, Attacked, testing::Range(std::size_t(0), attacks().size()),
                         [](const auto& attack) { return attacks()[attack.param].strName; });

}  // namespace
