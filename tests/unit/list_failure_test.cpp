// SPDX-License-Identifier: MIT
// Listing: the failures of each step with their lines, and what stays in the array.

#include "support/records.h"

namespace {

const std::string kNoConditions =
    failed("0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)");
const std::string kNoPaging = failed("0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)");
const std::string kNotRun = failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)");

class ListFailure : public RecordsTest {
protected:
    int list(const std::string& strRequest)
    {
        jRequest_ = json(strRequest);
        return table_.api.recList(jRequest_, jArray_);
    }

    Json::Value jRequest_;
    Json::Value jArray_ = json("[7]");
};

TEST_F(ListFailure, OfTheConditionsComesBeforeThePaging)
{
    const std::string strRequest = R"({"sort_by":5,"vornSqlWhereFilter":5})";
    EXPECT_EQ(-1, list(strRequest));
    EXPECT_EQ((Lines{kFilterIsNoText, kNoConditions, plain("jRecParam=" + strRequest)}), takeLog());
    EXPECT_EQ("[7]", text(jArray_));
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(ListFailure, OfARawFilterOfAnyOtherKind)
{
    for (const char* szFilter : {"null", "true", "1.5", "[]", R"(["id=1"])", "{}"}) {
        const std::string strRequest = std::string(R"({"vornSqlWhereFilter":)") + szFilter + "}";
        EXPECT_EQ(-1, list(strRequest));
        EXPECT_EQ((Lines{kFilterIsNoText, kNoConditions, plain("jRecParam=" + strRequest)}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(ListFailure, OfMemoryInATerm)
{
    const std::string strRequest = R"({"name":"Ann"})";
    doubles::state().iFailMprintf = 1;
    EXPECT_EQ(-1, list(strRequest));
    EXPECT_EQ(
        (Lines{kNoMemoryForText, kNoMatchTerm, kNoConditions, plain("jRecParam=" + strRequest)}),
        takeLog());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(ListFailure, OfMemoryInAMembershipTerm)
{
    const std::string strRequest = R"({"name":["Ann"]})";
    doubles::state().iFailMprintf = 1;
    EXPECT_EQ(-1, list(strRequest));
    EXPECT_EQ(
        (Lines{failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))"),
               failed("0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)"),
               kNoConditions, plain("jRecParam=" + strRequest)}),
        takeLog());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(ListFailure, OfThePaging)
{
    const std::string strRequest = R"({"name":"Ann","sort_by":"name"})";
    doubles::state().iFailMprintf = 2;
    EXPECT_EQ(-1, list(strRequest));
    EXPECT_EQ((Lines{failed("!szSql"), kNoPaging, plain("jRecParam=" + strRequest)}), takeLog());
    EXPECT_EQ("[7]", text(jArray_));
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(ListFailure, OfSqlThatSqliteRefuses)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        const char* szError;
    } cases[] = {
        {R"({"tags":[]})", " WHERE  ( );", kNearParenthesis},
        {R"({"name":"x","tags":[]})", " WHERE  (name='x' and  );", kNearParenthesis},
        {R"({"vornSqlWhereFilter":""})", " WHERE  (   );", kNearParenthesis},
        {R"({"vornSqlWhereFilter":"absent = 1"})", " WHERE  ( absent = 1  );",
         "no such column: absent"},
        {R"({"id":""})", " WHERE  (id= );", kNearParenthesis},
        {R"({"limit":null})", " LIMIT null;", "datatype mismatch"},
        {R"({"limit":1.5})", " LIMIT 1.5;", "datatype mismatch"},
        {R"({"limit":[]})", " LIMIT [];", "no such column: "},
        {R"({"limit":1,"offset":{}})", " LIMIT 1 OFFSET {};", R"(unrecognized token: "{")"},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, list(row.szRequest)) << row.szRequest;
        const std::string strSql = select(row.szTail);
        EXPECT_EQ((Lines{runFailed(row.szError, strSql), kNotRun,
                         plain(std::string("jRecParam=") + row.szRequest),
                         sqlError(row.szError, strSql)}),
                  takeLog());
        EXPECT_EQ(Lines{strSql}, takeStatements());
    }
    EXPECT_EQ("[7]", text(jArray_));
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(ListFailure, OfATableThatIsGone)
{
    database_.run("drop table " + table_.strName);
    const std::string strError = "no such table: " + table_.strName;
    const std::string strSql = select(";");
    for (const bool blDebug : {false, true}) {
        blDebugOutput = blDebug;
        EXPECT_EQ(-1, list("null"));
        Lines expected{runFailed(strError, strSql)};
        if (blDebug) expected.push_back(plain("run sql fail, err=" + strError));
        expected.insert(expected.end(),
                        {kNotRun, plain("jRecParam=null"), sqlError(strError, strSql)});
        EXPECT_EQ(expected, takeLog());
    }
}

TEST_F(ListFailure, GoesToStandardOutputWhenAsked)
{
    blLogToStdout = true;
    EXPECT_EQ(-1, list(R"({"tags":[]})"));
    const std::string strSql = select(" WHERE  ( );");
    const std::string strError = kNearParenthesis;
    EXPECT_EQ((Lines{runFailed(strError, strSql), kNotRun, plain(R"(jRecParam={"tags":[]})"),
                     sqlError(strError, strSql)}),
              takeLog());
    EXPECT_EQ(-1, list("[1]"));
    EXPECT_EQ((Lines{kNoObjectOrNull, plain("jRecParam=[1]"), sqlError(strError, "")}), takeLog());
}

TEST_F(ListFailure, RepeatsAnEarlierErrorTextUntilAStatementSucceeds)
{
    makeStale();
    const struct {
        const char* szRequest;
        Lines lines;
    } cases[] = {
        {"[1]", {kNoObjectOrNull}},
        {R"({"vornSqlWhereFilter":5})", {kFilterIsNoText, kNoConditions}},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, list(row.szRequest));
        Lines expected = row.lines;
        expected.push_back(plain(std::string("jRecParam=") + row.szRequest));
        expected.push_back(sqlError(kStale, ""));
        EXPECT_EQ(expected, takeLog());
    }
    jArray_ = "no array";
    EXPECT_EQ(-1, list("null"));
    EXPECT_EQ((Lines{failed("jRecArrayOut.type() != Json::nullValue && "
                            "jRecArrayOut.type() != Json::arrayValue"),
                     plain("jRecParam=null"), sqlError(kStale, "")}),
              takeLog());
    jArray_ = Json::nullValue;
    EXPECT_EQ(0, list("null"));
    EXPECT_EQ(-1, list("[1]"));
    EXPECT_EQ((Lines{kNoObjectOrNull, plain("jRecParam=[1]")}), takeLog());
}

TEST_F(ListFailure, RepeatsAnEarlierErrorTextWhereThePagingFails)
{
    makeStale();
    doubles::state().iFailMprintf = 1;
    EXPECT_EQ(-1, list(R"({"sort_by":"id"})"));
    EXPECT_EQ((Lines{failed("!szSql"), kNoPaging, plain(R"(jRecParam={"sort_by":"id"})"),
                     sqlError(kStale, "")}),
              takeLog());
}

// A member of a word that no row is read through: rows with NULL there are records.
class ListDouble : public HostTest {
protected:
    ListDouble() { database_.run("insert into " + table_.strName + " values (1,NULL),(2,2.5)"); }

    Lines failure(const std::string& strRequest, const std::string& strSql) const
    {
        const std::string strError = sqlite3_errstr(SQLITE_ABORT);
        return {error("type error, strType=double"),
                failed("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))"),
                plain("column_name[1]=real"),
                plain("column_value[1]=2.5"),
                failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)"),
                runFailed(strError, strSql),
                kNotRun,
                plain("jRecParam=" + strRequest),
                sqlError(strError, strSql)};
    }

    Database database_;
    Table table_{database_, R"({"id":{"cpptype":"int"},"real":{"cpptype":"double"}})",
                 "id integer primary key, real real"};
    Json::Value jRequest_;
};

TEST_F(ListDouble, RowsBeforeTheBadOneStay)
{
    const std::string strSql = "SELECT id,real FROM " + table_.strName + " ;";
    for (const char* szArray : {"null", "[]", "[7]"}) {
        Json::Value jArray = json(szArray);
        EXPECT_EQ(-1, table_.api.recList(jRequest_, jArray));
        EXPECT_EQ(failure("null", strSql), takeLog());
        EXPECT_EQ("[7]" == std::string(szArray) ? R"([7,{"id":1}])" : R"([{"id":1}])",
                  text(jArray));
    }
}

TEST_F(ListDouble, ANullArrayStaysNullWhenTheFirstRowIsBad)
{
    Json::Value jArray;
    jRequest_["id"] = 2;
    EXPECT_EQ(-1, table_.api.recList(jRequest_, jArray));
    EXPECT_EQ(failure(R"({"id":2})", "SELECT id,real FROM " + table_.strName + "  WHERE  (id=2 );"),
              takeLog());
    EXPECT_TRUE(jArray.isNull());
}

TEST_F(ListFailure, OfALockIsRetriedAndRowsReadBeforeItComeAgain)
{
    bool blFirst = true;
    doubles::state().exec = [&](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                                void* arg, char** errText) {
        const int iStatus = doubles::realExec(pDb, szSql, callback, arg, errText);
        if (!blFirst) return iStatus;
        blFirst = false;
        *errText = doubles::errorText("database is locked");
        return SQLITE_BUSY;
    };
    EXPECT_EQ(0, list(R"({"id":2})"));
    EXPECT_EQ(3U, jArray_.size());
    EXPECT_EQ(jArray_[1], jArray_[2]);
    EXPECT_EQ(2U, takeStatements().size());
    EXPECT_EQ(std::vector<unsigned>{10000}, doubles::state().sleeps);
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(ListFailure, OfAHandleWithoutConnection)
{
    VornJsonDbApi api(nullptr, table_.strName, table_.jDefinition, table_.strCreate);
    takeLog();
    EXPECT_EQ(-1, api.recList(jRequest_, jArray_));
    EXPECT_EQ((Lines{runFailed("Unknow Error!!", select(";")), kNotRun, plain("jRecParam=null"),
                     sqlError("Unknow Error!!", select(";"))}),
              takeLog());
    EXPECT_EQ("[7]", text(jArray_));
}

class ListLocked : public RecordsInFileTest {};

TEST_F(ListLocked, GivesUpAfterEveryAttemptAndWorksAgainLater)
{
    Json::Value jRequest;
    Json::Value jArray;
    EXPECT_EQ(-1, table_.api.recList(jRequest, jArray));
    EXPECT_EQ((Lines{runFailed("database is locked", select(";"), 500), kNotRun,
                     plain("jRecParam=null"), sqlError("database is locked", select(";"))}),
              takeLog());
    expectEveryAttempt(select(";"));
    EXPECT_TRUE(jArray.isNull());
    other("commit");
    EXPECT_EQ(0, table_.api.recList(jRequest, jArray));
    EXPECT_EQ(3U, jArray.size());
}

}  // namespace
