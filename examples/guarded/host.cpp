// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "host.h"

#include <json/reader.h>
#include <json/writer.h>

#include <stdexcept>

namespace {

// The reason may be told to the user.
class Refused : public std::runtime_error {
    using std::runtime_error::runtime_error;
};

void refuseIf(bool blBad, const std::string& strReason)
{
    if (blBad) throw Refused(strReason);
}

// Ids are never used again: a user may still hold that of a deleted note.
constexpr char kCreate[] =
    "create table if not exists note (author text not null, body text, done integer, "
    "id integer primary key autoincrement, title text, topics text);"
    "create index if not exists note_author on note (author)";

VornJsonTable::Limits limits()
{
    VornJsonTable::Limits limits;
    limits.nRequestMembers = 200;
    limits.nAnswerRows = 100;
    limits.nAnswerBytes = 1000000;
    limits.nSteps = 2000000;
    return limits;
}

Json::Value parsed(const std::string& strLine)
{
    refuseIf(kMaxLine < strLine.size(), "the command is too long");
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);  // also refuses a duplicate key
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jCommand;
    bool blRead = false;
    try {
        const char* szLine = strLine.data();
        blRead = pReader->parse(szLine, szLine + strLine.size(), &jCommand, nullptr);
    } catch (const Json::RuntimeError&) {
        throw Refused("the command is nested too deep");
    }
    refuseIf(!blRead || !jCommand.isObject(), "the command is not a JSON object");
    return jCommand;
}

// The operation of a command that has all its members, and no others.
std::string operationOf(const Json::Value& jCommand)
{
    static const std::map<std::string, Json::Value::Members> operations = {
        {"create", {"op", "record"}}, {"delete", {"condition", "op"}},
        {"get", {"condition", "op"}}, {"list", {"condition", "op", "options"}},
        {"save", {"op", "record"}},   {"update", {"condition", "op", "values"}}};
    const Json::Value& jOperation = jCommand["op"];
    const auto found = operations.find(jOperation.isString() ? jOperation.asString() : "");
    refuseIf(operations.end() == found, "there is no such operation");
    refuseIf(found->second != jCommand.getMemberNames(), "the command has other members");
    for (const std::string& strName : found->second)
        refuseIf("op" != strName && !jCommand[strName].isObject(),
                 "the " + strName + " is not an object");
    return found->first;
}

// SQLite makes the ids, and the host knows the author.
void refuseMembers(const Json::Value& jRecord, const std::vector<std::string>& names)
{
    for (const std::string& strName : names)
        refuseIf(jRecord.isMember(strName), "\"" + strName + "\" cannot be set");
}

// The patterns of a condition: each is compared at every place of every text, and SQLite counts
// that as one step.
std::size_t patternBytes(const Json::Value& jCondition)
{
    std::size_t nBytes = 0;
    for (auto it = jCondition.begin(); it != jCondition.end(); ++it) {
        if (jCondition.isObject() && "$like" == it.name() && it->isString())
            nBytes += it->asString().size();
        nBytes += patternBytes(*it);
    }
    return nBytes;
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

Json::Value noteDefinition()
{
    Json::Value jDefinition;
    Json::Value& jMember = jDefinition["note"]["member"];
    jMember["author"]["cpptype"] = "string";
    jMember["body"]["cpptype"] = "string";
    jMember["done"]["cpptype"] = "bool";
    jMember["done"]["cppDefaultValue"] = false;
    jMember["id"]["cpptype"] = "long long";
    jMember["title"]["cpptype"] = "string";
    jMember["topics"]["cpptype"] = "Json::arrayValue";
    jMember["topics"]["cppDefaultValue"] = Json::Value(Json::arrayValue);
    return jDefinition;
}

bool readLine(std::istream& stream, std::string& strLine)
{
    strLine.clear();
    char c = 0;
    while (stream.get(c) && '\n' != c)
        if (kMaxLine >= strLine.size()) strLine += c;
    return stream.good() || !strLine.empty();
}

Host::Host(sqlite3* pDb, const std::string& strAuthor)
    : notes_(pDb, "note", noteDefinition(), kCreate), strFailure_(notes_.reason())
{
    jAll_["author"] = strAuthor;
    notes_.setLimits(limits());
}

// Whatever the user asks for, it is in the notes of the author.
Json::Value Host::mine(const Json::Value& jCondition) const
{
    Json::Value jMine = jAll_;
    jMine["$and"].append(jCondition);
    return jMine;
}

// The result of a call that did not fail.
Json::Value Host::done(long long iResult) const
{
    using Cause = VornJsonTable::Cause;
    const Cause cause = notes_.cause();
    refuseIf(Cause::kRefused == cause || Cause::kLimit == cause, notes_.reason());
    if (0 > iResult) throw std::runtime_error(notes_.reason());
    return Json::Int64(iResult);
}

Json::Value Host::create(Json::Value jRecord, Json::Value& jStored)
{
    refuseMembers(jRecord, {"author", "id"});
    refuseIf(done(notes_.count(jAll_)) >= kMaxNotes, "there are too many notes");
    jRecord["author"] = jAll_["author"];
    return done(notes_.create(jRecord, jStored));
}

Json::Value Host::save(const Json::Value& jRecord, Json::Value& jStored)
{
    refuseMembers(jRecord, {"author"});
    Json::Value jSame;
    jSame["id"]["$eq"] = jRecord["id"];
    refuseIf(done(notes_.count(mine(jSame))) != 1, "there is no such note");
    return done(notes_.save(jRecord, jStored));
}

Json::Value Host::perform(const Json::Value& jCommand)
{
    const std::string strOperation = operationOf(jCommand);
    const Json::Value& jAsked = jCommand["condition"];
    refuseIf(kMaxPatterns < patternBytes(jAsked), "the patterns are too long");
    Json::Value jAnswer;
    Json::Value& jResult = jAnswer["result"];
    if ("create" == strOperation) {
        jResult = create(jCommand["record"], jAnswer["record"]);
    } else if ("save" == strOperation) {
        jResult = save(jCommand["record"], jAnswer["record"]);
    } else if ("list" == strOperation) {
        jResult = done(notes_.list(jAsked.empty() ? jAll_ : mine(jAsked), jCommand["options"],
                                   jAnswer["records"]));
    } else if ("get" == strOperation) {
        jResult = done(notes_.get(mine(jAsked), jAnswer["record"]));
    } else if ("update" == strOperation) {
        refuseMembers(jCommand["values"], {"author", "id"});
        jResult = done(notes_.update(mine(jAsked), jCommand["values"]));
    } else {
        jResult = done(notes_.remove(mine(jAsked)));
    }
    return jAnswer;
}

Json::Value Host::answer(const std::string& strLine)
{
    Json::Value jAnswer;
    try {
        return perform(parsed(strLine));
    } catch (const Refused& refused) {
        jAnswer["refused"] = refused.what();
    } catch (const std::exception&) {
        // A lock, the disk or a lack of memory. What it says is not for users.
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
