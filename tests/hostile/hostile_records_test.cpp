// SPDX-License-Identifier: MIT
// Hostile strings in every member of a record, and before members of every type.

#include "hostile/hostile_strings.h"
#include "support/database.h"
#include "support/figures.h"

#include <set>

namespace {

bool has(const std::string& strText, char c)
{
    return std::string::npos != strText.find(c);
}

struct Type {
    const char* szWord;
    const char* szValue;
    bool blDecoded = true;
};

const Type kTypes[] = {{"string", "\"m\""},        {"int", "42"},
                       {"unsigned int", "42"},     {"unsigned", "42", false},
                       {"long", "42", false},      {"unsigned long", "42", false},
                       {"long long", "42"},        {"unsigned long long", "42"},
                       {"float", "1.5", false},    {"double", "2.5", false},
                       {"bool", "true"},           {"Json::objectValue", R"({"k":1})"},
                       {"Json::arrayValue", "[1]"}};

class HostileRecords : public TableTest {
protected:
    HostileRecords() { database_.run("begin"); }
    ~HostileRecords() override { database_.run("commit"); }

    template <typename Check>
    static void forEachString(Check check)
    {
        for (const std::string& strHostile : hostileStrings()) {
            SCOPED_TRACE(testing::PrintToString(strHostile.substr(0, 100)));
            check(strHostile);
            doubles::state().log.clear();
        }
    }
};

TEST_F(HostileRecords, AreEnough)
{
    const auto& strings = hostileStrings();
    const std::size_t nStrings = std::set<std::string>(strings.begin(), strings.end()).size();
    EXPECT_LE(400U, nStrings);
    Figures::of("hostile strings") = static_cast<long long>(nStrings);
}

TEST_F(HostileRecords, KeepTextsAroundAMemberOfEachType)
{
    for (const Type& type : kTypes) {
        SCOPED_TRACE(type.szWord);
        Table table(database_,
                    std::string(R"({"a":{"cpptype":"string"},"m":{"cpptype":")") + type.szWord +
                        R"("},"z":{"cpptype":"string"}})",
                    "a text, m, z text");
        // Where blKept is false the call may end either way; on failure the record is left alone.
        const auto save = [&](const std::string& strFirst, const std::string& strLast,
                              bool blKept) {
            Json::Value jRecord;
            jRecord["a"] = strFirst;
            jRecord["m"] = json(type.szValue);
            jRecord["z"] = strLast;
            Json::Value jOut = jRecord;
            const int iResult = table.api.recSave(jOut, true);
            EXPECT_EQ(0 != iResult, !doubles::state().log.empty());
            doubles::state().log.clear();
            if (blKept) {
                EXPECT_EQ(type.blDecoded ? 0 : -1, iResult);
                EXPECT_EQ(jRecord, jOut);
                EXPECT_EQ((Rows{{strFirst, strLast}}),
                          database_.rows("select a, z from " + table.strName +
                                         " order by rowid desc limit 1"));
            } else if (0 != iResult) {
                EXPECT_EQ(-1, iResult);
                EXPECT_EQ(jRecord, jOut);
            }
        };
        forEachString([&](const std::string& strHostile) {
            const bool blCut = has(strHostile, '\0');
            // No value follows the last one.
            const bool blFormat = has(strHostile, '%');
            save(strHostile, "z", !blCut && !blFormat);
            save(strHostile, strHostile, !blCut && !blFormat);
            save("a", strHostile, !blCut);
            save("sound", "handle", true);
        });
    }
}

TEST_F(HostileRecords, KeepObjectsAndArrays)
{
    Table table(database_,
                R"({"a":{"cpptype":"Json::arrayValue"},"o":{"cpptype":"Json::objectValue"}})",
                "a text, o text");
    forEachString([&](const std::string& strHostile) {
        Json::Value jRecord = json(R"({"a":["a"],"o":{}})");
        jRecord["o"][strHostile] = strHostile;
        Json::Value jOut;
        EXPECT_EQ(0, table.api.recCreate(jRecord, jOut));
        EXPECT_EQ(jRecord, jOut);
        EXPECT_EQ(Lines(), takeLog());

        jRecord["a"][0] = strHostile;
        const Json::Value jBefore = jRecord;
        jOut = "untouched";
        const int iResult = table.api.recCreate(jRecord, jOut);
        EXPECT_EQ(jBefore, jRecord);
        if (!has(strHostile, '%')) {
            EXPECT_EQ(0, iResult);
            EXPECT_EQ(jRecord, jOut);
        } else if (0 != iResult) {
            EXPECT_EQ(-1, iResult);
            EXPECT_EQ(Json::Value("untouched"), jOut);
        }
        EXPECT_EQ(json(R"({"a":[],"o":{}})"), table.create(R"({"a":[],"o":{}})"));
    });
}

TEST_F(HostileRecords, AreLoggedWhereTheyAreRefused)
{
    Table table(database_, R"({"a":{"cpptype":"int"}})", "a");
    forEachString([&](const std::string& strHostile) {
        Json::Value jRecord;
        jRecord["a"] = strHostile;
        jRecord["x" + strHostile] = strHostile;
        Json::Value jOut;
        EXPECT_EQ(-1, table.api.recCreate(jRecord, jOut));
        EXPECT_EQ((Lines{error("type failed, strKey=a, jRecParam=" + text(jRecord)),
                         failed("0 > checkJsonType(jParam)"),
                         plain("call create rec, rec=" + text(jRecord))}),
                  takeLog());
        jRecord["a"] = 1;
        EXPECT_EQ(0, table.api.recCreate(jRecord, jOut));
        EXPECT_EQ(json(R"({"a":1})"), jOut);
    });
}

}  // namespace
