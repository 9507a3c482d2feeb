// SPDX-License-Identifier: MIT
#include "aims.h"

#include <algorithm>

namespace aims {
namespace {

bool isLogged(const char* szText)
{
    const auto& log = doubles::state().log;
    return std::any_of(log.begin(), log.end(), [szText](const doubles::LogRecord& record) {
        return std::string::npos != record.strText.find(szText);
    });
}

}  // namespace

bool vaultIsEmpty(World& world)
{
    return "0" == world.value("select count(*) from vault");
}

bool vaultIsGone(World& world)
{
    return "0" == world.value("select count(*) from sqlite_master where name = 'vault'");
}

bool secretIsTold(World& world)
{
    return std::any_of(world.answers.begin(), world.answers.end(), [](const Json::Value& jAnswer) {
        return std::string::npos != text(jAnswer).find("s3cr3t");
    });
}

bool answersTheQuestion(World& world)
{
    return 0 < world.answers.at(0)["records"].size();
}

bool connectionIsReadOnly(World& world)
{
    const bool blReadOnly = "1" == world.value("pragma query_only");
    world.database().run("pragma query_only=0");
    return blReadOnly;
}

bool transactionIsOpen(World& world)
{
    return world.blTransaction;
}

bool noteIsForged(World& world)
{
    return "1" == world.value("select count(*) from note where text = 'forged'");
}

bool everyNoteIsDeleted(World& world)
{
    return "0" == world.value("select count(*) from note");
}

bool noteTwoIsDeleted(World& world)
{
    return "0" == world.value("select count(*) from note where id = 2");
}

bool noteTwelveIsDeleted(World& world)
{
    return "0" == world.value("select count(*) from note where id = 12");
}

bool everyNoteIsTold(World& world)
{
    return 3 == world.answers.at(0)["records"].size();
}

bool thousandsAreTold(World& world)
{
    return 1000 < world.answers.at(0)["records"].size();
}

bool annIsImitated(World& world)
{
    return "2" == world.value("select count(*) from note where author = 'Ann'");
}

bool annIsTold(World& world)
{
    return "Ann" == world.answers.at(0)["records"][0]["author"].asString();
}

bool authorIsAnother(World& world)
{
    return "1" == world.value("select count(*) from note where id = 7 and author <> '50%s'");
}

bool hostIsThrownAt(World& world)
{
    return world.blThrown;
}

bool idsAreUsedUp(World& world)
{
    return "2147483647" == world.value("select max(id) from note");
}

bool noteIsEves(World& world)
{
    return "1" == world.value("select count(*) from note where id = 1 and author = 'Eve'");
}

bool newNoteIsChanged(World& world)
{
    return "1" == world.value("select count(*) from note where author = 'Eve' and text = 'Ann'");
}

bool crowdGrows(World& world)
{
    return "1001" == world.value("select count(*) from note where author = 'crowd'");
}

bool topicsAreLost(World& world)
{
    const Json::Value& jAnswer = world.answers.at(0);
    return 0 == jAnswer["result"].asInt() && jAnswer["record"].isMember("topics") &&
           jAnswer["record"]["topics"].isNull();
}

bool noteIsHuge(World& world)
{
    return "1" == world.value("select count(*) from note where length(text || author) > 4000000");
}

bool noteHasManyValues(World& world)
{
    return 3000 < world.answers.at(0)["record"]["topics"].size();
}

bool answerIsHuge(World& world)
{
    return 5000000 < text(world.answers.back()).size();
}

bool authorIsNoUtf8(World& world)
{
    return "1" == world.value("select count(*) from note where hex(author) = 'FF'");
}

bool logLineIsForged(World&)
{
    return isLogged("\nroot logged in");
}

bool logHasControls(World&)
{
    return isLogged("\xc2\x85") || isLogged("\xc2\x9b") || isLogged("\xe2\x80\xa8") ||
           isLogged("\xe2\x80\xae");
}

bool tableIsScanned(World& world)
{
    return 100 < world.iSteps;
}

bool sqliteIsBusy(World& world)
{
    return 10000 < world.iSteps;
}

}  // namespace aims
