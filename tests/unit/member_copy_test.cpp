// SPDX-License-Identifier: MIT
// jsonCopyMember: the members of one object into another.

#include "support/database.h"

namespace {

using VORN_JSON_DB::jsonCopyMember;

class MemberCopy : public HostTest {};

TEST_F(MemberCopy, FillsAndOverwrites)
{
    struct Case {
        const char* szName;
        const char* szIn;
        const char* szSource;
        const char* szFilled;
        const char* szOverwritten;
    };
    const Case cases[] = {
        {"both have one", R"({"a":1})", R"({"a":2,"b":3})", R"({"a":1,"b":3})", R"({"a":2,"b":3})"},
        {"nothing in common", R"({"a":1})", R"({"b":2})", R"({"a":1,"b":2})", R"({"a":1,"b":2})"},
        {"the destination has more", R"({"a":1,"z":[2]})", R"({"a":2})", R"({"a":1,"z":[2]})",
         R"({"a":2,"z":[2]})"},
        {"into null", "null", R"({"a":1,"b":2})", R"({"a":1,"b":2})", R"({"a":1,"b":2})"},
        {"into empty", "{}", R"({"a":1,"b":2})", R"({"a":1,"b":2})", R"({"a":1,"b":2})"},
        {"nothing into null", "null", "{}", "null", "null"},
        {"nothing into empty", "{}", "{}", "{}", "{}"},
        {"nothing into one", R"({"a":1})", "{}", R"({"a":1})", R"({"a":1})"},
        {"objects are not merged", R"({"o":{"x":1,"y":2}})", R"({"o":{"x":5}})",
         R"({"o":{"x":1,"y":2}})", R"({"o":{"x":5}})"},
        {"arrays are not merged", R"({"l":[1,2,3]})", R"({"l":[9]})", R"({"l":[1,2,3]})",
         R"({"l":[9]})"},
        {"null counts as a member", R"({"a":null})", R"({"a":1,"b":null})",
         R"({"a":null,"b":null})", R"({"a":1,"b":null})"},
        {"null replaces", R"({"a":1})", R"({"a":null})", R"({"a":1})", R"({"a":null})"},
        {"another kind", R"({"a":{"x":1},"b":"t"})", R"({"a":1.5,"b":{"y":true}})",
         R"({"a":{"x":1},"b":"t"})", R"({"a":1.5,"b":{"y":true}})"},
        {"every kind", "null",
         R"({"":0,"a":null,"b":true,"c":-1,"d":18446744073709551615,"e":1.5,"f":"t","g":[{}],"h":{"i":[]}})",
         R"({"":0,"a":null,"b":true,"c":-1,"d":18446744073709551615,"e":1.5,"f":"t","g":[{}],"h":{"i":[]}})",
         R"({"":0,"a":null,"b":true,"c":-1,"d":18446744073709551615,"e":1.5,"f":"t","g":[{}],"h":{"i":[]}})"},
        {"names count whole and in their case", R"({"a":1})", R"({"A":2,"a ":3,"a\u0000b":4})",
         R"({"A":2,"a":1,"a\u0000b":4,"a ":3})", R"({"A":2,"a":1,"a\u0000b":4,"a ":3})"},
    };
    for (const Case& row : cases)
        for (bool blOverwrite : {false, true}) {
            SCOPED_TRACE(std::string(row.szName) + (blOverwrite ? ", overwriting" : ", filling"));
            Json::Value jIn = json(row.szIn);
            Json::Value jSource = json(row.szSource);
            EXPECT_EQ(0, jsonCopyMember(jIn, jSource, blOverwrite));
            EXPECT_EQ(text(json(blOverwrite ? row.szOverwritten : row.szFilled)), text(jIn));
            EXPECT_EQ(text(json(row.szSource)), text(jSource));
            EXPECT_EQ(Lines(), takeLog());
        }
}

TEST_F(MemberCopy, CopiesAreOfTheirOwn)
{
    Json::Value jIn;
    Json::Value jSource = json(R"({"o":{"x":1}})");
    EXPECT_EQ(0, jsonCopyMember(jIn, jSource, true));
    jSource["o"]["x"] = 2;
    EXPECT_EQ(R"({"o":{"x":1}})", text(jIn));
    jIn["o"]["x"] = 3;
    EXPECT_EQ(R"({"o":{"x":2}})", text(jSource));
}

TEST_F(MemberCopy, IntoItselfChangesNothing)
{
    for (bool blOverwrite : {false, true}) {
        Json::Value jIn = json(R"({"a":1,"o":{"x":[2]}})");
        EXPECT_EQ(0, jsonCopyMember(jIn, jIn, blOverwrite));
        EXPECT_EQ(R"({"a":1,"o":{"x":[2]}})", text(jIn));
    }
}

TEST_F(MemberCopy, FromAMemberOfTheDestination)
{
    for (bool blOverwrite : {false, true}) {
        Json::Value jIn = json(R"({"a":1,"o":{"a":2,"b":3}})");
        EXPECT_EQ(0, jsonCopyMember(jIn, jIn["o"], blOverwrite));
        EXPECT_EQ(blOverwrite ? R"({"a":2,"b":3,"o":{"a":2,"b":3}})"
                              : R"({"a":1,"b":3,"o":{"a":2,"b":3}})",
                  text(jIn));
    }
}

TEST_F(MemberCopy, IntoADestinationInsideTheSource)
{
    struct Case {
        const char* szSource;
        std::vector<const char*> path;  // to the destination
        const char* szFilled;
        const char* szOverwritten;
    };
    const Case cases[] = {
        {R"({"a":1,"o":{"a":2,"b":3}})",
         {"o"},
         R"({"a":1,"o":{"a":2,"b":3,"o":{"a":2,"b":3}}})",
         R"({"a":1,"o":{"a":1,"b":3,"o":{"a":1,"b":3}}})"},
        {R"({"a":1,"n":null})",
         {"n"},
         R"({"a":1,"n":{"a":1,"n":{"a":1}}})",
         R"({"a":1,"n":{"a":1,"n":{"a":1}}})"},
        {R"({"o":{"p":{"o":1}},"z":[2]})",
         {"o", "p"},
         R"({"o":{"p":{"o":1,"z":[2]}},"z":[2]})",
         R"({"o":{"p":{"o":{"p":{"o":1}},"z":[2]}},"z":[2]})"},
    };
    for (const Case& row : cases)
        for (bool blOverwrite : {false, true}) {
            SCOPED_TRACE(std::string(row.szSource) + (blOverwrite ? ", overwriting" : ", filling"));
            Json::Value jSource = json(row.szSource);
            Json::Value* pjIn = &jSource;
            for (const char* szName : row.path) pjIn = &(*pjIn)[szName];
            EXPECT_EQ(0, jsonCopyMember(*pjIn, jSource, blOverwrite));
            EXPECT_EQ(text(json(blOverwrite ? row.szOverwritten : row.szFilled)), text(jSource));
            EXPECT_EQ(Lines(), takeLog());
        }
}

const std::string kBadDestination =
    utilFailed("jIn.type() != Json::nullValue && jIn.type() != Json::objectValue");
const std::string kBadSource = utilFailed("jSubSet.type() != Json::objectValue");

// A failing copy, in every variant of the log.
void expectFailure(const char* szIn, const char* szSource, const std::string& strLine)
{
    for (bool blOverwrite : {false, true})
        for (bool blStdout : {false, true}) {
            SCOPED_TRACE(std::string(szIn) + " from " + szSource);
            blLogToStdout = blStdout;
            Json::Value jIn = json(szIn);
            Json::Value jSource = json(szSource);
            EXPECT_EQ(-1, jsonCopyMember(jIn, jSource, blOverwrite));
            EXPECT_EQ(text(json(szIn)), text(jIn));
            EXPECT_EQ(text(json(szSource)), text(jSource));
            EXPECT_EQ(Lines{strLine}, takeLog());
        }
}

constexpr const char* kOtherKinds[] = {"[]", R"([{"a":1}])",         R"("")", R"("x")", "0",    "1",
                                       "-1", "18446744073709551615", "1.5",   "true",   "false"};

TEST_F(MemberCopy, DestinationsOfEveryOtherKind)
{
    for (const char* szIn : kOtherKinds) {
        expectFailure(szIn, R"({"a":1})", kBadDestination);
        expectFailure(szIn, "{}", kBadDestination);
    }
}

TEST_F(MemberCopy, SourcesOfEveryOtherKind)
{
    for (const char* szIn : {"null", "{}", R"({"a":1})"}) {
        for (const char* szSource : kOtherKinds) expectFailure(szIn, szSource, kBadSource);
        // Null is no source, unlike for the destination.
        expectFailure(szIn, "null", kBadSource);
    }
}

TEST_F(MemberCopy, TheDestinationIsLookedAtFirst)
{
    expectFailure("[]", "[]", kBadDestination);
    expectFailure("1", "null", kBadDestination);
}

}  // namespace
