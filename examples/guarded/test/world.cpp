// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "world.h"

#include <json/reader.h>

#include <sstream>

namespace {

constexpr int kReaderDepth = 12000;

int addSteps(unsigned, void* pSteps, void* pStatement, void*)
{
    *static_cast<long long*>(pSteps) +=
        sqlite3_stmt_status(static_cast<sqlite3_stmt*>(pStatement), SQLITE_STMTSTATUS_VM_STEP, 1);
    return 0;
}

}  // namespace

std::string Command::operator()(const std::string& strArgument, const std::string& strMore) const
{
    const std::string strOperation = szOperation;
    const bool blRecord = "create" == strOperation || "save" == strOperation;
    const char* szMore = "list" == strOperation     ? R"(,"options":)"
                         : "update" == strOperation ? R"(,"values":)"
                                                    : nullptr;
    return R"({"op":")" + strOperation + (blRecord ? R"(","record":)" : R"(","condition":)") +
           strArgument + (nullptr == szMore ? "" : szMore + strMore) + "}";
}

std::string repeated(unsigned uTimes, const std::string& strText)
{
    std::string strAll;
    for (unsigned u = 0; u < uTimes; ++u) strAll += strText;
    return strAll;
}

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

World::World(Kind kind, unsigned uMoreNotes) : kind_(kind)
{
    database.run("create table vault (secret text); insert into vault values ('s3cr3t')");
    // A host that does not think of strangers gives out the id of a deleted note again.
    if (Kind::kUnchecked == kind_)
        database.run(
            "create table note (author text, body text, done integer, id integer primary key, "
            "title text, topics text)");
    EXPECT_EQ("", Host(database.get(), "").failure());
    database.run(
        "insert into note values ('Ann','first',0,1,'','[]'),('Bob','second',0,2,'','[]'),"
        "('Eve','third',0,3,'','[]'),('Bob','twelfth',0,12,'','[]')");
    database.run(
        "with recursive n(i) as (select 100 union all select i + 1 from n) insert into note "
        "select case when i < 99 + " +
        std::to_string(kMaxNotes) + " then 'Eve' else 'crowd' end,'',0,i,'','[]' from n limit " +
        std::to_string(uMoreNotes));
    if (Kind::kUnchecked == kind_) {
        std::string strTable = "note";
        std::string strCreate = "select 1";
        Json::Value jDefinition = noteDefinition();
        pNotes_ = std::make_unique<VornJsonDbApi>(database.get(), strTable, jDefinition, strCreate);
    }
    strBefore = contents();
    sqlite3_trace_v2(database.get(), SQLITE_TRACE_PROFILE, addSteps, &iSteps);
}

// The request of the library has no other place for options.
Json::Value World::perform(const std::string& strAuthor, const Json::Value& jCommand)
{
    Json::Value jRequest = jCommand["condition"];
    for (const std::string& strName : jCommand["options"].getMemberNames())
        jRequest["sort" == strName ? "sort_by" : strName] =
            "sort" == strName ? jCommand["options"][strName][0] : jCommand["options"][strName];
    Json::Value jRecord = jCommand["record"];
    if (jRecord.isObject() && !jRecord.isMember("author")) jRecord["author"] = strAuthor;
    Json::Value jValues = jCommand["values"];
    Json::Value jAnswer;
    Json::Value& jResult = jAnswer["result"];
    const std::string strOperation = jCommand["op"].asString();
    if ("create" == strOperation) jResult = pNotes_->recCreate(jRecord, jAnswer["record"]);
    if ("save" == strOperation) {
        pNotes_->fillDefaultValue(jRecord, false);
        jResult = pNotes_->recSave(jRecord, false);
    }
    if ("list" == strOperation) jResult = pNotes_->recList(jRequest, jAnswer["records"]);
    if ("get" == strOperation) jResult = pNotes_->recGetOne(jRequest, jAnswer["record"]);
    if ("delete" == strOperation) jResult = pNotes_->recDelete(jRequest);
    if ("update" == strOperation) jResult = pNotes_->recUpdateByFilter(jRequest, jValues);
    return jAnswer;
}

Json::Value World::answer(const std::string& strAuthor, const std::string& strLine)
{
    return Kind::kExample == kind_ ? Host(database.get(), strAuthor).answer(strLine)
                                   : perform(strAuthor, readAnything(strLine));
}

void World::send(const std::string& strLines)
{
    std::istringstream stream(strLines);
    for (std::string strLine; std::getline(stream, strLine);) {
        const bool blAnn = 0 == strLine.rfind(kAnn, 0);
        if (blAnn) strLine.erase(0, sizeof kAnn - 1);
        try {
            if (kHostSavesAgain == strLine)
                saveAgain();
            else
                answers.push_back(answer(blAnn ? "Ann" : "Eve", strLine));
        } catch (const std::exception&) {
            blThrown = true;
        }
    }
    blTransaction = 0 == sqlite3_get_autocommit(database.get());
    if (blTransaction) database.run("rollback");
}

void World::saveAgain()
{
    Json::Value jRecord = answer("Eve", get(R"({"id":3})"))["record"];
    jRecord.removeMember("author");
    const Json::Value jAnswer = answer("Eve", save(text(jRecord)));
    EXPECT_TRUE(jAnswer.isMember("result")) << text(jAnswer);
}

std::string World::contents()
{
    std::string strContents;
    for (const char* szSql : {"select sql from sqlite_master order by name", "select * from vault",
                              "select * from note where author <> 'Eve' order by id"})
        for (const auto& row : database.rows(szSql))
            for (const std::string& strCell : row) strContents += strCell + "|";
    return strContents;
}
