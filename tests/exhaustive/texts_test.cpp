// SPDX-License-Identifier: MIT
// Null and empty for every text and pointer of every function, and handles made of nothing.

#include "calls.h"

namespace {

// clang-format off
// Texts and pointers that are null or empty, and the other functions: the end and, where it is
// given, the output. Without a connection, what runs SQL fails.
const struct Row {
    const char* szCall;
    const char* szEnd;
    const char* szWithoutConnection;
    const char* szOut = nullptr;
} kRows[] = {
    {"tableCreate", "0", "-1"},
    {"setErrMsg \"\"", "0", "0"},
    {"runSqlEx \"\"", "-1", "-1"},
    {"runSqlEx \"\" callback", "-1", "-1"},
    // Without a callback the result is the count of the last INSERT.
    {"runSqlEx values(1) nullptr arg", "1", "-1"},
    {"runSqlEx values(1) callback nullptr", "0", "-1"},
    {"runSqlEx \t", "1", "-1"},
    {"recSave @ insert", "0", "-1"},
    {"recCreate @", "0", "-1"},
    {"recList null", "0", "-1"},
    {"recGetOne null", "1", "-1"},
    {"recDelete @", "1", "-1"},
    {"recDeleteAll", "1", "-1"},
    {"recUpdateByWhere @ \"\"", "-1", "-1"},
    {"recUpdateByWhere @ z", "0", "-1"},
    {"recUpdateByFilter @ @", "0", "-1"},
    {R"(recDeleteByArray ["z"] nullptr)", "-1", "-1"},
    {R"(recDeleteByArray ["z"] "")", "-1", "-1"},
    {"recDeleteByArray [] z", "-1", "-1"},
    {"recDeleteByArray [] nullptr", "-1", "-1"},
    {R"(recDeleteByArray [""] z)", "0", "-1"},
    {R"(recDeleteByArray ["z"] z)", "1", "-1"},
    {"recDeleteByName z nullptr", "-1", "-1"},
    {R"(recDeleteByName z "")", "-1", "-1"},
    {R"(recDeleteByName "" z)", "-1", "-1"},
    {R"(recDeleteByName "" nullptr)", "-1", "-1"},
    {"recDeleteByName z z", "1", "-1"},
    {R"(SqlExpandMemberName "")", "0", "0", "a,m,z"},
    {R"(SqlExpandMemberSymbol "" @)", "0", "0", "'a',5,'z') "},
    {R"(SqlExpandMemberList @ "" 1)", "0", "0", " (a='a' and m=5 and z='z' )"},
    {R"(SqlMakeByMatchField "" null)", "-1", "-1"},
    {R"(SqlMakeByMatchField z null "")", "0", "0", "z=''"},
    {"SqlMakeByListField nullptr []", "-1", "-1"},
    {R"(SqlMakeByListField "" [])", "-1", "-1"},
    {R"(SqlMakeByListField z ["y"] "")", "0", "0", "z in ('y' )"},
    {R"(VectorParamToJson ["z"] nullptr)", "-1", "-1"},
    {R"(VectorParamToJson ["z"] "")", "-1", "-1"},
    {"VectorParamToJson [] z", "0", "0", R"({"kept":1,"z":[]})"},
    {R"(SqlFilterConditionFromJson {"limit":1} "")", "0", "0", " LIMIT 1"},
    {R"(convert2ReadableTime 0 "" 3)", "0", "0", "Thu, 01 Jan 1970 00:00:00 GMT"},
    {"convert2ReadableTime 0 before 0", "-1", "-1"},
    {R"(getTimeAfterNow 0 "" 3)", "0", "0"},
    {"getTimeAfterNow 0 before 0", "-1", "-1"},
};
// clang-format on

class Texts : public CallTest {};

TEST_F(Texts, MayBeNullOrEmpty)
{
    Table& table = tableOf("int");
    VornJsonDbApi unconnected(nullptr, table.strName, table.jDefinition, table.strCreate);
    EXPECT_EQ(plain("Failed [!pDb]"), takeLog().at(0));
    for (const Row& row : kRows) {
        SCOPED_TRACE(row.szCall);
        const std::string strOut = checkCall(table, table.api, row.szCall, row.szEnd);
        if (nullptr != row.szOut) {
            EXPECT_EQ(row.szOut, strOut);
        }
        checkCall(table, unconnected, row.szCall, row.szWithoutConnection);
    }
    printFigure("matrix cells, texts and pointers", nCells_);
}

// A handle without those of its arguments whose bits are set.
void checkHandleWithout(int iMissing, Database& database, Table& table)
{
    SCOPED_TRACE(iMissing);
    const char* const conditions[] = {"!pDb", "strName.empty()", "jTableDef.empty()",
                                      "strSqlCreate.empty()"};
    Lines expected;
    bool missing[std::size(conditions)] = {};
    for (std::size_t i = 0; i < std::size(conditions); ++i) {
        missing[i] = 0 != (iMissing & (1 << i));
        if (missing[i]) expected.push_back(plain(std::string("Failed [") + conditions[i] + "]"));
    }
    std::string strName = freshName();
    std::string strNone;
    Json::Value jNone;
    VornJsonDbApi api(missing[0] ? nullptr : database.get(), missing[1] ? strNone : strName,
                      missing[2] ? jNone : table.jDefinition,
                      missing[3] ? strNone : table.strCreate);
    Lines lines = takeLog();
    EXPECT_EQ(missing[0] || missing[3],
              !lines.empty() && failed("0 > tableCreate()") == lines.back());
    lines.resize(expected.size());
    EXPECT_EQ(expected, lines);
    EXPECT_EQ("", api.getErrMsg());
    // No such table is there or defined: what runs SQL fails, and all the rest ends.
    for (const Row& row : kRows) {
        const std::string strEnd = called(api, row.szCall).strEnd;
        if (0 == std::string(row.szCall).compare(0, 3, "rec")) {
            EXPECT_EQ("-1", strEnd) << row.szCall;
        }
        takeLog();
    }
}

TEST_F(Texts, MayBeMissingInAHandle)
{
    constexpr int kChoices = 16;
    // In a process of its own, because the member types of the empty name would stay.
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(
        {
            for (int i = 0; i < kChoices; ++i) {
                checkHandleWithout(i, database_, tableOf("int"));
                expectSound(tableOf("int"));
            }
            endProcess(database_);
        },
        testing::ExitedWithCode(0), "");
    printFigure("matrix cells, handles with empty arguments", kChoices * std::size(kRows));
}

}  // namespace
