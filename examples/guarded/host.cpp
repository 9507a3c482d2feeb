// SPDX-License-Identifier: MIT
#include "host.h"

#include "guard.h"

#include <json/writer.h>

#include <memory>
#include <sstream>

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
        jMember["id"]["cpptype"] = "long long";
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

// Whether the request finds a note.
bool finds(VornJsonDbApi& notes, Json::Value jRequest)
{
    jRequest["limit"] = 1;
    Json::Value jNote;
    const int iFound = notes.recGetOne(jRequest, jNote);
    if (0 > iFound) throw std::runtime_error("a note cannot be looked up");
    return 0 < iFound;
}

// With more of them a list of the author's notes would take too many steps.
void checkQuota(VornJsonDbApi& notes, const Json::Value& jNote)
{
    Json::Value jLast;
    jLast["author"] = jNote["author"];
    jLast["offset"] = kMaxNotes - 1;
    if (finds(notes, jLast)) throw guard::Refused("the author has too many notes");
}

// A save would make a note where there is none, with any id, or take over another author's.
void checkSaved(VornJsonDbApi& notes, const Json::Value& jNote)
{
    Json::Value jSame;
    for (const char* szName : {"id", "author"}) jSame[szName] = jNote[szName];
    // The library ignores a condition without a value.
    if (!jNote.isMember("id") || !finds(notes, jSame))
        throw guard::Refused("the author has no such note");
}

// In ASCII, so that an answer is one line whatever is in it.
std::string toLine(const Json::Value& jValue)
{
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    const std::unique_ptr<Json::StreamWriter> pWriter(builder.newStreamWriter());
    std::ostringstream stream;
    stream.exceptions(std::ios::badbit);  // without memory it would end in the middle
    pWriter->write(jValue, &stream);
    return stream.str() + "\n";
}

}  // namespace

const Json::Value& noteTypes()
{
    return VORN_JSON_DB::recType(definition(), strTable);
}

VornJsonDbApi openNotes(sqlite3* pDb)
{
    // Without autoincrement the id of a deleted note would be given to another author's.
    std::string strCreate =
        "create table if not exists note (author text, done integer, "
        "id integer primary key autoincrement, text text, topics text); "
        "create index if not exists note_author on note (author)";
    return VornJsonDbApi(pDb, strTable, definition(), strCreate);
}

void checkNote(VornJsonDbApi& notes, const Json::Value& jCommand)
{
    const std::string strOperation = jCommand["op"].asString();
    if ("create" != strOperation && "save" != strOperation) return;
    Json::Value jNote = jCommand["record"];
    notes.fillDefaultValue(jNote, false);
    if ("create" == strOperation)
        checkQuota(notes, jNote);
    else
        checkSaved(notes, jNote);
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
        const int iResult = fence_.run(accessOf(jCommand), [&] {
            checkNote(notes_, jCommand);
            return perform(notes_, jCommand, jAnswer);
        });
        jAnswer["result"] = iResult;
        if (0 <= iResult) return jAnswer;
        jAnswer.clear();  // a list may hold what was read before the failure
        const std::string strReason = notes_.getErrMsg();
        jAnswer["error"] = strReason.empty() ? "failed" : strReason;
    } catch (const guard::Refused& refused) {
        jAnswer["refused"] = refused.what();
    } catch (const std::exception&) {
        // A value of the wrong kind, or a lack of memory. What it says is not for strangers.
        jAnswer.clear();
        jAnswer["error"] = "failed";
    }
    return jAnswer;
}

void Host::serve(const std::string& strLine, std::ostream& stream)
{
    try {
        stream << toLine(answer(strLine));
    } catch (const std::exception&) {
        stream << "{\"error\":\"failed\"}\n";
    }
    stream << std::flush;
}
