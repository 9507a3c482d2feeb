// SPDX-License-Identifier: MIT
// A member of every type word as every kind of JSON value, in records, requests and lists: how each
// call ends.

#include "support/matrix.h"

#include <map>
#include <memory>
#include <set>

namespace {

const char* const kWords[] = {"string",      "int",
                              "long long",   "long",
                              "bool",        "unsigned int",
                              "unsigned",    "unsigned long long",
                              "float",       "unsigned long",
                              "double",      "Json::Value",
                              "uid_t",       "Json::objectValue",
                              "time_t",      "Json::arrayValue",
                              "no such word"};

// An end is the result, or T for a Json::LogicError.
struct Row {
    const char* szCalls;  // between bars, as the words
    const char* szWords;
    const char* szEnds;
};

// A condition that SQLite refuses gives -1: an empty list, a bare value that is missing, a bare
// text that is no column. A list is no value to set.
// clang-format off
const Row kRows[] = {
    //                                                         null true  -1 2^64-1 1.5  ""  "x"   []  [1]   {} {"k":1}
    {"checkJsonType", "int|long long|uid_t|time_t",           " -1   -1    0    0   -1   -1   -1   -1   -1   -1   -1"},
    {"checkJsonType", "bool",                                 " -1    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"checkJsonType|recCreate|recCreate, default", "string",  " -1   -1   -1   -1   -1    0    0   -1   -1   -1   -1"},
    {"checkJsonType|recCreate|recCreate, default", "Json::arrayValue",
                                                              " -1   -1   -1   -1   -1   -1   -1    0    0   -1   -1"},
    {"checkJsonType|recCreate|recCreate, default", "Json::objectValue",
                                                              " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0"},
    {"checkJsonType|recCreate|recCreate, default|recUpdateByFilter, values",
     "unsigned int|unsigned|long|unsigned long|unsigned long long|float|double|Json::Value|no such word",
                                                              " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    // What passes the check may still be too large to be written, or of a word that is never written.
    {"recCreate|recCreate, default", "int|long long",         " -1   -1    0    T   -1   -1   -1   -1   -1   -1   -1"},
    {"recCreate|recCreate, default", "bool",                  " -1    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"recCreate|recCreate, default", "uid_t|time_t",          " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},

    {"SqlExpandMemberSymbol|recSave", "string",               "  0    0    0    0    0    0    0    T    T    T    T"},
    {"SqlExpandMemberSymbol|recSave", "int|long long|bool",   "  0    0    0    T    0    T    T    T    T    T    T"},
    {"SqlExpandMemberSymbol", "long",                         "  0    0    0    T    0    T    T    T    T    T    T"},
    {"SqlExpandMemberSymbol|recSave", "unsigned int|unsigned long long",
                                                              "  0    0    T    0    0    T    T    T    T    T    T"},
    {"SqlExpandMemberSymbol", "unsigned|unsigned long",       "  0    0    T    0    0    T    T    T    T    T    T"},
    {"SqlExpandMemberSymbol", "float|double",                 "  0    0    0    0    0    T    T    T    T    T    T"},
    {"SqlExpandMemberSymbol|recSave", "Json::objectValue|Json::arrayValue",
                                                              "  0    0    0    0    0    0    0    0    0    0    0"},
    {"SqlExpandMemberSymbol|recSave", "Json::Value|uid_t|time_t|no such word",
                                                              " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    // Written, and not read back.
    {"recSave", "long",                                       " -1   -1   -1    T   -1    T    T    T    T    T    T"},
    {"recSave", "unsigned|unsigned long",                     " -1   -1    T   -1   -1    T    T    T    T    T    T"},
    {"recSave", "float|double",                               " -1   -1   -1   -1   -1    T    T    T    T    T    T"},

    {"SqlMakeByMatchField", "string|int|long long|long|unsigned int|unsigned long long|unsigned|unsigned long|float|double|uid_t|time_t|no such word",
                                                              "  0    0    0    0    0    0    0    T    T    T    T"},
    {"SqlMakeByMatchField", "bool",                           "  0    0    0    T    0    T    T    T    T    T    T"},
    {"SqlMakeByMatchField", "Json::Value|Json::objectValue|Json::arrayValue",
                                                              "  0    0    0    0    0    0    0    0    0    0    0"},
    {"SqlMakeByListField", "string|int|long long|long|bool|unsigned int|unsigned long long|unsigned|unsigned long|float|double|uid_t|time_t|no such word",
                                                              "  0    0    0    0    0    0    0    T    T    T    T"},
    {"SqlMakeByListField", "Json::Value|Json::objectValue|Json::arrayValue",
                                                              "  0    0    0    0    0    0    0    0    0    0    0"},
    {"SqlExpandMemberList", "string|int|long long|long|unsigned int|unsigned long long|unsigned|unsigned long|float|double|uid_t|time_t|no such word",
                                                              "  0    0    0    0    0    0    0    0    0    T    T"},
    {"SqlExpandMemberList", "bool",                           "  0    0    0    T    0    T    T    0    0    T    T"},
    {"SqlExpandMemberList", "Json::Value|Json::objectValue|Json::arrayValue",
                                                              "  0    0    0    0    0    0    0    0    0    0    0"},

    // The member is NULL in every row: no condition finds one.
    {"recList|recGetOne|recDelete|recDelete, all|recUpdateByFilter, filter", "string",
                                                              "  0    0    0    0    0    0    0   -1    0    T    T"},
    {"recList|recGetOne|recDelete|recDelete, all|recUpdateByFilter, filter",
     "int|long long|long|unsigned int|unsigned long long|unsigned|unsigned long|float|double|uid_t|time_t|no such word",
                                                              " -1    0    0    0    0   -1   -1   -1    0    T    T"},
    {"recList|recGetOne|recDelete|recDelete, all|recUpdateByFilter, filter", "bool",
                                                              "  0    0    0    T    0    T    T   -1    0    T    T"},
    {"recList|recGetOne|recDelete|recDelete, all|recUpdateByFilter, filter",
     "Json::Value|Json::objectValue|Json::arrayValue",        "  0    0    0    0    0    0    0   -1    0    0    0"},

    {"recUpdateByWhere", "string",                            "  0    0    0    0    0    0    0   -1   -1    T    T"},
    {"recUpdateByWhere", "int|long long|long|unsigned int|unsigned long long|unsigned|unsigned long|float|double|uid_t|time_t|no such word",
                                                              " -1    0    0    0    0   -1   -1   -1   -1    T    T"},
    {"recUpdateByWhere", "bool",                              "  0    0    0    T    0    T    T   -1   -1    T    T"},
    {"recUpdateByWhere", "Json::Value|Json::objectValue|Json::arrayValue",
                                                              "  0    0    0    0    0    0    0   -1   -1    0    0"},
    {"recUpdateByFilter, values", "string",                   " -1   -1   -1   -1   -1    0    0   -1   -1   -1   -1"},
    {"recUpdateByFilter, values", "int|long long|uid_t|time_t"," -1   -1    0    0   -1   -1   -1   -1   -1   -1   -1"},
    {"recUpdateByFilter, values", "bool",                     " -1    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"recUpdateByFilter, values", "Json::objectValue",        " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0"},
    {"recUpdateByFilter, values", "Json::arrayValue",         " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
};
// clang-format on

struct Scene {
    VornJsonDbApi& api;
    Json::Value& jTypes;
    Outputs out;
};

Json::Value holding(const char* szTemplate, const Json::Value& jValue)
{
    return filledIn(szTemplate, text(jValue));
}

// The value goes into each call as a member, or as the only item of a list.
using Call = int (*)(Scene& s, const Json::Value& jValue);

constexpr char kAlone[] = R"({"m":$})";
// Other members are written before and behind it.
constexpr char kRecordOf[] = R"({"a":"a","m":$,"z":"z"})";

int save(Scene& s, const Json::Value& jValue)
{
    Json::Value jRecord = holding(kRecordOf, jValue);
    const Json::Value jBefore = jRecord;
    try {
        const int iResult = s.api.recSave(jRecord, true);
        if (0 > iResult) {
            EXPECT_EQ(jBefore, jRecord);
        }
        return iResult;
    } catch (...) {
        EXPECT_EQ(jBefore, jRecord);
        throw;
    }
}

int createByDefault(Scene& s, const Json::Value& jValue)
{
    s.jTypes["m"]["cppDefaultValue"] = jValue;
    Json::Value jRecord = json(R"({"z":"z"})");
    const std::string strEnd = endOf([&] { return s.api.recCreate(jRecord, s.out.jObject); });
    s.jTypes["m"].removeMember("cppDefaultValue");
    EXPECT_EQ(R"({"z":"z"})", text(jRecord));
    if ("T" == strEnd) throw Json::LogicError("again");
    return std::stoi(strEnd);
}

int matchField(Scene& s, const Json::Value& jValue)
{
    std::string strField = "m";
    Json::Value jParam = holding("$", jValue);
    return s.api.SqlMakeByMatchField(strField, jParam, s.out.strText);
}

int expandList(Scene& s, const Json::Value& jValue)
{
    Json::Value jRequest = holding(kAlone, jValue);
    std::string strOut;
    return s.api.SqlExpandMemberList(jRequest, strOut, VORN_SQL_WHERE_TYPE_AND);
}

int updateWhere(Scene& s, const Json::Value& jValue)
{
    Json::Value jRecord = holding(kAlone, jValue);
    std::string strWhere = "z='z'";
    return s.api.recUpdateByWhere(jRecord, strWhere);
}

int updateFilter(Scene& s, const Json::Value& jFilterIn, const Json::Value& jValuesIn)
{
    Json::Value jFilter = jFilterIn;
    Json::Value jValues = jValuesIn;
    return s.api.recUpdateByFilter(jFilter, jValues);
}

// A call of one JSON argument.
template <typename Function>
int with(const char* szTemplate, const Json::Value& jValue, Function function)
{
    Json::Value jArgument = holding(szTemplate, jValue);
    return function(jArgument);
}

const std::map<std::string, Call> kCalls = {
    {"checkJsonType",
     [](Scene& s, const Json::Value& j) {
         return with(kRecordOf, j, [&](Json::Value& jIn) { return s.api.checkJsonType(jIn); });
     }},
    {"recCreate",
     [](Scene& s, const Json::Value& j) {
         return with(kRecordOf, j,
                     [&](Json::Value& jIn) { return s.api.recCreate(jIn, s.out.jObject); });
     }},
    {"recCreate, default", createByDefault},
    {"recSave", save},
    {"SqlExpandMemberSymbol",
     [](Scene& s, const Json::Value& j) {
         return with(kRecordOf, j, [&](Json::Value& jIn) {
             return s.api.SqlExpandMemberSymbol(s.out.strText, jIn);
         });
     }},
    {"SqlMakeByMatchField", matchField},
    {"SqlMakeByListField",
     [](Scene& s, const Json::Value& j) {
         return with("[$]", j, [&](Json::Value& jIn) {
             return s.api.SqlMakeByListField("m", jIn, s.out.strText);
         });
     }},
    {"SqlExpandMemberList", expandList},
    {"recList",
     [](Scene& s, const Json::Value& j) {
         return with(kAlone, j, [&](Json::Value& jIn) { return s.api.recList(jIn, s.out.jArray); });
     }},
    {"recGetOne",
     [](Scene& s, const Json::Value& j) {
         return with(kAlone, j,
                     [&](Json::Value& jIn) { return s.api.recGetOne(jIn, s.out.jObject); });
     }},
    {"recDelete",
     [](Scene& s, const Json::Value& j) {
         return with(kAlone, j, [&](Json::Value& jIn) { return s.api.recDelete(jIn); });
     }},
    {"recDelete, all",
     [](Scene& s, const Json::Value& j) {
         return with(kAlone, j, [&](Json::Value& jIn) { return s.api.recDelete(jIn, true); });
     }},
    {"recUpdateByWhere", updateWhere},
    {"recUpdateByFilter, filter",
     [](Scene& s, const Json::Value& j) {
         return updateFilter(s, holding(kAlone, j), json(R"({"z":"y"})"));
     }},
    {"recUpdateByFilter, values",
     [](Scene& s, const Json::Value& j) {
         return updateFilter(s, json(R"({"z":"z"})"), holding(kAlone, j));
     }},
};

class MemberMatrix : public TableTest {
protected:
    Table& tableOf(const std::string& strWord)
    {
        auto& pTable = tables_[strWord];
        if (nullptr == pTable)
            pTable = std::make_unique<Table>(database_,
                                             R"({"a":{"cpptype":"string"},"m":{"cpptype":")" +
                                                 strWord + R"("},"z":{"cpptype":"string"}})",
                                             "a, m, z");
        return *pTable;
    }

    void check(const std::string& strCall, const std::string& strWord, const char* szKind,
               const std::string& strExpected)
    {
        SCOPED_TRACE(strCall + ", " + strWord + ", " + szKind);
        Table& table = tableOf(strWord);
        database_.run("delete from " + table.strName);
        database_.run("insert into " + table.strName + " (z) values ('z')");
        Scene scene{table.api, VORN_JSON_DB::recType(table.jDefinition, table.strName), {}};
        const Json::Value jValue = json(szKind);

        const std::string strEnd = endOf([&] { return kCalls.at(strCall)(scene, jValue); });
        EXPECT_EQ(strExpected, strEnd);
        EXPECT_EQ("-1" == strEnd, !takeLog().empty());
        if (isFailure(strEnd)) scene.out.expectUntouched();
        expectSound(database_, table.api, R"({"z":"sound"})");
    }

    std::map<std::string, std::unique_ptr<Table>> tables_;
    UnwatchedLog unwatched_;
};

TEST_F(MemberMatrix, OfTypeWords)
{
    std::set<std::string> checked;
    for (const Row& row : kRows) {
        const std::vector<std::string> ends = split(row.szEnds, ' ');
        ASSERT_EQ(std::size(kKinds), ends.size()) << row.szCalls << " " << row.szWords;
        for (const std::string& strCall : split(row.szCalls, '|'))
            for (const std::string& strWord : split(row.szWords, '|')) {
                EXPECT_TRUE(checked.insert(strCall + "|" + strWord).second) << strCall << strWord;
                for (std::size_t i = 0; i < ends.size(); ++i)
                    check(strCall, strWord, kKinds[i], ends[i]);
            }
    }
    // The table has no gap.
    for (const auto& call : kCalls)
        for (const char* szWord : kWords)
            EXPECT_EQ(1U, checked.count(call.first + "|" + szWord)) << call.first << " " << szWord;
    printFigure("matrix cells, members by type word", checked.size() * std::size(kKinds));
}

}  // namespace
