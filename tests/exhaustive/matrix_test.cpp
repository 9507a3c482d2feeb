// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every argument of every function as every kind of JSON value, including a member of every type
// word: how the call ends, that it changes nothing that it should not, and that handle and
// connection go on working.

#include "support/matrix.h"
#include "support/figures.h"

#include <map>
#include <memory>
#include <set>

namespace {

// One value of each kind that jsoncpp knows, and edge cases.
constexpr const char* kKinds[] = {"null", "true", "-1",        "18446744073709551615",
                                  "1.5",  "\"\"", "\"x\"",     "[]",
                                  "[1]",  "{}",   R"({"k":1})"};

// In a call, $ is the value in question, # a record with it as a member and @ the record of the
// table. kByDefault creates a record without the member, whose default is the value.
const std::string kRecordOf = R"({"a":"a","m":$,"z":"z"})";
const std::string kRecord = R"({"a":"a","m":5,"z":"z"})";
const std::string kByDefault = "recCreate by default";

// An end is the result, T for a Json::LogicError or W for a failure that nevertheless wrote.
struct Row {
    std::string strCalls;  // between bars, as the words
    std::string strWords;  // of the member m
    const char* szEnds;
};

// The calls with an argument of that shape.
std::string with(const char* szArgument, const std::string& strCalls)
{
    return replaced(strCalls, '$', szArgument);
}

const std::string kUpdates = "|recUpdateByWhere $ 1|recUpdateByFilter @ $";
const std::string kCheckOrSave =
    "checkJsonType $|fillDefaultValue $ fill|recSave $ insert|recSave $ replace|recCreate $";
const std::string kConditions =
    "recList $|recGetOne $|recDelete $|recDelete $ all|recUpdateByFilter $ @";
const std::string kExpandLists =
    "SqlExpandMemberList $ before 0|SqlExpandMemberList $ before 1|SqlExpandMemberList $ before 2";
const std::string kPage = "SqlFilterConditionFromJson $";

// On a table whose m is an int. SQLite refuses an empty raw filter and one of an unknown column,
// and wants whole numbers of 64 bits for paging.
// clang-format off
const Row kArguments[] = {
    //                                              null true  -1 2^64-1 1.5  ""  "x"   []  [1]   {} {"k":1} @
    {"checkJsonType $",                    "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {"fillDefaultValue $ fill|recCreate @ $|SqlExpandMemberName before $|SqlExpandMemberSymbol before $",
                                           "int",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {"fillDefaultValue $ check",           "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1    0"},
    {"recSave $ insert|recSave $ replace|recCreate $|recUpdateByFilter $ @" + kUpdates,
                                           "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1    0"},
    {"recList $",                          "int",  "  0   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {R"(recGetOne {"m":6} $)",             "int",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {R"(recList @ $|recList {"m":6} $)",   "int",  "  0   -1   -1   -1   -1   -1   -1    0    0   -1   -1   -1"},
    {"recGetOne $|recGetOne @ $",          "int",  "  1   -1   -1   -1   -1   -1   -1   -1   -1    1    1    1"},
    {"recDelete $",                        "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1    1"},
    {"recDelete $ all",                    "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1    1    1    1"},
    {kExpandLists,                         "int",  "  1   -1   -1   -1   -1   -1   -1   -1   -1    1    1    0"},
    {"SqlExpandMemberList $ before 3",     "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {"SqlMakeByListField m $",             "int",  " -1   -1   -1   -1   -1   -1   -1    0    0   -1   -1   -1"},
    {"SqlMakeByListField m [2,$]",         "int",  "  0    0    0    0    0    0    0    T    T    T    T    T"},
    {R"(VectorParamToJson ["a","b"] m $|jsonCopyMember $ @ keep|jsonCopyMember $ @ overwrite|)" + kPage,
                                           "int",  "  0   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {R"(jsonCopyMember {"k":1} $ keep|jsonCopyMember {"k":1} $ overwrite)",
                                           "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0    0"},
    {"jsonCopyMember # @ keep|jsonCopyMember # @ overwrite|jsonCopyMember @ # keep|jsonCopyMember @ # overwrite",
                                           "int",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    // Members that no table declares.
    {with(R"({"a":"a","m":5,"x":$,"z":"z"})", kCheckOrSave + kUpdates),
                                           "int",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {with(R"({"m":5,"x":$})", "recList $|recUpdateByFilter $ @"),
                                           "int",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {with(R"({"m":5,"x":$})", "recGetOne $|recDelete $"),
                                           "int",  "  1    1    1    1    1    1    1    1    1    1    1    1"},
    // The raw filter, sorting and paging.
    {with(R"({"m":5,"vornSqlWhereFilter":$})", kExpandLists),
                                           "int",  " -1   -1   -1   -1   -1    0    0   -1   -1   -1   -1   -1"},
    {with(R"({"m":5,"vornSqlWhereFilter":$})", kConditions),
                                           "int",  " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {with(R"({"m":5,"vornSqlWhereFilter":$})", kUpdates),
                                           "int",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {with(R"({"sort_by":$})", "recList $|" + kPage),
                                           "int",  "  T    T    T    T    T    0    0    T    T    T    T    T"},
    {R"(recGetOne {"sort_by":$})",         "int",  "  T    T    T    T    T    1    1    T    T    T    T    T"},
    {with(R"({"sort_by":"z","sort_direction":$})", "recList $|" + kPage),
                                           "int",  "  0    0    0    0    0    0    0    T    T    T    T    T"},
    {with(R"({"sort_direction":$})", "recList $|" + kPage) + R"(|recList {"offset":$}|)" +
     with(R"({"limit":$})", kPage) + "|" + with(R"({"limit":1,"offset":$})", kPage),
                                           "int",  "  0    0    0    0    0    0    0    0    0    0    0    0"},
    {R"(recList {"limit":$}|recList {"limit":1,"offset":$})",
                                           "int",  " -1    0    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
};

const char kEveryWord[] =
    "string|int|long long|long|bool|unsigned int|unsigned|unsigned long long|float|unsigned long|double|"
    "Json::Value|uid_t|Json::objectValue|time_t|Json::arrayValue|no such word";
const std::string kJson = "Json::Value|Json::objectValue|Json::arrayValue";
const std::string kNumbers =
    "int|long long|long|unsigned int|unsigned long long|unsigned|unsigned long|float|double|uid_t|time_t|no such word";

const std::string kCreates = "recCreate #|" + kByDefault;
const std::string kCreatesAndCheck = "checkJsonType #|" + kCreates;
const std::string kLiteral = "SqlExpandMemberSymbol before #";
const std::string kSave = "recSave # insert";
const std::string kListField = "SqlMakeByListField m [$]";
const std::string kMemberList = R"(SqlExpandMemberList {"m":$} before 1)";
const std::string kFinds = R"(recList {"m":$}|recGetOne {"m":$}|recDelete {"m":$}|recDelete {"m":$} all|)"
                           R"(recUpdateByFilter {"m":$} {"z":"y"})";
const std::string kUpdateWhere = R"(recUpdateByWhere {"m":$} z='z')";
const std::string kUpdateValues = R"(recUpdateByFilter {"z":"z"} {"m":$})";

// Of a member of that type word. No value is the one in the table.
const Row kMembers[] = {
    //                                                     null true  -1 2^64-1 1.5  ""  "x"   []  [1]   {} {"k":1}
    {"checkJsonType #", "int|long long|uid_t|time_t",     " -1   -1    0    0   -1   -1   -1   -1   -1   -1   -1"},
    {kCreatesAndCheck, "bool",                            " -1    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {kCreatesAndCheck, "string",                          " -1   -1   -1   -1   -1    0    0   -1   -1   -1   -1"},
    {kCreatesAndCheck, "Json::arrayValue",                " -1   -1   -1   -1   -1   -1   -1    0    0   -1   -1"},
    {kCreatesAndCheck, "Json::objectValue",               " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0"},
    {kCreatesAndCheck + "|" + kUpdateValues,
     "unsigned int|unsigned|long|unsigned long|unsigned long long|float|double|Json::Value|no such word",
                                                          " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    // What passes the check may still be too large to be written, or of a word that is never written.
    {kCreates, "int|long long",                           " -1   -1    0    T   -1   -1   -1   -1   -1   -1   -1"},
    {kCreates, "uid_t|time_t",                            " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},

    {kLiteral + "|" + kSave, "string",                    "  0    0    0    0    0    0    0    T    T    T    T"},
    {kLiteral + "|" + kSave, "int|long long|bool",        "  0    0    0    T    0    T    T    T    T    T    T"},
    {kLiteral, "long",                                    "  0    0    0    T    0    T    T    T    T    T    T"},
    {kLiteral + "|" + kSave, "unsigned int|unsigned long long",
                                                          "  0    0    T    0    0    T    T    T    T    T    T"},
    {kLiteral, "unsigned|unsigned long",                  "  0    0    T    0    0    T    T    T    T    T    T"},
    {kLiteral, "float|double",                            "  0    0    0    0    0    T    T    T    T    T    T"},
    {kLiteral + "|" + kSave, "Json::objectValue|Json::arrayValue",
                                                          "  0    0    0    0    0    0    0    0    0    0    0"},
    {kLiteral + "|" + kSave, "Json::Value|uid_t|time_t|no such word",
                                                          " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    // Written, and not read back.
    {kSave, "long",                                       "  W    W    W    T    W    T    T    T    T    T    T"},
    {kSave, "unsigned|unsigned long",                     "  W    W    T    W    W    T    T    T    T    T    T"},
    {kSave, "float|double",                               "  W    W    W    W    W    T    T    T    T    T    T"},

    {"SqlMakeByMatchField m $", "string|" + kNumbers,     "  0    0    0    0    0    0    0    T    T    T    T"},
    {"SqlMakeByMatchField m $", "bool",                   "  0    0    0    T    0    T    T    T    T    T    T"},
    {kListField, "string|bool|" + kNumbers,               "  0    0    0    0    0    0    0    T    T    T    T"},
    {kMemberList, "string|" + kNumbers,                   "  0    0    0    0    0    0    0    0    0    T    T"},
    {kMemberList, "bool",                                 "  0    0    0    T    0    T    T    0    0    T    T"},
    {"SqlMakeByMatchField m $|" + kListField + "|" + kMemberList, kJson,
                                                          "  0    0    0    0    0    0    0    0    0    0    0"},

    // SQLite refuses an empty list, a missing bare value and a bare text that is not a column.
    {kFinds, "string",                                    "  0    0    0    0    0    0    0   -1    0    T    T"},
    {kFinds, kNumbers,                                    " -1    0    0    0    0   -1   -1   -1    0    T    T"},
    {kFinds, "bool",                                      "  0    0    0    T    0    T    T   -1    0    T    T"},
    {kFinds, kJson,                                       "  0    0    0    0    0    0    0   -1    0    0    0"},

    // A list is not a value to set.
    {kUpdateWhere, "string",                              "  0    0    0    0    0    0    0   -1   -1    T    T"},
    {kUpdateWhere, kNumbers,                              " -1    0    0    0    0   -1   -1   -1   -1    T    T"},
    {kUpdateWhere, "bool",                                "  0    0    0    T    0    T    T   -1   -1    T    T"},
    {kUpdateWhere, kJson,                                 "  0    0    0    0    0    0    0   -1   -1    0    0"},
    {kUpdateValues, "string",                             " -1   -1   -1   -1   -1    0    0   -1   -1   -1   -1"},
    {kUpdateValues, "int|long long|uid_t|time_t",         " -1   -1    0    0   -1   -1   -1   -1   -1   -1   -1"},
    {kUpdateValues, "bool",                               " -1    0   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
    {kUpdateValues, "Json::objectValue",                  " -1   -1   -1   -1   -1   -1   -1   -1   -1    0    0"},
    {kUpdateValues, "Json::arrayValue",                   " -1   -1   -1   -1   -1   -1   -1   -1   -1   -1   -1"},
};
// clang-format on

// Calls on tables of one record: two texts and a member of any type word.
class EveryCall : public TableTest {
protected:
    void check(const Row& row, const std::vector<std::string>& kinds)
    {
        const std::vector<std::string> ends = split(row.szEnds, ' ');
        ASSERT_EQ(kinds.size(), ends.size()) << row.strCalls;
        for (const std::string& strWord : split(row.strWords, '|'))
            for (const std::string& strCall : split(row.strCalls, '|')) {
                EXPECT_TRUE(words_[strCall].insert(strWord).second) << strCall << " " << strWord;
                for (std::size_t i = 0; i < kinds.size(); ++i) {
                    SCOPED_TRACE(strWord + ", " + strCall + ", " + kinds[i]);
                    checkCall(tableOf(strWord), strCall, kinds[i], ends[i]);
                }
            }
    }

    std::map<std::string, std::set<std::string>> words_;  // of each call that was checked
    long long iCells_ = 0;                                // calls that were checked

private:
    Table& tableOf(const std::string& strWord)
    {
        auto& pTable = tables_[strWord];
        const std::string strMembers =
            R"({"a":{"cpptype":"string"},"m":{"cpptype":"$"},"z":{"cpptype":"string"}})";
        if (nullptr == pTable)
            pTable =
                std::make_unique<Table>(database_, replaced(strMembers, '$', strWord), "a, m, z");
        return *pTable;
    }

    // The call logs exactly when it returns -1.
    void checkCall(Table& table, const std::string& strCall, const std::string& strValue,
                   const std::string& strExpected)
    {
        database_.run("delete from " + table.strName + "; insert into " + table.strName +
                      " values ('a', 5, 'z')");
        const std::string strRows = "select * from " + table.strName;
        const Rows before = database_.rows(strRows);
        const Words words = split(withValue(strCall, strValue), ' ');
        const Ended ended =
            kByDefault == strCall ? createdByDefault(table, strValue) : called(table.api, words);
        const bool blWritten = "W" == strExpected;
        EXPECT_EQ(blWritten ? "-1" : strExpected, ended.strEnd);
        EXPECT_EQ("-1" == ended.strEnd, !takeLog().empty());
        const bool blFailed = "T" == ended.strEnd || "-1" == ended.strEnd;
        if (blFailed) {
            EXPECT_EQ(blWritten, before != database_.rows(strRows));
        }
        // These leave what they appended before they failed.
        const bool blAppends =
            "SqlExpandMemberList" == words[0] || "SqlFilterConditionFromJson" == words[0];
        if ((blFailed && !blAppends) || ("recGetOne" == words[0] && "0" == ended.strEnd)) {
            EXPECT_EQ("", ended.strChange);
        }
        EXPECT_EQ("", table.api.getErrMsg());
        expectSound(database_, table.api, R"({"a":"s","z":"sound"})");
        ++iCells_;
    }

    static std::string withValue(const std::string& strCall, const std::string& strValue)
    {
        return replaced(replaced(replaced(strCall, '#', kRecordOf), '$', strValue), '@', kRecord);
    }

    static Ended createdByDefault(Table& table, const std::string& strValue)
    {
        Json::Value& jMember = VORN_JSON_DB::recType(table.jDefinition, table.strName)["m"];
        jMember["cppDefaultValue"] = json(strValue);
        const Ended ended = called(table.api, {"recCreate", R"({"a":"a","z":"z"})"});
        jMember.removeMember("cppDefaultValue");
        return ended;
    }

    std::map<std::string, std::unique_ptr<Table>> tables_;
};

TEST_F(EveryCall, TakesAnyKindOfJsonValue)
{
    std::vector<std::string> kinds(std::begin(kKinds), std::end(kKinds));
    kinds.emplace_back("@");
    for (const Row& row : kArguments) check(row, kinds);
    Figures::of("matrix cells, JSON arguments") = iCells_;
}

TEST_F(EveryCall, TakesAnyKindOfValueUnderAnyTypeWord)
{
    for (const Row& row : kMembers) check(row, {std::begin(kKinds), std::end(kKinds)});
    for (const auto& [strCall, words] : words_)
        for (const std::string& strWord : split(kEveryWord, '|'))
            EXPECT_EQ(1U, words.count(strWord)) << strCall << " " << strWord;
    Figures::of("matrix cells, members by type word") = iCells_;
}

}  // namespace
