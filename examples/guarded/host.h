// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// The host: a table of notes, and the commands of one of its users.
///
///     {"op": "create", "record": {"title": "Tea", "topics": ["kitchen"]}}
///     {"op": "save",   "record": {"id": 1, "body": "2 cups"}}
///     {"op": "list",   "condition": {"done": false}, "options": {"sort": ["-id"], "limit": 10}}
///     {"op": "get",    "condition": {"id": 1}}
///     {"op": "update", "condition": {"id": {"$in": [1, 2]}}, "values": {"done": true}}
///     {"op": "delete", "condition": {"id": 1}}
///
/// Each has one answer: {"result": 0, "record": {...}}, {"result": 2, "records": [...]},
/// {"result": 1}, {"refused": "reason"} or {"error": "failed"}.
#ifndef EXAMPLES_GUARDED_HOST_H
#define EXAMPLES_GUARDED_HOST_H

#include <VornJsonTable.h>

#include <istream>
#include <ostream>

constexpr std::size_t kMaxLine = 8 * 1024;
// How many notes an author may have.
constexpr int kMaxNotes = 1000;
// How many bytes the patterns of a condition may have.
constexpr std::size_t kMaxPatterns = 30;

// Reads a line; false at the end of the stream. Of a line that is too long it keeps one byte more
// than is allowed and drops the rest.
bool readLine(std::istream& stream, std::string& strLine);

// Of the table "note".
Json::Value noteDefinition();

// It reaches the notes of the author only, who has to have logged in.
class Host {
public:
    Host(sqlite3* pDb, const std::string& strAuthor);

    // Why the table cannot be used; empty if it can.
    const std::string& failure() const { return strFailure_; }

    // Answers one line. Throws only if memory runs out.
    Json::Value answer(const std::string& strLine);

    // Writes the answer as a line, which says "failed" if memory runs out. Throws nothing.
    void serve(const std::string& strLine, std::ostream& stream);

private:
    Json::Value perform(const Json::Value& jCommand);
    Json::Value create(Json::Value jRecord, Json::Value& jStored);
    Json::Value save(const Json::Value& jRecord, Json::Value& jStored);
    Json::Value mine(const Json::Value& jCondition) const;
    Json::Value done(long long iResult) const;

    VornJsonTable notes_;
    Json::Value jAll_;  // the condition of all notes of the author
    std::string strFailure_;
};

#endif
