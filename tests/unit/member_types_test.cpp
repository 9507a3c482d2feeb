// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What is read of a table definition, and how it is kept.

#include "support/database.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <iterator>
#include <utility>

namespace {

const char kGood[] = R"({"$":{"member":{"a":{"cpptype":"int"}}}})";
const char kGoodEntry[] = R"({"a":{"cpptype":"int"}})";
const char kAbsent[] = "no entry";

class MemberTypes : public HostTest {
protected:
    // The definition with every "$" replaced by the table's name.
    Json::Value definition(std::string strText) const
    {
        for (std::size_t n = 0; std::string::npos != (n = strText.find('$', n));)
            strText.replace(n, 1, strName_);
        return json(strText);
    }

    // What the library keeps of the definition, or kept before; it leaves the definition alone.
    Json::Value& entry(const std::string& strDefinition)
    {
        Json::Value jDefinition = definition(strDefinition);
        Json::Value& jEntry = VORN_JSON_DB::recType(jDefinition, strName_);
        EXPECT_EQ(definition(strDefinition), jDefinition);
        return jEntry;
    }

    // The log holds the lines after a failed check; the last one shows the types of all tables.
    void expectFailure(const std::string& strCondition, const std::string& strDefinition,
                       const std::string& strEntry)
    {
        const Lines lines = takeLog();
        ASSERT_EQ(4U, lines.size());
        EXPECT_EQ((Lines{utilFailed(strCondition), utilPlain("strJsonName=" + strName_),
                         utilPlain("jTableDef=" + text(definition(strDefinition)))}),
                  Lines(lines.begin(), lines.begin() + 3));
        const std::string strAllTypes = utilPlain("jType=");
        ASSERT_EQ(0U, lines[3].find(strAllTypes));
        Json::Value jTypes = json(lines[3].substr(strAllTypes.size()));
        EXPECT_EQ(strEntry, jTypes.isMember(strName_) ? text(jTypes[strName_]) : kAbsent);
        EXPECT_EQ(kGoodEntry, text(jTypes["known"]));
    }

    std::string strName_ = freshName();
};

TEST_F(MemberTypes, HoldTypesAndDefaultsOfTheDefinition)
{
    EXPECT_EQ(R"({"a":{"cpptype":"int"},"b":{"cppDefaultValue":"x","cpptype":"string"}})",
              text(entry(R"({"other": {"member": {"z": {"cpptype": "int"}}},
                             "$": {"comment": 1, "member": {
                                 "b": {"cpptype": "string", "cppDefaultValue": "x", "width": 3},
                                 "a": {"cpptype": "int", "default": 7}}}})")));
    std::vector<std::string> members;
    for (const char* szWord :
         {"string", "int", "unsigned int", "unsigned", "long", "unsigned long", "long long",
          "unsigned long long", "float", "double", "bool", "Json::Value", "Json::objectValue",
          "Json::arrayValue", "uid_t", "time_t", "String", "no such word", ""})
        members.push_back(R"({"a":{"cpptype":")" + std::string(szWord) + R"("}})");
    for (const char* szDefault :
         {"null", "true", "-3", "2.5", R"("x")", "[1,[2]]", R"({"k":{}})", "{}", "[]"})
        members.push_back(R"({"a":{"cppDefaultValue":)" + std::string(szDefault) +
                          R"(,"cpptype":"int"}})");
    for (const std::string& strMembers : members) {
        strName_ = freshName();
        EXPECT_EQ(strMembers, text(entry(R"({"$":{"member":)" + strMembers + "}}")));
    }
    EXPECT_EQ(Lines(), takeLog());
}

const char kNoWord[] = R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))";
const char kWordIsNoText[] = R"(!jTableDef[strJsonName]["member"][strKey]["cpptype"].isString())";

// The first failed check, the entry that it leaves, and that no later definition completes it.
TEST_F(MemberTypes, KeepTheEntryOfABadDefinition)
{
    const struct {
        const char* szDefinition;
        const char* szCondition;
        const char* szEntry = "null";
    } cases[] = {
        {"null", "jTableDef.empty()"},
        {"{}", "jTableDef.empty()"},
        {"[]", "jTableDef.empty()"},
        {R"({"other":{"member":{"a":{"cpptype":"int"}}}})", "!jTableDef.isMember(strJsonName)"},
        {"[1]", "!jTableDef.isMember(strJsonName)"},
        {R"("$")", "!jTableDef.isMember(strJsonName)"},
        {"5", "!jTableDef.isMember(strJsonName)"},
        {R"({"$":null})", "!jTableDef[strJsonName].isObject()"},
        {R"({"$":["member"]})", "!jTableDef[strJsonName].isObject()"},
        {R"({"$":{}})", R"(!jTableDef[strJsonName].isMember("member"))"},
        {R"({"$":{"Member":{}}})", R"(!jTableDef[strJsonName].isMember("member"))"},
        {R"({"$":{"member":null}})", R"(!jTableDef[strJsonName]["member"].isObject())"},
        {R"({"$":{"member":[]}})", R"(!jTableDef[strJsonName]["member"].isObject())"},
        {R"({"$":{"member":"a"}})", R"(!jTableDef[strJsonName]["member"].isObject())"},
        {kGood, "strJsonName.empty()"},
        {R"({"$":{"member":{}}})", "jType == Json::nullValue || !jType.isMember(strJsonName)"},
        {R"({"$":{"member":{"a":{}}}})", kNoWord},
        {R"({"$":{"member":{"a":"int"}}})", kNoWord},
        {R"({"$":{"member":{"a":null}}})", kNoWord},
        {R"({"$":{"member":{"a":{"cpptype":4}}}})", kWordIsNoText},
        {R"({"$":{"member":{"a":{"cpptype":null}}}})", kWordIsNoText},
        {R"({"$":{"member":{"b":{"cpptype":"int"},"a":{}}}})", kNoWord},
        // What was read before the bad member stays.
        {R"({"$":{"member":{"a":{"cpptype":"int"},"b":{},"c":{"cpptype":"int"}}}})", kNoWord,
         kGoodEntry},
        {R"({"$":{"member":{"a":{"cpptype":"int"},"b":{"cpptype":["int"]}}}})", kWordIsNoText,
         kGoodEntry},
    };
    strName_ = "known";
    entry(kGood);
    blDebugOutput = true;  // makes no difference
    for (const auto& bad : cases) {
        SCOPED_TRACE(bad.szDefinition);
        strName_ = kGood == bad.szDefinition ? "" : freshName();
        const bool blNull = std::string("null") == bad.szEntry;
        const Json::Value* pjEntry = &entry(bad.szDefinition);
        EXPECT_EQ(bad.szEntry, text(*pjEntry));
        expectFailure(bad.szCondition, bad.szDefinition, blNull ? kAbsent : bad.szEntry);

        EXPECT_EQ(pjEntry, &entry(kGood));
        EXPECT_EQ(bad.szEntry, text(*pjEntry));
        if (blNull) expectFailure("jType[strJsonName].type() != Json::objectValue", kGood, "null");
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(MemberTypes, StayOnceTheyAreKnown)
{
    const std::string strFirst = strName_;
    const Json::Value* pjEntry = &entry(kGood);
    for (int i = 0; i < 100; ++i) {
        strName_ = freshName();
        entry(kGood);
    }
    strName_ = strFirst;
    for (const char* szDefinition :
         {"null", "[]", R"({"$":{"member":{"b":{"cpptype":"string"}}}})"}) {
        EXPECT_EQ(pjEntry, &entry(szDefinition));
        EXPECT_EQ(kGoodEntry, text(*pjEntry));
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(MemberTypes, KeepTheFirstDefinitionForEveryHandle)
{
    Database database;
    Table first(database, strName_, R"({"a":{"cpptype":"string"}})", "a");
    Table second(database, strName_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a");
    Json::Value jText = json(R"({"a":"x"})");
    Json::Value jNumber = json(R"({"a":5})");
    EXPECT_EQ(0, first.api.checkJsonType(jText));
    EXPECT_EQ(0, second.api.checkJsonType(jText));
    EXPECT_EQ(-1, second.api.checkJsonType(jNumber));
    EXPECT_EQ(Lines{error(R"(type failed, strKey=a, jRecParam={"a":5})")}, takeLog());
    std::string strSql;
    EXPECT_EQ(-1, second.api.SqlExpandMemberSymbol(strSql, jText));
    EXPECT_EQ(Lines{failed("!jType.isMember(strKey)")}, takeLog());
}

#if defined(__GLIBCXX__) && 8 == __SIZEOF_SIZE_T__
// A name of 16 bytes that ends so that it has the hash of the other one: libstdc++ hashes eight
// bytes at a time, and each step can be undone.
std::string nameOfSameHash(const std::string& strOther, std::uint64_t uBegin)
{
    constexpr std::uint64_t kFactor = 0xc6a4a7935bd1e995;
    std::uint64_t uInverse = kFactor;
    for (int i = 0; i < 5; ++i) uInverse *= 2 - kFactor * uInverse;
    const auto mix = [](std::uint64_t u) { return u ^ u >> 47; };
    const auto step = [=](std::uint64_t u) { return mix(u * kFactor) * kFactor; };
    std::uint64_t other[2];
    memcpy(other, strOther.data(), sizeof(other));
    const std::uint64_t uStart = 0xc70f6907UL ^ sizeof(other) * kFactor;
    const std::uint64_t uWanted =
        step(other[1]) ^ (uStart ^ step(other[0])) * kFactor ^ (uStart ^ step(uBegin)) * kFactor;
    const std::uint64_t name[2] = {uBegin, mix(uWanted * uInverse) * uInverse};
    return std::string(reinterpret_cast<const char*>(name), sizeof(name));
}

TEST_F(MemberTypes, AreKeptForNamesOfTheSameHash)
{
    const std::string strFirst = "a name of sixtee";
    const std::string names[] = {strFirst, nameOfSameHash(strFirst, 1),
                                 nameOfSameHash(strFirst, 2)};
    for (int iRound = 0; iRound < 2; ++iRound)
        for (std::size_t i = 0; i < std::size(names); ++i) {
            strName_ = names[i];
            EXPECT_EQ(std::hash<std::string>()(strFirst), std::hash<std::string>()(strName_));
            Json::Value jDefinition;
            jDefinition[strName_]["member"]["m" + std::to_string(i)]["cpptype"] = "int";
            EXPECT_TRUE(jDefinition[strName_]["member"] ==
                        VORN_JSON_DB::recType(jDefinition, strName_));
        }
    EXPECT_EQ(Lines(), takeLog());
}
#endif

// In separate processes, where nothing is known yet under the empty name.
TEST_F(MemberTypes, RefuseAnEmptyNameAfterTheLookUps)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const std::pair<const char*, const char*> cases[] = {
        {R"({"":{"member":[]}})", R"(!jTableDef[strJsonName]["member"].isObject())"},
        {R"({"":{"member":{"a":{"cpptype":"int"}}}})", "strJsonName.empty()"},
    };
    strName_.clear();
    for (const auto& [szDefinition, szCondition] : cases) {
        const Lines lines = {utilFailed(szCondition), utilPlain("strJsonName="),
                             utilPlain(std::string("jTableDef=") + szDefinition),
                             utilPlain("jType=null")};
        EXPECT_EXIT(_Exit(entry(szDefinition).isNull() && lines == takeLog() ? 0 : 1),
                    testing::ExitedWithCode(0), "")
            << szDefinition;
    }
}

}  // namespace
