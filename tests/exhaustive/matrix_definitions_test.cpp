// SPDX-License-Identifier: MIT
// Each place of a table definition as every kind of JSON value: what recType makes of it, and what
// a handle with such a definition can do.

#include "support/matrix.h"

namespace {

// The value stands at "$"; the table is called "t" here. An end of recType is O for an object and N
// for null, of a handle the result of the call.
struct Row {
    const char* szDefinition;
    const char* szTypes;
    const char* szList;    // recList of every record
    const char* szSave;    // recSave of {"m":1}
    const char* szDelete;  // recDelete of {"m":1}
};

constexpr char kNull[] = "N N N N N N N N N N N";
constexpr char kObject[] = "O O O O O O O O O O O";
constexpr char kFails[] = "-1 -1 -1 -1 -1 -1 -1 -1 -1 -1 -1";
constexpr char kWorks[] = "0 0 0 0 0 0 0 0 0 0 0";

// clang-format off
const Row kRows[] = {
    {"$",                         kNull, kFails, kFails, kFails},
    {R"({"t":$})",                kNull, kFails, kFails, kFails},
    {R"({"t":{"member":$}})",     kNull, kFails, kFails, kFails},
    {R"({"t":{"member":{"m":$}}})",
                                  kNull, kFails, kFails, kFails},
    // Any text is a type word.
    //  null true -1 2^64-1 1.5  ""  "x"  []  [1]  {} {"k":1}
    {R"({"t":{"member":{"m":{"cpptype":$}}}})",
       " N    N    N    N    N    O    O    N    N    N    N",
       "-1   -1   -1   -1   -1    0    0   -1   -1   -1   -1",
       kFails,
       "-1   -1   -1   -1   -1    0    0   -1   -1   -1   -1"},
    {R"({"t":{"member":{"m":{"cpptype":"int","cppDefaultValue":$}}}})",
                                  kObject, kWorks, kWorks, kWorks},
    // What nobody reads.
    {R"({"t":{"member":{"m":{"cpptype":"int","x":$}},"x":$},"x":$})",
                                  kObject, kWorks, kWorks, kWorks},
    // The members before a bad one are known, but the column of the bad one is asked for.
    {R"({"t":{"member":{"m":{"cpptype":"int"},"n":$}}})",
                                  kObject, kFails, kFails, kWorks},
};
// clang-format on

class DefinitionMatrix : public TableTest {
protected:
    // Its column m is NULL in its only row.
    void makeTable()
    {
        strName_ = freshName();
        strCreate_ = "create table if not exists " + strName_ + " (m)";
        database_.run(strCreate_ + "; insert into " + strName_ + " values (null)");
    }

    Json::Value definition(std::string strTemplate, const std::string& strKind) const
    {
        const std::string strTable = R"("t":)";
        if (const std::size_t n = strTemplate.find(strTable); std::string::npos != n)
            strTemplate.replace(n, strTable.size(), "\"" + strName_ + "\":");
        for (std::size_t n = 0; std::string::npos != (n = strTemplate.find('$', n));
             n += strKind.size())
            strTemplate.replace(n, 1, strKind);
        return json(strTemplate);
    }

    void checkTypes(const Json::Value& jDefinition, const std::string& strExpected)
    {
        Json::Value jGiven = jDefinition;
        const Json::Value& jTypes = VORN_JSON_DB::recType(jGiven, strName_);
        EXPECT_EQ("O" == strExpected, jTypes.isObject());
        EXPECT_EQ("N" == strExpected, jTypes.isNull());
        EXPECT_EQ(jDefinition, jGiven);
        takeLog();
    }

    void checkHandle(const Json::Value& jDefinition, const std::string& strList,
                     const std::string& strSave, const std::string& strDelete)
    {
        Json::Value jGiven = jDefinition;
        VornJsonDbApi api(database_.get(), strName_, jGiven, strCreate_);
        EXPECT_EQ(jDefinition, jGiven);
        EXPECT_EQ(jDefinition.empty() ? Lines{plain("Failed [jTableDef.empty()]")} : Lines(),
                  takeLog());

        Outputs out;
        Json::Value jRequest;
        expectEnd(strList, "recList", [&] { return api.recList(jRequest, out.jArray); });
        Json::Value jRecord = json(R"({"m":1})");
        expectEnd(strSave, "recSave", [&] { return api.recSave(jRecord, true); });
        EXPECT_EQ(R"({"m":1})", text(jRecord));
        database_.run("delete from " + strName_ + " where m");
        expectEnd(strDelete, "recDelete", [&] { return api.recDelete(jRecord); });
        if (isFailure(strList)) out.expectUntouched();
    }

    template <typename Call>
    void expectEnd(const std::string& strExpected, const char* szCall, Call call)
    {
        EXPECT_EQ(strExpected, endOf(call)) << szCall;
        EXPECT_EQ(isFailure(strExpected), !takeLog().empty()) << szCall;
        ++nCells_;
    }

    std::string strName_;
    std::string strCreate_;
    std::size_t nCells_ = 0;
    UnwatchedLog unwatched_;
};

TEST_F(DefinitionMatrix, OfEveryPlace)
{
    Table sound(database_, R"({"z":{"cpptype":"string"}})", "z");
    for (const Row& row : kRows) {
        const std::vector<std::string> types = split(row.szTypes, ' ');
        const std::vector<std::string> lists = split(row.szList, ' ');
        const std::vector<std::string> saves = split(row.szSave, ' ');
        const std::vector<std::string> deletes = split(row.szDelete, ' ');
        for (const auto* pEnds : {&types, &lists, &saves, &deletes})
            ASSERT_EQ(std::size(kKinds), pEnds->size()) << row.szDefinition;
        for (std::size_t i = 0; i < std::size(kKinds); ++i) {
            SCOPED_TRACE(std::string(row.szDefinition) + " " + kKinds[i]);
            makeTable();
            const Json::Value jDefinition = definition(row.szDefinition, kKinds[i]);
            checkHandle(jDefinition, lists[i], saves[i], deletes[i]);
            checkTypes(jDefinition, types[i]);
            expectSound(database_, sound.api, R"({"z":"sound"})");
            nCells_ += 2;  // the constructor and recType
        }
    }
    printFigure("matrix cells, definitions", nCells_);
}

}  // namespace
