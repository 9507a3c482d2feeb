// SPDX-License-Identifier: MIT
#include "guard.h"

#include <json/reader.h>

#include <algorithm>
#include <memory>

namespace guard {
namespace {

void refuseIf(bool blBad, const char* szReason)
{
    if (blBad) throw Refused(szReason);
}

// The code point that begins there; moves on to the next one.
char32_t readCodePoint(const std::string& strText, std::size_t& uAt)
{
    constexpr char32_t kLeast[] = {0, 0x80, 0x800, 0x10000};
    const char* szWrong = "a text is not UTF-8";
    const auto uLead = static_cast<unsigned char>(strText[uAt++]);
    if (0x80 > uLead) return uLead;
    refuseIf(0xc0 > uLead || 0xf8 <= uLead, szWrong);
    const unsigned uMore = 0xf0 <= uLead ? 3 : 0xe0 <= uLead ? 2 : 1;
    char32_t c = uLead & (0x3fU >> uMore);
    for (unsigned u = 0; u < uMore; ++u, ++uAt) {
        refuseIf(0x80 != (strText[uAt] & 0xc0), szWrong);  // so is the NUL at the end
        c = c << 6 | (strText[uAt] & 0x3f);
    }
    refuseIf(kLeast[uMore] > c || 0x10ffff < c || (0xd800 <= c && 0xdfff >= c), szWrong);
    return c;
}

// Control characters, line separators and what reverses the direction of a line.
bool isControl(char32_t c)
{
    constexpr char32_t kControls[][2] = {{0, 0x1f},        {0x7f, 0x9f},     {0x61c, 0x61c},
                                         {0x200e, 0x200f}, {0x2028, 0x202e}, {0x2066, 0x2069}};
    return std::any_of(std::begin(kControls), std::end(kControls),
                       [c](const char32_t(&range)[2]) { return range[0] <= c && range[1] >= c; });
}

// "%" is a conversion for the members that are formatted later, NUL cuts the text, and a newline
// would begin a line of the log.
void checkText(const std::string& strText)
{
    for (std::size_t uAt = 0; uAt < strText.size();) {
        const char32_t c = readCodePoint(strText, uAt);
        refuseIf('%' == c || isControl(c), "\"%\" and control characters are not allowed");
    }
}

// Every text in a value, the keys of objects included.
void checkTexts(const Json::Value& jValue)
{
    if (jValue.isString()) checkText(jValue.asString());
    for (auto it = jValue.begin(); it != jValue.end(); ++it) {
        if (jValue.isObject()) checkText(it.name());
        checkTexts(*it);
    }
}

bool isWholeNumber(const Json::Value& jValue)
{
    return Json::intValue == jValue.type() || Json::uintValue == jValue.type();
}

bool hasKind(const std::string& strWord, const Json::Value& jValue)
{
    if ("string" == strWord) return jValue.isString();
    if ("bool" == strWord) return jValue.isBool();
    if ("int" == strWord) return isWholeNumber(jValue) && jValue.isInt();
    if ("long long" == strWord) return isWholeNumber(jValue) && jValue.isInt64();
    if ("Json::objectValue" == strWord) return jValue.isObject();
    if ("Json::arrayValue" == strWord) return jValue.isArray();
    return false;
}

// The library writes a value under a numeric word as bare SQL.
void checkKind(const std::string& strWord, const Json::Value& jValue)
{
    refuseIf(!hasKind(strWord, jValue), "a member has a value of another kind");
    checkTexts(jValue);
}

// The library ignores other members, and selects more without them.
std::string checkDeclared(const Json::Value& jTypes, const std::string& strName)
{
    refuseIf(!jTypes.isMember(strName), "there is no such member");
    return jTypes[strName]["cpptype"].asString();
}

void checkRecord(const Json::Value& jTypes, const Json::Value& jRecord)
{
    refuseIf(!jRecord.isObject() || jRecord.empty(), "a record is an object with members");
    for (auto it = jRecord.begin(); it != jRecord.end(); ++it)
        checkKind(checkDeclared(jTypes, it.name()), *it);
}

// SQLite gives a new note its id, one above the greatest ever. After that, id and author stay.
void checkKept(const Json::Value& jRecord, const char* szName)
{
    if (jRecord.isMember(szName)) throw Refused(std::string("\"") + szName + "\" cannot be set");
}

// The items of a list are written without a comma, so [1,2] is 12.
const Json::Value& checkList(const Json::Value& jCondition)
{
    if (!jCondition.isArray()) return jCondition;
    refuseIf(1 != jCondition.size(), "a list has one item");
    return jCondition[0];
}

// SQL of the host, not of strangers.
void checkRawFilter(const std::string& strKey)
{
    refuseIf("vornSqlWhereFilter" == strKey, "SQL is not taken");
}

bool checkSorting(const Json::Value& jTypes, const std::string& strKey, const Json::Value& jValue)
{
    if ("sort_by" == strKey) {
        refuseIf(!jValue.isString() || !jTypes.isMember(jValue.asString()),
                 "\"sort_by\" is the name of a member");
        return true;
    }
    if ("sort_direction" != strKey) return false;
    refuseIf(jValue != "asc" && jValue != "desc", "\"sort_direction\" is \"asc\" or \"desc\"");
    return true;
}

// The JSON text of both is written as it is.
bool checkPaging(const std::string& strKey, const Json::Value& jValue)
{
    if ("limit" != strKey && "offset" != strKey) return false;
    refuseIf(!isWholeNumber(jValue) || !jValue.isInt() || 0 > jValue.asInt(),
             "\"limit\" and \"offset\" are whole numbers");
    refuseIf("limit" == strKey && kMaxRows < jValue.asUInt(), "\"limit\" is too large");
    return true;
}

void checkRequest(const Json::Value& jTypes, const Json::Value& jRequest)
{
    refuseIf(!jRequest.isObject(), "a request is an object");
    for (auto it = jRequest.begin(); it != jRequest.end(); ++it) {
        checkRawFilter(it.name());
        if (checkSorting(jTypes, it.name(), *it) || checkPaging(it.name(), *it)) continue;
        checkKind(checkDeclared(jTypes, it.name()), checkList(*it));
    }
}

// A condition on another member, and an order, reads the whole table unless one of these narrows
// it.
void checkIndexed(const Json::Value& jTypes, const Json::Value& jRequest)
{
    if (jRequest.isMember("id") || jRequest.isMember("author")) return;
    for (const std::string& strKey : jRequest.getMemberNames())
        refuseIf("sort_by" == strKey || jTypes.isMember(strKey),
                 "a list asks for an id or an author");
}

// Without a limit the library reads the whole table.
void limitRows(Json::Value& jRequest)
{
    if (!jRequest.isMember("limit")) jRequest["limit"] = kMaxRows;
}

// A change has to name its record: {"id": 5}.
void checkOneRecord(const Json::Value& jTypes, const Json::Value& jRequest)
{
    checkRequest(jTypes, jRequest);
    refuseIf(Json::Value::Members{"id"} != jRequest.getMemberNames() || jRequest["id"].isArray(),
             "the request names one record by its id");
}

// Each value takes some hundred bytes, however short its text is.
std::size_t countValues(const Json::Value& jValue)
{
    std::size_t nValues = 1;
    for (const Json::Value& jMember : jValue) nValues += countValues(jMember);
    return nValues;
}

}  // namespace

bool readLine(std::istream& stream, std::string& strLine)
{
    strLine.clear();
    char c = 0;
    while (stream.get(c) && '\n' != c)
        if (kMaxLine >= strLine.size()) strLine += c;
    return stream.good() || !strLine.empty();
}

Json::Value readCommand(const std::string& strLine)
{
    refuseIf(kMaxLine < strLine.size(), "the command is too long");
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);  // also refuses a duplicate key
    builder["stackLimit"] = kMaxDepth;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jCommand;
    bool blRead = false;
    try {
        const char* szLine = strLine.data();
        blRead = pReader->parse(szLine, szLine + strLine.size(), &jCommand, nullptr);
    } catch (const Json::RuntimeError&) {
        throw Refused("the command is nested too deep");
    }
    refuseIf(!blRead || !jCommand.isObject(), "the command is not a JSON object");
    refuseIf(kMaxValues < countValues(jCommand), "the command holds too many values");
    return jCommand;
}

void checkCommand(const Json::Value& jTypes, Json::Value& jCommand)
{
    using Keys = Json::Value::Members;
    const Keys keys = jCommand.getMemberNames();
    refuseIf(!jCommand["op"].isString(), "there is no such operation");
    const std::string strOperation = jCommand["op"].asString();
    if ("create" == strOperation || "save" == strOperation) {
        refuseIf(Keys{"op", "record"} != keys, "the command holds a record");
        checkRecord(jTypes, jCommand["record"]);
        if ("create" == strOperation) checkKept(jCommand["record"], "id");
    } else if ("list" == strOperation) {
        refuseIf(Keys{"op", "request"} != keys, "the command holds a request");
        checkRequest(jTypes, jCommand["request"]);
        checkIndexed(jTypes, jCommand["request"]);
        limitRows(jCommand["request"]);
    } else if ("get" == strOperation || "delete" == strOperation) {
        refuseIf(Keys{"op", "request"} != keys, "the command holds a request");
        checkOneRecord(jTypes, jCommand["request"]);
    } else {
        refuseIf("update" != strOperation, "there is no such operation");
        refuseIf(Keys{"op", "request", "values"} != keys, "the command holds a request and values");
        checkOneRecord(jTypes, jCommand["request"]);
        checkRecord(jTypes, jCommand["values"]);
        for (const char* szName : {"id", "author"}) checkKept(jCommand["values"], szName);
    }
}

}  // namespace guard
