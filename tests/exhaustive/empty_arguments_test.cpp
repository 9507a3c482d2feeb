// SPDX-License-Identifier: MIT
// Null and empty for every text and pointer of every function, and for those of the constructor.

#include "calls.h"

namespace {

// Texts and pointers that are null or empty, and the other functions. Without a connection, what
// runs SQL fails.
const struct Row {
    const char* szCalls;  // between bars
    const char* szEnd;    // the result, and the output that the call has to give
    const char* szWithoutConnection;
} kRows[] = {
    {"tableCreate|recSave @ insert|recCreate @|recList null", "0", "-1"},
    {"recUpdateByWhere @ z|recUpdateByFilter @ @", "0", "-1"},
    {"recGetOne null|recDelete @|recDeleteAll", "1", "-1"},
    {R"(runSqlEx ""|runSqlEx "" callback|recUpdateByWhere @ "")", "-1", "-1"},
    // Without a callback the result is the count of the last INSERT.
    {"runSqlEx values(1) nullptr arg|runSqlEx \t", "1", "-1"},
    {"runSqlEx values(1) callback nullptr", "0", "-1"},
    {R"(recDeleteByArray ["z"] z|recDeleteByName z z)", "1", "-1"},
    {R"(recDeleteByArray [""] z)", "0", "-1"},
    {R"(recDeleteByArray ["z"] nullptr|recDeleteByArray ["z"] ""|recDeleteByArray [] z)", "-1",
     "-1"},
    {R"(recDeleteByName z nullptr|recDeleteByName z ""|recDeleteByName "" z)", "-1", "-1"},
    {R"(recDeleteByArray [] nullptr|recDeleteByName "" nullptr)", "-1", "-1"},
    {R"(SqlExpandMemberName "")", "0 a,m,z", "0"},
    {R"(SqlExpandMemberSymbol "" @)", "0 'a',5,'z') ", "0"},
    {R"(SqlExpandMemberList @ "" 1)", "0  (a='a' and m=5 and z='z' )", "0"},
    {R"(SqlMakeByMatchField z null "")", "0 z=''", "0"},
    {R"(SqlMakeByListField z ["y"] "")", "0 z in ('y' )", "0"},
    {R"(SqlMakeByMatchField "" null|SqlMakeByListField "" []|SqlMakeByListField nullptr [])", "-1",
     "-1"},
    {"VectorParamToJson [] z", R"(0 {"kept":1,"z":[]})", "0"},
    {R"(VectorParamToJson ["z"] nullptr|VectorParamToJson ["z"] "")", "-1", "-1"},
    {R"(SqlFilterConditionFromJson {"limit":1} "")", "0  LIMIT 1", "0"},
    {R"(convert2ReadableTime 0 "" 3)", "0 Thu, 01 Jan 1970 00:00:00 GMT", "0"},
    {R"(getTimeAfterNow 0 "" 3|setErrMsg "")", "0", "0"},
    {"convert2ReadableTime 0 before 0|getTimeAfterNow 0 before 0", "-1", "-1"},
};

class EmptyArguments : public CallTest {};

TEST_F(EmptyArguments, AreSafeForEveryCall)
{
    Table& table = tableOf("int");
    VornJsonDbApi unconnected(nullptr, table.strName, table.jDefinition, table.strCreate);
    EXPECT_EQ(plain("Failed [!pDb]"), takeLog().at(0));
    for (const Row& row : kRows)
        for (const std::string& strCall : split(row.szCalls, '|')) {
            SCOPED_TRACE(strCall);
            checkCall(table, table.api, strCall, row.szEnd);
            checkCall(table, unconnected, strCall, row.szWithoutConnection);
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
    // No such table exists or is defined: what runs SQL fails, and everything else still ends.
    for (const Row& row : kRows)
        for (const std::string& strCall : split(row.szCalls, '|')) {
            const std::string strEnd = called(api, strCall).strEnd;
            if (0 == strCall.compare(0, 3, "rec")) {
                EXPECT_EQ("-1", strEnd) << strCall;
            }
            takeLog();
        }
}

TEST_F(EmptyArguments, AreSafeForTheConstructor)
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
    std::size_t nCalls = 0;
    for (const Row& row : kRows) nCalls += split(row.szCalls, '|').size();
    printFigure("matrix cells, handles with empty arguments", kChoices * nCalls);
}

}  // namespace
