// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Members of a JSON value of any kind: a value that is not an object has none, where jsoncpp's own
// calls would throw.
#pragma once

#include <json/value.h>

#include <string>
#include <string_view>

namespace vorn {

// The member, or null if there is none.
inline const Json::Value* findMember(const Json::Value& jValue, std::string_view strKey)
{
    return jValue.isObject() ? jValue.find(strKey.data(), strKey.data() + strKey.size()) : nullptr;
}

inline Json::Value* findMember(Json::Value& jValue, std::string_view strKey)
{
    return const_cast<Json::Value*>(findMember(const_cast<const Json::Value&>(jValue), strKey));
}

inline bool hasMember(const Json::Value& jValue, std::string_view strKey)
{
    return nullptr != findMember(jValue, strKey);
}

// The name at an iterator over an object.
inline std::string_view memberName(const Json::Value::const_iterator& it)
{
    const char* szEnd = nullptr;
    const char* szName = it.memberName(&szEnd);
    return {szName, static_cast<std::size_t>(szEnd - szName)};
}

// Finds members of a value in one walk; each may be asked for once, in ascending order of the names
// (the order in which jsoncpp holds them).
class MemberWalk {
public:
    explicit MemberWalk(const Json::Value& jValue)
    {
        if (!jValue.isObject()) return;
        it_ = jValue.begin();
        nLeft_ = jValue.size();
    }

    // The member, or null if there is none.
    const Json::Value* find(std::string_view strKey)
    {
        while (0 < nLeft_) {
            const std::string_view strName = memberName(it_);
            const bool blFound = strName == strKey;
            if (!blFound && strName > strKey) break;
            const Json::Value& jMember = *it_;
            ++it_;
            --nLeft_;
            if (blFound) return &jMember;
        }
        return nullptr;
    }

private:
    Json::Value::const_iterator it_;
    Json::ArrayIndex nLeft_ = 0;
};

// The text of a JSON string; empty if the value is not a string.
inline std::string_view textOf(const Json::Value& jString)
{
    const char* szBegin = nullptr;
    const char* szEnd = nullptr;
    jString.getString(&szBegin, &szEnd);
    return {szBegin, static_cast<std::size_t>(szEnd - szBegin)};
}

}  // namespace vorn
