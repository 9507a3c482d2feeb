// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "util/plain_json.h"

#include "util/json_members.h"
#include "util/json_scanner.h"
#include "util/shared_keys.h"

#include <memory>
#include <string_view>

namespace vorn {

namespace {

// Texts that are nested more deeply are left to jsoncpp, which has a limit of its own.
constexpr int kMaxLevels = 200;

// Each function returns false where the text is left to jsoncpp's reader.
class PlainReader {
public:
    explicit PlainReader(const char* szText) : szText_(szText), scanner_(szText) {}

    bool readAll(Json::Value& jValue)
    {
        if (!readValue(jValue, kMaxLevels)) return false;
        scanner_.skipBlanks();
        return '\0' == *scanner_.at();
    }

private:
    bool readValue(Json::Value& jValue, int nLevels)
    {
        scanner_.skipBlanks();
        const char* const szBegin = scanner_.at();
        if (!readPayload(jValue, nLevels)) return false;
        jValue.setOffsetStart(szBegin - szText_);
        jValue.setOffsetLimit(scanner_.at() - szText_);
        return true;
    }

    bool readPayload(Json::Value& jValue, int nLevels)
    {
        switch (*scanner_.at()) {
        case '{': return 0 < nLevels && readObject(jValue, nLevels - 1);
        case '[': return 0 < nLevels && readArray(jValue, nLevels - 1);
        case '"': {
            std::string_view strText;
            return scanner_.readString(strText) &&
                   set(jValue, {strText.data(), strText.data() + strText.size()});
        }
        case 't': return scanner_.skip("true") && set(jValue, true);
        case 'f': return scanner_.skip("false") && set(jValue, false);
        case 'n': return scanner_.skip("null") && set(jValue, {});
        default: return scanner_.readNumber(jValue);
        }
    }

    // Cheaper than an assignment, which moves comments and offsets too.
    static bool set(Json::Value& jValue, Json::Value jNew)
    {
        jValue.swapPayload(jNew);
        return true;
    }

    bool readArray(Json::Value& jArray, int nLevels)
    {
        set(jArray, Json::arrayValue);
        scanner_.skip('[');
        scanner_.skipBlanks();
        if (scanner_.skip(']')) return true;
        do {
            if (!readValue(jArray.append(Json::Value()), nLevels)) return false;
            scanner_.skipBlanks();
        } while (scanner_.skip(','));
        return scanner_.skip(']');
    }

    bool readObject(Json::Value& jObject, int nLevels)
    {
        scanner_.skip('{');
        scanner_.skipBlanks();
        if (scanner_.skip('}')) return set(jObject, Json::objectValue);
        std::string_view strName;
        if (!readName(strName)) return false;
        SharedKey* const pKey = sharedKey(strName);
        const bool blShape = nullptr != pKey && !pKey->blShapeless;
        if (const Json::Value* pjShape =
                blShape ? pKey->pjShape.load(std::memory_order_acquire) : nullptr)
            return fillShape(jObject, *pKey, *pjShape, nLevels);
        set(jObject, Json::objectValue);
        if (!readMembers(jObject, strName, nLevels)) return false;
        if (blShape) learnShape(*pKey, jObject);
        return true;
    }

    // The name of a member, up to its value.
    bool readName(std::string_view& strName)
    {
        scanner_.skipBlanks();
        if (!scanner_.readString(strName)) return false;
        scanner_.skipBlanks();
        return scanner_.skip(':');
    }

    // After the first name, up to the end of the object.
    bool readMembers(Json::Value& jObject, std::string_view strName, int nLevels)
    {
        while (readValue(member(jObject, strName), nLevels)) {
            scanner_.skipBlanks();
            if (scanner_.skip('}')) return true;
            if (!scanner_.skip(',') || !readName(strName)) return false;
        }
        return false;
    }

    static Json::Value& member(Json::Value& jObject, std::string_view strName)
    {
        if (const SharedKey* pKey = sharedKey(strName))
            return jObject[Json::StaticString(pKey->strName.c_str())];
        return *jObject.demand(strName.data(), strName.data() + strName.size());
    }

    // The same for an object that is expected to have the members of the shape in their order,
    // which saves the insertion of each. From the first that differs on, they are inserted.
    bool fillShape(Json::Value& jObject, SharedKey& first, const Json::Value& jShape, int nLevels)
    {
        set(jObject, jShape);
        std::string_view strName = first.strName;
        bool blClosed = false;
        auto shape = jShape.begin();
        const auto end = jShape.end();
        for (auto it = jObject.begin(); end != shape && memberName(shape) == strName; ++it) {
            if (!readValue(*it, nLevels)) return false;
            ++shape;
            scanner_.skipBlanks();
            blClosed = scanner_.skip('}');
            if (blClosed) break;
            if (!scanner_.skip(',') || !readName(strName)) return false;
        }
        if (blClosed && end == shape) return true;
        first.blShapeless = true;
        for (; end != shape; ++shape) jObject.removeMember(memberName(shape).data());
        return blClosed || readMembers(jObject, strName, nLevels);
    }

    static void learnShape(SharedKey& first, const Json::Value& jObject)
    {
        constexpr Json::ArrayIndex kMostMembers = 16;
        auto pjShape = std::make_unique<Json::Value>(Json::objectValue);
        for (auto it = jObject.begin(), end = jObject.end(); end != it; ++it) {
            const SharedKey* pKey = sharedKey(memberName(it));
            if (nullptr == pKey || kMostMembers < jObject.size()) {
                first.blShapeless = true;
                return;
            }
            (*pjShape)[Json::StaticString(pKey->strName.c_str())] = Json::Value();
        }
        const Json::Value* pjNone = nullptr;
        if (first.pjShape.compare_exchange_strong(pjNone, pjShape.get(), std::memory_order_acq_rel))
            static_cast<void>(pjShape.release());
    }

    const char* const szText_;
    JsonScanner scanner_;
};

}  // namespace

bool readPlainJson(const char* szText, Json::Value& jValue)
{
    if (!jValue.isNull()) return false;
    if (PlainReader(szText).readAll(jValue)) return true;
    jValue = Json::Value();
    return false;
}

}  // namespace vorn
