// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "record_reader.h"

#include "failure.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <iterator>
#include <utility>

namespace tool {

namespace {

constexpr char kByteOrderMark[] = "\xef\xbb\xbf";

}  // namespace

RecordReader::RecordReader(const std::string& strPath, std::string strArray)
    : input_("-" == strPath ? std::cin : file_),
      strArray_(std::move(strArray)),
      place_{"-" == strPath ? "standard input" : strPath, 0}
{
    if ("-" == strPath) return;
    file_.open(strPath);
    if (!file_) throw Failure(strPath + ": " + std::strerror(errno));
}

bool RecordReader::next(Json::Value& jRecord)
{
    if (!blWhole_) {
        if (!nextLine()) return false;
        const bool blFirst = !std::exchange(blStarted_, true);
        const std::size_t uFirst = strLine_.find_first_not_of(" \t\r");
        blWhole_ = blFirst && (!strArray_.empty() || '[' == strLine_[uFirst]);
        if (!blWhole_) {
            jRecord = parseJson(strLine_, place_);
            return true;
        }
        readArray();
    }
    if (uNext_ == jRecords_.size()) return false;
    jRecord.swap(jRecords_[uNext_++]);
    place_.uRecord = uNext_;
    const auto uStart = static_cast<std::size_t>(jRecord.getOffsetStart());
    place_.uLine += static_cast<unsigned long>(
        std::count(strText_.begin() + static_cast<std::ptrdiff_t>(uOffset_),
                   strText_.begin() + static_cast<std::ptrdiff_t>(uStart), '\n'));
    uOffset_ = uStart;
    return true;
}

// The next line that is not blank.
bool RecordReader::nextLine()
{
    errno = 0;
    while (std::getline(input_, strLine_)) {
        if (1 == ++place_.uLine && 0 == strLine_.compare(0, 3, kByteOrderMark))
            strLine_.erase(0, 3);
        if (std::string::npos != strLine_.find_first_not_of(" \t\r")) return true;
    }
    if (input_.bad()) throw Failure(place_.strSource + ": " + std::strerror(errno));
    return false;
}

// From the line on that was read.
void RecordReader::readArray()
{
    strText_ = std::exchange(strLine_, std::string()) + "\n";
    strText_.append(std::istreambuf_iterator<char>(input_), {});
    Json::Value jTop = parseJson(strText_, place_);
    const bool blObject = !strArray_.empty() && jTop.isObject();
    Json::Value& jArray = blObject ? jTop[strArray_] : jTop;
    if (!jArray.isArray() || strArray_.empty() == blObject)
        throw Failure(place_.strSource + ": no array" +
                      (strArray_.empty() ? "" : " under " + toText(strArray_)));
    jRecords_.swap(jArray);
}

}  // namespace tool
