// SPDX-License-Identifier: MIT
// Every attack succeeds against a host without checks, and fails against the example.

#include "attacks.h"

namespace {

using Layers = World::Layers;

class Attacked : public HostTest, public testing::WithParamInterface<std::size_t> {
protected:
    static void expectGoesOn(World& world)
    {
        world.send(create(R"({"text":"fine"})"));
        const Json::Value jAnswer = world.answers.back();
        EXPECT_EQ(0, jAnswer["result"].asInt()) << text(jAnswer);
        EXPECT_EQ("fine", jAnswer["record"]["text"].asString());
        world.send(erase(R"({"id":)" + text(jAnswer["record"]["id"]) + "}"));
        EXPECT_EQ(1, world.answers.back()["result"].asInt());
    }
};

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

}  // namespace
