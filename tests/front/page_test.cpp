// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/front.md: every row of every table is run on the records of the page.
#include "front/front.h"
#include "support/markdown.h"

#include <regex>

namespace {

class FrontPage : public FrontTest {
protected:
    FrontPage()
    {
        EXPECT_EQ(6U, page_.blocks.size());  // three are included below
        EXPECT_EQ("", table_.reason());
        EXPECT_EQ(static_cast<long long>(jRecords_.size()), table_.createMany(jRecords_));
    }

    // The outcome: the ids of the records in their order, or the reason.
    std::string listed(const std::string& strCondition, const std::string& strOptions)
    {
        takeStatements();
        Json::Value jFound;
        const long long iResult = table_.list(json(strCondition), json(strOptions), jFound);
        if (0 > iResult) return table_.reason();
        std::string strIds;
        for (const Json::Value& jRecord : jFound)
            strIds += (strIds.empty() ? "" : ", ") + jRecord["id"].asString();
        return strIds.empty() ? "none" : strIds;
    }

    // What comes between these words in the list's statement.
    std::string written(const std::string& strBefore, const std::string& strAfter)
    {
        for (const std::string& strSql : takeStatements()) {
            const std::size_t uBegin = strSql.find(strBefore);
            if (std::string::npos == uBegin) continue;
            const std::size_t uAt = uBegin + strBefore.size();
            return strSql.substr(uAt, strSql.find(strAfter, uAt) - uAt);
        }
        return "not run";
    }

    // Whether a condition selects a new record that has nothing but an id.
    std::string selectsAbsent(const std::string& strCondition)
    {
        database_.run("savepoint absent; insert into front_book (id) values (99)");
        Json::Value jBoth;
        jBoth["id"] = 99;
        if (!json(strCondition).empty()) jBoth["$or"][0] = json(strCondition);
        const long long nFound = table_.count(jBoth);
        database_.run("rollback to absent; release absent");
        return 1 == nFound ? "yes" : "no";
    }

    const MarkdownPage page_ = readPage("front.md");
    const Json::Value jRecords_ = json(page_.blocks.at(2).strText);
    VornJsonTable table_{database_.get(), "front_book", json(page_.blocks.at(0).strText),
                         page_.blocks.at(1).strText};
};

TEST_F(FrontPage, ShowsEachOperator)
{
    for (const auto& row : table(page_, "Operators", 31).rows) {
        SCOPED_TRACE(row[1]);
        EXPECT_EQ(row[3], listed(row[1], "null"));
        EXPECT_EQ(row[2], written("WHERE  ( ", " and 1) order by "));
        // A record has always got its key.
        if (std::string::npos == row[1].find("\"id\"")) {
            EXPECT_EQ(row[4], selectsAbsent(row[1]));
        }
    }
}

TEST_F(FrontPage, ShowsWhatIsRefused)
{
    for (const auto& row : table(page_, "What a condition refuses", 26).rows) {
        EXPECT_EQ(row[1], listed(row[0], "null")) << row[0];
        EXPECT_EQ(VornJsonTable::Cause::kRefused, table_.cause());
        EXPECT_EQ(std::vector<std::string>(), takeStatements());
    }
    for (const auto& row : table(page_, "What the options refuse", 14).rows) {
        EXPECT_EQ(row[1], listed("null", row[0])) << row[0];
        EXPECT_EQ(VornJsonTable::Cause::kRefused, table_.cause());
        EXPECT_EQ(std::vector<std::string>(), takeStatements());
    }
}

TEST_F(FrontPage, ShowsEachOrder)
{
    for (const auto& row : table(page_, "Sorting and pages", 17).rows) {
        SCOPED_TRACE(row[0]);
        EXPECT_EQ(row[2], listed("null", row[0]));
        EXPECT_EQ(row[1], written(" order by ", " limit "));
    }
}

TEST_F(FrontPage, SortsUnderTheCollationOfAColumn)
{
    for (const auto& [strColumn, strSorted, nFound] :
         {std::tuple("text", R"([null,"Zebra","apple","bee"])", 1),
          std::tuple("text collate nocase", R"([null,"apple","bee","Zebra"])", 2)}) {
        Front kept(database_, R"({"id":{"cpptype":"int"},"m":{"cpptype":"string"}})",
                   std::string("id int primary key, m ") + strColumn);
        kept.run("insert into @ values (1, 'Zebra'), (2, 'bee'), (3, 'apple'), (4, null)");
        Json::Value jOptions = json(R"({"sort":["m"],"limit":1})");
        Json::Value jNames(Json::arrayValue);
        Json::Value jPage;
        while (1 == kept.table->list({}, jOptions, jPage)) {
            jNames.append(jPage[0]["m"]);
            jOptions["after"] = jPage[0];
        }
        EXPECT_EQ(json(strSorted), jNames);
        EXPECT_EQ(nFound, kept.table->count(json(R"({"m":{"$in":["apple","ZEBRA"]}})")));
    }
}

TEST_F(FrontPage, ShowsATypeWordAndAColumnForEachKind)
{
    for (const auto& row : table(page_, "Which type word and column", 11).rows) {
        SCOPED_TRACE(row[0]);
        Front kept(database_, R"({"id":{"cpptype":"int"},"m":{"cpptype":")" + row[1] + "\"}}",
                   "id int primary key, m " + row[2]);
        Json::Value jRecord;
        jRecord["id"] = 1;
        jRecord["m"] = json(row[3]);
        EXPECT_EQ("0", kept.create(jRecord));
        EXPECT_EQ(jRecord, kept.jStored);
        Json::Value jCondition;
        jCondition["m"]["$gte"] = jRecord["m"];
        EXPECT_EQ("yes" == row[4] ? 1 : -1, kept.table->count(jCondition));
    }
}

TEST_F(FrontPage, FindsWhatBeginsWithATextFromAUser)
{
    std::vector<long long> counts;
    for (const std::string strTyped : {"100% w", "100_", "under_", "Under%", "F", "\\", ""}) {
        Json::Value jCondition;
#include "front/FindsWhatBeginsWithATextFromAUser.inc"
        counts.push_back(table_.count(jCondition));
    }
    EXPECT_EQ((std::vector<long long>{1, 0, 1, 0, 1, 0, 5}), counts);
}

TEST_F(FrontPage, AddsTheConditionOfTheHost)
{
    Front notes(database_, R"({"id":{"cpptype":"int"},"owner":{"cpptype":"string"}})",
                "id int primary key, owner text");
    notes.run("insert into @ values (1, 'ann'), (2, 'bob'), (3, 'ann')");
    const std::string strUser = "ann";
    std::vector<long long> counts;
    for (const char* szAsked : {"{}", "null", R"({"id":{"$lt":3}})", R"({"owner":"bob"})"}) {
        const Json::Value jAsked = json(szAsked);
        Json::Value jCondition;
#include "front/AddsTheConditionOfTheHost.inc"
        counts.push_back(notes.table->count(jCondition));
    }
    EXPECT_EQ((std::vector<long long>{2, 2, 1, 0}), counts);
}

TEST_F(FrontPage, TellsADuplicate)
{
    Front kept(database_, R"({"id":{"cpptype":"int"},"mail":{"cpptype":"string"},
                              "phone":{"cpptype":"string"},"street":{"cpptype":"string"},
                              "number":{"cpptype":"int"}})",
               "id int primary key, mail text not null unique, phone text unique, street text, "
               "number integer, unique (street, number)");
    VornJsonTable& users = *kept.table;
    std::vector<std::string> answers;
    for (const char* szUser :
         {R"({"id":1,"mail":"a","phone":"1","street":"s","number":1})", R"({"id":2,"mail":"a"})",
          R"({"id":1,"mail":"b"})", R"({"id":3,"mail":"c","street":"s","number":1})",
          R"({"id":4,"mail":"d"})", R"({"id":5,"mail":"e"})", R"({"id":6})"}) {
        const Json::Value jUser = json(szUser);
        Json::Value jStored;
        std::string strAnswer;
#include "front/TellsADuplicate.inc"
        answers.push_back(strAnswer);
    }
    EXPECT_EQ((std::vector<std::string>{"", "taken: mail\n", "taken: id\n",
                                        "taken: street\ntaken: number\n", "", "", ""}),
              answers);
    EXPECT_EQ(VornJsonTable::Cause::kInvalid, users.cause());
    EXPECT_EQ("0", kept.save(json(R"({"id":1,"mail":"b"})")));
    EXPECT_EQ("0", kept.save(json(R"({"id":2,"mail":"a"})")));
    EXPECT_EQ(4, users.count({}));
    EXPECT_EQ("duplicate", kept.save(json(R"({"id":9,"mail":"a"})")).substr(0, 9));
    EXPECT_EQ((std::vector<std::string>{"mail"}), users.columns());
}

// What another program wrote.
TEST_F(FrontPage, SaysHowDamagedJsonReads)
{
    database_.run("update front_book set pages=3000000000, tags='[1,', any='oops' where id=1");
    Json::Value jFound;
    EXPECT_EQ(1, table_.get(json(R"({"id":1})"), jFound));
    EXPECT_EQ(2147483647, jFound["pages"].asInt());
    EXPECT_EQ(json("[1,null]"), jFound["tags"]);
    EXPECT_TRUE(jFound.isMember("any") && jFound["any"].isNull());
}

// As many terms and levels as are taken are not too many for SQLite, and one more is refused.
TEST_F(FrontPage, TakesThreeHundredTermsAndTenLevels)
{
    Json::Value jWide;
    for (Json::ArrayIndex u = 0; u < 300; ++u) jWide["$or"][u]["id"] = u;
    EXPECT_EQ(5, table_.count(jWide)) << table_.reason();
    jWide["$or"][300]["id"] = 300;
    EXPECT_EQ(-1, table_.count(jWide));
    EXPECT_EQ("the condition has more than 300 terms", table_.reason());

    Json::Value jDeep;
    jDeep["id"] = 1;
    for (int i = 0; i < 10; ++i) {
        Json::Value jOuter;
        jOuter["$or"][0]["id"]["$ne"] = 7;
        jOuter["$or"][1].swap(jDeep);
        jDeep.swap(jOuter);
    }
    EXPECT_LE(0, table_.count(jDeep)) << table_.reason();
    Json::Value jDeeper;
    jDeeper["$or"][0] = jDeep;
    EXPECT_EQ(-1, table_.count(jDeeper));
    EXPECT_EQ("the condition has lists nested deeper than 10 levels", table_.reason());
}

}  // namespace
