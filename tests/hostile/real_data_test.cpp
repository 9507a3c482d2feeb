// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The languages and subdivisions of Debian's package iso-codes through every operation, each
// record compared whole with its entry in the source file. Members that an entry lacks are absent
// in the record too: no defaults are declared, and the columns are then NULL.

#include "support/database.h"

#include <fstream>
#include <iterator>
#include <map>

namespace {

struct Source {
    const char* szFile;
    const char* szList;  // the key of the array in the file
    std::size_t nAtLeast;
    const char* szKey;                    // the member that is the primary key
    const char* szOptional;               // one that many entries lack
    std::vector<std::string> conditions;  // members that are searched by every value they have
};

const Source kSources[] = {
    {"iso_639-3.json", "639-3", 7000, "alpha_3", "common_name", {"bibliographic", "scope", "type"}},
    {"iso_3166-2.json", "3166-2", 5000, "code", "parent", {"parent", "type"}},
};

// By their primary keys.
using Records = std::map<std::string, Json::Value>;

Json::Value object(const std::string& strMember, const Json::Value& jValue)
{
    Json::Value jObject;
    jObject[strMember] = jValue;
    return jObject;
}

// Entry by entry: the message for a whole map would be endless.
void expectSame(const Records& expected, const Records& actual)
{
    EXPECT_EQ(expected.size(), actual.size());
    for (const auto& [strKey, jRecord] : expected) {
        const auto found = actual.find(strKey);
        ASSERT_NE(actual.end(), found) << strKey << " is missing";
        ASSERT_EQ(jRecord, found->second);
    }
}

class RealData : public TableTest, public testing::WithParamInterface<std::size_t> {
protected:
    // Fails if the package is missing: nothing is skipped silently.
    void SetUp() override
    {
        const std::string strPath = std::string("/usr/share/iso-codes/json/") + source_.szFile;
        std::ifstream file(strPath);
        ASSERT_TRUE(file.is_open()) << strPath << " is missing: install the package iso-codes";
        const std::string strText{std::istreambuf_iterator<char>(file), {}};
        const Json::Value jList = json(strText)[source_.szList];
        Json::Value jMembers;
        for (const Json::Value& jEntry : jList) {
            entries_[jEntry[source_.szKey].asString()] = jEntry;
            for (const std::string& strMember : jEntry.getMemberNames())
                jMembers[strMember]["cpptype"] = "string";
        }
        ASSERT_EQ(jList.size(), entries_.size()) << "a key comes twice";
        ASSERT_LE(source_.nAtLeast, entries_.size()) << strPath << " is not complete";

        std::string strColumns = std::string("primary key (") + source_.szKey + ")";
        for (const std::string& strMember : jMembers.getMemberNames())
            strColumns.insert(0, strMember + " text,");
        pTable_ = std::make_unique<Table>(database_, text(jMembers), strColumns);
        // Without these, reading the whole table would take most of the time.
        for (const std::string& strMember : source_.conditions)
            database_.run("create index by_" + strMember + " on " + pTable_->strName + " (" +
                          strMember + ")");
    }

    VornJsonDbApi& api() { return pTable_->api; }

    Records list(const Json::Value& jConditions = Json::nullValue)
    {
        Json::Value jRequest = jConditions;
        Json::Value jArray(Json::arrayValue);
        EXPECT_EQ(0, api().recList(jRequest, jArray)) << text(jRequest);
        Records records;
        for (Json::Value& jRecord : jArray)
            records[jRecord[source_.szKey].asString()].swap(jRecord);
        EXPECT_EQ(jArray.size(), records.size()) << "a record came twice";
        return records;
    }

    // Each condition on all of the members that finds anything, with what it finds.
    std::map<Json::Value, Records> conditions(const std::vector<std::string>& members) const
    {
        std::map<Json::Value, Records> found;
        for (const auto& [strKey, jEntry] : entries_) {
            Json::Value jCondition;
            for (const std::string& strMember : members)
                if (jEntry.isMember(strMember)) jCondition[strMember] = jEntry[strMember];
            if (members.size() == jCondition.size()) found[jCondition][strKey] = jEntry;
        }
        return found;
    }

    void expectListed(const std::vector<std::string>& members)
    {
        std::size_t nFound = 0;
        const auto all = conditions(members);
        EXPECT_LT(1U, all.size());
        for (const auto& [jCondition, expected] : all) {
            expectSame(expected, list(jCondition));
            nFound += expected.size();
            Json::Value jLists;
            for (const std::string& strMember : members)
                jLists[strMember].append(jCondition[strMember]);
            expectSame(expected, list(jLists));
        }
        const Json::Value jWithout =
            object("vornSqlWhereFilter", members[0] + " is null or " + members.back() + " is null");
        EXPECT_EQ(entries_.size(), nFound + list(jWithout).size()) << members[0];
    }

    const Source& source_ = kSources[GetParam()];
    std::unique_ptr<Table> pTable_;
    Records entries_;
};

// One operation after the other, on the same table.
TEST_P(RealData, GoesThroughEveryOperation)
{
    ASSERT_LE(0, api().runSqlEx("begin"));
    for (const auto& [strKey, jEntry] : entries_) {
        Json::Value jRecord = jEntry;
        Json::Value jStored;
        ASSERT_EQ(0, api().recCreate(jRecord, jStored)) << text(jEntry);
        ASSERT_EQ(jEntry, jStored);
    }
    ASSERT_LE(0, api().runSqlEx("commit"));
    EXPECT_EQ(Lines(), takeLog());

    expectSame(entries_, list());
    const std::vector<std::string>& members = source_.conditions;
    for (const std::string& strMember : members) expectListed({strMember});
    expectListed({members[members.size() - 2], members.back()});

    Json::Value jNone = object(source_.szKey, "no such key");
    Json::Value jRecord;
    EXPECT_EQ(0, api().recGetOne(jNone, jRecord));
    EXPECT_EQ(Lines(), takeLog());

    ASSERT_LE(0, api().runSqlEx("begin"));
    for (auto& [strKey, jEntry] : entries_) {
        Json::Value jRequest = object(source_.szKey, strKey);
        ASSERT_EQ(1, api().recGetOne(jRequest, jRecord = Json::Value())) << strKey;
        ASSERT_EQ(jEntry, jRecord);
        const std::string strName = jEntry["name"].asString();
        Json::Value jValues = object("name", "'" + strName + "' of " + strKey);
        jValues[source_.szOptional] = "was " + strName;
        ASSERT_EQ(0, api().recUpdateByFilter(jRequest, jValues)) << strKey;
        for (const char* szMember : {"name", source_.szOptional})
            jEntry[szMember] = jValues[szMember];
    }
    ASSERT_LE(0, api().runSqlEx("commit"));
    expectSame(entries_, list());

    std::size_t nLeft = entries_.size();
    for (const auto& [jCondition, gone] : conditions({members.back()})) {
        Json::Value jRequest = jCondition;
        ASSERT_EQ(static_cast<int>(gone.size()), api().recDelete(jRequest)) << text(jCondition);
        nLeft -= gone.size();
        EXPECT_EQ(std::to_string(nLeft),
                  database_.value("select count(*) from " + pTable_->strName));
        EXPECT_TRUE(list(jCondition).empty()) << text(jCondition);
    }
    EXPECT_EQ(0U, nLeft);
    EXPECT_EQ(0, api().recDeleteAll());
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("ok", database_.value("pragma integrity_check"));
}

INSTANTIATE_TEST_SUITE_P(IsoCodes, RealData, testing::Values(0U, 1U), [](const auto& source) {
    return 0 == source.param ? "Languages" : "Subdivisions";
});

}  // namespace
