// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every hostile text, and every text in an attack on the example of a guarded host, as a value, a
// name, an operator, an option, a sort key and a page key: it is refused or harmless. A victim
// table shows whether anything else was written.
#include "front/front.h"
#include "hostile/hostile_roles.h"

#include "examples/guarded/test/attacks.h"

namespace {

constexpr char kMembers[] = R"({
    "id":   {"cpptype": "long long"},
    "json": {"cpptype": "Json::Value"},
    "text": {"cpptype": "string"}})";
constexpr char kColumns[] = "id integer primary key, json text, text text";

// The names that the table knows are not hostile, and the longest text would only take time.
std::vector<std::string> texts()
{
    std::set<std::string> all = attackTexts();
    for (const char* szKnown : {"id", "limit", "offset", "sort"}) EXPECT_EQ(1U, all.erase(szKnown));
    std::vector<std::string> texts = hostileStrings();
    std::copy_if(all.begin(), all.end(), std::back_inserter(texts),
                 [](const std::string& strText) { return 1000000 > strText.size(); });
    return texts;
}

class FrontHostile : public FrontTest {
protected:
    FrontHostile()
    {
        database_.run("pragma journal_mode=memory");
        database_.run("create table victim (a); insert into victim values ('sound')");
        EXPECT_EQ("2", front_.createMany(json(R"([{"id":1,"text":"a"},{"id":2,"text":"b"}])")));
        front_.run("create table @_before as select * from @");
    }

    // The number of records found, or -1 for a refusal by the table itself.
    int found(const Json::Value& jCondition, const Json::Value& jOptions = {})
    {
        doubles::reset();
        const std::string strOutcome = front_.list(jCondition, jOptions);
        if (0 == strOutcome.find("refused: ")) {
            // SQLite has seen nothing of it, nor has the log.
            EXPECT_EQ(std::vector<std::string>(), takeStatements());
            EXPECT_TRUE(doubles::state().log.empty());
            return -1;
        }
        for (const std::string& strSql : takeStatements())
            EXPECT_TRUE("begin" == strSql || "commit" == strSql ||
                        0U == strSql.find("select 1 from ") || 0U == strSql.find("SELECT id,json,"))
                << strSql;
        return static_cast<int>(front_.jStored.size());
    }

    void expectSound()
    {
        EXPECT_EQ((Rows{{"sound"}}), database_.rows("select * from victim"));
        EXPECT_EQ(Rows(), front_.rows("select * from @ except select * from @_before"));
        EXPECT_EQ((Rows{{"2"}}), front_.rows("select count(*) from @"));
        Figures::of("front, hostile roles")++;
    }

    const std::vector<std::string> texts_ = texts();
    Front front_{database_, kMembers, kColumns};
};

TEST_F(FrontHostile, FindTextsAsValues)
{
    for (const std::string& strText : texts_) {
        SCOPED_TRACE(testing::PrintToString(strText.substr(0, 100)));
        for (const char* szOperator : {"$eq", "$gt", "$lte", "$like", "$in", "$ne"})
            for (const char* szMember : {"text", "json"}) {
                Json::Value jCondition;
                Json::Value& jTerm = jCondition[szMember][szOperator];
                if (std::string("$in") == szOperator)
                    jTerm[0] = strText;
                else
                    jTerm = strText;
                const int nFound = found(jCondition);
                if (std::string("$eq") == szOperator || std::string("$in") == szOperator) {
                    EXPECT_GE(0, nFound);
                }
                expectSound();
            }
    }
}

TEST_F(FrontHostile, RefuseTextsAsNames)
{
    for (const std::string& strText : texts_) {
        SCOPED_TRACE(testing::PrintToString(strText.substr(0, 100)));
        Json::Value jName;
        jName[strText] = 1;
        Json::Value jOperator;
        jOperator["text"][strText] = "a";
        Json::Value jGroup;
        jGroup["$or"][0][strText] = "a";
        EXPECT_EQ(-1, found(jName));
        EXPECT_EQ(-1, found(jOperator));
        EXPECT_EQ(-1, found(jGroup));
        EXPECT_EQ(-1, found({}, jName));
        for (const char* szBefore : {"", "-"}) {
            Json::Value jSort;
            jSort["sort"][0] = szBefore + strText;
            EXPECT_EQ(-1, found({}, jSort));
        }
        for (const char* szOption : {"limit", "offset", "after", "sort"}) {
            Json::Value jOption;
            jOption[szOption] = strText;
            EXPECT_EQ(-1, found({}, jOption));
        }
        EXPECT_EQ(0U, front_.create(jName).find("refused: "));
        EXPECT_EQ(0U, front_.save(jName).find("refused: "));
        EXPECT_EQ(0U, front_.update(json(R"({"id":1})"), jName).find("refused: "));
        EXPECT_EQ(0U, front_.remove(jName).find("refused: "));
        expectSound();
    }
}

TEST_F(FrontHostile, PageAfterTexts)
{
    for (const std::string& strText : texts_) {
        SCOPED_TRACE(testing::PrintToString(strText.substr(0, 100)));
        Json::Value jOptions = json(R"({"sort":["text"],"after":{"id":7}})");
        jOptions["after"]["text"] = strText;
        EXPECT_GE(2, found({}, jOptions));
        jOptions["after"]["id"] = strText;
        EXPECT_EQ(-1, found({}, jOptions));
        expectSound();
    }
}

}  // namespace
