// SPDX-License-Identifier: MIT
// The example's tables, somebody else's table beside them, and the host with none, one or both of
// its layers.
#pragma once

#include "support/database.h"

#include "examples/guarded/fence.h"
#include "examples/guarded/host.h"

#include <memory>
#include <string>
#include <vector>

// The lines of a stranger: the operation with its record or request, and the values of an update.
std::string command(const char* szOperation, const std::string& strArgument,
                    const std::string& strValues = "");
inline const auto create = [](const std::string& strRecord) {
    return command("create", strRecord);
};
inline const auto save = [](const std::string& strRecord) { return command("save", strRecord); };
inline const auto list = [](const std::string& strRequest) { return command("list", strRequest); };
inline const auto get = [](const std::string& strRequest) { return command("get", strRequest); };
inline const auto erase = [](const std::string& strRequest) {
    return command("delete", strRequest);
};
inline const auto update = [](const std::string& strRequest, const std::string& strValues) {
    return command("update", strRequest, strValues);
};

std::string repeated(unsigned uTimes, const std::string& strText);

// A line for World::send(): the host itself reads note 1 and saves it again.
inline constexpr char kHostSavesAgain[] = "(the host saves note 1 again)";

class World {
public:
    enum class Layers { kNone, kGuard, kFence, kBoth };

    explicit World(Layers layers, unsigned uMoreNotes = 0);

    // Sends the lines and keeps their answers. Without the guard the reader takes what it can.
    void send(const std::string& strLines);

    // Takes the layers away, so that a test can look at the database.
    void stop();

    // Both tables and the schema as text, at first and after stop().
    std::string contents();

    std::vector<Json::Value> answers;
    bool blThrown = false;       // an exception reached the host
    bool blTransaction = false;  // one was open after the last line
    long long iSteps = 0;        // thousands that SQLite took without a fence
    std::string strBefore;       // the contents before the first line
    Database database;

private:
    Json::Value call(Json::Value& jCommand);
    Json::Value answer(const std::string& strLine);
    void saveAgain();

    Layers layers_;
    std::unique_ptr<Host> pHost_;            // with both layers
    std::unique_ptr<VornJsonDbApi> pNotes_;  // otherwise
    std::unique_ptr<Fence> pFence_;
};
