// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The lookups of member types in every operation, on types that are missing, of the wrong kind
// or partial: the result, the whole log and what is left in the table.

#include "support/lookups.h"
#include "lookup_cases.h"

#include <map>
#include <utility>

namespace {

const std::string kNoWord = R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))";
const std::string kWordIsNoText =
    R"(!jTableDef[strJsonName]["member"][strKey]["cpptype"].isString())";

std::string typesOf(const std::string& strA)
{
    return R"({"a":)" + strA + R"(,"b":{"cpptype":"string"},"c":{"cpptype":"string"}})";
}

std::string defined(const std::string& strMembers)
{
    return R"({"$":{"member":)" + strMembers + "}}";
}

const std::string kWhole = defined(typesOf(R"({"cpptype":"string"})"));

// The types that calls meet.
struct Types {
    std::string strDefinition;
    std::string strCondition = "";  // of the look-up that fails, if any
    std::string strFirst = "-";     // the table's entry when the first look-up fails
    std::string strEntry = "null";  // and afterwards; fails again unless it is an object
    std::string strLater = "";      // the definition after the column list, if it differs
    bool blByHost = false;          // the host has put the entry there before the call
};

class LookUps : public LookUpsTest {
protected:
    // Each call on a table of its own, and once more if later look-ups log other lines.
    void expect(const Cases& cases, const Types& types)
    {
        strName_ = freshName();
        for (const Case& c : cases)
            for (const std::string& strCall : split(c.strCalls, '|')) {
                SCOPED_TRACE(strCall + " on " + types.strDefinition + types.strEntry);
                if (!types.blByHost) strName_ = freshName();
                const auto pApi = handleOf(types);
                expectCall(c, strCall, *pApi, types, !types.blByHost);
                if (!types.blByHost) expectCall(c, strCall, *pApi, types, false);
            }
    }

    std::unique_ptr<VornJsonDbApi> handleOf(const Types& types)
    {
        std::string strCreate = "create table if not exists " + strName_ + " (a, b, c)";
        Json::Value jDefinition = json(replaced(types.strDefinition, '$', strName_));
        auto pApi =
            std::make_unique<VornJsonDbApi>(database_.get(), strName_, jDefinition, strCreate);
        if (types.blByHost) VORN_JSON_DB::recType(jDefinition, strName_) = json(types.strEntry);
        takeLog();
        return pApi;
    }

    void expectLog(const Lines& expected) { EXPECT_EQ(named(expected), takeOwnLog()); }

private:
    // Every line of the call.
    static Lines linesOf(const Case& c, const Words& call, const Types& types)
    {
        const std::vector<Lines> levels =
            levelsOf(call[0], argumentsOf(call), json(types.strEntry));
        if (levels.empty() || '-' != c.szEnd[0]) return c.lines;
        if (!c.strSql.empty())
            return c.lines + Lines{runFailed(c.strError, c.strSql), levels[0][0]} +
                   restOf(levels, 0, c.strError, c.strSql);
        // An operation checks by itself, but recCreate leaves the values to recSave.
        return c.lines + restOf(levels, kNoValue == c.lines.back() ? 0 : levels.size() - 1, "", "");
    }

    void expectCall(const Case& c, const std::string& strCall, VornJsonDbApi& api,
                    const Types& types, bool blFirst)
    {
        database_.run("delete from " + strName_ + ";insert into " + strName_ +
                      " values ('x','y','z'),('u','v','w')");
        EXPECT_EQ(c.szEnd, called(api, split(strCall, ' ')).whole());
        const auto again = [&](const std::string& strDefinition) {
            return '{' == types.strEntry[0] ? Lines()
                                            : lookUp(kPoisoned, strDefinition, types.strEntry);
        };
        const Lines later = again(types.strLater.empty() ? types.strDefinition : types.strLater);
        std::map<std::string, Lines> lookUps = {
            {kEarlyLookUp, blFirst ? again(types.strDefinition) : later},
            {kDecoder, again("null")}};
        lookUps[kLookUp] =
            blFirst ? lookUp(types.strCondition, types.strDefinition, types.strFirst) : later;
        Lines expected;
        for (const std::string& strLine : linesOf(c, split(strCall, ' '), types)) {
            const auto look = lookUps.find(strLine);
            expected = expected + (lookUps.end() == look ? Lines{strLine} : look->second);
            if (kLookUp == strLine) look->second = later;
        }
        expectLog(expected);
        EXPECT_EQ(c.szRows, database_.value("select group_concat(a||b||c) from " + strName_));
    }
};

TEST_F(LookUps, FailOnABadDefinition)
{
    for (const auto& bad : kBadDefinitions) {
        expect(kWithoutTypes, {bad.szDefinition, bad.szCondition});
        // The column list leaves the table in the handle's copy.
        expect(kWithoutColumns, {bad.szDefinition, bad.szCondition, "-", "null", bad.szLater});
    }
}

TEST_F(LookUps, FailOnTypesOfTheWrongKind)
{
    for (const char* szEntry : {"null", "[{\"a\":1}]", "\"a\"", "5", "true"})
        expect(kWithoutTypes + kWithColumns, {kWhole, "", "", szEntry, "", true});
}

TEST_F(LookUps, StopAtAMemberWithoutATypeWord)
{
    for (const char* szMember : {"{}", "\"int\"", "null", R"({"cpptype":5})"}) {
        const std::string strMember = szMember;
        const std::string strCondition =
            std::string::npos == strMember.find("cpptype") ? kNoWord : kWordIsNoText;
        // The first member: no types.
        expect(kWithoutTypes + kWithColumns, {defined(typesOf(strMember)), strCondition});
        // The second one: those of the first.
        const std::string strA = R"({"a":{"cppDefaultValue":"d","cpptype":"string"})";
        const std::string strRest = R"(,"b":)" + strMember + R"(,"c":{"cpptype":"string"}})";
        expect(kWithPartialTypes, {defined(strA + strRest), strCondition, strA + "}", strA + "}"});
    }
}

TEST_F(LookUps, FailOnTypesThatLackAColumn)
{
    const std::pair<const char*, Lines> cases[] = {
        {R"({"b":{"cpptype":"string"},"c":{"cpptype":"string"}})", {}},
        {R"({"a":{"cpptype":"string"},"c":{"cpptype":"string"}})",
         {plain("column_name[1]=b"), plain("column_value[1]=y")}},
        {R"({"a":{"cpptype":"string"},"b":{"cpptype":"string"}})",
         {plain("column_name[2]=c"), plain("column_value[2]=z")}},
        {"{}", {}},
    };
    const char szCalls[] = "recList null|recGetOne null";
    for (const auto& [szEntry, traced] : cases)
        expect(
            {{szCalls, "-1", rowRefused(fieldFailed(kNoColumn), traced), kRows, kSelect, kAborted}},
            {kWhole, "", "", szEntry, "", true});
}

TEST_F(LookUps, TreatAMemberOfTheWrongKindAsOneOfAnUnknownWord)
{
    for (const char* szA : {"{}", "null", R"({"cpptype":null})", "5", "\"string\"", "[\"string\"]"})
        expect(kWithoutAWord, {kWhole, "", "", typesOf(szA), "", true});
    for (const char* szA : {R"({"cpptype":["string"]})", R"({"cpptype":{}})"})
        expect(kWithAWordThatThrows, {kWhole, "", "", typesOf(szA), "", true});
}

TEST_F(LookUps, SucceedOnceTheHostHasRepairedTheEntry)
{
    const auto pApi = handleOf({kWhole});
    Json::Value jNone;
    Json::Value& jEntry = VORN_JSON_DB::recType(jNone, strName_);
    EXPECT_TRUE(jEntry.isNull());
    expectLog(lookUp("jTableDef.empty()", "null", "-"));
    jEntry = json(typesOf(R"({"cpptype":"int"})"));
    const char szSave[] = R"(recSave {"a":1,"b":"y","c":"z"} insert)";
    EXPECT_EQ("0", called(*pApi, split(szSave, ' ')).strEnd);
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
