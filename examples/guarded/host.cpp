// SPDX-License-Identifier: MIT
#include "host.h"

#include "guard.h"

namespace {

std::string strTable = "note";

Json::Value& definition()
{
    static Json::Value jDefinition = [] {
        Json::Value jMade;
        Json::Value& jMember = jMade[strTable]["member"];
        jMember["author"]["cpptype"] = "string";
        jMember["author"]["cppDefaultValue"] = "nobody";
        jMember["done"]["cpptype"] = "bool";
        jMember["done"]["cppDefaultValue"] = false;
        jMember["id"]["cpptype"] = "int";
        jMember["text"]["cpptype"] = "string";
        jMember["text"]["cppDefaultValue"] = "";
        jMember["topics"]["cpptype"] = "Json::arrayValue";
        jMember["topics"]["cppDefaultValue"] = Json::Value(Json::arrayValue);
        return jMade;
    }();
    return jDefinition;
}

int save(VornJsonDbApi& notes, Json::Value& jRecord, Json::Value& jStored)
{
    jStored = jRecord;
    notes.fillDefaultValue(jStored, false);  // the record needs the member that comes last
    return notes.recSave(jStored, false);
}

}  // namespace

const Json::Value& noteTypes()
{
    return VORN_JSON_DB::recType(definition(), strTable);
}

VornJsonDbApi openNotes(sqlite3* pDb)
{
    std::string strCreate =
        "create table if not exists note (author text, done integer, id integer primary key, "
        "text text, topics text)";
    return VornJsonDbApi(pDb, strTable, definition(), strCreate);
}

int perform(VornJsonDbApi& notes, Json::Value& jCommand, Json::Value& jAnswer)
{
    const std::string strOperation = jCommand["op"].asString();
    if ("create" == strOperation) return notes.recCreate(jCommand["record"], jAnswer["record"]);
    if ("save" == strOperation) return save(notes, jCommand["record"], jAnswer["record"]);
    if ("list" == strOperation) return notes.recList(jCommand["request"], jAnswer["records"]);
    if ("get" == strOperation) return notes.recGetOne(jCommand["request"], jAnswer["record"]);
    if ("delete" == strOperation) return notes.recDelete(jCommand["request"]);
    return notes.recUpdateByFilter(jCommand["request"], jCommand["values"]);
}

Access accessOf(const Json::Value& jCommand)
{
    const std::string strOperation = jCommand["op"].asString();
    if ("create" == strOperation || "save" == strOperation) return Access::kInsert;
    if ("update" == strOperation) return Access::kUpdate;
    if ("delete" == strOperation) return Access::kDelete;
    return Access::kRead;
}

Json::Value Host::answer(const std::string& strLine)
{
    Json::Value jAnswer;
    try {
        Json::Value jCommand = guard::readCommand(strLine);
        guard::checkCommand(noteTypes(), jCommand);
        notes_.setErrMsg("");
        const int iResult =
            fence_.run(accessOf(jCommand), [&] { return perform(notes_, jCommand, jAnswer); });
        jAnswer["result"] = iResult;
        if (0 <= iResult) return jAnswer;
        jAnswer.clear();  // a list may hold what was read before the failure
        const std::string strReason = notes_.getErrMsg();
        jAnswer["error"] = strReason.empty() ? "failed" : strReason;
    } catch (const guard::Refused& refused) {
        jAnswer["refused"] = refused.what();
    } catch (const Json::Exception&) {
        // A value of the wrong kind. What it says is for the log, not for strangers.
        jAnswer.clear();
        jAnswer["error"] = "failed";
    }
    return jAnswer;
}
