// SPDX-License-Identifier: MIT
#include "support/record_calls.h"

namespace {

// An argument that must not change, even if the call throws.
template <typename Value>
struct Unchanged {
    explicit Unchanged(const Value& given) : value(given), before(given) {}
    ~Unchanged() { EXPECT_EQ(before, value) << "an argument was changed"; }

    Value value;
    const Value before;
};

struct Request : Unchanged<Json::Value> {
    explicit Request(const std::string& strText) : Unchanged(json(strText)) {}
};

std::string joined(const std::vector<std::string>& texts)
{
    std::string strJoined;
    for (const std::string& strText : texts) strJoined += "," + strText;
    return strJoined.substr(texts.empty() ? 0 : 1);
}

// A request or record as the log shows it.
std::string shown(const char* szName, const std::string& strValue)
{
    return plain(szName + ("=" + text(json(strValue))));
}

}  // namespace

RecordsTest::Call RecordsTest::save(const std::string& strRecord, bool blCreate)
{
    return {"recSave " + strRecord,
            [=](VornJsonDbApi& api, Json::Value& jOut) { return api.recSave(jOut, blCreate); },
            {{failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
              shown(blCreate ? "blCreate=1, jRecInOut" : "blCreate=0, jRecInOut", strRecord),
              plain("jType=$types")}},
            strRecord};
}

RecordsTest::Call RecordsTest::create(const std::string& strRecord, const std::string& strFilled)
{
    Call call = save(strFilled.empty() ? strRecord : strFilled, true);
    call.strName = "recCreate " + strRecord;
    call.run = [=](VornJsonDbApi& api, Json::Value& jOut) {
        Request record(strRecord);
        return api.recCreate(record.value, jOut);
    };
    call.levels.push_back(
        {failed("0 > recSave(jParam, true)"), shown("call create rec, rec", call.strOut)});
    call.strOut = R"({"left":"over"})";
    call.blTellsDuplicate = true;
    return call;
}

RecordsTest::Call RecordsTest::list(const std::string& strRequest, const std::string& strArray)
{
    return {"recList " + strRequest,
            [=](VornJsonDbApi& api, Json::Value& jOut) {
                Request request(strRequest);
                return api.recList(request.value, jOut);
            },
            {{failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
              shown("jRecParam", strRequest)}},
            strArray};
}

RecordsTest::Call RecordsTest::get(const std::string& strRequest, const std::string& strOut)
{
    Call call = list(strRequest, strOut);
    call.strName = "recGetOne " + strRequest;
    call.run = [=](VornJsonDbApi& api, Json::Value& jOut) {
        Request request(strRequest);
        return api.recGetOne(request.value, jOut);
    };
    call.levels.push_back({failed("0 > recList(jRecParam, jRecArray)")});
    return call;
}

RecordsTest::Call RecordsTest::updateByWhere(const std::string& strRecord,
                                             const std::string& strWhere)
{
    return {"recUpdateByWhere " + strRecord + " " + strWhere,
            [=](VornJsonDbApi& api, Json::Value&) {
                Request record(strRecord);
                Unchanged<std::string> where(strWhere);
                return api.recUpdateByWhere(record.value, where.value);
            },
            {{failed("0 > runSqlEx(strSql, NULL, NULL)"), shown("jRecIn", strRecord)}}};
}

RecordsTest::Call RecordsTest::updateByFilter(const std::string& strFilter,
                                              const std::string& strValues)
{
    Call call = updateByWhere(strValues, "");
    call.strName = "recUpdateByFilter " + strFilter + " " + strValues;
    call.run = [=](VornJsonDbApi& api, Json::Value&) {
        Request filter(strFilter);
        Request values(strValues);
        return api.recUpdateByFilter(filter.value, values.value);
    };
    call.levels.push_back({failed("0 > recUpdateByWhere(jParamIn, strSql)"),
                           shown("recUpdateByFilter failed, jParamIn", strValues)});
    call.blTellsDuplicate = true;
    return call;
}

RecordsTest::Call RecordsTest::remove(const std::string& strRequest, bool blDeleteAll)
{
    Call call{"recDelete " + strRequest,
              [=](VornJsonDbApi& api, Json::Value&) {
                  Request request(strRequest);
                  return api.recDelete(request.value, blDeleteAll);
              },
              {{failed("0 > (err = runSqlEx(strSqlRun))")}}};
    call.blTracesCount = true;
    return call;
}

RecordsTest::Call RecordsTest::removeAll()
{
    Call call = remove("{}");
    call.strName = "recDeleteAll";
    call.run = [](VornJsonDbApi& api, Json::Value&) { return api.recDeleteAll(); };
    return call;
}

RecordsTest::Call RecordsTest::removeByArray(const std::vector<std::string>& texts,
                                             const char* szKey)
{
    const std::string strKey = nullptr == szKey ? "(null)" : szKey;
    Call call = remove("{}");
    call.strName = "recDeleteByArray " + strKey + " " + joined(texts);
    call.run = [=](VornJsonDbApi& api, Json::Value&) {
        Unchanged<std::vector<std::string>> values(texts);
        return api.recDeleteByArray(values.value, szKey);
    };
    call.levels.push_back(
        {failed("0 > (err = recDelete(jParam))"),
         plain("recDeleteByArray failed, name=" + strKey + ", strVector=" + joined(texts))});
    return call;
}

RecordsTest::Call RecordsTest::removeByName(const std::string& strValue, const char* szKey)
{
    const std::string strKey = nullptr == szKey ? "(null)" : szKey;
    Call call = removeByArray({strValue}, szKey);
    call.strName = "recDeleteByName " + strKey + " " + strValue;
    call.run = [=](VornJsonDbApi& api, Json::Value&) {
        Unchanged<std::string> value(strValue);
        return api.recDeleteByName(value.value, szKey);
    };
    call.levels.push_back(
        {failed("0 > (err = recDeleteByArray(strVector, szKey))"),
         plain("recDeleteByName failed, name=" + strKey + ", strValue=" + strValue)});
    return call;
}
