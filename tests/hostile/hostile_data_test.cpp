// SPDX-License-Identifier: MIT
// Every hostile string in the roles of a text that is data: it comes back as it was, and finds and
// deletes the record that holds it.

#include "support/hostile_roles.h"

#include <algorithm>
#include <climits>
#include <cstdlib>

namespace {

class HostileData : public HostileRoleTest {
protected:
    // The member of record 1 as a fetch gives it.
    Json::Value fetched(const char* szMember)
    {
        Json::Value jRequest = json(R"({"n":1})");
        Json::Value jRecord;
        EXPECT_EQ(1, table_.api.recGetOne(jRequest, jRecord));
        EXPECT_EQ(3U, jRecord.size());
        return jRecord[szMember];
    }

    // Sets the member of record 1.
    void update(const char* szMember, const Json::Value& jValue)
    {
        Json::Value jFilter = json(R"({"n":1})");
        Json::Value jValues = member(szMember, jValue);
        EXPECT_EQ(0, table_.api.recUpdateByFilter(jFilter, jValues));
        EXPECT_EQ(member(szMember, jValue), jValues);
    }

    // The request means record 1 alone.
    void expectFinds(const Json::Value& jAsked)
    {
        Json::Value jRequest = jAsked;
        Json::Value jRecords;
        EXPECT_EQ(0, table_.api.recList(jRequest, jRecords));
        ASSERT_EQ(1U, jRecords.size());
        EXPECT_EQ(1, jRecords[0]["n"].asInt());
        EXPECT_EQ(1, table_.api.recDelete(jRequest));
        EXPECT_EQ(jAsked, jRequest);
        EXPECT_EQ(1U, rowCount());
        EXPECT_TRUE(doubles::state().log.empty());
    }
};

TEST_F(HostileData, TextOfANewRecord)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jRecord = json(R"({"n":3,"o":{}})");
        jRecord["s"] = strHostile;
        Json::Value jExpected = jRecord;
        jExpected["s"] = upToNul(strHostile);
        Json::Value jStored;
        EXPECT_EQ(0, table_.api.recCreate(jRecord, jStored));
        EXPECT_EQ(jExpected, jStored);
        EXPECT_EQ(0, table_.api.recSave(jRecord, false));
        EXPECT_EQ(jExpected, jRecord);
    });
}

TEST_F(HostileData, TextOfAnUpdate)
{
    forEachString([&](const std::string& strHostile) {
        update("s", strHostile);
        EXPECT_EQ(Json::Value(upToNul(strHostile)), fetched("s"));
        Json::Value jValues = member("s", strHostile);
        std::string strWhere = "n=2";
        EXPECT_EQ(0, table_.api.recUpdateByWhere(jValues, strWhere));
        EXPECT_EQ(upToNul(strHostile),
                  database_.value("select s from " + table_.strName + " where n=2"));
    });
}

TEST_F(HostileData, DefaultValue)
{
    Json::Value& jTypes = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    forEachString([&](const std::string& strHostile) {
        jTypes["s"]["cppDefaultValue"] = strHostile;
        Json::Value jRecord = json(R"({"n":3,"o":{}})");
        Json::Value jStored;
        EXPECT_EQ(0, table_.api.recCreate(jRecord, jStored));
        EXPECT_EQ(Json::Value(upToNul(strHostile)), jStored["s"]);
        EXPECT_EQ(0, table_.api.fillDefaultValue(jRecord, false));
        EXPECT_EQ(Json::Value(strHostile), jRecord["s"]);
        jTypes["s"].removeMember("cppDefaultValue");
    });
}

// In JSON text a NUL is spelt out and stays.
TEST_F(HostileData, JsonMember)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jObject;
        jObject[strHostile].append(strHostile);
        update("o", jObject);
        EXPECT_EQ(jObject, fetched("o"));
        expectFinds(member("o", jObject));
    });
}

TEST_F(HostileData, Condition)
{
    forEachString([&](const std::string& strHostile) {
        update("s", strHostile);
        expectFinds(member("s", strHostile));
    });
}

TEST_F(HostileData, ListItem)
{
    forEachString([&](const std::string& strHostile) {
        update("s", strHostile);
        Json::Value jList(Json::arrayValue);
        jList.append(strHostile);
        expectFinds(member("s", jList));
    });
}

TEST_F(HostileData, ListItemOfAJsonMember)
{
    forEachString([&](const std::string& strHostile) {
        update("o", member("k", strHostile));
        Json::Value jList(Json::arrayValue);
        jList.append(member("k", strHostile));
        expectFinds(member("o", jList));
    });
}

TEST_F(HostileData, ValueOfADeleteByArray)
{
    forEachString([&](const std::string& strHostile) {
        update("s", strHostile);
        std::vector<std::string> values = {strHostile};
        EXPECT_EQ(1, table_.api.recDeleteByArray(values, "s"));
        EXPECT_EQ(1U, rowCount());
        EXPECT_EQ(std::vector<std::string>{strHostile}, values);
    });
}

TEST_F(HostileData, ValueOfADeleteByName)
{
    forEachString([&](const std::string& strHostile) {
        update("s", strHostile);
        std::string strValue = strHostile;
        EXPECT_EQ(strHostile.empty() ? -1 : 1, table_.api.recDeleteByName(strValue, "s"));
        EXPECT_EQ(strHostile.empty() ? 2U : 1U, rowCount());
        EXPECT_EQ(strHostile, strValue);
    });
}

TEST_F(HostileData, SortKeyAndDirection)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jRequest;
        jRequest["sort_by"] = strHostile;
        jRequest["sort_direction"] = strHostile;
        std::string strOut;
        EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jRequest, strOut));
        EXPECT_EQ(" order by '" + doubled(strHostile) + "' ASC", strOut);
        Json::Value jRecords;
        EXPECT_EQ(0, table_.api.recList(jRequest, jRecords));
        EXPECT_EQ(2U, jRecords.size());
    });
}

long long number(const std::string& strText)
{
    return strtoll(strText.c_str(), nullptr, 10);
}

Json::Value asText(const std::string& strText)
{
    return strText.c_str();
}

Json::Value asInt(const std::string& strText)
{
    return static_cast<int>(std::clamp<long long>(number(strText), INT_MIN, INT_MAX));
}

Json::Value asInt64(const std::string& strText)
{
    return Json::Int64(number(strText));
}

Json::Value asBool(const std::string& strText)
{
    return 1 == number(strText);
}

Json::Value asJson(const std::string& strText)
{
    return leftByReader(strText.c_str());
}

struct Word {
    const char* szWord;
    // What a stored text comes back as; null where no column can be decoded.
    Json::Value (*value)(const std::string& strText);
};

const Word kWords[] = {
    {"string", asText},      {"int", asInt},
    {"unsigned int", asInt}, {"long long", asInt64},
    {"bool", asBool},        {"unsigned long long", asInt64},
    {"double", nullptr},     {"Json::objectValue", asJson},
    {"unknown", nullptr},    {"Json::arrayValue", asJson},
};

// The text of a column, stored by somebody else.
TEST_F(HostileData, StoredTextUnderEveryWord)
{
    for (const Word& word : kWords) {
        SCOPED_TRACE(word.szWord);
        Table stored(database_, std::string(R"({"v":{"cpptype":")") + word.szWord + R"("}})", "v");
        forEachString([&](const std::string& strHostile) {
            database_.run("delete from " + stored.strName);
            database_.run("insert into " + stored.strName + " values ('" + doubled(strHostile) +
                          "')");
            const bool blDecoded = nullptr != word.value;
            Json::Value jRequest;
            Json::Value jRecords(Json::arrayValue);
            EXPECT_EQ(blDecoded ? 0 : -1, stored.api.recList(jRequest, jRecords));
            EXPECT_EQ(blDecoded, doubles::state().log.empty());
            ASSERT_EQ(blDecoded ? 1U : 0U, jRecords.size());
            if (blDecoded) {
                EXPECT_EQ(text(word.value(strHostile)), text(jRecords[0]["v"]));
            }
        });
    }
}

TEST_F(HostileData, MessageOfTheHost)
{
    forEachString([&](const std::string& strHostile) {
        table_.api.setErrMsg(strHostile);
        EXPECT_EQ(strHostile, table_.api.getErrMsg());
        table_.api.setErrMsg("");
    });
}

TEST_F(HostileData, NameAndValueOfCopiedMembers)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jFrom;
        jFrom[strHostile] = strHostile;
        Json::Value jInto;
        EXPECT_EQ(0, VORN_JSON_DB::jsonCopyMember(jInto, jFrom, true));
        EXPECT_EQ(jFrom, jInto);

        std::vector<std::string> values = {strHostile, strHostile};
        Json::Value jParam;
        const bool blNoKey = upToNul(strHostile).empty();
        EXPECT_EQ(blNoKey ? -1 : 0,
                  table_.api.VectorParamToJson(values, strHostile.c_str(), jParam));
        if (!blNoKey) {
            EXPECT_EQ(Json::Value(strHostile), jParam[strHostile.c_str()][1]);
        }
    });
}

TEST_F(HostileData, TextThatATimeReplaces)
{
    forEachString([&](const std::string& strHostile) {
        std::string strOut = strHostile;
        EXPECT_EQ(-1, VORN_JSON_DB::convert2ReadableTime(0, strOut, 1));
        EXPECT_EQ(strHostile, strOut);
        EXPECT_EQ(0, VORN_JSON_DB::convert2ReadableTime(0, strOut, 5));
        EXPECT_EQ("1970-01-01 00:00:00", strOut);
    });
}

}  // namespace
