// SPDX-License-Identifier: MIT
#include "calls.h"

#include <set>
#include <sstream>

namespace {

// The arguments of a call by position, of which 0 is the function's name.
struct Call {
    VornJsonDbApi& api;
    std::vector<std::string> words;
    std::map<std::size_t, Json::Value> values = {};
    std::map<std::size_t, std::string> texts = {};
    std::vector<std::string> items = {};
    std::size_t iOut = 0;

    bool is(std::size_t i, const char* szWord) const { return words[i] == szWord; }
    int number(std::size_t i) const { return std::stoi(words[i]); }

    Json::Value& in(std::size_t i) { return values[i] = json(words[i]); }
    Json::Value* pointer(std::size_t i) { return words[i].empty() ? nullptr : &in(i); }
    Json::Value& out(std::size_t i, const char* szBefore = R"({"kept":1})")
    {
        iOut = i;
        if (words[i].empty()) words[i] = szBefore;
        return in(i);
    }

    std::string textBefore(std::size_t i) const { return is(i, R"("")") ? "" : words[i]; }
    std::string& text(std::size_t i) { return texts[i] = textBefore(i); }
    const char* sz(std::size_t i) { return is(i, "nullptr") ? nullptr : text(i).c_str(); }
    std::string& textOut(std::size_t i)
    {
        iOut = i;
        if (words[i].empty()) words[i] = "before";
        return text(i);
    }

    std::vector<std::string>& list(std::size_t i)
    {
        for (const Json::Value& jItem : json(words[i])) items.push_back(jItem.asString());
        return items;
    }
};

int ignoreRow(void*, int, char**, char**)
{
    return 0;
}

const std::map<std::string, int (*)(Call& c)> kFunctions = {
    {"tableCreate", [](Call& c) { return c.api.tableCreate(); }},
    {"setErrMsg",
     [](Call& c) {
         c.api.setErrMsg("x");
         c.api.setErrMsg(c.text(1));
         return c.text(1) == c.api.getErrMsg() ? 0 : -1;
     }},
    {"runSqlEx",
     [](Call& c) {
         return c.api.runSqlEx(c.text(1), c.is(2, "callback") ? ignoreRow : nullptr,
                               c.is(3, "arg") ? &c : nullptr);
     }},
    {"fillDefaultValue",
     [](Call& c) {
         const bool blCheck = c.is(2, "check");
         return c.api.fillDefaultValue(blCheck ? c.in(1) : c.out(1), blCheck);
     }},
    {"checkJsonType", [](Call& c) { return c.api.checkJsonType(c.in(1)); }},
    {"recSave", [](Call& c) { return c.api.recSave(c.out(1), c.is(2, "insert")); }},
    {"recCreate", [](Call& c) { return c.api.recCreate(c.in(1), c.out(2)); }},
    {"recList", [](Call& c) { return c.api.recList(c.in(1), c.out(2, R"(["kept"])")); }},
    {"recGetOne", [](Call& c) { return c.api.recGetOne(c.in(1), c.out(2)); }},
    {"recUpdateByWhere", [](Call& c) { return c.api.recUpdateByWhere(c.in(1), c.text(2)); }},
    {"recUpdateByFilter", [](Call& c) { return c.api.recUpdateByFilter(c.in(1), c.in(2)); }},
    {"recDelete", [](Call& c) { return c.api.recDelete(c.in(1), c.is(2, "all")); }},
    {"recDeleteAll", [](Call& c) { return c.api.recDeleteAll(); }},
    {"recDeleteByArray", [](Call& c) { return c.api.recDeleteByArray(c.list(1), c.sz(2)); }},
    {"recDeleteByName", [](Call& c) { return c.api.recDeleteByName(c.text(1), c.sz(2)); }},
    {"SqlExpandMemberName",
     [](Call& c) { return c.api.SqlExpandMemberName(c.textOut(1), c.pointer(2)); }},
    {"SqlExpandMemberSymbol",
     [](Call& c) { return c.api.SqlExpandMemberSymbol(c.textOut(1), c.in(2)); }},
    {"SqlExpandMemberList",
     [](Call& c) { return c.api.SqlExpandMemberList(c.in(1), c.textOut(2), c.number(3)); }},
    {"SqlMakeByMatchField",
     [](Call& c) { return c.api.SqlMakeByMatchField(c.text(1), c.in(2), c.textOut(3)); }},
    {"SqlMakeByListField",
     [](Call& c) { return c.api.SqlMakeByListField(c.sz(1), c.in(2), c.textOut(3)); }},
    {"VectorParamToJson",
     [](Call& c) { return c.api.VectorParamToJson(c.list(1), c.sz(2), c.out(3)); }},
    {"SqlFilterConditionFromJson",
     [](Call& c) { return c.api.SqlFilterConditionFromJson(c.in(1), c.textOut(2)); }},
    {"jsonCopyMember",
     [](Call& c) { return VORN_JSON_DB::jsonCopyMember(c.out(1), c.in(2), c.is(3, "overwrite")); }},
    {"convert2ReadableTime",
     [](Call& c) {
         return VORN_JSON_DB::convert2ReadableTime(c.number(1), c.textOut(2), c.number(3));
     }},
    {"getTimeAfterNow",
     [](Call& c) { return VORN_JSON_DB::getTimeAfterNow(c.number(1), c.textOut(2), c.number(3)); }},
};

// They leave what they appended before they failed.
const std::set<std::string> kAppenders = {"SqlExpandMemberList", "SqlFilterConditionFromJson"};

}  // namespace

Ended called(VornJsonDbApi& api, const std::string& strCall)
{
    Call call{api, split(replaced(strCall, '@', R"({"a":"a","m":5,"z":"z"})"), ' ')};
    constexpr std::size_t kMaxWords = 4;
    call.words.resize(kMaxWords);
    const std::string strFunction = call.words[0];
    Ended ended;
    try {
        ended.strEnd = std::to_string(kFunctions.at(strFunction)(call));
    } catch (const Json::LogicError&) {
        ended.strEnd = "T";
    }

    const bool blKept =
        isFailure(ended.strEnd) || ("recGetOne" == strFunction && "0" == ended.strEnd);
    for (const auto& [i, jValue] : call.values) {
        const Json::Value jBefore = json(call.words[i]);
        if (i != call.iOut || blKept)
            EXPECT_EQ(jBefore, jValue) << strCall;
        else if (jBefore != jValue)
            ended.strOut = text(jValue);
    }
    for (const auto& [i, strText] : call.texts) {
        const std::string strBefore = call.textBefore(i);
        if (i != call.iOut || (blKept && 0 == kAppenders.count(strFunction)))
            EXPECT_EQ(strBefore, strText) << strCall;
        else
            ended.strOut = strText.substr(strBefore.size());
        EXPECT_EQ(strBefore, strText.substr(0, strBefore.size())) << strCall;
    }
    return ended;
}

std::string replaced(const std::string& strText, char cOld, const std::string& strNew)
{
    std::string strOut;
    for (char c : strText) strOut.append(cOld == c ? strNew : std::string(1, c));
    return strOut;
}

Table& CallTest::tableOf(const std::string& strWord)
{
    auto& pTable = tables_[strWord];
    const std::string strMembers =
        R"({"a":{"cpptype":"string"},"m":{"cpptype":"$"},"z":{"cpptype":"string"}})";
    if (nullptr == pTable)
        pTable = std::make_unique<Table>(database_, replaced(strMembers, '$', strWord), "a, m, z");
    return *pTable;
}

void CallTest::checkCall(Table& table, VornJsonDbApi& api, const std::string& strCall,
                         const std::string& strExpected)
{
    database_.run("delete from " + table.strName + "; insert into " + table.strName +
                  " values ('a', 5, 'z')");
    const std::string strRows = "select * from " + table.strName;
    const Rows before = database_.rows(strRows);
    const Ended ended = called(api, strCall);
    const bool blWritten = "W" == strExpected;
    const bool blOutput = std::string::npos != strExpected.find(' ');
    EXPECT_EQ(blWritten ? "-1" : strExpected, blOutput ? ended.whole() : ended.strEnd);
    EXPECT_EQ("-1" == ended.strEnd, !takeLog().empty());
    if (isFailure(ended.strEnd)) {
        EXPECT_EQ(blWritten, before != database_.rows(strRows));
    }
    EXPECT_EQ("", api.getErrMsg());
    expectSound(table);
    ++nCells_;
}

void CallTest::expectSound(Table& table)
{
    ::expectSound(database_, table.api, R"({"a":"s","z":"sound"})");
}
