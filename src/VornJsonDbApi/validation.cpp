// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/validation.h"

#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/member_types.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

#include <algorithm>

using namespace vorn;

namespace {

bool isOfKind(CheckedKind kind, const Json::Value& jValue)
{
    switch (kind) {
    case CheckedKind::kIntegral: return jValue.isIntegral();
    case CheckedKind::kBool: return jValue.isBool();
    case CheckedKind::kString: return jValue.isString();
    case CheckedKind::kArray: return jValue.isArray();
    case CheckedKind::kObject: return jValue.isObject();
    case CheckedKind::kNo: break;
    }
    return false;
}

}  // namespace

bool vorn::isCompleteAndValid(const Json::Value& jRec, const TableTypes* pTypes)
{
    const std::vector<DeclaredMember>* pMembers = nullptr == pTypes ? nullptr : pTypes->unchanged();
    if (nullptr == pMembers || !jRec.isObject() || jRec.size() != pMembers->size()) return false;
    auto it = jRec.begin();
    return std::all_of(pMembers->begin(), pMembers->end(), [&it](const DeclaredMember& member) {
        const bool blValid =
            memberName(it) == member.strName && isOfKind(member.pForms->checked, *it);
        ++it;
        return blValid;
    });
}

int VornJsonDbApi::fillDefaultValue(Json::Value& jParam, bool blCheckOnly)
{
    const Json::Value& jType = memberTypes(jTableDef, strName);
    if (!jType.isObject()) return 0;
    MemberWalk present(jParam);
    for (auto it = jType.begin(), end = jType.end(); it != end; ++it) {
        const std::string_view strKey = memberName(it);
        if (nullptr != present.find(strKey)) continue;
        if (blCheckOnly) {
            LOG_ERROR("lost data member=%s", std::string(strKey).c_str());
            if (blDebugOutput) LOG_PLAIN("jParam=%s", toString(jParam).c_str());
            return -1;
        }
        const Json::Value* pjDefault = findMember(*it, "cppDefaultValue");
        // Inserting here is safe: the new name sorts before everything still to be visited.
        if (nullptr != pjDefault && (jParam.isNull() || jParam.isObject()))
            jParam[std::string(strKey)] = Json::Value(*pjDefault);
    }
    return 0;
}

int VornJsonDbApi::checkJsonType(Json::Value& jRecParam)
{
    const Json::Value& jType = memberTypes(jTableDef, strName);
    if (FAILED(!jRecParam.isObject())) return -1;
    MemberWalk types(jType);
    const Json::Value& jRec = jRecParam;
    for (auto it = jRec.begin(), end = jRec.end(); it != end; ++it) {
        const std::string_view strKey = memberName(it);
        const Json::Value* pjMember = types.find(strKey);
        if (nullptr == pjMember) continue;
        const CheckedKind kind = TypeWord(*pjMember).forms().checked;
        if (isOfKind(kind, *it)) continue;
        if (CheckedKind::kNo == kind)
            LOG_ERROR("type not found!!, key=%s", std::string(strKey).c_str());
        else
            LOG_ERROR("type failed, strKey=%s, jRecParam=%s", std::string(strKey).c_str(),
                      toString(jRecParam).c_str());
        return -1;
    }
    return 0;
}
