// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The example's table, somebody else's table beside it, and Eve, who sends lines to the example, or
// to a host that passes what it reads to the library unchecked.
#pragma once

#include "support/database.h"

#include "examples/guarded/host.h"

#include <memory>
#include <string>
#include <vector>

// Eve's lines: the operation with its record or condition, and the options or values.
struct Command {
    std::string operator()(const std::string& strArgument, const std::string& strMore = "{}") const;

    const char* szOperation;
};
inline constexpr Command create{"create"}, save{"save"}, list{"list"}, get{"get"}, erase{"delete"},
    update{"update"};

std::string repeated(unsigned uTimes, const std::string& strText);

// As a host that never thought of strangers reads a line: at any depth, the last of equal keys.
Json::Value readAnything(const std::string& strLine);

// Lines for World::send(): Ann sends what follows, and the host itself reads note 3, which is
// Eve's, and saves it again.
inline constexpr char kAnn[] = "Ann: ";
inline constexpr char kHostSavesAgain[] = "(the host saves note 3 again)";

class World {
public:
    enum class Kind { kUnchecked, kExample };

    // Of the further notes, Eve gets as many as she may have.
    explicit World(Kind kind, unsigned uMoreNotes = 0);

    // Sends the lines and keeps their answers.
    void send(const std::string& strLines);

    // What is not Eve's, as text: the schema, the other table, and the notes of the others.
    std::string contents();

    std::vector<Json::Value> answers;
    bool blThrown = false;       // an exception reached the host
    bool blTransaction = false;  // one was open after the last line
    long long iSteps = 0;        // that SQLite took
    std::string strBefore;       // the contents before the first line
    Database database;

private:
    Json::Value answer(const std::string& strAuthor, const std::string& strLine);
    Json::Value perform(const std::string& strAuthor, const Json::Value& jCommand);
    void saveAgain();

    Kind kind_;
    std::unique_ptr<VornJsonDbApi> pNotes_;  // unchecked
};
