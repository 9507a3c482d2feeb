// SPDX-License-Identifier: MIT
/// @file
/// The host: a table of notes, and commands of strangers for it.
///
///     {"op": "create", "record": {"id": 1, "text": "hello"}}
///     {"op": "save",   "record": {"id": 1, "text": "hello again"}}
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

#include <string>

// The types of the notes' members, as the guard reads them.
const Json::Value& noteTypes();

// A handle for the table "note", which it creates.
VornJsonDbApi openNotes(sqlite3* pDb);

// Does the command as it stands, unchecked: what guard and fence stand around. Adds what it reads
// to the answer and returns the library's result.
int perform(VornJsonDbApi& notes, Json::Value& jCommand, Json::Value& jAnswer);

// The access that the command needs.
Access accessOf(const Json::Value& jCommand);

class Host {
public:
    explicit Host(sqlite3* pDb) : notes_(openNotes(pDb)), fence_(pDb, "note") {}

    // Answers one line. Throws nothing but a lack of memory.
    Json::Value answer(const std::string& strLine);

private:
    VornJsonDbApi notes_;
    Fence fence_;
};

#endif
