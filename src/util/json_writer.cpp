// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// toString(): the text that jsoncpp's stream writer gives without comments and indentation, written
// straight into a string.
#include "util/json_members.h"
#include "util/json_text.h"

#include <json/writer.h>

#include <algorithm>
#include <charconv>
#include <cmath>

namespace vorn {

namespace {

// Bytes that suffice for most texts.
constexpr std::size_t kUsualText = 128;

bool isEscaped(char c)
{
    return '"' == c || '\\' == c || 0x20 > static_cast<unsigned char>(c);
}

void appendEscape(std::string& strOut, char c)
{
    constexpr char kHexDigits[] = "0123456789abcdef";
    switch (c) {
    case '"': strOut += "\\\""; break;
    case '\\': strOut += "\\\\"; break;
    case '\b': strOut += "\\b"; break;
    case '\f': strOut += "\\f"; break;
    case '\n': strOut += "\\n"; break;
    case '\r': strOut += "\\r"; break;
    case '\t': strOut += "\\t"; break;
    default: strOut.append("\\u00") += {kHexDigits[c >> 4], kHexDigits[c & 15]};
    }
}

void appendString(std::string& strOut, std::string_view strText)
{
    strOut += '"';
    for (;;) {
        const auto escaped = std::find_if(strText.begin(), strText.end(), isEscaped);
        const auto nPlain = static_cast<std::size_t>(escaped - strText.begin());
        strOut.append(strText, 0, nPlain);
        if (strText.size() == nPlain) break;
        appendEscape(strOut, *escaped);
        strText.remove_prefix(nPlain + 1);
    }
    strOut += '"';
}

template <typename Integer>
void appendInteger(std::string& strOut, Integer value)
{
    char szText[24];
    const auto written = std::to_chars(std::begin(szText), std::end(szText), value);
    strOut.append(szText, written.ptr);
}

void appendReal(std::string& strOut, double dValue)
{
    if (std::isfinite(dValue))
        strOut += Json::valueToString(dValue, 17);
    else if (std::isnan(dValue))
        strOut += "NaN";
    else
        strOut += 0 > dValue ? "-Infinity" : "Infinity";
}

[[gnu::noinline]] void appendScalar(std::string& strOut, const Json::Value& jValue)
{
    switch (jValue.type()) {
    case Json::intValue: appendInteger(strOut, jValue.asLargestInt()); break;
    case Json::uintValue: appendInteger(strOut, jValue.asLargestUInt()); break;
    case Json::realValue: appendReal(strOut, jValue.asDouble()); break;
    case Json::stringValue: appendString(strOut, textOf(jValue)); break;
    case Json::booleanValue: strOut += jValue.asBool() ? "true" : "false"; break;
    default: strOut += "null";
    }
}

[[gnu::noinline]] void appendName(std::string& strOut, const Json::Value::const_iterator& it)
{
    appendString(strOut, memberName(it));
    strOut += ':';
}

// Its frame is on the stack once for each level of nesting, so the two above are not inlined.
void appendValue(std::string& strOut, const Json::Value& jValue)
{
    const bool blObject = jValue.isObject();
    if (!blObject && !jValue.isArray()) return appendScalar(strOut, jValue);
    strOut += blObject ? '{' : '[';
    Json::ArrayIndex nItems = 0;
    for (auto it = jValue.begin(), end = jValue.end(); end != it; ++it, ++nItems) {
        if (blObject) appendName(strOut, it);
        // An item that was never set reads as null.
        for (; !blObject && it.index() != nItems; ++nItems) strOut += "null,";
        appendValue(strOut, *it);
        strOut += ',';
    }
    if (0 != nItems) strOut.pop_back();
    strOut += blObject ? '}' : ']';
}

}  // namespace

std::string toString(const Json::Value& jValue)
{
    std::string strText;
    strText.reserve(kUsualText);
    appendValue(strText, jValue);
    return strText;
}

}  // namespace vorn
