// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A definition and a CREATE statement from records: such that every record can be stored as it is.
#include "commands.h"
#include "database.h"
#include "failure.h"
#include "json_text.h"
#include "record_reader.h"

#include <algorithm>
#include <cctype>
#include <map>
#include <set>

namespace tool {

namespace {

// What the values of a member have in common.
enum Kind { kNone, kText, kInteger, kBoolean, kObject, kArray, kMixed };

struct Words {
    const char* szWord;
    const char* szColumn;
};
constexpr Words kWords[] = {{"Json::Value", "json text"},       {"string", "text"},
                            {"long long", "integer"},           {"bool", "boolean"},
                            {"Json::objectValue", "json text"}, {"Json::arrayValue", "json text"},
                            {"Json::Value", "json text"}};

Kind kindOf(const Json::Value& jValue)
{
    switch (jValue.type()) {
    case Json::nullValue: return kNone;
    case Json::intValue: return kInteger;
    case Json::uintValue: return jValue.isInt64() ? kInteger : kMixed;
    case Json::realValue: return kMixed;
    case Json::booleanValue: return kBoolean;
    case Json::arrayValue: return kArray;
    case Json::objectValue: return kObject;
    case Json::stringValue: break;
    }
    // A text column cannot hold NUL bytes, JSON text can.
    return std::string::npos == jValue.asString().find('\0') ? kText : kMixed;
}

bool holdsUtf8(const Json::Value& jValue)
{
    if (jValue.isString()) return isUtf8(jValue.asString());
    for (auto it = jValue.begin(); it != jValue.end(); ++it)
        if ((jValue.isObject() && !isUtf8(it.name())) || !holdsUtf8(*it)) return false;
    return true;
}

std::string lower(std::string strName)
{
    std::transform(strName.begin(), strName.end(), strName.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return strName;
}

[[noreturn]] void refuse(const Place& place, const std::string& strMember,
                         const std::string& strReason)
{
    throw Failure(toString(place) + ": member " + toText(strMember) + ": " + strReason);
}

Json::Value makeTable(const std::string& strName, const std::map<std::string, Kind>& kinds,
                      const std::string& strKey)
{
    Json::Value jTable;
    std::string strColumns;
    for (const auto& [strMember, kind] : kinds) {
        jTable["definition"][strName]["member"][strMember]["cpptype"] = kWords[kind].szWord;
        strColumns += (strColumns.empty() ? "" : ", ") + strMember + " " + kWords[kind].szColumn;
        if (strMember == strKey)
            strColumns += kText == kind ? " not null primary key" : " primary key";
    }
    jTable["name"] = strName;
    jTable["create"] = "create table if not exists " + strName + " (" + strColumns + ")";
    return jTable;
}

// Where the key comes from: records that all have it, no record, or the one or the other.
enum class Key { kMember, kAdded, kEither };

class Inference {
public:
    Inference(std::string strKey, Key key)
        : strKey_(std::move(strKey)), key_(key), memory_(openDatabase(":memory:", true))
    {
    }

    void add(const Json::Value& jRecord, const Place& place)
    {
        if (!jRecord.isObject()) throw Failure(toString(place) + ": not an object");
        for (auto it = jRecord.begin(); it != jRecord.end(); ++it) {
            const std::string strMember = it.name();
            const auto [found, blNew] = kinds_.try_emplace(strMember, kNone);
            if (blNew) checkName(strMember, place);
            if (!holdsUtf8(*it)) refuse(place, strMember, "a string that is not UTF-8");
            const Kind kind = kindOf(*it);
            if (kNone == found->second)
                found->second = kind;
            else if (kNone != kind && found->second != kind)
                found->second = kMixed;
        }
        if (Key::kAdded != key_ && strKeyFlaw_.empty()) strKeyFlaw_ = flawOfKey(jRecord, place);
        if (Key::kMember == key_ && !strKeyFlaw_.empty()) throw Failure(strKeyFlaw_);
    }

    Json::Value table(const std::string& strName)
    {
        const auto alike = names_.find(lower(strKey_));
        const bool blAlike = names_.end() != alike;
        const bool blThere = blAlike && strKey_ == alike->second;
        const char* szHint = "; --key names another key, --add-key adds one";
        if (blThere && !strKeyFlaw_.empty()) throw Failure(strKeyFlaw_ + szHint);
        if (blAlike && (!blThere || Key::kAdded == key_))
            throw Failure("key " + toText(strKey_) + ": there is a member " +
                          toText(alike->second) + szHint);
        if (!blThere) kinds_[strKey_] = kInteger;
        Json::Value jTable = makeTable(strName, kinds_, strKey_);
        bindTable(memory_.get(), jTable);
        return jTable;
    }

private:
    // A table of this one member says whether the name can be one.
    void checkName(const std::string& strMember, const Place& place)
    {
        const auto [found, blNew] = names_.try_emplace(lower(strMember), strMember);
        if (!blNew)
            refuse(place, strMember, "differs from " + toText(found->second) + " only in case");
        try {
            const std::string strName = "name_" + std::to_string(names_.size());
            bindTable(memory_.get(), makeTable(strName, {{strMember, kText}}, strMember));
        } catch (const Failure& failure) {
            throw Failure(toString(place) + ": " + failure.what());
        }
    }

    // Why the member cannot be the key, or nothing.
    std::string flawOfKey(const Json::Value& jRecord, const Place& place)
    {
        const Json::Value& jKey = jRecord[strKey_];
        const Kind kind = kindOf(jKey);
        const char* szFlaw = nullptr;
        if (kText != kind && kInteger != kind)
            szFlaw = kNone == kind ? "missing" : "neither a string nor an integer";
        else if (kinds_[strKey_] != kind)
            szFlaw = "strings and integers";
        else if (!keys_.insert(jKey.asString()).second)
            szFlaw = "not unique";
        if (nullptr == szFlaw) return "";
        return toString(place) + ": member " + toText(strKey_) + ": " + szFlaw +
               ", and it is the key";
    }

    const std::string strKey_;
    const Key key_;
    std::string strKeyFlaw_;  // of the first record that has one
    Database memory_;
    std::map<std::string, Kind> kinds_;
    std::map<std::string, std::string> names_;  // by the names in lower case
    std::set<std::string> keys_;
};

// The name of the file, without what a name of a table cannot have.
std::string tableName(const std::string& strPath)
{
    std::string strName = strPath.substr(strPath.rfind('/') + 1);
    strName = strName.substr(0, strName.rfind('.'));
    for (char& c : strName)
        if (0 == std::isalnum(static_cast<unsigned char>(c))) c = '_';
    return strName;
}

}  // namespace

int infer(const Arguments& arguments, Output& output)
{
    const std::string& strPath = arguments.values[0];
    if ("-" == strPath && !arguments.has("table"))
        throw UsageError("standard input has no name: --table gives the table one");
    if (arguments.has("key") && arguments.has("add-key"))
        throw UsageError("expected either --key or --add-key");
    RecordReader reader(strPath, arguments.option("array"));
    Inference inference = arguments.has("key")
                              ? Inference(arguments.option("key"), Key::kMember)
                              : Inference(arguments.option("add-key", "id"),
                                          arguments.has("add-key") ? Key::kAdded : Key::kEither);
    Json::Value jRecord;
    if (!reader.next(jRecord)) throw Failure(strPath + ": no records");
    do inference.add(jRecord, reader.place());
    while (reader.next(jRecord));
    output.text(tableText(inference.table(arguments.option("table", tableName(strPath)))));
    return kDone;
}

}  // namespace tool
