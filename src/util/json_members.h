// Members of a JSON value that may be of any kind: what is not an object has none, where jsoncpp's
// own calls would throw.
#pragma once

#include <json/value.h>

#include <string_view>

// The member, or null where there is none.
inline const Json::Value* findMember(const Json::Value& jValue, std::string_view strKey)
{
    return jValue.isObject() ? jValue.find(strKey.data(), strKey.data() + strKey.size()) : nullptr;
}

inline bool hasMember(const Json::Value& jValue, std::string_view strKey)
{
    return nullptr != findMember(jValue, strKey);
}

inline Json::Value::Members memberNames(const Json::Value& jValue)
{
    return jValue.isObject() ? jValue.getMemberNames() : Json::Value::Members();
}

// The type word of a member as the cache of member types holds it.
inline std::string typeWordOf(const Json::Value& jMember)
{
    const Json::Value* pjWord = findMember(jMember, "cpptype");
    return nullptr == pjWord ? std::string() : pjWord->asString();
}
