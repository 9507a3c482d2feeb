// SPDX-License-Identifier: MIT
// Rows and arguments that SQLite or the library itself never hand to the row callback.

#include "support/rows.h"

namespace {

using doubles::state;

class StrangeRows : public TableTest {
protected:
    static constexpr char kRecord[] =
        "0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)";

    int run(Json::Value* pjRows) { return table_.api.runSqlEx("a text", callback_, pjRows); }

    // The lines of a failed row, and that of the statement.
    static Lines stopped(Lines lines)
    {
        lines.push_back(plain("i=0,errno=?, run sql failed, error=query aborted, sql=a text"));
        return lines;
    }

    Table table_{database_, R"({"i":{"cpptype":"int"},"s":{"cpptype":"string"}})", "i"};
    doubles::RowCallback callback_ = rowCallback(table_);
    Json::Value rows_;
};

TEST_F(StrangeRows, AreRefusedWithoutAnArray)
{
    state().exec = execOfRow({{"i"}, {"1"}});
    EXPECT_EQ(-1, run(nullptr));
    EXPECT_EQ(stopped({failed("!pjRecArray")}), takeLog());
}

TEST_F(StrangeRows, AreRefusedIntoAnythingButAnArray)
{
    state().exec = execOfRow({{"i"}, {"1"}});
    for (const char* szTarget : {"{}", R"({"a":1})", "5", R"("x")", "false", "0.5"}) {
        rows_ = json(szTarget);
        EXPECT_EQ(-1, run(&rows_));
        EXPECT_EQ(stopped({failed("pjRecArray->type() != Json::arrayValue && "
                                  "pjRecArray->type() != Json::nullValue")}),
                  takeLog());
        EXPECT_EQ(json(szTarget), rows_);
    }
}

TEST_F(StrangeRows, WithoutNamesOrValuesAreRefused)
{
    for (bool blNames : {false, true}) {
        state().exec = [blNames](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                                 char** errText) {
            char* texts[] = {nullptr};
            EXPECT_EQ(-1, callback(arg, 1, blNames ? nullptr : texts, blNames ? texts : nullptr));
            *errText = doubles::errorText("query aborted");
            return SQLITE_ABORT;
        };
        EXPECT_EQ(-1, run(&rows_));
        EXPECT_EQ(stopped({failed("NULL == column_name || NULL == column_value"), failed(kRecord)}),
                  takeLog());
        EXPECT_TRUE(rows_.isNull());
    }
}

TEST_F(StrangeRows, WithoutNamesOrValuesBehindGoodOnesAreRefused)
{
    for (bool blNames : {false, true}) {
        state().exec = [blNames](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                                 char** errText) {
            std::string strName = "i";
            std::string strValue = "1";
            char* names[] = {&strName[0]};
            char* values[] = {&strValue[0]};
            for (int i = 0; i < 3; ++i) EXPECT_EQ(0, callback(arg, 1, values, names));
            EXPECT_EQ(-1, callback(arg, 1, blNames ? nullptr : values, blNames ? names : nullptr));
            *errText = doubles::errorText("query aborted");
            return SQLITE_ABORT;
        };
        rows_ = Json::nullValue;
        EXPECT_EQ(-1, run(&rows_));
        EXPECT_EQ(stopped({failed("NULL == column_name || NULL == column_value"), failed(kRecord)}),
                  takeLog());
        EXPECT_EQ(R"([{"i":1},{"i":1},{"i":1}])", text(rows_));
    }
}

TEST_F(StrangeRows, WithoutAFirstNameAreRefused)
{
    state().exec = execOfRow({{nullptr, "i"}, {"7", "1"}});
    EXPECT_EQ(-1, run(&rows_));
    EXPECT_EQ(stopped({failed("NULL == column_name[i]"), failed(kRecord)}), takeLog());
}

TEST_F(StrangeRows, WithoutALaterNameAreRefusedAndShown)
{
    for (const char* szValue : {static_cast<const char*>(nullptr), "7"}) {
        state().exec = execOfRow({{"i", nullptr}, {"1", szValue}});
        EXPECT_EQ(-1, run(&rows_));
        EXPECT_EQ(stopped({failed("NULL == column_name[i]"), plain("column_name[1]=(null)"),
                           plain(std::string("column_value[1]=") + (szValue ? szValue : "(null)")),
                           failed(kRecord)}),
                  takeLog());
        EXPECT_TRUE(rows_.isNull());
    }
}

TEST_F(StrangeRows, OfNoColumnsAreEmptyObjects)
{
    for (int nColumns : {0, -1}) {
        state().exec = [nColumns](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                                  char**) {
            char* texts[] = {nullptr};
            EXPECT_EQ(0, callback(arg, nColumns, texts, texts));
            return SQLITE_OK;
        };
        EXPECT_EQ(0, run(&rows_));
    }
    EXPECT_EQ("[{},{}]", text(rows_));
    EXPECT_EQ(Lines(), takeLog());
}

// A host may change what recType refers to.
TEST_F(StrangeRows, OfAMemberWithoutATypeAreRefused)
{
    Json::Value& jTypes = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    state().exec = execOfRow({{"i"}, {"1"}});
    for (const char* szType : {"{}", R"({"cpptype":null})"}) {
        jTypes["i"] = json(szType);
        EXPECT_EQ(-1, run(&rows_));
        EXPECT_EQ(stopped({error("type error, strType="),
                           failed("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, "
                                  "column_value, i))"),
                           failed(kRecord)}),
                  takeLog());
    }
    jTypes["i"] = json(R"({"cpptype":"bool"})");
    EXPECT_EQ(0, run(&rows_));
    EXPECT_EQ(R"([{"i":true}])", text(rows_));
}

// Two rows of one statement, as if SQLite went on after the first failed.
TEST_F(StrangeRows, WithoutTypesAskForThemEveryTime)
{
    VORN_JSON_DB::recType(table_.jDefinition, table_.strName) = Json::nullValue;
    state().exec = [](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                      char** errText) {
        Row row = {{"i"}, {"1"}};
        EXPECT_EQ(-1, row.handTo(callback, arg));
        EXPECT_EQ(-1, row.handTo(callback, arg));
        *errText = doubles::errorText("query aborted");
        return SQLITE_ABORT;
    };
    EXPECT_EQ(-1, run(&rows_));
    const Lines lines = takeLog();
    ASSERT_EQ(15U, lines.size());
    for (std::size_t i : {0U, 7U}) {
        EXPECT_EQ(utilFailed("jType[strJsonName].type() != Json::objectValue"), lines[i]);
        EXPECT_EQ(utilPlain("strJsonName=" + table_.strName), lines[i + 1]);
        EXPECT_EQ(utilPlain("jTableDef=null"), lines[i + 2]);
        EXPECT_EQ(0U, lines[i + 3].find(utilPlain("jType={")));
        EXPECT_EQ(failed("!jType.isMember(strName)"), lines[i + 4]);
    }
}

// What a host changes through the reference of recType holds from the next statement on.
TEST_F(StrangeRows, KeepTheTypesOfTheStatementsFirstRow)
{
    Row row{{"s"}, {"5"}};
    Json::Value& jTypes = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    state().exec = [&](sqlite3*, const char*, doubles::RowCallback callback, void* arg, char**) {
        EXPECT_EQ(0, row.handTo(callback, arg));
        jTypes["s"]["cpptype"] = "int";
        EXPECT_EQ(0, row.handTo(callback, arg));
        return SQLITE_OK;
    };
    EXPECT_EQ(0, run(&rows_));
    EXPECT_EQ(0, run(&rows_));
    EXPECT_EQ(R"([{"s":"5"},{"s":"5"},{"s":5},{"s":5}])", text(rows_));
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
