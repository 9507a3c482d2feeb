// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The text of a value list, which grows by one formatted value at a time.
#pragma once

#include <string>
#include <utility>

namespace vorn {

// A value and its kind, as SQLite's formatter takes it.
struct FormatArgument {
    enum class Kind { kInteger, kFloat, kText };

    Kind kind = Kind::kInteger;
    long long iValue = 0;
    double dValue = 0;
    const char* szValue = nullptr;

    static FormatArgument integer(long long iValue) { return {Kind::kInteger, iValue, 0, nullptr}; }
    static FormatArgument floating(double dValue) { return {Kind::kFloat, 0, dValue, nullptr}; }
    static FormatArgument text(const char* szValue) { return {Kind::kText, 0, 0, szValue}; }
};

// Kept(FormattedLists.ReadAPercentSignAsAConversion): a `%` in a text acts as a conversion for
// every later value
//
// Every value is appended as
//
//     text = sqlite3_mprintf(text + conversion, value)
//
// with the whole text so far, stored values included, as the format; so a "%" in one value acts as
// a conversion for every later one. This class gives the same bytes wherever C defines them and no
// width exceeds a limit, in linear time while the text has no "%", and otherwise without reading
// arguments that were never passed. formatted_text.cpp has the rules.
class FormattedText {
public:
    explicit FormattedText(const std::string& strText);

    // Appends one conversion of sqlite3_mprintf ("%Q", "%lld", "%llu", "%f", "%lf") and formats the
    // text with the argument. Throws std::logic_error if SQLite runs out of memory or finds the
    // text too long.
    void appendValue(const char* szConversion, const FormatArgument& argument);

    // Appends text that holds neither "%" nor a NUL byte.
    void append(const char* szText) { strText_ += szText; }

    std::string take() { return std::move(strText_); }

private:
    std::string strText_;
    bool blPlain_;
};

}  // namespace vorn
