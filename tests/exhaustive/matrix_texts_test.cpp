// SPDX-License-Identifier: MIT
// Null and empty for every text and pointer of every call: how the call ends.

#include "support/matrix.h"

namespace {

using VORN_JSON_DB::convert2ReadableTime;
using VORN_JSON_DB::getTimeAfterNow;

std::string strEmpty;
std::string strOfMember = "z";
std::string strOfValue = "z";
Json::Value jNone;

struct Scene {
    VornJsonDbApi& api;
    Outputs out;
    std::vector<std::string> values;  // "z"
    Json::Value jRecord;              // {"m":5,"z":"z"}, as the row of the table
};

struct Row {
    const char* szCall;
    const char* szEnd;              // the result
    const char* szWithoutDatabase;  // of a handle without a connection
    int (*run)(Scene& s);
};

std::vector<std::string>& empty(std::vector<std::string>& values)
{
    values.clear();
    return values;
}

// What the call appends to a text that is empty is as long as what it appends to another.
template <typename Append>
int appendsAlike(Append append)
{
    std::string strOther = "before";
    std::string strOut;
    const int iResult = append(strOut);
    EXPECT_EQ(iResult, append(strOther));
    EXPECT_EQ(strOther, "before" + strOut);
    return iResult;
}

int ignoreRow(void*, int, char**, char**)
{
    return 0;
}

const Row kRows[] = {
    {"tableCreate", "0", "-1", [](Scene& s) { return s.api.tableCreate(); }},
    {"runSqlEx, no text", "-1", "-1", [](Scene& s) { return s.api.runSqlEx(""); }},
    {"runSqlEx, no text, a callback", "-1", "-1",
     [](Scene& s) { return s.api.runSqlEx("", ignoreRow); }},
    // Without a callback the result is the count of the last INSERT.
    {"runSqlEx, no callback", "1", "-1",
     [](Scene& s) { return s.api.runSqlEx("select 1", nullptr, &s); }},
    {"runSqlEx, no callback's argument", "0", "-1",
     [](Scene& s) { return s.api.runSqlEx("select 1", ignoreRow, nullptr); }},
    {"runSqlEx, blanks", "1", "-1", [](Scene& s) { return s.api.runSqlEx("  "); }},

    {"recSave", "0", "-1", [](Scene& s) { return s.api.recSave(s.jRecord, true); }},
    {"recCreate", "0", "-1", [](Scene& s) { return s.api.recCreate(s.jRecord, s.out.jObject); }},
    {"recList", "0", "-1", [](Scene& s) { return s.api.recList(jNone, s.out.jArray); }},
    {"recGetOne", "1", "-1", [](Scene& s) { return s.api.recGetOne(jNone, s.out.jObject); }},
    {"recDelete", "1", "-1", [](Scene& s) { return s.api.recDelete(s.jRecord); }},
    {"recDeleteAll", "1", "-1", [](Scene& s) { return s.api.recDeleteAll(); }},

    {"recUpdateByWhere, no condition", "-1", "-1",
     [](Scene& s) { return s.api.recUpdateByWhere(s.jRecord, strEmpty); }},
    {"recUpdateByWhere", "0", "-1",
     [](Scene& s) { return s.api.recUpdateByWhere(s.jRecord, strOfMember); }},
    {"recUpdateByFilter", "0", "-1",
     [](Scene& s) { return s.api.recUpdateByFilter(s.jRecord, s.jRecord); }},

    {"recDeleteByArray, null key", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByArray(s.values, nullptr); }},
    {"recDeleteByArray, empty key", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByArray(s.values, ""); }},
    {"recDeleteByArray, no values", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByArray(empty(s.values), "z"); }},
    {"recDeleteByArray, no values, null key", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByArray(empty(s.values), nullptr); }},
    {"recDeleteByArray, an empty value", "0", "-1",
     [](Scene& s) {
         s.values[0].clear();
         return s.api.recDeleteByArray(s.values, "z");
     }},
    {"recDeleteByArray", "1", "-1", [](Scene& s) { return s.api.recDeleteByArray(s.values, "z"); }},
    {"recDeleteByName, null key", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByName(strOfValue, nullptr); }},
    {"recDeleteByName, empty key", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByName(strOfValue, ""); }},
    {"recDeleteByName, no value", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByName(strEmpty, "z"); }},
    {"recDeleteByName, no value, null key", "-1", "-1",
     [](Scene& s) { return s.api.recDeleteByName(strEmpty, nullptr); }},
    {"recDeleteByName", "1", "-1", [](Scene& s) { return s.api.recDeleteByName(strOfValue, "z"); }},

    {"SqlExpandMemberName, null record", "0", "0",
     [](Scene& s) {
         return appendsAlike([&](std::string& t) { return s.api.SqlExpandMemberName(t, nullptr); });
     }},
    {"SqlExpandMemberSymbol, empty text", "0", "0",
     [](Scene& s) {
         return appendsAlike(
             [&](std::string& t) { return s.api.SqlExpandMemberSymbol(t, s.jRecord); });
     }},
    {"SqlExpandMemberList, empty text", "0", "0",
     [](Scene& s) {
         return appendsAlike([&](std::string& t) {
             return s.api.SqlExpandMemberList(s.jRecord, t, VORN_SQL_WHERE_TYPE_AND);
         });
     }},
    {"SqlMakeByMatchField, empty name", "-1", "-1",
     [](Scene& s) { return s.api.SqlMakeByMatchField(strEmpty, jNone, s.out.strText); }},
    {"SqlMakeByMatchField, empty text", "0", "0",
     [](Scene& s) {
         return appendsAlike(
             [&](std::string& t) { return s.api.SqlMakeByMatchField(strOfMember, jNone, t); });
     }},
    {"SqlMakeByListField, null name", "-1", "-1",
     [](Scene& s) { return s.api.SqlMakeByListField(nullptr, s.out.jArray, s.out.strText); }},
    {"SqlMakeByListField, empty name", "-1", "-1",
     [](Scene& s) { return s.api.SqlMakeByListField("", s.out.jArray, s.out.strText); }},
    {"SqlMakeByListField, empty text", "0", "0",
     [](Scene& s) {
         return appendsAlike(
             [&](std::string& t) { return s.api.SqlMakeByListField("z", s.out.jArray, t); });
     }},
    {"VectorParamToJson, null key", "-1", "-1",
     [](Scene& s) { return s.api.VectorParamToJson(s.values, nullptr, s.out.jObject); }},
    {"VectorParamToJson, empty key", "-1", "-1",
     [](Scene& s) { return s.api.VectorParamToJson(s.values, "", s.out.jObject); }},
    {"VectorParamToJson, no values", "0", "0",
     [](Scene& s) { return s.api.VectorParamToJson(empty(s.values), "z", s.out.jObject); }},
    {"SqlFilterConditionFromJson, empty text", "0", "0",
     [](Scene& s) {
         s.jRecord["limit"] = 1;
         return appendsAlike(
             [&](std::string& t) { return s.api.SqlFilterConditionFromJson(s.jRecord, t); });
     }},

    {"setErrMsg, empty", "0", "0",
     [](Scene& s) {
         s.api.setErrMsg("x");
         s.api.setErrMsg("");
         return s.api.getErrMsg().empty() ? 0 : -1;
     }},
    {"convert2ReadableTime, empty text", "0", "0",
     [](Scene&) {
         std::string strOut;
         return convert2ReadableTime(0, strOut, 3);
     }},
    {"convert2ReadableTime, no layout", "-1", "-1",
     [](Scene& s) { return convert2ReadableTime(0, s.out.strText, 0); }},
    {"getTimeAfterNow, empty text", "0", "0",
     [](Scene&) {
         std::string strOut;
         return getTimeAfterNow(0, strOut, 3);
     }},
    {"getTimeAfterNow, no layout", "-1", "-1",
     [](Scene& s) { return getTimeAfterNow(0, s.out.strText, 0); }},
};

class TextMatrix : public TableTest {
protected:
    void check(const Row& row, VornJsonDbApi& api, const std::string& strExpected)
    {
        database_.run("delete from " + table_.strName);
        database_.run("insert into " + table_.strName + " values (5, 'z')");
        Scene scene{api, {}, {"z"}, json(kRecord)};
        const std::string strEnd = endOf([&] { return row.run(scene); });
        EXPECT_EQ(strExpected, strEnd);
        EXPECT_EQ("-1" == strEnd, !takeLog().empty());
        if (isFailure(strEnd)) {
            scene.out.expectUntouched();
            EXPECT_EQ(json(kRecord), scene.jRecord);
            EXPECT_EQ("1", database_.value("select count(*) from " + table_.strName));
        }
        EXPECT_EQ("", api.getErrMsg());
        expectSound(database_, table_.api, kRecord);
        ++nCells_;
    }

    Table table_{database_, R"({"m":{"cpptype":"int"},"z":{"cpptype":"string"}})", "m, z"};
    std::size_t nCells_ = 0;
    UnwatchedLog unwatched_;
};

TEST_F(TextMatrix, OfNullAndEmpty)
{
    VornJsonDbApi unconnected(nullptr, table_.strName, table_.jDefinition, table_.strCreate);
    EXPECT_EQ(plain("Failed [!pDb]"), takeLog().at(0));
    for (const Row& row : kRows) {
        SCOPED_TRACE(row.szCall);
        check(row, table_.api, row.szEnd);
        check(row, unconnected, row.szWithoutDatabase);
    }
    printFigure("matrix cells, texts and pointers", nCells_);
}

// A handle with some of its arguments missing; each bit of iMissing is one.
void checkHandleWithout(int iMissing, Database& database, const Table& table)
{
    SCOPED_TRACE(iMissing);
    std::string strName = 0 != (iMissing & 2) ? "" : freshName();
    Json::Value jDefinition = 0 != (iMissing & 4) ? Json::Value() : table.jDefinition;
    std::string strCreate = 0 != (iMissing & 8) ? "" : table.strCreate;
    VornJsonDbApi api(0 != (iMissing & 1) ? nullptr : database.get(), strName, jDefinition,
                      strCreate);
    Lines expected;
    if (0 != (iMissing & 1)) expected.push_back(plain("Failed [!pDb]"));
    if (0 != (iMissing & 2)) expected.push_back(plain("Failed [strName.empty()]"));
    if (0 != (iMissing & 4)) expected.push_back(plain("Failed [jTableDef.empty()]"));
    if (0 != (iMissing & 8)) expected.push_back(plain("Failed [strSqlCreate.empty()]"));
    Lines lines = takeLog();
    const bool blCreated = 0 == (iMissing & 9);
    EXPECT_EQ(blCreated, lines.empty() || failed("0 > tableCreate()") != lines.back());
    lines.resize(expected.size());
    EXPECT_EQ(expected, lines);
    EXPECT_EQ("", api.getErrMsg());
    // No such table is there or defined: what runs SQL fails, and all the rest ends too.
    for (const Row& row : kRows) {
        SCOPED_TRACE(row.szCall);
        Scene scene{api, {}, {"z"}, json(kRecord)};
        const std::string strEnd = endOf([&] { return row.run(scene); });
        if (0 == std::string(row.szCall).compare(0, 3, "rec")) {
            EXPECT_EQ("-1", strEnd);
        }
        takeLog();
    }
}

TEST_F(TextMatrix, OfHandlesMadeOfNothing)
{
    constexpr int kChoices = 16;
    // In a process of its own, because the member types of the empty name would stay.
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(
        {
            for (int i = 0; i < kChoices; ++i) {
                checkHandleWithout(i, database_, table_);
                expectSound(database_, table_.api, kRecord);
            }
            endProcess(database_);
        },
        testing::ExitedWithCode(0), "");
    printFigure("matrix cells, handles with empty arguments", kChoices * std::size(kRows));
}

}  // namespace
