// SPDX-License-Identifier: MIT
#include "world.h"

#include "examples/guarded/guard.h"

#include <json/reader.h>

#include <sstream>

namespace {

constexpr int kReaderDepth = 12000;

// As a host that never thought of strangers reads a line: at any depth, the last of equal keys.
Json::Value readAnything(const std::string& strLine)
{
    Json::CharReaderBuilder builder;
    builder["stackLimit"] = kReaderDepth;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jCommand;
    std::string strError;
    EXPECT_TRUE(
        pReader->parse(strLine.data(), strLine.data() + strLine.size(), &jCommand, &strError))
        << strError;
    return jCommand;
}

int countSteps(void* pWorld)
{
    ++static_cast<World*>(pWorld)->iSteps;
    return 0;
}

}  // namespace

std::string command(const char* szOperation, const std::string& strArgument,
                    const std::string& strValues)
{
    const std::string strOperation = szOperation;
    const bool blRecord = "create" == strOperation || "save" == strOperation;
    return R"({"op":")" + strOperation + (blRecord ? R"(","record":)" : R"(","request":)") +
           strArgument + (strValues.empty() ? "" : R"(,"values":)" + strValues) + "}";
}

std::string repeated(unsigned uTimes, const std::string& strText)
{
    std::string strAll;
    for (unsigned u = 0; u < uTimes; ++u) strAll += strText;
    return strAll;
}

World::World(Layers layers, unsigned uMoreNotes) : layers_(layers)
{
    database.run("create table vault (secret text); insert into vault values ('s3cr3t')");
    // The table of a host without the guard gives out the greatest id again when its note is gone.
    if (Layers::kNone == layers_ || Layers::kFence == layers_)
        database.run(
            "create table note (author text, done integer, id integer primary key, text text, "
            "topics text)");
    {
        const VornJsonDbApi notes = openNotes(database.get());
        database.run(
            "insert into note values ('Ann',0,1,'first','[]'),('Bob',0,2,'second','[]'),"
            "('Eve',0,12,'twelfth','[]')");
        database.run(
            "with recursive n(i) as (select 100 union all select i + 1 from n) "
            "insert into note select 'crowd',0,i,'','[]' from n limit " +
            std::to_string(uMoreNotes));
    }
    strBefore = contents();
    if (Layers::kBoth == layers_) {
        pHost_ = std::make_unique<Host>(database.get());
        return;
    }
    pNotes_.reset(new VornJsonDbApi(openNotes(database.get())));
    if (Layers::kFence == layers_)
        pFence_ = std::make_unique<Fence>(database.get(), "note");
    else
        sqlite3_progress_handler(database.get(), 1000, countSteps, this);
}

Json::Value World::call(Json::Value& jCommand)
{
    Json::Value jAnswer;
    const auto work = [&] { return perform(*pNotes_, jCommand, jAnswer); };
    const int iResult = pFence_ ? pFence_->run(accessOf(jCommand), work) : work();
    // No host hands out what a list read before it failed.
    if (0 > iResult) jAnswer.clear();
    jAnswer["result"] = iResult;
    return jAnswer;
}

Json::Value World::answer(const std::string& strLine)
{
    if (pHost_) return pHost_->answer(strLine);
    if (Layers::kGuard != layers_) {
        Json::Value jCommand = readAnything(strLine);
        return call(jCommand);
    }
    try {
        Json::Value jCommand = guard::readCommand(strLine);
        guard::checkCommand(noteTypes(), jCommand);
        checkNote(*pNotes_, jCommand);
        return call(jCommand);
    } catch (const guard::Refused& refused) {
        Json::Value jAnswer;
        jAnswer["refused"] = refused.what();
        return jAnswer;
    }
}

void World::send(const std::string& strLines)
{
    std::istringstream stream(strLines);
    for (std::string strLine; std::getline(stream, strLine);) {
        try {
            if (kHostSavesAgain == strLine)
                saveAgain();
            else
                answers.push_back(answer(strLine));
        } catch (const std::exception&) {
            blThrown = true;
        }
    }
    blTransaction = 0 == sqlite3_get_autocommit(database.get());
}

void World::saveAgain()
{
    Json::Value jGet = json(R"({"op":"get","request":{"id":1}})");
    Json::Value jSave = json(R"({"op":"save"})");
    jSave["record"] = (pHost_ ? pHost_->answer(text(jGet)) : call(jGet))["record"];
    const Json::Value jAnswer = pHost_ ? pHost_->answer(text(jSave)) : call(jSave);
    EXPECT_TRUE(jAnswer.isMember("result")) << text(jAnswer);
}

void World::stop()
{
    pFence_.reset();
    pHost_.reset();
    pNotes_.reset();
    sqlite3_progress_handler(database.get(), 0, nullptr, nullptr);
    if (blTransaction) database.run("rollback");
}

std::string World::contents()
{
    std::string strContents;
    for (const char* szSql : {"select sql from sqlite_master order by name", "select * from vault",
                              "select * from note order by id"})
        for (const auto& row : database.rows(szSql))
            for (const std::string& strCell : row) strContents += strCell + "|";
    return strContents;
}
