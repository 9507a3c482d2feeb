// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "util/json_scanner.h"

#include <cctype>
#include <cfenv>
#include <cfloat>
#include <charconv>
#include <climits>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <locale>

namespace vorn {

namespace {

void appendUtf8(std::string& strOut, unsigned uCode)
{
    const auto append = [&strOut](unsigned uByte) { strOut += static_cast<char>(uByte); };
    const auto appendLater = [&](unsigned uShift) { append(0x80 | (uCode >> uShift & 0x3F)); };
    if (0x80 > uCode) return append(uCode);
    if (0x800 > uCode) {
        append(0xC0 | uCode >> 6);
    } else {
        if (0x10000 > uCode) {
            append(0xE0 | uCode >> 12);
        } else {
            append(0xF0 | uCode >> 18);
            appendLater(12);
        }
        appendLater(6);
    }
    appendLater(0);
}

}  // namespace

bool JsonScanner::skip(std::string_view strWord)
{
    if (0 != strncmp(szAt_, strWord.data(), strWord.size())) return false;
    szAt_ += strWord.size();
    return true;
}

bool JsonScanner::readEscapedString(const char* szBegin, std::string_view& strText)
{
    strUnescaped_.clear();
    for (;;) {
        strUnescaped_.append(szBegin, szAt_);
        if (!skip('\\')) break;
        if (!readEscape()) return false;
        szBegin = szAt_;
        skipPlain();
    }
    strText = strUnescaped_;
    return skip('"');
}

bool JsonScanner::readEscape()
{
    constexpr std::string_view kEscapes = "\"\\/bfnrt";
    constexpr std::string_view kMeanings = "\"\\/\b\f\n\r\t";
    const char c = *szAt_++;
    if ('u' == c) return readCodePoint();
    const std::size_t i = kEscapes.find(c);
    if (std::string_view::npos == i) return false;
    strUnescaped_ += kMeanings[i];
    return true;
}

// One half of a surrogate pair without the other is not taken.
bool JsonScanner::readCodePoint()
{
    const auto isHalf = [](unsigned uCode, unsigned uFirst) { return uFirst == (uCode & ~0x3FFU); };
    unsigned uCode = 0;
    if (!readHex(uCode) || isHalf(uCode, 0xDC00)) return false;
    if (isHalf(uCode, 0xD800)) {
        unsigned uLow = 0;
        if (!skip("\\u") || !readHex(uLow) || !isHalf(uLow, 0xDC00)) return false;
        uCode = 0x10000 + ((uCode & 0x3FF) << 10) + (uLow & 0x3FF);
    }
    appendUtf8(strUnescaped_, uCode);
    return true;
}

bool JsonScanner::readHex(unsigned& uCode)
{
    // from_chars would take fewer digits, too.
    for (int i = 0; i < 4; ++i)
        if (0 == isxdigit(static_cast<unsigned char>(szAt_[i]))) return false;
    std::from_chars(szAt_, szAt_ + 4, uCode, 16);
    szAt_ += 4;
    return true;
}

bool JsonScanner::skipDigits()
{
    const char* const szBegin = szAt_;
    while ('0' <= *szAt_ && *szAt_ <= '9') ++szAt_;
    return szBegin != szAt_;
}

bool JsonScanner::readNumber(Json::Value& jNumber)
{
    const auto set = [&jNumber](Json::Value jNew) { return jNumber.swapPayload(jNew), true; };
    const char* const szBegin = szAt_;
    const bool blNegative = skip('-');
    const char* const szDigits = szAt_;
    if (!skipDigits() || ('0' == *szDigits && 1 < szAt_ - szDigits)) return false;
    if ('.' == *szAt_ || 'e' == *szAt_ || 'E' == *szAt_) return readReal(szBegin, jNumber);
    std::uint64_t uValue = 0;
    if (std::errc() != std::from_chars(szDigits, szAt_, uValue).ec) return false;
    if (!blNegative && INT64_MAX < uValue) return set(Json::UInt64(uValue));
    if (static_cast<std::uint64_t>(INT64_MAX) + 1 < uValue) return false;
    return set(static_cast<Json::Int64>(blNegative ? 0 - uValue : uValue));
}

// Without a library that reads them, none is taken.
bool JsonScanner::readReal(const char* szBegin, Json::Value& jNumber)
{
    if (skip('.') && !skipDigits()) return false;
    if (skip('e') || skip('E')) {
        if (!skip('+')) static_cast<void>(skip('-'));
        if (!skipDigits()) return false;
    }
    double dValue = 0;
#ifdef __cpp_lib_to_chars
    // jsoncpp follows the locale and the rounding mode of the host, and sets errno close to zero.
    if (std::locale() != std::locale::classic() || FE_TONEAREST != fegetround()) return false;
    if (std::errc() != std::from_chars(szBegin, szAt_, dValue).ec) return false;
    if (0 != dValue && DBL_MIN >= std::abs(dValue)) return false;
#else
    return false;
#endif
    Json::Value jReal(dValue);
    jNumber.swapPayload(jReal);
    return true;
}

}  // namespace vorn
