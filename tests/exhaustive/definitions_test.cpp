// SPDX-License-Identifier: MIT
// Each place of a table definition as every kind of JSON value: what a handle with it can do.

#include "calls.h"

namespace {

// The value is at "$" and the table's name at "!". An end of each kind of value.
struct Row {
    const char* szDefinition;
    const char* szList;
    const char* szSave;
    const char* szDelete;  // and recType: null where it fails
};

constexpr char kFails[] = "-1 -1 -1 -1 -1 -1 -1 -1 -1 -1 -1";
constexpr char kWorks[] = "0 0 0 0 0 0 0 0 0 0 0";
// Any text is a type word. null true -1 2^64-1 1.5 "" "x" [] [1] {} {"k":1}
constexpr char kOfTexts[] = "-1 -1 -1 -1 -1 0 0 -1 -1 -1 -1";

const Row kRows[] = {
    {"$", kFails, kFails, kFails},
    {R"({"!":$})", kFails, kFails, kFails},
    {R"({"!":{"member":$}})", kFails, kFails, kFails},
    {R"({"!":{"member":{"m":$}}})", kFails, kFails, kFails},
    {R"({"!":{"member":{"m":{"cpptype":$}}}})", kOfTexts, kFails, kOfTexts},
    {R"({"!":{"member":{"m":{"cpptype":"int","cppDefaultValue":$}}}})", kWorks, kWorks, kWorks},
    // What nobody reads.
    {R"({"!":{"member":{"m":{"cpptype":"int","x":$}},"x":$},"x":$})", kWorks, kWorks, kWorks},
    // The members before a bad one are known, but the column of the bad one is asked for.
    {R"({"!":{"member":{"m":{"cpptype":"int"},"n":$}}})", kFails, kFails, kWorks},
};

class Definitions : public CallTest {
protected:
    void check(const Row& row, std::size_t iKind)
    {
        std::string strName = freshName();
        std::string strCreate = "create table if not exists " + strName + " (m)";
        database_.run(strCreate + "; insert into " + strName + " values (null)");
        const Json::Value jDefinition =
            json(replaced(replaced(row.szDefinition, '!', strName), '$', kKinds[iKind]));
        Json::Value jGiven = jDefinition;
        VornJsonDbApi api(database_.get(), strName, jGiven, strCreate);
        EXPECT_EQ(jDefinition.empty() ? Lines{plain("Failed [jTableDef.empty()]")} : Lines(),
                  takeLog());
        const std::pair<const char*, const char*> calls[] = {
            {"recList null", row.szList},
            {R"(recSave {"m":1} insert)", row.szSave},
            {R"(recDelete {"m":1})", row.szDelete}};
        for (const auto& [szCall, szEnds] : calls) {
            database_.run("delete from " + strName + " where m");
            const std::string strEnd = split(szEnds, ' ').at(iKind);
            EXPECT_EQ(strEnd, called(api, szCall).strEnd) << szCall;
            EXPECT_EQ(isFailure(strEnd), !takeLog().empty()) << szCall;
        }
        const bool blKnown = "0" == split(row.szDelete, ' ').at(iKind);
        const Json::Value& jTypes = VORN_JSON_DB::recType(jGiven, strName);
        EXPECT_EQ(blKnown ? Json::objectValue : Json::nullValue, jTypes.type());
        EXPECT_EQ(jDefinition, jGiven);
        takeLog();
        expectSound(tableOf("string"));
        nCells_ += std::size(calls) + 2;
    }
};

TEST_F(Definitions, MayHoldAnyValueAtAnyPlace)
{
    for (const Row& row : kRows)
        for (std::size_t i = 0; i < std::size(kKinds); ++i) {
            SCOPED_TRACE(std::string(row.szDefinition) + " " + kKinds[i]);
            check(row, i);
        }
    printFigure("matrix cells, definitions", nCells_);
}

}  // namespace
