// SPDX-License-Identifier: MIT
// Every JSON argument of every call as every kind of JSON value: how the call ends, that it leaves
// its outputs and the table alone where it fails, and that handle and connection go on working.

#include "support/matrix.h"

#include <algorithm>

namespace {

using VORN_JSON_DB::jsonCopyMember;

struct Scene {
    VornJsonDbApi& api;
    Outputs out;
};

// Whether the argument in question is an output, and what happens to the text that a call appends
// to where it fails.
enum class Way { kInput, kOutput, kAppends };

struct Call {
    const char* szName;
    Way way;
    int (*run)(Scene& scene, Json::Value& jArgument);
};

int copied(Json::Value& jIn, Json::Value& jSubSet)
{
    const int iResult = jsonCopyMember(jIn, jSubSet, false);
    EXPECT_EQ(iResult, jsonCopyMember(jIn, jSubSet, true));
    return iResult;
}

std::string strOfMember = "m";
std::string strOfWhere = "1";
std::vector<std::string> strOfVector = {"a", "b"};

int updateWhere(Scene& scene, Json::Value& jArgument)
{
    return scene.api.recUpdateByWhere(jArgument, strOfWhere);
}

template <int iJoiner>
int expandList(Scene& scene, Json::Value& jArgument)
{
    return scene.api.SqlExpandMemberList(jArgument, scene.out.strText, iJoiner);
}

Json::Value& sound()
{
    static Json::Value jRecord;
    return jRecord = json(kRecord);
}

Json::Value& noMatch()
{
    static Json::Value jRequest;
    return jRequest = json(R"({"m":6})");
}

const Call kCalls[] = {
    {"checkJsonType", Way::kInput, [](Scene& s, Json::Value& j) { return s.api.checkJsonType(j); }},
    {"fillDefaultValue, fill", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.fillDefaultValue(j, false); }},
    {"fillDefaultValue, check", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.fillDefaultValue(j, true); }},
    {"recSave, insert", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.recSave(j, true); }},
    {"recSave, replace", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.recSave(j, false); }},
    {"recCreate, in", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.recCreate(j, s.out.jObject); }},
    {"recCreate, out", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.recCreate(sound(), j); }},
    {"recList, request", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.recList(j, s.out.jArray); }},
    {"recList, out", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.recList(sound(), j); }},
    {"recGetOne, request", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.recGetOne(j, s.out.jObject); }},
    {"recGetOne, out", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.recGetOne(sound(), j); }},
    {"recList, out, no match", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.recList(noMatch(), j); }},
    {"recGetOne, out, no match", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.recGetOne(noMatch(), j); }},
    {"recUpdateByWhere", Way::kInput, updateWhere},
    {"recUpdateByFilter, filter", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.recUpdateByFilter(j, sound()); }},
    {"recUpdateByFilter, values", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.recUpdateByFilter(sound(), j); }},
    {"recDelete", Way::kInput, [](Scene& s, Json::Value& j) { return s.api.recDelete(j); }},
    {"recDelete, all", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.recDelete(j, true); }},
    {"SqlExpandMemberName", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.SqlExpandMemberName(s.out.strText, &j); }},
    {"SqlExpandMemberSymbol", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.SqlExpandMemberSymbol(s.out.strText, j); }},
    {"SqlExpandMemberList, or", Way::kAppends, expandList<VORN_SQL_WHERE_TYPE_OR>},
    {"SqlExpandMemberList, and", Way::kAppends, expandList<VORN_SQL_WHERE_TYPE_AND>},
    {"SqlExpandMemberList, comma", Way::kAppends, expandList<VORN_SQL_WHERE_TYPE_COMMA>},
    {"SqlExpandMemberList, 3", Way::kInput, expandList<3>},
    {"SqlMakeByMatchField", Way::kInput,
     [](Scene& s, Json::Value& j) {
         return s.api.SqlMakeByMatchField(strOfMember, j, s.out.strText);
     }},
    {"SqlMakeByListField", Way::kInput,
     [](Scene& s, Json::Value& j) { return s.api.SqlMakeByListField("m", j, s.out.strText); }},
    {"VectorParamToJson", Way::kOutput,
     [](Scene& s, Json::Value& j) { return s.api.VectorParamToJson(strOfVector, "m", j); }},
    {"SqlFilterConditionFromJson", Way::kAppends,
     [](Scene& s, Json::Value& j) { return s.api.SqlFilterConditionFromJson(j, s.out.strText); }},
    {"jsonCopyMember, into", Way::kOutput,
     [](Scene&, Json::Value& j) { return copied(j, sound()); }},
    {"jsonCopyMember, from", Way::kInput,
     [](Scene& s, Json::Value& j) { return copied(s.out.jObject, j); }},
};

// The value in question stands at "$" of the argument. An end is the result, or T for a
// Json::LogicError; "rec" is {"m":5,"z":"z"}, the record that the table holds.
struct Row {
    const char* szCalls;  // between bars
    const char* szArgument;
    const char* szEnds;
};

// clang-format off
const Row kRows[] = {
    //                                                       null true  -1 2^64-1 1.5  ""  "x"   []  [1]   {} {"k":1} rec
    {"checkJsonType",               "$",                    " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {"fillDefaultValue, fill",      "$",                    "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"fillDefaultValue, check",     "$",                    " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1    0"},
    {"recSave, insert|recSave, replace|recCreate, in|recUpdateByWhere|recUpdateByFilter, filter|recUpdateByFilter, values",
                                    "$",                    " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1    0"},
    {"recCreate, out",              "$",                    "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"recList, request",            "$",                    "  0   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {"recGetOne, out, no match",    "$",                    "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"recList, out|recList, out, no match",
                                    "$",                    "  0   -1   -1   -1   -1   -1   -1    0    0   -1   -1   -1"},
    {"recGetOne, request|recGetOne, out",
                                    "$",                    "  1   -1   -1   -1   -1   -1   -1   -1   -1    1    1    1"},
    {"recDelete",                   "$",                    " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1    1"},
    {"recDelete, all",              "$",                    " -1   -1   -1   -1   -1   -1   -1   -1   -1    1    1    1"},
    {"SqlExpandMemberName|SqlExpandMemberSymbol",
                                    "$",                    "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"SqlExpandMemberList, or|SqlExpandMemberList, and|SqlExpandMemberList, comma",
                                    "$",                    "  1   -1   -1   -1   -1   -1   -1   -1   -1    1    1    0"},
    {"SqlExpandMemberList, 3",      "$",                    " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"SqlMakeByMatchField",         "$",                    "  0    0    0    0    0    0    0    T    T    T    T    T"},
    {"SqlMakeByListField",          "$",                    " -1   -1   -1   -1   -1   -1   -1    0    0   -1   -1   -1"},
    {"SqlMakeByListField",          "[$]",                  "  0    0    0    0    0    0    0    T    T    T    T    T"},
    {"SqlMakeByListField",          "[2,$]",                "  0    0    0    0    0    0    0    T    T    T    T    T"},
    {"VectorParamToJson|SqlFilterConditionFromJson|jsonCopyMember, into",
                                    "$",                    "  0   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {"jsonCopyMember, from",        "$",                    " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {"jsonCopyMember, into|jsonCopyMember, from",
                                    R"({"m":$})",           "  0    0    0    0    0    0    0    0    0    0    0    0"},
    // Members that no table declares.
    {"checkJsonType|fillDefaultValue, fill|recSave, insert|recSave, replace|recCreate, in|recUpdateByWhere|recUpdateByFilter, values",
                                    R"({"m":5,"x":$,"z":"z"})",
                                                            "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"recList, request|recUpdateByFilter, filter",
                                    R"({"m":5,"x":$})",     "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"recGetOne, request|recDelete",R"({"m":5,"x":$})",     "  1    1    1    1    1    1    1    1    1    1    1    1"},
    // The raw filter; SQLite refuses an empty one and one of an unknown column.
    {"SqlExpandMemberList, or|SqlExpandMemberList, and|SqlExpandMemberList, comma",
                      R"({"m":5,"vornSqlWhereFilter":$})",  " -1   -1   -1   -1   -1    0    0   -1   -1   -1   -1   -1"},
    {"recList, request|recGetOne, request|recDelete|recDelete, all|recUpdateByFilter, filter",
                      R"({"m":5,"vornSqlWhereFilter":$})",  " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"recUpdateByWhere|recUpdateByFilter, values",
                      R"({"m":5,"vornSqlWhereFilter":$})",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    // Sorting and paging; SQLite wants whole numbers of 64 bits.
    {"SqlFilterConditionFromJson|recList, request",
                      R"({"sort_by":$})",                   "  T    T    T    T    T    0    0    T    T    T    T    T"},
    {"recGetOne, request",
                      R"({"sort_by":$})",                   "  T    T    T    T    T    1    1    T    T    T    T    T"},
    {"SqlFilterConditionFromJson|recList, request",
                      R"({"sort_by":"z","sort_direction":$})",
                                                            "  0    0    0    0    0    0    0    T    T    T    T    T"},
    {"SqlFilterConditionFromJson|recList, request",
                      R"({"sort_direction":$})",            "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"SqlFilterConditionFromJson",
                      R"({"limit":$})",                     "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"SqlFilterConditionFromJson",
                      R"({"limit":1,"offset":$})",          "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"recList, request",
                      R"({"limit":$})",                     " -1    0    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"recList, request",
                      R"({"limit":1,"offset":$})",          " -1    0    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"recList, request",
                      R"({"offset":$})",                    "  0    0    0    0    0    0    0    0    0    0    0    0"},
};
// clang-format on

class Matrix : public TableTest {
protected:
    Rows contents() { return database_.rows("select m, z from " + table_.strName); }

    void check(const Call& call, const char* szTemplate, const std::string& strKind,
               const std::string& strExpected)
    {
        SCOPED_TRACE(std::string(call.szName) + " " + szTemplate + " " + strKind);
        database_.run("delete from " + table_.strName);
        database_.run("insert into " + table_.strName + " values (5, 'z')");
        const Rows before = contents();
        Scene scene{table_.api, {}};
        Json::Value jArgument = filledIn(szTemplate, strKind);
        const Json::Value jBefore = jArgument;

        const std::string strEnd = endOf([&] { return call.run(scene, jArgument); });
        EXPECT_EQ(strExpected, strEnd);
        EXPECT_EQ("-1" == strEnd, !takeLog().empty());
        if (Way::kOutput != call.way || isFailure(strEnd)) {
            EXPECT_EQ(jBefore, jArgument);
            EXPECT_EQ(jBefore.type(), jArgument.type());
        }
        if (isFailure(strEnd)) {
            EXPECT_EQ(before, contents());
            if (Way::kAppends == call.way) scene.out.strText.resize(6);
            scene.out.expectUntouched();
        }
        expectSound(database_, table_.api, kRecord);
        ++nCells_;
    }

    Table table_{database_, R"({"m":{"cpptype":"int"},"z":{"cpptype":"string"}})", "m, z"};
    std::size_t nCells_ = 0;
    UnwatchedLog unwatched_;
};

TEST_F(Matrix, OfJsonArguments)
{
    std::vector<std::string> kinds(std::begin(kKinds), std::end(kKinds));
    kinds.emplace_back(kRecord);
    for (const Row& row : kRows) {
        const std::vector<std::string> ends = split(row.szEnds, ' ');
        ASSERT_EQ(kinds.size(), ends.size()) << row.szCalls << " " << row.szArgument;
        for (const std::string& strCall : split(row.szCalls, '|')) {
            const auto call = std::find_if(std::begin(kCalls), std::end(kCalls),
                                           [&](const Call& c) { return strCall == c.szName; });
            ASSERT_NE(std::end(kCalls), call) << strCall;
            for (std::size_t i = 0; i < kinds.size(); ++i)
                check(*call, row.szArgument, kinds[i], ends[i]);
        }
    }
    printFigure("matrix cells, JSON arguments", nCells_);
}

}  // namespace
