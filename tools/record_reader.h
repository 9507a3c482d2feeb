// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Records from a file or standard input: JSON lines, one at a time, or a JSON array, as a whole.
#pragma once

#include "json_text.h"

#include <fstream>
#include <istream>
#include <string>

namespace tool {

class RecordReader {
public:
    // "-" is standard input. With a name in strArray, the input is an object whose member of that
    // name is the array of the records.
    RecordReader(const std::string& strPath, std::string strArray);

    // Sets the next record; false at the end. Throws Failure with the line and the reason.
    bool next(Json::Value& jRecord);

    // Where the last record began.
    const Place& place() const { return place_; }
    // The bytes of the last line read, 0 for a record of an array.
    std::size_t size() const { return strLine_.size(); }

private:
    bool nextLine();
    void readArray();

    std::ifstream file_;
    std::istream& input_;
    std::string strArray_;
    Place place_;
    bool blStarted_ = false;
    bool blWhole_ = false;
    std::string strLine_;
    std::string strText_;  // of the whole array
    Json::Value jRecords_;
    Json::ArrayIndex uNext_ = 0;
    std::size_t uOffset_ = 0;  // up to which lines were counted
};

}  // namespace tool
