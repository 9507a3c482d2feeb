// SPDX-License-Identifier: MIT
// Member types that a host changes through the reference of recType, in every operation that reads
// them.

#include "support/database.h"

namespace {

class ChangedTypes : public TableTest {
protected:
    // What the operations make of {"m":5}, and of the row that holds it: each result with the SQL
    // that was run, or the first line of the log.
    Lines operations(VornJsonDbApi& api)
    {
        Json::Value jChecked = json(R"({"m":5})");
        Json::Value jSaved = json(R"({"m":5})");
        Json::Value jRequest = json(R"({"m":5})");
        Json::Value jRecords;
        Lines lines;
        const auto add = [this, &lines](int iResult) {
            const Lines log = takeLog();
            const Lines statements = takeStatements();
            lines.push_back(std::to_string(iResult) + " " +
                            (!log.empty()         ? log[0]
                             : statements.empty() ? ""
                                                  : statements[0]));
        };
        takeStatements();
        database_.run("delete from " + table_.strName);
        add(api.checkJsonType(jChecked));
        add(api.recSave(jSaved, true));
        database_.run("insert into " + table_.strName + " values (5)");
        add(api.recList(jRequest, jRecords));
        lines.push_back(text(jRecords));
        return lines;
    }

    // The same for a type word that no operation knows.
    Lines ofAnUnknownWord() const
    {
        return {"-1 " + error("type not found!!, key=m"),
                "-1 " + error("cannot support this type="), "-1 " + error("type error, strType="),
                "null"};
    }

    Lines ofAKnownWord(const std::string& strWritten, const std::string& strTerm,
                       const std::string& strRead) const
    {
        const std::string& strName = table_.strName;
        return {"0 ",
                "0 INSERT INTO " + strName + " (m) VALUES (" + strWritten + ") ;select * from " +
                    strName + " where rowid == last_insert_rowid();",
                "0 SELECT m FROM " + strName + "  WHERE  (m=" + strTerm + " );",
                R"([{"m":)" + strRead + R"(},{"m":)" + strRead + "}]"};
    }

    Json::Value& types() { return VORN_JSON_DB::recType(table_.jDefinition, table_.strName); }

    Table table_{database_, R"({"m":{"cpptype":"int"}})", "m"};
};

TEST_F(ChangedTypes, HoldFromTheNextStatementOnForEveryHandle)
{
    Table second(database_, table_.strName, R"({"m":{"cpptype":"int"}})", "m");
    Json::Value& jTypes = types();
    for (VornJsonDbApi* pApi : {&table_.api, &second.api}) {
        jTypes["m"]["cpptype"] = "int";
        EXPECT_EQ(ofAKnownWord("5", "5", "5"), operations(*pApi));
        jTypes["m"]["cpptype"] = "bool";
        Lines ofABool = ofAKnownWord("5", "5", "false");
        ofABool[0] = "-1 " + error(R"(type failed, strKey=m, jRecParam={"m":5})");
        EXPECT_EQ(ofABool, operations(*pApi));
        jTypes["m"]["cpptype"] = "no such word";
        EXPECT_EQ("-1 " + error("type not found!!, key=m"), operations(*pApi)[0]);
        jTypes["m"]["cpptype"] = "long long";
        EXPECT_EQ(ofAKnownWord("5", "5", "5"), operations(*pApi));
    }
}

TEST_F(ChangedTypes, OfADamagedEntryAreOfNoKnownWordAndStay)
{
    Json::Value& jTypes = types();
    for (const char* szEntry : {"{}", R"({"cppDefaultValue":1})", R"({"type":"int"})", "null", "5",
                                "true", R"("int")", "[]", R"([{"cpptype":"int"}])"}) {
        SCOPED_TRACE(szEntry);
        jTypes["m"] = json(szEntry);
        EXPECT_EQ(ofAnUnknownWord(), operations(table_.api));
        EXPECT_EQ(text(json(szEntry)), text(jTypes["m"]));
    }
    jTypes["m"] = json(R"({"cpptype":"int"})");
    EXPECT_EQ(ofAKnownWord("5", "5", "5"), operations(table_.api));
}

}  // namespace
