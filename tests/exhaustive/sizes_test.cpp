// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// How wide, long and deep records may be. Each failed look-up of member types logs those of all
// tables, so the tests of look-ups run before the wide tables here.

#include "support/matrix.h"
#include "support/stack.h"

namespace {

class LargeRecords : public TableTest {};

// A definition of that many columns, "c0000" and so on, and a record of them, as JSON.
struct Wide {
    explicit Wide(int nColumns)
    {
        for (int i = 0; i < nColumns; ++i) {
            const std::string strComma = 0 == i ? "" : ",";
            const std::string strName = "c" + std::to_string(10000 + i);
            const bool blText = 0 != i % 2;
            strColumns += strComma + strName;
            strMembers += strComma + '"' + strName + "\":{\"cpptype\":\"" +
                          (blText ? "string" : "int") + "\"}";
            strRecord += strComma + '"' + strName +
                         "\":" + (blText ? "\"it's" + std::to_string(i) + '"' : std::to_string(i));
            // SQLite's limit for the depth of an expression is 1,000.
            if (899 == i) strRequest = "{" + strRecord + "}";
        }
        strMembers = "{" + strMembers + "}";
        strRecord = "{" + strRecord + "}";
    }

    std::string strColumns, strMembers, strRecord, strRequest;
};

// SQLite's default limit.
constexpr int kMaxColumns = 2000;

TEST_F(LargeRecords, MayHaveAsManyColumnsAsSqliteAllows)
{
    const Wide wide(kMaxColumns);
    const std::string& strRecord = wide.strRecord;
    Table table(database_, wide.strMembers, wide.strColumns);
    const auto end = [&](const std::string& strCall) {
        return called(table.api, split(strCall, ' ')).whole();
    };
    EXPECT_EQ("0 " + strRecord, end("recCreate " + strRecord + " {}"));
    EXPECT_EQ("1 " + strRecord, end("recGetOne null {}"));
    EXPECT_EQ("0", end("recSave " + strRecord + " insert"));
    EXPECT_EQ("0", end("recUpdateByWhere " + strRecord + " 1"));
    EXPECT_EQ("0 [" + strRecord + "," + strRecord + "]", end("recList " + wide.strRequest + " []"));
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("-1", end("recList " + strRecord));
    EXPECT_EQ("-1", end("recDelete " + strRecord));
    takeLog();
    EXPECT_EQ("2", database_.value("select count(*) from " + table.strName));
    expectSound(database_, table.api, strRecord);
}

TEST_F(LargeRecords, MayNotHaveOneColumnMore)
{
    const Wide wide(kMaxColumns + 1);
    std::string strName = freshName();
    Json::Value jDefinition = json("{\"" + strName + "\":{\"member\":" + wide.strMembers + "}}");
    std::string strCreate = "create table " + strName + " (" + wide.strColumns + ")";
    VornJsonDbApi api(database_.get(), strName, jDefinition, strCreate);
    EXPECT_EQ(plain("sql error, err=too many columns on " + strName + ", sql=" + strCreate),
              takeLog().at(2));
    EXPECT_EQ("-1", called(api, {"recCreate", wide.strRecord}).whole());
    EXPECT_EQ("-1", called(api, {"recList", "null"}).whole());
    EXPECT_LE(3U, takeLog().size());
    Table sound(database_, R"({"z":{"cpptype":"string"}})", "z");
    expectSound(database_, sound.api, R"({"z":"sound"})");
}

// A mebibyte that has to be escaped in many places.
std::string longText()
{
    std::string strText;
    while (strText.size() < (1U << 20)) strText += "O'Brien \"\\\n\xc5\xbe\xf0\x9f\x90\x8e; -- ";
    strText.resize(1U << 20, 'x');
    return strText;
}

Json::Value member(const char* szName, const Json::Value& jValue)
{
    Json::Value jObject;
    jObject[szName] = jValue;
    return jObject;
}

TEST_F(LargeRecords, MayHoldATextOfAMebibyte)
{
    Table table(
        database_,
        R"({"n":{"cpptype":"int"},"o":{"cpptype":"Json::objectValue"},"s":{"cpptype":"string"}})",
        "n, o, s");
    Json::Value jRecord = member("o", member("k", longText()));
    jRecord["n"] = 1;
    jRecord["s"] = longText();
    Json::Value jStored;
    EXPECT_EQ(0, table.api.recCreate(jRecord, jStored));
    EXPECT_EQ(jRecord, jStored);
    table.create(R"({"n":2,"o":{},"s":"other"})");

    Json::Value jText = member("s", longText());
    Json::Value jItem;
    jItem.append(longText());
    const std::string strFilter = "s = '" + replaced(longText(), '\'', "''") + "'";
    for (Json::Value jRequest : {jText, member("s", jItem), member("o", jRecord["o"]),
                                 member("vornSqlWhereFilter", strFilter)}) {
        Json::Value jFound;
        EXPECT_EQ(0, table.api.recList(jRequest, jFound));
        ASSERT_EQ(1U, jFound.size());
        EXPECT_EQ(jRecord, jFound[0]);
        EXPECT_EQ(0, table.api.recUpdateByFilter(jRequest, jText));
    }
    Json::Value jSorted = member("sort_by", longText());
    EXPECT_EQ(0, table.api.recList(jSorted, jStored = Json::Value()));
    EXPECT_EQ(2U, jStored.size());
    std::string strValue = longText();
    EXPECT_EQ(1, table.api.recDeleteByName(strValue, "s"));
    EXPECT_EQ(Lines(), takeLog());
    table.api.setErrMsg(longText());
    EXPECT_EQ(longText(), table.api.getErrMsg());

    // A line of the log may be as long.
    Json::Value jBad = member("n", longText());
    EXPECT_EQ(-1, table.api.recCreate(jBad, jStored));
    EXPECT_EQ(
        (Lines{error("type failed, strKey=n, jRecParam=" + text(jBad)),
               failed("0 > checkJsonType(jParam)"), plain("call create rec, rec=" + text(jBad))}),
        takeLog());
}

// jsoncpp recurses once per level, and so does this test.
constexpr std::size_t kStack = (VORN_SANITIZED ? 64U : 8U) << 20;

// [[[]]] or {"k":{"k":{}}}
Json::Value nested(Json::ValueType type, std::size_t nLevels)
{
    Json::Value jValue(type);
    for (std::size_t i = 1; i < nLevels; ++i) {
        Json::Value jOuter(type);
        (Json::arrayValue == type ? jOuter[0] : jOuter["k"]).swap(jValue);
        jValue.swap(jOuter);
    }
    return jValue;
}

void storeAndAsk(Database& database, Table& table, std::size_t nLevels)
{
    SCOPED_TRACE(nLevels);
    Json::Value jRecord;
    jRecord["a"] = nested(Json::arrayValue, nLevels);
    jRecord["o"] = nested(Json::objectValue, nLevels);
    const std::string strArrays = text(jRecord["a"]);
    const std::string strObjects = text(jRecord["o"]);
    Json::Value jStored;
    EXPECT_EQ(0, table.api.recCreate(jRecord, jStored));
    EXPECT_EQ((Rows{{strArrays, strObjects}}), database.rows("select a, o from " + table.strName));
    EXPECT_EQ(1000 < nLevels ? json(R"({"a":null,"o":null})") : jRecord, jStored);

    // Found by the whole text, however deep.
    Json::Value jRequest;
    jRequest["a"].append(jRecord["a"]);
    jRequest["o"] = jRecord["o"];
    Json::Value jRecords;
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    ASSERT_EQ(1U, jRecords.size());
    EXPECT_EQ(jStored, jRecords[0]);
    EXPECT_EQ(1, table.api.recDelete(jRequest));

    // Texts that another program stored.
    database.run("insert into " + table.strName + " values ('" + strArrays + "', '" + strObjects +
                 "'); update " + table.strName + " set a = a || ' '");
    jRequest = Json::Value();
    Json::Value jRead;
    EXPECT_EQ(1, table.api.recGetOne(jRequest, jRead));
    EXPECT_EQ(jStored, jRead);
    EXPECT_EQ(1, table.api.recDeleteAll());
    EXPECT_EQ(Lines(), takeLog());

    // A refused record is logged, however deep it is.
    Json::Value jBad = member("o", jRecord["a"]);
    EXPECT_EQ(-1, table.api.recCreate(jBad, jStored));
    EXPECT_EQ(plain("call create rec, rec={\"o\":" + strArrays + "}"), takeLog().back());
    Json::Value jCopy;
    EXPECT_EQ(0, VORN_JSON_DB::jsonCopyMember(jCopy, jRecord, true));
    EXPECT_EQ(jRecord, jCopy);
}

TEST_F(LargeRecords, MayHaveManyLevels)
{
    Table table(database_,
                R"({"a":{"cpptype":"Json::arrayValue"},"o":{"cpptype":"Json::objectValue"}})",
                "a, o");
    withStack(kStack, [&] {
        for (std::size_t nLevels : {1U, 999U, 1000U, 1001U, 10000U})
            storeAndAsk(database_, table, nLevels);
    });
    expectSound(database_, table.api, R"({"a":[],"o":{}})");
}

}  // namespace
