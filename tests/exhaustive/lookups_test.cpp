// SPDX-License-Identifier: MIT
// The look-ups of member types behind recSave and recCreate, on definitions that have none or not
// all: every look-up happens and logs, line by line.

#include "support/lookups.h"

namespace {

class LookUps : public LookUpsTest {
protected:
    // What a save logs after its look-ups when its lists are empty.
    static Lines emptyLists(const std::string& strVerb, const std::string& strRecord)
    {
        const std::string strSql =
            strVerb + " INTO $ () VALUES (;select * from $ where rowid == last_insert_rowid();";
        const std::string strError = "near \")\": syntax error";
        return {plain("i=0,errno=?, run sql failed, error=" + strError + ", sql=" + strSql),
                failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
                plain(std::string("blCreate=") + ("INSERT" == strVerb ? "1" : "0") +
                      ", jRecInOut=" + strRecord),
                plain("jType=null"), plain("sql error, err=" + strError + ", sql=" + strSql)};
    }

    static Lines createFailed(const std::string& strRecord)
    {
        return {failed("0 > recSave(jParam, true)"), plain("call create rec, rec=" + strRecord)};
    }

    int save(VornJsonDbApi& api, bool blCreate, const char* szRecord)
    {
        Json::Value jRecord = json(szRecord);
        const int iResult = api.recSave(jRecord, blCreate);
        EXPECT_EQ(json(szRecord), jRecord);
        return iResult;
    }

    int create(VornJsonDbApi& api, const char* szRecord)
    {
        Json::Value jRecord = json(szRecord);
        Json::Value jStored = "untouched";
        const int iResult = api.recCreate(jRecord, jStored);
        EXPECT_EQ(Json::Value("untouched"), jStored);
        return iResult;
    }

    std::string strCreate_ = "create table if not exists " + strName_ + " (a, b)";
};

TEST_F(LookUps, OfASaveWithABadDefinition)
{
    for (const BadDefinition& bad : kBadDefinitions) {
        SCOPED_TRACE(bad.szName);
        strName_ = freshName();
        strCreate_ = "create table " + strName_ + " (a, b)";
        Json::Value jDefinition = json(named(bad.szDefinition));
        VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate_);
        takeLog();

        // recSave's own look-up, then the value list's, which finds what the first has left.
        EXPECT_EQ(-1, save(api, true, R"({"a":1})"));
        EXPECT_EQ(
            named(lookUp(bad.szCondition, bad.szDefinition, "-") +
                  lookUp(kPoisoned, bad.szLater, "null") + emptyLists("INSERT", R"({"a":1})")),
            takeOwnLog());
        EXPECT_EQ(-1, save(api, false, R"({"a":1})"));
        EXPECT_EQ(
            named(lookUp(kPoisoned, bad.szLater, "null") + lookUp(kPoisoned, bad.szLater, "null") +
                  emptyLists("REPLACE", R"({"a":1})")),
            takeOwnLog());
    }
}

TEST_F(LookUps, OfACreateWithABadDefinition)
{
    for (const BadDefinition& bad : kBadDefinitions) {
        SCOPED_TRACE(bad.szName);
        strName_ = freshName();
        strCreate_ = "create table " + strName_ + " (a, b)";
        Json::Value jDefinition = json(named(bad.szDefinition));
        VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate_);
        takeLog();

        // Defaults, type check, recSave and the value list look up once each.
        EXPECT_EQ(-1, create(api, R"({"a":1})"));
        EXPECT_EQ(named(lookUp(bad.szCondition, bad.szDefinition, "-") +
                        lookUp(kPoisoned, bad.szDefinition, "null") +
                        lookUp(kPoisoned, bad.szDefinition, "null") +
                        lookUp(kPoisoned, bad.szLater, "null") +
                        emptyLists("INSERT", R"({"a":1})") + createFailed(R"({"a":1})")),
                  takeOwnLog());
        EXPECT_EQ(-1, create(api, R"({"a":1})"));
        const Lines again = lookUp(kPoisoned, bad.szLater, "null");
        EXPECT_EQ(named(again + again + again + again + emptyLists("INSERT", R"({"a":1})") +
                        createFailed(R"({"a":1})")),
                  takeOwnLog());
        // No look-up is reached by an empty record, two by one that is no object.
        EXPECT_EQ(-1, create(api, "{}"));
        EXPECT_EQ((Lines{failed("jRecIn.empty()"), plain("call create rec, rec={}")}), takeLog());
        EXPECT_EQ(-1, create(api, "[1]"));
        EXPECT_EQ(named(again + again +
                        Lines{failed("!jRecParam.isObject()"), failed("0 > checkJsonType(jParam)"),
                              plain("call create rec, rec=[1]")}),
                  takeOwnLog());
    }
}

TEST_F(LookUps, OfASaveWithoutAnyWord)
{
    const char szDefinition[] = R"({"$":{"member":{"a":{},"b":{"cpptype":"int"}}}})";
    Json::Value jDefinition = json(named(szDefinition));
    VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate_);
    const Lines failure = {failed("!jType.isMember(strKey)"),
                           failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
                           plain(R"(blCreate=1, jRecInOut={"a":1,"b":2})"), plain("jType=null")};
    EXPECT_EQ(-1, save(api, true, R"({"a":1,"b":2})"));
    EXPECT_EQ(named(lookUp(kNoWord, szDefinition, "-") + lookUp(kPoisoned, szDefinition, "null") +
                    failure),
              takeOwnLog());
    EXPECT_EQ(-1, create(api, R"({"a":1,"b":2})"));
    const Lines again = lookUp(kPoisoned, szDefinition, "null");
    EXPECT_EQ(named(again + again + again + again + failure + createFailed(R"({"a":1,"b":2})")),
              takeOwnLog());
}

TEST_F(LookUps, OfARecordWithPartialTypes)
{
    const struct {
        const char* szMember;
        const char* szCondition;
    } cases[] = {
        {"{}", kNoWord},
        {"\"int\"", kNoWord},
        {"null", kNoWord},
        {R"({"cpptype":5})", kWordIsNoText},
    };
    const std::string strEntry = R"({"a":{"cppDefaultValue":7,"cpptype":"int"}})";
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szMember);
        strName_ = freshName();
        strCreate_ = "create table " + strName_ + " (a, b, c)";
        const std::string strDefinition =
            std::string(R"({"$":{"member":{"a":{"cppDefaultValue":7,"cpptype":"int"},"b":)") +
            c.szMember + R"(,"c":{"cpptype":"int"}}}})";
        Json::Value jDefinition = json(named(strDefinition));
        VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate_);

        const Lines first = lookUp(c.szCondition, strDefinition, strEntry);
        const auto failure = [&](const std::string& strRecord) {
            return Lines{failed("!jType.isMember(strKey)"),
                         failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
                         plain("blCreate=1, jRecInOut=" + strRecord), plain("jType=" + strEntry)};
        };
        // The first look-up fails half-way and is the only one that says so.
        EXPECT_EQ(-1, create(api, R"({"b":1,"c":2})"));
        EXPECT_EQ(named(first + failure(R"({"a":7,"b":1,"c":2})") +
                        createFailed(R"({"a":7,"b":1,"c":2})")),
                  takeOwnLog());
        EXPECT_EQ(-1, create(api, R"({"x":1})"));
        EXPECT_EQ(named(failure(R"({"a":7,"x":1})") + createFailed(R"({"a":7,"x":1})")),
                  takeOwnLog());
        EXPECT_EQ(-1, save(api, true, R"({"a":1})"));
        EXPECT_EQ(named(failure(R"({"a":1})")), takeOwnLog());
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(LookUps, HealWhereTheHostMendsTheEntry)
{
    Json::Value jDefinition = json(named(R"({"$":{"member":{"a":{"cpptype":"int"}}}})"));
    VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate_);
    Json::Value jNone;
    Json::Value& jEntry = VORN_JSON_DB::recType(jNone, strName_);
    EXPECT_TRUE(jEntry.isNull());
    EXPECT_EQ(named(lookUp("jTableDef.empty()", "null", "-")), takeOwnLog());
    jEntry = json(R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})");
    Json::Value jRecord = json(R"({"a":1})");
    EXPECT_EQ(0, api.recSave(jRecord, true));
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
