// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// jsonCopyMember: the members of one object into another.

#include "support/database.h"

namespace {

using VORN_JSON_DB::jsonCopyMember;

class MemberCopy : public HostTest {
protected:
    // What filling and overwriting make of the destination; or the line that both log instead.
    static void expectCopies(const char* szIn, const char* szSource, const char* szFilled,
                             const char* szOverwritten, const Lines& lines = {})
    {
        for (bool blOverwrite : {false, true}) {
            SCOPED_TRACE(std::string(szIn) + " from " + szSource);
            Json::Value jIn = json(szIn);
            Json::Value jSource = json(szSource);
            EXPECT_EQ(lines.empty() ? 0 : -1, jsonCopyMember(jIn, jSource, blOverwrite));
            EXPECT_EQ(text(json(blOverwrite ? szOverwritten : szFilled)), text(jIn));
            EXPECT_EQ(text(json(szSource)), text(jSource));
            EXPECT_EQ(lines, takeLog());
        }
    }
};

TEST_F(MemberCopy, FillsAndOverwrites)
{
    const char* szEveryKind =
        R"({"":0,"a":null,"b":true,"c":-1,"d":18446744073709551615,"e":1.5,"f":"t","g":[{}],"h":{}})";
    expectCopies("null", szEveryKind, szEveryKind, szEveryKind);
    const char* szBoth = R"({"a":1,"b":3,"z":[2]})";
    expectCopies(R"({"a":1,"z":[2]})", R"({"a":2,"b":3})", szBoth, R"({"a":2,"b":3,"z":[2]})");
    for (const char* szIn : {"null", "{}", R"({"a":1})"}) expectCopies(szIn, "{}", szIn, szIn);
    // Objects and arrays are not merged.
    const char* szNested = R"({"l":[1,2],"o":{"x":1,"y":2}})";
    expectCopies(szNested, R"({"l":[9],"o":{"x":5}})", szNested, R"({"l":[9],"o":{"x":5}})");
    // Null counts as a member.
    expectCopies(R"({"a":null,"b":1})", R"({"a":1,"b":null})", R"({"a":null,"b":1})",
                 R"({"a":1,"b":null})");
    // Names are compared whole and case-sensitively.
    const char* szNames = R"({"A":2,"a":1,"a\u0000b":4,"a ":3})";
    expectCopies(R"({"a":1})", R"({"A":2,"a ":3,"a\u0000b":4})", szNames, szNames);
}

TEST_F(MemberCopy, RefusesAnyOtherKind)
{
    const Lines badDestination = {
        utilFailed("jIn.type() != Json::nullValue && jIn.type() != Json::objectValue")};
    const Lines badSource = {utilFailed("jSubSet.type() != Json::objectValue")};
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        for (const char* szKind : {"[]", R"([{"a":1}])", R"("")", R"("x")", "1", "-1",
                                   "18446744073709551615", "1.5", "true", "false"}) {
            // The destination is checked first.
            for (const char* szSource : {R"({"a":1})", "{}", "[]", "null"})
                expectCopies(szKind, szSource, szKind, szKind, badDestination);
            for (const char* szIn : {"null", "{}", R"({"a":1})"})
                expectCopies(szIn, szKind, szIn, szIn, badSource);
        }
        // Null is refused as a source, unlike as a destination.
        for (const char* szIn : {"null", "{}"}) expectCopies(szIn, "null", szIn, szIn, badSource);
    }
}

TEST_F(MemberCopy, MakesCopiesThatDoNotFollowTheSource)
{
    Json::Value jIn;
    Json::Value jSource = json(R"({"o":{"x":1}})");
    EXPECT_EQ(0, jsonCopyMember(jIn, jSource, true));
    jSource["o"]["x"] = 2;
    EXPECT_EQ(R"({"o":{"x":1}})", text(jIn));
    jIn["o"]["x"] = 3;
    EXPECT_EQ(R"({"o":{"x":2}})", text(jSource));
}

TEST_F(MemberCopy, CopiesBetweenPartsOfOneValue)
{
    using Path = std::vector<const char*>;
    const Path whole, o = {"o"}, n = {"n"}, op = {"o", "p"};
    const struct {
        const char* szValue;
        const Path& in;
        const Path& source;
        const char* szFilled;
        const char* szOverwritten;
    } cases[] = {
        {R"({"o":{"x":[2]}})", whole, whole, R"({"o":{"x":[2]}})", R"({"o":{"x":[2]}})"},
        {R"({"a":1,"o":{"a":2,"b":3}})", whole, o, R"({"a":1,"b":3,"o":{"a":2,"b":3}})",
         R"({"a":2,"b":3,"o":{"a":2,"b":3}})"},
        {R"({"a":1,"o":{"a":2}})", o, whole, R"({"a":1,"o":{"a":2,"o":{"a":2}}})",
         R"({"a":1,"o":{"a":1,"o":{"a":1}}})"},
        {R"({"a":1,"n":null})", n, whole, R"({"a":1,"n":{"a":1,"n":{"a":1}}})",
         R"({"a":1,"n":{"a":1,"n":{"a":1}}})"},
        {R"({"o":{"p":{"o":1}},"z":[2]})", op, whole, R"({"o":{"p":{"o":1,"z":[2]}},"z":[2]})",
         R"({"o":{"p":{"o":{"p":{"o":1}},"z":[2]}},"z":[2]})"},
    };
    for (const auto& row : cases)
        for (bool blOverwrite : {false, true}) {
            Json::Value jValue = json(row.szValue);
            const auto at = [&](const Path& path) {
                Json::Value* pjValue = &jValue;
                for (const char* szName : path) pjValue = &(*pjValue)[szName];
                return pjValue;
            };
            EXPECT_EQ(0, jsonCopyMember(*at(row.in), *at(row.source), blOverwrite));
            EXPECT_EQ(blOverwrite ? row.szOverwritten : row.szFilled, text(jValue));
            EXPECT_EQ(Lines(), takeLog());
        }
}

}  // namespace
