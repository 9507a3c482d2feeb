// SPDX-License-Identifier: MIT
// The look-ups of member types behind every operation, on types that are missing, of a wrong kind
// or partial: the result, the whole log and what is left in the table.

#include "lookup_cases.h"

#include <utility>

namespace {

const std::string kPoisoned = "jType[strJsonName].type() != Json::objectValue";
const std::string kNoWord = R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))";
const std::string kWordIsNoText =
    R"(!jTableDef[strJsonName]["member"][strKey]["cpptype"].isString())";

const struct {
    const char* szDefinition;
    const char* szLater;  // after the column list looked for its members
    const char* szCondition;
} kBadDefinitions[] = {
    {"null", R"({"$":{"member":null}})", "jTableDef.empty()"},
    {"{}", R"({"$":{"member":null}})", "jTableDef.empty()"},
    {"[]", "[]", "jTableDef.empty()"},
    {R"(["$"])", R"(["$"])", "!jTableDef.isMember(strJsonName)"},
    {R"({"-":{}})", R"({"-":{},"$":{"member":null}})", "!jTableDef.isMember(strJsonName)"},
    {R"({"$":null})", R"({"$":{"member":null}})", "!jTableDef[strJsonName].isObject()"},
    {R"({"$":"member"})", R"({"$":"member"})", "!jTableDef[strJsonName].isObject()"},
    {R"({"$":{"x":1}})", R"({"$":{"member":null,"x":1}})",
     R"(!jTableDef[strJsonName].isMember("member"))"},
    {R"({"$":{"member":["a"]}})", R"({"$":{"member":["a"]}})",
     R"(!jTableDef[strJsonName]["member"].isObject())"},
    {R"({"$":{"member":{}}})", R"({"$":{"member":{}}})",
     "jType == Json::nullValue || !jType.isMember(strJsonName)"},
};

std::string typesOf(const std::string& strA)
{
    return R"({"a":)" + strA + R"(,"b":{"cpptype":"string"},"c":{"cpptype":"string"}})";
}

std::string defined(const std::string& strMembers)
{
    return R"({"$":{"member":)" + strMembers + "}}";
}

const std::string kWhole = defined(typesOf(R"({"cpptype":"string"})"));

// Four lines of a look-up that fails; the entry of the table, or "-" where there is none.
Lines lookUp(const std::string& strCondition, const std::string& strDefinition,
             const std::string& strEntry)
{
    return {utilFailed(strCondition), utilPlain("strJsonName=$"),
            utilPlain("jTableDef=" + strDefinition), utilPlain("jType=" + strEntry)};
}

// What the look-ups log: the first on a table, those before and after the columns were listed.
struct LookUpLines {
    Lines first, early, later, decoder;
    std::string strTypes = "null";  // that are found then
};

class LookUps : public TableTest {
protected:
    // Each case on a table of its own, and once more where later look-ups log other lines. Where
    // strEntry is given, the host has put it in place of the table's types.
    void expect(const Cases& cases, const std::string& strDefinition, const LookUpLines& lookUps,
                const std::string& strEntry = "")
    {
        const bool blChange = lookUps.first != lookUps.later;
        const LookUpLines later = {lookUps.later, lookUps.later, lookUps.later, lookUps.decoder,
                                   lookUps.strTypes};
        strName_ = freshName();
        for (const Case& c : cases)
            for (const std::string& strCall : split(c.strCalls, '|')) {
                SCOPED_TRACE(strCall + " on " + strDefinition + strEntry);
                if (blChange) strName_ = freshName();
                const auto pApi = handleOf(strDefinition, strEntry);
                expectCall(c, strCall, *pApi, lookUps);
                if (blChange) expectCall(c, strCall, *pApi, later);
            }
    }

    std::unique_ptr<VornJsonDbApi> handleOf(const std::string& strDefinition,
                                            const std::string& strEntry = "")
    {
        std::string strCreate = "create table if not exists " + strName_ + " (a, b, c)";
        Json::Value jDefinition = json(replaced(strDefinition, '$', strName_));
        auto pApi =
            std::make_unique<VornJsonDbApi>(database_.get(), strName_, jDefinition, strCreate);
        if (!strEntry.empty()) VORN_JSON_DB::recType(jDefinition, strName_) = json(strEntry);
        takeLog();
        return pApi;
    }

    void expectLog(const Lines& expected)
    {
        Lines named;
        for (const std::string& strLine : expected)
            named.push_back(replaced(strLine, '$', strName_));
        EXPECT_EQ(named, takeOwnLog());
    }

    std::string strName_ = freshName();

private:
    void expectCall(const Case& c, const std::string& strCall, VornJsonDbApi& api,
                    const LookUpLines& lookUps)
    {
        database_.run("delete from " + strName_ + ";insert into " + strName_ +
                      " values ('x','y','z'),('u','v','w')");
        const Ended ended = called(api, strCall);
        EXPECT_EQ(c.szEnd, ended.whole());
        Lines expected;
        Lines look = lookUps.first;
        for (const std::string& strLine : linesOf(c, strCall, lookUps.strTypes)) {
            if (kLookUp == strLine)
                expected = expected + std::exchange(look, lookUps.later);
            else if (kEarlyLookUp == strLine)
                expected = expected + lookUps.early;
            else
                expected = expected + (kDecoder == strLine ? lookUps.decoder : Lines{strLine});
        }
        expectLog(expected);
        EXPECT_EQ(c.szRows, database_.value("select group_concat(a||b||c) from " + strName_));
    }

    // The log. A dump of all tables' types is reduced to the entry of this table.
    Lines takeOwnLog()
    {
        const std::string strDump = utilPlain("jType=");
        const std::string strKey = '"' + strName_ + "\":";
        Lines lines = takeLog();
        for (std::string& strLine : lines) {
            if (0 != strLine.compare(0, strDump.size(), strDump)) continue;
            const std::size_t nKey = strLine.find(strKey);
            // The reader leaves what follows the entry.
            strLine = strDump + (std::string::npos == nKey
                                     ? "-"
                                     : text(leftByReader(strLine.substr(nKey + strKey.size()))));
        }
        return lines;
    }
};

TEST_F(LookUps, FailOnABadDefinition)
{
    for (const auto& bad : kBadDefinitions) {
        const Lines first = lookUp(bad.szCondition, bad.szDefinition, "-");
        const Lines early = lookUp(kPoisoned, bad.szDefinition, "null");
        const Lines later = lookUp(kPoisoned, bad.szLater, "null");
        // The column list leaves the table in the handle's copy.
        expect(kWithoutColumns, bad.szDefinition, {first, early, later, {}});
        expect(kWithoutTypes, bad.szDefinition, {first, early, early, {}});
    }
}

TEST_F(LookUps, FailOnTypesOfAWrongKind)
{
    for (const char* szEntry : {"null", "[{\"a\":1}]", "\"a\"", "5", "true"}) {
        const Lines look = lookUp(kPoisoned, kWhole, szEntry);
        const LookUpLines lookUps = {look, look, look, lookUp(kPoisoned, "null", szEntry), szEntry};
        expect(kWithoutTypes + kWithColumns, kWhole, lookUps, szEntry);
    }
}

TEST_F(LookUps, EndAtAMemberWithoutAWord)
{
    const std::pair<std::string, std::string> cases[] = {{"{}", kNoWord},
                                                         {"\"int\"", kNoWord},
                                                         {"null", kNoWord},
                                                         {R"({"cpptype":5})", kWordIsNoText}};
    for (const auto& [strMember, strCondition] : cases) {
        // The first member: no types.
        const std::string strNone = defined(typesOf(strMember));
        const Lines later = lookUp(kPoisoned, strNone, "null");
        expect(
            kWithoutTypes + kWithColumns, strNone,
            {lookUp(strCondition, strNone, "-"), later, later, lookUp(kPoisoned, "null", "null")});
        // The second one: those of the first.
        const std::string strA = R"({"a":{"cppDefaultValue":"d","cpptype":"string"})";
        const std::string strPartial =
            defined(strA + R"(,"b":)" + strMember + R"(,"c":{"cpptype":"string"}})");
        expect(kWithPartialTypes, strPartial,
               {lookUp(strCondition, strPartial, strA + "}"), {}, {}, {}, strA + "}"});
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
        expect({{szCalls, "-1", rowRefused(kNoColumn, traced), kRows, kSelect, kAborted}}, kWhole,
               {}, szEntry);
}

TEST_F(LookUps, TakeAMemberOfAWrongKindForOneOfAnUnknownWord)
{
    for (const char* szA : {"{}", "null", R"({"cpptype":null})", "5", "\"string\"", "[\"string\"]"})
        expect(kWithoutAWord, kWhole, {}, typesOf(szA));
    for (const char* szA : {R"({"cpptype":["string"]})", R"({"cpptype":{}})"})
        expect(kWithAWordThatThrows, kWhole, {}, typesOf(szA));
}

TEST_F(LookUps, SucceedOnceTheHostHasRepairedTheEntry)
{
    const auto pApi = handleOf(kWhole);
    Json::Value jNone;
    Json::Value& jEntry = VORN_JSON_DB::recType(jNone, strName_);
    EXPECT_TRUE(jEntry.isNull());
    expectLog(lookUp("jTableDef.empty()", "null", "-"));
    jEntry = json(typesOf(R"({"cpptype":"int"})"));
    const char szSave[] = R"(recSave {"a":1,"b":"y","c":"z"} insert)";
    EXPECT_EQ("0", called(*pApi, szSave).strEnd);
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
