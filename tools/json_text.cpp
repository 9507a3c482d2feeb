// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "json_text.h"

#include "failure.h"

#include <json/reader.h>
#include <json/writer.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <sstream>

namespace tool {

namespace {

std::unique_ptr<Json::CharReader> newReader()
{
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);
    builder["strictRoot"] = false;
    builder["stackLimit"] = 1000;  // as the library reads
    return std::unique_ptr<Json::CharReader>(builder.newCharReader());
}

[[noreturn]] void fail(Place place, const std::string& strReason, unsigned uLine = 1)
{
    if (0 < place.uLine) place.uLine += uLine - 1;
    throw Failure(toString(place) + ": " + strReason);
}

// jsoncpp reports on several lines: "* Line 1, Column 8\n  Missing ':' after object member name\n"
[[noreturn]] void failParsing(const Place& place, const std::string& strErrors)
{
    std::istringstream errors(strErrors);
    std::string strText;
    unsigned uLine = 1;
    unsigned uColumn = 0;
    errors >> strText >> strText >> uLine >> strText >> strText >> uColumn >> std::ws;
    std::getline(errors, strText);
    fail(place, "not valid JSON: column " + std::to_string(uColumn) + ": " + strText, uLine);
}

// The text that a value was read from.
std::string_view sourceOf(const Json::Value& jValue, std::string_view strText)
{
    const auto uStart = static_cast<std::size_t>(jValue.getOffsetStart());
    return strText.substr(uStart, static_cast<std::size_t>(jValue.getOffsetLimit()) - uStart);
}

// jsoncpp reads an integer that does not fit as a fraction.
void checkIntegers(const Json::Value& jValue, const std::string& strMember,
                   std::string_view strText, const Place& place)
{
    for (auto it = jValue.begin(); it != jValue.end(); ++it)
        if (it->isArray() || it->isObject() || Json::realValue == it->type())
            checkIntegers(*it, jValue.isObject() ? it.name() : strMember, strText, place);
    if (Json::realValue != jValue.type()) return;
    const std::string_view strSource = sourceOf(jValue, strText);
    if (std::string_view::npos != strSource.find_first_of(".eE")) return;
    const auto nLines = std::count(strText.data(), strSource.data(), '\n');
    fail(place,
         (strMember.empty() ? "" : "member " + toText(strMember) + ": ") + "the integer " +
             std::string(strSource) + " does not fit into 64 bits",
         static_cast<unsigned>(nLines) + 1);
}

void appendQuoted(std::string_view strText, std::string& strOut)
{
    constexpr char kShort[] = "\b\f\n\r\t\"\\";
    constexpr char kLetters[] = "bfnrt\"\\";
    strOut += '"';
    std::size_t uDone = 0;
    for (std::size_t u = 0; u < strText.size(); ++u) {
        const char c = strText[u];
        if (0x20 <= static_cast<unsigned char>(c) && '"' != c && '\\' != c) continue;
        strOut.append(strText, uDone, u - uDone);
        uDone = u + 1;
        const char* szFound = '\0' == c ? nullptr : std::strchr(kShort, c);
        if (nullptr != szFound) {
            strOut += {'\\', kLetters[szFound - kShort]};
            continue;
        }
        char szEscape[8];
        (void)std::snprintf(szEscape, sizeof szEscape, "\\u%04x", static_cast<unsigned>(c));
        strOut += szEscape;
    }
    strOut.append(strText, uDone);
    strOut += '"';
}

void appendReal(double d, std::string& strOut)
{
    if (!std::isfinite(d)) {
        strOut += Json::valueToString(d);
        return;
    }
    char szText[40];
    for (int iDigits = 15; iDigits <= 17; ++iDigits) {
        (void)std::snprintf(szText, sizeof szText, "%.*g", iDigits, d);
        if (std::strtod(szText, nullptr) == d) break;
    }
    strOut += szText;
    if (nullptr == std::strpbrk(szText, ".e")) strOut += ".0";
}

}  // namespace

std::string toString(const Place& place)
{
    return place.strSource + (0 < place.uLine ? ":" + std::to_string(place.uLine) : "") +
           (0 < place.uRecord ? ", record " + std::to_string(place.uRecord) : "");
}

Json::Value parseJson(std::string_view strText, const Place& place)
{
    static const std::unique_ptr<Json::CharReader> pReader = newReader();
    Json::Value jValue;
    std::string strErrors;
    try {
        if (!pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, &strErrors))
            failParsing(place, strErrors);
    } catch (const Json::Exception&) {
        fail(place, "JSON of more than 1000 levels");
    }
    checkIntegers(jValue, "", strText, place);
    return jValue;
}

void appendJson(const Json::Value& jValue, std::string& strOut)
{
    char cBetween = jValue.isObject() ? '{' : '[';
    switch (jValue.type()) {
    case Json::nullValue: strOut += "null"; return;
    case Json::intValue: strOut += std::to_string(jValue.asInt64()); return;
    case Json::uintValue: strOut += std::to_string(jValue.asUInt64()); return;
    case Json::realValue: appendReal(jValue.asDouble(), strOut); return;
    case Json::booleanValue: strOut += jValue.asBool() ? "true" : "false"; return;
    case Json::stringValue: {
        const char* pBegin = nullptr;
        const char* pEnd = nullptr;
        jValue.getString(&pBegin, &pEnd);
        appendQuoted({pBegin, static_cast<std::size_t>(pEnd - pBegin)}, strOut);
        return;
    }
    case Json::arrayValue:
    case Json::objectValue: break;
    }
    if (jValue.empty()) strOut += cBetween;
    for (auto it = jValue.begin(); it != jValue.end(); ++it, cBetween = ',') {
        strOut += cBetween;
        if (jValue.isObject()) {
            appendQuoted(it.name(), strOut);
            strOut += ':';
        }
        appendJson(*it, strOut);
    }
    strOut += jValue.isObject() ? '}' : ']';
}

std::string toText(const Json::Value& jValue)
{
    std::string strText;
    appendJson(jValue, strText);
    return strText;
}

bool isUtf8(std::string_view strText)
{
    constexpr std::uint32_t kLeast[] = {0, 0x80, 0x800, 0x10000};
    for (std::size_t u = 0; u < strText.size();) {
        const unsigned uLead = static_cast<unsigned char>(strText[u++]);
        if (0x80 > uLead) continue;
        if (0xc0 > uLead || 0xf8 <= uLead) return false;
        const unsigned nMore = 0xf0 <= uLead ? 3 : 0xe0 <= uLead ? 2 : 1;
        std::uint32_t uPoint = uLead & (0x3fU >> nMore);
        if (strText.size() - u < nMore) return false;
        for (unsigned i = 0; i < nMore; ++i, ++u) {
            const unsigned uByte = static_cast<unsigned char>(strText[u]);
            if (0x80 != (uByte & 0xc0)) return false;
            uPoint = uPoint << 6 | (uByte & 0x3fU);
        }
        const bool blSurrogate = 0xd800 <= uPoint && 0xdfff >= uPoint;
        if (kLeast[nMore] > uPoint || 0x10ffff < uPoint || blSurrogate) return false;
    }
    return true;
}

}  // namespace tool
