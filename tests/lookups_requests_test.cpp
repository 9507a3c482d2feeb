// SPDX-License-Identifier: MIT
// The look-ups of member types behind listing, fetching, updating and deleting, where the
// definition lacks the table: every look-up happens and logs, and what a listing inserts shows
// afterwards.

#include "support/records.h"

namespace {

class RequestLookUps : public TableTest {
protected:
    RequestLookUps() { database_.run("insert into " + strName_ + " values ('x'),('y')"); }

    // The log, without the types of other tables.
    static Lines takeLines()
    {
        const std::string strDump = utilPlain("jType=");
        Lines lines = takeLog();
        for (std::string& strLine : lines)
            if (0 == strLine.compare(0, strDump.size(), strDump)) strLine = strDump;
        return lines;
    }

    // A failed look-up, the first one of the table or a later one.
    Lines lookUp(bool blFirst) const
    {
        return {utilFailed(blFirst ? "!jTableDef.isMember(strJsonName)"
                                   : "jType[strJsonName].type() != Json::objectValue"),
                utilPlain("strJsonName=" + strName_), utilPlain("jTableDef=" + text(jExpected_)),
                utilPlain("jType=")};
    }

    static Lines join(std::initializer_list<Lines> parts)
    {
        Lines lines;
        for (const Lines& part : parts) lines.insert(lines.end(), part.begin(), part.end());
        return lines;
    }

    std::string count() { return database_.value("select count(*) from " + strName_); }

    std::string strName_ = freshName();
    Json::Value jDefinition_ = json(R"({"other":{"member":{"a":{"cpptype":"string"}}}})");
    // The handle's own copy as it should be.
    Json::Value jExpected_ = jDefinition_;
    std::string strCreate_ = "create table if not exists " + strName_ + " (a text)";
    VornJsonDbApi api_{database_.get(), strName_, jDefinition_, strCreate_};
    Json::Value jRequest_ = json(R"({"a":"x"})");
    Json::Value jFilter_ = json(R"({"vornSqlWhereFilter":"1"})");
};

TEST_F(RequestLookUps, OfAListing)
{
    const std::string strSql = "SELECT  FROM " + strName_ + " ;";
    const std::string strError = "near \"FROM\": syntax error";
    const Lines refused = {runFailed(strError, strSql),
                           failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
                           plain(R"(jRecParam={"a":"x"})"), sqlError(strError, strSql)};
    Json::Value jArray;
    EXPECT_EQ(-1, api_.recList(jRequest_, jArray));
    EXPECT_EQ(join({lookUp(true), refused}), takeLines());
    // The column list has put the table there.
    jExpected_[strName_]["member"] = Json::nullValue;
    EXPECT_EQ(-1, api_.recList(jRequest_, jArray));
    EXPECT_EQ(join({lookUp(false), refused}), takeLines());
    Json::Value jOut = "mine";
    EXPECT_EQ(-1, api_.recGetOne(jRequest_, jOut));
    EXPECT_EQ(join({lookUp(false), refused, {failed("0 > recList(jRecParam, jRecArray)")}}),
              takeLines());
    EXPECT_TRUE(jArray.isNull());
    EXPECT_EQ("mine", jOut.asString());
}

TEST_F(RequestLookUps, OfAnUpdate)
{
    const std::string strSql = "UPDATE " + strName_ + " SET  WHERE  ( 1  );";
    const Lines refused = {runFailed(kNearWhere, strSql),
                           failed("0 > runSqlEx(strSql, NULL, NULL)"), plain(R"(jRecIn={"a":"x"})"),
                           sqlError(kNearWhere, strSql)};
    // The filter, the type check and the SET list each look.
    EXPECT_EQ(-1, api_.recUpdateByFilter(jFilter_, jRequest_));
    EXPECT_EQ(join({lookUp(true),
                    lookUp(false),
                    lookUp(false),
                    refused,
                    {failed("0 > recUpdateByWhere(jParamIn, strSql)"),
                     plain(R"(recUpdateByFilter failed, jParamIn={"a":"x"})")}}),
              takeLines());
    std::string strWhere = " ( 1  )";
    EXPECT_EQ(-1, api_.recUpdateByWhere(jRequest_, strWhere));
    EXPECT_EQ(join({lookUp(false), refused}), takeLines());
    EXPECT_EQ(-1, api_.recUpdateByFilter(jRequest_, jRequest_));
    EXPECT_EQ(join({lookUp(false),
                    {failed("strSql.empty()"),
                     plain(R"(recUpdateByFilter failed, jParamIn={"a":"x"})")}}),
              takeLines());
}

TEST_F(RequestLookUps, OfADelete)
{
    EXPECT_EQ(-1, api_.recDelete(jRequest_));
    EXPECT_EQ(join({lookUp(true), {failed("strSql.empty()")}}), takeLines());
    EXPECT_EQ("2", count());
    // The raw filter and the delete of everything need no types.
    jFilter_ = json(R"({"vornSqlWhereFilter":"a = 'x'"})");
    EXPECT_EQ(1, api_.recDelete(jFilter_));
    EXPECT_EQ(lookUp(false), takeLines());
    EXPECT_EQ(1, api_.recDeleteAll());
    EXPECT_EQ(lookUp(false), takeLines());
    EXPECT_EQ("0", count());
    EXPECT_EQ((Lines{"DELETE FROM " + strName_ + "  WHERE  ( a = 'x'  );",
                     "DELETE FROM " + strName_ + " ;"}),
              [&] {
                  Lines all = takeStatements();
                  return Lines(all.end() - 2, all.end());
              }());
    // A request of another kind is refused before anybody looks.
    jRequest_ = json("[1]");
    EXPECT_EQ(-1, api_.recDelete(jRequest_));
    EXPECT_EQ(Lines{failed("jRecParam.type() != Json::objectValue")}, takeLines());
}

}  // namespace
