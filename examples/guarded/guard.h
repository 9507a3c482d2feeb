// SPDX-License-Identifier: MIT
/// @file
/// The checks of a host that takes commands from strangers, before it calls the library. They need
/// nothing but the command and the member types of the table. Each refuses by throwing Refused.
#ifndef EXAMPLES_GUARDED_GUARD_H
#define EXAMPLES_GUARDED_GUARD_H

#include <json/value.h>

#include <istream>
#include <stdexcept>
#include <string>

namespace guard {

constexpr std::size_t kMaxLine = 8 * 1024;
// What a command holds, in all: values of records and requests, the items of their arrays, itself.
constexpr std::size_t kMaxValues = 1000;
// The library reads back 1,000 levels.
constexpr int kMaxDepth = 900;
constexpr unsigned kMaxRows = 100;

// The reason may be told to the stranger.
class Refused : public std::runtime_error {
    using std::runtime_error::runtime_error;
};

// Reads a line; false at the end of the stream. Of a line that is too long it keeps one byte more
// than is allowed and drops the rest.
bool readLine(std::istream& stream, std::string& strLine);

// Makes a JSON object of a line.
Json::Value readCommand(const std::string& strLine);

// Checks a command against the member types that VORN_JSON_DB::recType() gives, and limits the rows
// of a list that has no limit.
void checkCommand(const Json::Value& jTypes, Json::Value& jCommand);

}  // namespace guard

#endif
