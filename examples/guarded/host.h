// SPDX-License-Identifier: MIT
/// @file
/// The host: a table of notes, and commands of strangers for it.
///
///     {"op": "create", "record": {"author": "Ann", "text": "hello"}}
///     {"op": "save",   "record": {"id": 1, "author": "Ann", "text": "hello again"}}
///     {"op": "list",   "request": {"author": "Ann", "limit": 10, "offset": 20}}
///     {"op": "get",    "request": {"id": 1}}
///     {"op": "update", "request": {"id": 1}, "values": {"done": true}}
///     {"op": "delete", "request": {"id": 1}}
///
/// Each has one answer: {"result": 0, "record": {...}}, {"result": 0, "records": [...]},
/// {"result": 1}, {"refused": "reason"} or {"error": "reason"}.
#ifndef EXAMPLES_GUARDED_HOST_H
#define EXAMPLES_GUARDED_HOST_H

#include "fence.h"

#include <VornJsonDbApi.h>

#include <ostream>
#include <string>

// How many notes an author may have.
constexpr int kMaxNotes = 1000;

// The types of the notes' members, as the guard reads them.
const Json::Value& noteTypes();

// A handle for the table "note", which it creates with an index on the author.
VornJsonDbApi openNotes(sqlite3* pDb);

// Checks what only the table can tell about a command that the guard lets through. Refuses in the
// same way.
void checkNote(VornJsonDbApi& notes, const Json::Value& jCommand);

// Performs the command unchecked; guard and fence surround this call. Adds what it reads to the
// answer and returns the library's result.
int perform(VornJsonDbApi& notes, Json::Value& jCommand, Json::Value& jAnswer);

// The access that the command needs.
Access accessOf(const Json::Value& jCommand);

class Host {
public:
    explicit Host(sqlite3* pDb) : notes_(openNotes(pDb)), fence_(pDb, "note") {}

    // Answers one line. Throws only if memory runs out.
    Json::Value answer(const std::string& strLine);

    // Writes the answer as a line, which says "failed" if memory runs out. Throws nothing.
    void serve(const std::string& strLine, std::ostream& stream);

private:
    VornJsonDbApi notes_;
    Fence fence_;
};

#endif
