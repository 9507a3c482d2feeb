// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Standard output, apart from the C library's: the log of libvornjsondb never gets in between.
#pragma once

#include <json/value.h>

#include <string>
#include <string_view>

namespace tool {

class Output {
public:
    // Takes standard output over. What else is printed from now on goes to standard error.
    Output();
    ~Output();
    Output(const Output&) = delete;
    Output& operator=(const Output&) = delete;

    // Everything that follows may throw Failure or ClosedPipe.
    void text(std::string_view strText);
    // One line of JSON.
    void line(const Json::Value& jValue);
    // Has to be called at the end: until then, a part of the output may be in memory.
    void finish();

private:
    void write();

    int iFile_;
    std::string strBuffer_;
};

}  // namespace tool
