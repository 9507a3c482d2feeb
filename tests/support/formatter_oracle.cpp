// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/formatter_oracle.h"

#include <sqlite3.h>

#include <algorithm>
#include <cstring>

namespace {

using formatter_oracle::Value;

constexpr unsigned kMaxField = 4096;

// What a format reads, as found by the test's own scanner.
struct Reads {
    bool blDefined = true;  // nothing but conversions that may be called with one value
    int iCount = 0;
    std::string strFirst;  // the first conversion that reads: its length and type, "lld"
};

// Moves past the digits there, if any. False if they are a number above kMaxField.
bool smallNumber(const std::string& strText, std::size_t& i)
{
    const std::size_t nEnd = std::min(strText.find_first_not_of("0123456789", i), strText.size());
    const std::string strDigits = strText.substr(i, nEnd - i);
    i = nEnd;
    const std::size_t nZeros = std::min(strDigits.find_first_not_of('0'), strDigits.size());
    const std::string strNumber = strDigits.substr(nZeros);
    return strNumber.size() <= 4 && (strNumber.empty() || std::stoul(strNumber) <= kMaxField);
}

Reads scan(const std::string& strText)
{
    Reads reads;
    const auto at = [&](std::size_t i) { return i < strText.size() ? strText[i] : '\0'; };
    for (std::size_t i = 0; std::string::npos != (i = strText.find('%', i));) {
        i = strText.find_first_not_of("-+ #!0,", i + 1);
        if (std::string::npos == i) return reads;
        const bool blWidth = smallNumber(strText, i);
        bool blPrecision = true;
        if ('.' == at(i)) {
            ++i;
            blPrecision = smallNumber(strText, i);
        }
        if ('*' == at(i) || !blWidth || !blPrecision) reads.blDefined = false;
        if (!reads.blDefined) return reads;
        std::string strRead;
        while ('l' == at(i) && strRead.size() < 2) strRead += strText[i++];
        const char cType = at(i++);
        if ('%' == cType) continue;
        if ('\0' == cType || nullptr == strchr("diuxXoprfeEgGcszqQwn", cType)) return reads;
        if ('n' == cType || 'z' == cType) reads.blDefined = false;
        if (1 == ++reads.iCount) reads.strFirst = strRead + cType;
    }
    return reads;
}

// Whether the one argument that is read has the type of the value.
bool suits(const Value& value, const std::string& strRead)
{
    const char cType = strRead.back();
    if (value.jValue.isString()) return nullptr != strchr("sqQw", cType);
    if (0 == strcmp("%lf", value.szConversion)) return nullptr != strchr("feEgG", cType);
    if ('p' == cType) return true;
    return "ll" == strRead.substr(0, strRead.size() - 1) && nullptr != strchr("diuxXor", cType);
}

}  // namespace

int formatter_oracle::countReads(const std::string& strFormat)
{
    return scan(strFormat).iCount;
}

bool formatter_oracle::isComparable(const std::string& strFormat, const Value& value)
{
    // The call sees the text up to its first NUL byte.
    const Reads reads = scan(strFormat.c_str());
    return reads.blDefined &&
           (0 == reads.iCount || (1 == reads.iCount && suits(value, reads.strFirst)));
}

std::string formatter_oracle::described(const std::string& strFormat, const Value& value)
{
    const auto printed = [&](auto argument) {
        char* szText = sqlite3_mprintf(strFormat.c_str(), argument);
        const std::string strText = szText;
        sqlite3_free(szText);
        return strText;
    };
    const std::string strConversion = value.szConversion;
    if ("%Q" == strConversion) return printed(value.jValue.asCString());
    if ("%lld" == strConversion) return printed(static_cast<long long>(value.jValue.asInt64()));
    if ("%lf" == strConversion) return printed(value.jValue.asDouble());
    return printed(static_cast<unsigned long long>(value.jValue.asUInt64()));
}
