#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

namespace {

bool passes(Check check, const Json::Value& jValue)
{
    switch (check) {
    case Check::kIntegral: return jValue.isIntegral();
    case Check::kBool: return jValue.isBool();
    case Check::kString: return jValue.isString();
    case Check::kArray: return jValue.isArray();
    case Check::kObject: return jValue.isObject();
    case Check::kNo: break;
    }
    return false;
}

}  // namespace

int VornJsonDbApi::fillDefaultValue(Json::Value& jParam, bool blCheckOnly)
{
    const Json::Value& jType = VORN_JSON_DB::recType(jTableDef, strName);
    for (const std::string& strKey : memberNames(jType)) {
        if (hasMember(jParam, strKey)) continue;
        if (blCheckOnly) {
            LOG_ERROR("lost data member=%s", strKey.c_str());
            if (blDebugOutput) LOG_PLAIN("jParam=%s", toString(jParam).c_str());
            return -1;
        }
        const Json::Value* pjDefault = findMember(jType[strKey], "cppDefaultValue");
        if (nullptr != pjDefault && (jParam.isNull() || jParam.isObject()))
            jParam[strKey] = Json::Value(*pjDefault);
    }
    return 0;
}

int VornJsonDbApi::checkJsonType(Json::Value& jRecParam)
{
    const Json::Value& jType = VORN_JSON_DB::recType(jTableDef, strName);
    if (FAILED(!jRecParam.isObject())) return -1;
    for (const std::string& strKey : jRecParam.getMemberNames()) {
        const Json::Value* pjMember = findMember(jType, strKey);
        if (nullptr == pjMember) continue;
        const Check check = typeWord(typeWordOf(*pjMember)).check;
        if (Check::kNo == check) {
            LOG_ERROR("type not found!!, key=%s", strKey.c_str());
            return -1;
        }
        if (!passes(check, jRecParam[strKey])) {
            LOG_ERROR("type failed, strKey=%s, jRecParam=%s", strKey.c_str(),
                      toString(jRecParam).c_str());
            return -1;
        }
    }
    return 0;
}
