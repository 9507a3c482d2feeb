// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The text so far is itself a format of sqlite3_mprintf. Its grammar there:
//
//     conversion = "%" flag* [width] ["." [precision]] ["l" | "ll"] type
//     flag       = "-" | "+" | " " | "#" | "!" | "0" | ","
//     width      = digits | "*"        precision = digits | "*"
//     type       = d i r              signed integer       (r: 1st, 2nd, ...)
//                | u x X o p          unsigned integer
//                | c                  a character by its code
//                | f e E g G          floating point
//                | s z q Q w          text                 (z: released by the formatter)
//                | n                  no output, stores the length so far through a pointer
//                | %                  a percent sign, takes no argument
//
// Any other type ends the output at its "%". A lone "%" at the very end is written.
//
// Only one value is passed but a text may ask for more, so each conversion is formatted alone:
// every "*", every "%n" and every other conversion but "%%" takes one slot, in order. The first
// slot is the value, given only to a conversion of its own kind; all others are 0, 0.0 or NULL of
// the conversion's kind. "%n" stores nothing, "%z" releases nothing, "*" means no width. A width or
// precision above kMaxField counts as kMaxField, so that data cannot ask for gigabytes.

#include "VornJsonDbApi/formatted_text.h"

#include "util/sqlite_text.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>
#include <utility>

namespace vorn {

namespace {

constexpr unsigned kMaxField = 4096;

// Longer texts are checked with SQLite: half of the limit that it has by default.
constexpr std::size_t kLongText = 500'000'000;

// Bytes that suffice for most value lists.
constexpr std::size_t kUsualList = 256;

enum class ConversionKind {
    kEnd,
    kSigned,
    kUnsigned,
    kPointer,
    kCharacter,
    kFloat,
    kText,
    kLength,
    kPercent
};

struct Conversion {
    std::string strFormat;  // without its "*", with width and precision limited, "z" as "s"
    int iStars = 0;
    int iLongs = 0;
    ConversionKind type = ConversionKind::kEnd;
};

ConversionKind conversionKind(char cType)
{
    switch (cType) {
    case 'd':
    case 'i':
    case 'r': return ConversionKind::kSigned;
    case 'u':
    case 'x':
    case 'X':
    case 'o': return ConversionKind::kUnsigned;
    case 'p': return ConversionKind::kPointer;
    case 'c': return ConversionKind::kCharacter;
    case 'f':
    case 'e':
    case 'E':
    case 'g':
    case 'G': return ConversionKind::kFloat;
    case 's':
    case 'z':
    case 'q':
    case 'Q':
    case 'w': return ConversionKind::kText;
    case 'n': return ConversionKind::kLength;
    case '%': return ConversionKind::kPercent;
    default: return ConversionKind::kEnd;
    }
}

bool isDigit(char c)
{
    return '0' <= c && c <= '9';
}

// Reads digits or a "*" at szText into the conversion and returns the character that follows.
const char* readField(const char* szText, Conversion& conversion)
{
    if ('*' == *szText) {
        ++conversion.iStars;
        return szText + 1;
    }
    if (!isDigit(*szText)) return szText;
    unsigned uField = 0;
    for (; isDigit(*szText); ++szText) uField = uField * 10 + static_cast<unsigned>(*szText - '0');
    // SQLite lets the number wrap at 32 bits and drops the sign.
    conversion.strFormat += std::to_string(std::min(uField & 0x7fffffffU, kMaxField));
    return szText;
}

// Reads the conversion that follows a "%" and moves szText past it.
Conversion readConversion(const char*& szText)
{
    Conversion conversion;
    const std::size_t nFlags = strspn(szText, "-+ #!0,");
    conversion.strFormat.assign("%").append(szText, nFlags);
    szText = readField(szText + nFlags, conversion);
    if ('.' == *szText) {
        conversion.strFormat += '.';
        szText = readField(szText + 1, conversion);
    }
    for (; 'l' == *szText && 2 > conversion.iLongs; ++szText) {
        conversion.strFormat += 'l';
        ++conversion.iLongs;
    }
    conversion.type = conversionKind(*szText);
    if (ConversionKind::kEnd == conversion.type) return conversion;
    conversion.strFormat += 'z' == *szText ? 's' : *szText;
    ++szText;
    return conversion;
}

// A formatted text. Throws std::logic_error if it is null (out of memory, or too long a text),
// as constructing a string from null does.
template <typename Argument>
SqliteText formatted(const char* szFormat, Argument argument)
{
    char* szText = sqlite3_mprintf(szFormat, argument);
    if (nullptr == szText) throw std::logic_error("SQLite cannot format a text");
    return SqliteText(szText);
}

template <typename Argument>
void append(std::string& strOut, const char* szFormat, Argument argument)
{
    strOut += formatted(szFormat, argument);
}

void appendInteger(std::string& strOut, const Conversion& conversion, long long iValue)
{
    const char* szFormat = conversion.strFormat.c_str();
    if (ConversionKind::kCharacter == conversion.type)
        return append(strOut, szFormat, static_cast<int>(iValue));
    if (ConversionKind::kPointer == conversion.type || 2 == conversion.iLongs)
        return append(strOut, szFormat, iValue);
    if (1 == conversion.iLongs) return append(strOut, szFormat, static_cast<long>(iValue));
    return append(strOut, szFormat, static_cast<int>(iValue));
}

void appendConversion(std::string& strOut, const Conversion& conversion,
                      const FormatArgument& argument)
{
    const char* szFormat = conversion.strFormat.c_str();
    switch (conversion.type) {
    case ConversionKind::kSigned:
    case ConversionKind::kUnsigned:
    case ConversionKind::kPointer:
    case ConversionKind::kCharacter: return appendInteger(strOut, conversion, argument.iValue);
    case ConversionKind::kFloat: return append(strOut, szFormat, argument.dValue);
    case ConversionKind::kText: return append(strOut, szFormat, argument.szValue);
    case ConversionKind::kPercent: return append(strOut, szFormat, 0);
    case ConversionKind::kLength:
    case ConversionKind::kEnd: break;
    }
}

// Throws if SQLite's formatter finds the text too long. The precision makes it count beyond the 30
// bits to which it otherwise cuts a length.
void refuseTooLong(const std::string& strText)
{
    formatted(strText.size() < (1U << 30) ? "%s" : "%.2147483647s", strText.c_str());
}

// Formats a text that holds conversions.
std::string formatText(const char* szText, FormatArgument value)
{
    std::string strOut;
    std::size_t nLong = kLongText;
    const auto takeSlot = [&value] { return std::exchange(value, FormatArgument()); };
    for (;;) {
        const char* szPercent = strchr(szText, '%');
        if (nullptr == szPercent) return strOut += szText;
        strOut.append(szText, szPercent);
        szText = szPercent + 1;
        if ('\0' == *szText) return strOut += '%';

        const Conversion conversion = readConversion(szText);
        if (ConversionKind::kEnd == conversion.type) return strOut;
        for (int i = 0; i < conversion.iStars; ++i) takeSlot();
        const FormatArgument argument =
            ConversionKind::kPercent == conversion.type ? FormatArgument() : takeSlot();
        appendConversion(strOut, conversion, argument);
        if (nLong < strOut.size()) {
            refuseTooLong(strOut);
            nLong = 2 * strOut.size();
        }
        // The character with the code 0 ends the text.
        if (ConversionKind::kCharacter == conversion.type && 0 == static_cast<int>(argument.iValue))
            return strOut;
    }
}

void appendFormatted(std::string& strOut, const char* szConversion, const FormatArgument& argument)
{
    switch (argument.kind) {
    case FormatArgument::Kind::kInteger: return append(strOut, szConversion, argument.iValue);
    case FormatArgument::Kind::kFloat: return append(strOut, szConversion, argument.dValue);
    case FormatArgument::Kind::kText: return append(strOut, szConversion, argument.szValue);
    }
}

bool isPlain(const std::string& strText)
{
    return std::string::npos == strText.find('%') && std::string::npos == strText.find('\0');
}

}  // namespace

FormattedText::FormattedText(const std::string& strText) : blPlain_(isPlain(strText))
{
    strText_.reserve(strText.size() + kUsualList);
    strText_ = strText;
}

void FormattedText::appendValue(const char* szConversion, const FormatArgument& argument)
{
    if (blPlain_) {
        const std::size_t nBefore = strText_.size();
        appendFormatted(strText_, szConversion, argument);
        blPlain_ = std::string::npos == strText_.find('%', nBefore);
    } else {
        strText_ = formatText((strText_ + szConversion).c_str(), argument);
        blPlain_ = isPlain(strText_);
    }
    if (kLongText < strText_.size()) refuseTooLong(strText_);
}

}  // namespace vorn
