// SPDX-License-Identifier: MIT
// The languages and subdivisions of Debian's package iso-codes through every operation, each
// record compared whole with its entry in the source file. Members that an entry lacks are absent
// in the record too: no defaults are declared, and the columns are then NULL.

#include "support/matrix.h"

#include <fstream>
#include <iterator>
#include <map>
#include <set>

namespace {

struct Source {
    const char* szFile;
    const char* szList;  // the key of the array in the file
    std::size_t nAtLeast;
    const char* szKey;       // the member that is the primary key
    const char* szOptional;  // one that many entries lack
    const char* szMembers;
    std::vector<std::string> conditions;  // members that are searched by every value they have
};

const Source kSources[] = {
    {"iso_639-3.json",
     "639-3",
     7000,
     "alpha_3",
     "common_name",
     "alpha_2 alpha_3 bibliographic common_name inverted_name name scope type",
     {"bibliographic", "scope", "type"}},
    {"iso_3166-2.json",
     "3166-2",
     5000,
     "code",
     "parent",
     "code name parent type",
     {"parent", "type"}},
};

// By their primary keys.
using Records = std::map<std::string, Json::Value>;

Json::Value object(const std::string& strMember, const Json::Value& jValue)
{
    Json::Value jObject;
    jObject[strMember] = jValue;
    return jObject;
}

// Entry by entry: the message of a whole map would be without end.
void expectSame(const Records& expected, const Records& actual)
{
    EXPECT_EQ(expected.size(), actual.size());
    for (const auto& [strKey, jRecord] : expected) {
        const auto found = actual.find(strKey);
        ASSERT_NE(actual.end(), found) << strKey << " is missing";
        ASSERT_EQ(jRecord, found->second);
    }
}

class RealData : public HostTest, public testing::WithParamInterface<std::size_t> {
public:
    // Fails where the package is missing: nothing is left out quietly.
    void SetUp() override
    {
        const std::string strPath = std::string("/usr/share/iso-codes/json/") + source_.szFile;
        std::ifstream file(strPath);
        ASSERT_TRUE(file.is_open()) << strPath << " is missing: install the package iso-codes";
        const std::string strText{std::istreambuf_iterator<char>(file), {}};
        const Json::Value jList = json(strText)[source_.szList];
        for (const Json::Value& jEntry : jList) entries_[jEntry[source_.szKey].asString()] = jEntry;
        ASSERT_EQ(jList.size(), entries_.size()) << "a key comes twice";
        ASSERT_LE(source_.nAtLeast, entries_.size()) << strPath << " is not complete";
        RecordProperty("records", static_cast<int>(entries_.size()));

        Json::Value jMembers;
        std::string strColumns = std::string("primary key (") + source_.szKey + ")";
        for (const std::string& strMember : split(source_.szMembers, ' ')) {
            jMembers[strMember]["cpptype"] = "string";
            strColumns.insert(0, strMember + " text,");
        }
        pTable_ = std::make_unique<Table>(database_, text(jMembers), strColumns);
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

    // The entries that have the members, by the values of these.
    std::map<std::vector<std::string>, Records> groups(
        const std::vector<std::string>& members) const
    {
        std::map<std::vector<std::string>, Records> groups;
        for (const auto& [strKey, jEntry] : entries_) {
            std::vector<std::string> values;
            for (const std::string& strMember : members)
                if (jEntry.isMember(strMember)) values.push_back(jEntry[strMember].asString());
            if (members.size() == values.size()) groups[values][strKey] = jEntry;
        }
        return groups;
    }

    void create()
    {
        for (const auto& [strKey, jEntry] : entries_) {
            Json::Value jRecord = jEntry;
            Json::Value jStored;
            ASSERT_EQ(0, api().recCreate(jRecord, jStored)) << text(jEntry);
            ASSERT_EQ(jEntry, jStored);
        }
    }

    void listWholeAndInPages()
    {
        expectSame(entries_, list());
        Records records;
        Json::Value jRequest = object("limit", 1000);
        for (int iOffset = 0; iOffset < static_cast<int>(entries_.size()); iOffset += 1000) {
            jRequest["offset"] = iOffset;
            records.merge(list(jRequest));
        }
        expectSame(entries_, records);
    }

    void listByEveryValueOfOneCondition()
    {
        for (const std::string& strMember : source_.conditions) {
            std::size_t nFound = 0;
            for (const auto& [values, expected] : groups({strMember})) {
                const Records records = list(object(strMember, values[0]));
                expectSame(expected, records);
                nFound += records.size();
                // The same as a list of one item.
                Json::Value jList;
                jList.append(values[0]);
                EXPECT_EQ(records, list(object(strMember, jList))) << values[0];
            }
            EXPECT_LT(0U, nFound) << strMember;
            const Json::Value jWithout = object("vornSqlWhereFilter", strMember + " is null");
            EXPECT_EQ(entries_.size(), nFound + list(jWithout).size()) << strMember;
        }
    }

    void listByEveryPairOfConditions()
    {
        const std::vector<std::string> members(source_.conditions.end() - 2,
                                               source_.conditions.end());
        const auto pairs = groups(members);
        ASSERT_LT(1U, pairs.size());
        for (const auto& [values, expected] : pairs) {
            Json::Value jCondition = object(members[0], values[0]);
            jCondition[members[1]] = values[1];
            expectSame(expected, list(jCondition));
        }
    }

    void fetch()
    {
        Json::Value jRecord;
        for (const auto& [strKey, jEntry] : entries_) {
            Json::Value jRequest = object(source_.szKey, strKey);
            ASSERT_EQ(1, api().recGetOne(jRequest, jRecord = Json::Value())) << strKey;
            ASSERT_EQ(jEntry, jRecord);
        }
        Json::Value jRequest = object(source_.szKey, "no such key");
        EXPECT_EQ(0, api().recGetOne(jRequest, jRecord));
    }

    void updateByKey()
    {
        for (auto& [strKey, jEntry] : entries_) {
            const std::string strName = jEntry["name"].asString();
            Json::Value jFilter = object(source_.szKey, strKey);
            Json::Value jValues = object("name", "'" + strName + "' of " + strKey);
            jValues[source_.szOptional] = "was " + strName;
            ASSERT_EQ(0, api().recUpdateByFilter(jFilter, jValues)) << strKey;
            for (const std::string& strMember : jValues.getMemberNames())
                jEntry[strMember] = jValues[strMember];
        }
        expectSame(entries_, list());
    }

    void updateByCondition()
    {
        const std::string& strMember = source_.conditions.back();
        for (const auto& [values, changed] : groups({strMember})) {
            Json::Value jFilter = object(strMember, values[0]);
            Json::Value jValues = object(source_.szOptional, "all of " + values[0]);
            ASSERT_EQ(0, api().recUpdateByFilter(jFilter, jValues)) << values[0];
            for (const auto& [strKey, jEntry] : changed)
                entries_[strKey][source_.szOptional] = jValues[source_.szOptional];
        }
        expectSame(entries_, list());
    }

    void deleteEverySecondByName()
    {
        bool blDelete = false;
        for (auto entry = entries_.begin(); entries_.end() != entry;) {
            std::string strKey = entry->first;
            blDelete = !blDelete;
            if (blDelete) {
                ASSERT_EQ(1, api().recDeleteByName(strKey, source_.szKey)) << strKey;
            }
            entry = blDelete ? entries_.erase(entry) : std::next(entry);
        }
        expectSame(entries_, list());
    }

    void deleteTheRestByCondition()
    {
        const std::string& strMember = source_.conditions.back();
        std::size_t nLeft = entries_.size();
        for (const auto& [values, gone] : groups({strMember})) {
            Json::Value jCondition = object(strMember, values[0]);
            ASSERT_EQ(static_cast<int>(gone.size()), api().recDelete(jCondition)) << values[0];
            nLeft -= gone.size();
            EXPECT_EQ(std::to_string(nLeft),
                      database_.value("select count(*) from " + pTable_->strName));
            EXPECT_TRUE(list(jCondition).empty()) << values[0];
        }
        EXPECT_EQ(0U, nLeft);
        EXPECT_EQ(0, api().recDeleteAll());
    }

    const Source& source_ = kSources[GetParam()];
    Database database_;
    std::unique_ptr<Table> pTable_;
    Records entries_;
};

// One after the other, on the same table.
TEST_P(RealData, GoesThroughEveryOperation)
{
    for (const auto step :
         {&RealData::create, &RealData::listWholeAndInPages,
          &RealData::listByEveryValueOfOneCondition, &RealData::listByEveryPairOfConditions,
          &RealData::fetch, &RealData::updateByKey, &RealData::updateByCondition,
          &RealData::deleteEverySecondByName, &RealData::deleteTheRestByCondition}) {
        ASSERT_LE(0, api().runSqlEx("begin"));
        (this->*step)();
        ASSERT_LE(0, api().runSqlEx("commit"));
        EXPECT_EQ(Lines(), takeLog());
        takeStatements();
        ASSERT_FALSE(HasFailure());
    }
    EXPECT_EQ("ok", database_.value("pragma integrity_check"));
}

INSTANTIATE_TEST_SUITE_P(IsoCodes, RealData, testing::Values(0U, 1U), [](const auto& source) {
    return 0 == source.param ? "Languages" : "Subdivisions";
});

}  // namespace
