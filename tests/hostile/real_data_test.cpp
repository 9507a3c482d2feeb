// SPDX-License-Identifier: MIT
// The languages and subdivisions of Debian's package iso-codes through every operation, each
// record compared whole with its entry in the source file. Members that an entry lacks are absent
// in the record too: no defaults are declared, and the columns are then NULL.

#include "support/database.h"

#include <fstream>
#include <iterator>
#include <map>
#include <set>
#include <utility>

namespace {

struct Source {
    const char* szFile;
    const char* szList;  // the key of the array in the file
    std::size_t nAtLeast;
    const char* szKey;       // the member that is the primary key
    const char* szOptional;  // one that many entries lack
    std::vector<std::string> members;
    std::vector<std::string> conditions;  // members that are searched by every value they have
};

void PrintTo(const Source& source, std::ostream* pStream)
{
    *pStream << source.szFile;
}

const Source kLanguages = {"iso_639-3.json",
                           "639-3",
                           7000,
                           "alpha_3",
                           "common_name",
                           {"alpha_2", "alpha_3", "bibliographic", "common_name", "inverted_name",
                            "name", "scope", "type"},
                           {"bibliographic", "scope", "type"}};
const Source kSubdivisions = {
    "iso_3166-2.json", "3166-2", 5000, "code", "parent", {"code", "name", "parent", "type"},
    {"parent", "type"}};

// By their primary keys.
using Records = std::map<std::string, Json::Value>;

class RealData : public HostTest, public testing::WithParamInterface<Source> {
protected:
    void SetUp() override
    {
        readSource();
        if (HasFatalFailure()) return;
        Json::Value jMembers;
        std::string strColumns = std::string("primary key (") + key() + ")";
        for (const std::string& strMember : GetParam().members) {
            jMembers[strMember]["cpptype"] = "string";
            strColumns.insert(0, strMember + " text,");
        }
        pTable_ = std::make_unique<Table>(database_, text(jMembers), strColumns);
        createAll();
    }

    // Fails where the package is missing: nothing is left out quietly.
    void readSource()
    {
        const std::string strPath = std::string("/usr/share/iso-codes/json/") + GetParam().szFile;
        std::ifstream file(strPath);
        ASSERT_TRUE(file.is_open()) << strPath << " is missing: install the package iso-codes";
        const std::string strText{std::istreambuf_iterator<char>(file), {}};
        const Json::Value jList = json(strText)[GetParam().szList];
        for (const Json::Value& jEntry : jList) source_[jEntry[key()].asString()] = jEntry;
        ASSERT_EQ(jList.size(), source_.size()) << "a key comes twice";
        ASSERT_LE(GetParam().nAtLeast, source_.size()) << strPath << " is not complete";
        RecordProperty("records", static_cast<int>(source_.size()));
    }

    // Inside one transaction; each row as it is stored has to be the entry.
    void createAll()
    {
        transaction([this] {
            for (const auto& [strKey, jEntry] : source_) {
                Json::Value jRecord = jEntry;
                Json::Value jStored;
                ASSERT_EQ(0, api().recCreate(jRecord, jStored)) << text(jEntry);
                ASSERT_EQ(jEntry, jStored);
            }
        });
    }

    template <typename Work>
    void transaction(Work work)
    {
        ASSERT_LE(0, api().runSqlEx("begin"));
        work();
        ASSERT_LE(0, api().runSqlEx("commit"));
        EXPECT_EQ(Lines(), takeLog());
        takeStatements();
    }

    Records list(const Json::Value& jConditions)
    {
        Json::Value jRequest = jConditions;
        Json::Value jArray(Json::arrayValue);
        EXPECT_EQ(0, api().recList(jRequest, jArray)) << text(jRequest);
        Records records;
        for (const Json::Value& jRecord : jArray) records[jRecord[key()].asString()] = jRecord;
        EXPECT_EQ(jArray.size(), records.size()) << "a record came twice";
        return records;
    }

    // The entries that have each member of jConditions, with that value.
    Records entries(const Json::Value& jConditions) const
    {
        Records records;
        for (const auto& [strKey, jEntry] : source_) {
            bool blAll = true;
            for (const std::string& strMember : jConditions.getMemberNames())
                blAll = blAll && jEntry[strMember] == jConditions[strMember];
            if (blAll) records[strKey] = jEntry;
        }
        return records;
    }

    std::set<std::string> values(const std::string& strMember) const
    {
        std::set<std::string> values;
        for (const auto& [strKey, jEntry] : source_)
            if (jEntry.isMember(strMember)) values.insert(jEntry[strMember].asString());
        return values;
    }

    const char* key() const { return GetParam().szKey; }
    VornJsonDbApi& api() { return pTable_->api; }

    Database database_;
    std::unique_ptr<Table> pTable_;
    Records source_;
};

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

TEST_P(RealData, IsListedWholeAndInPages)
{
    expectSame(source_, list(Json::nullValue));

    Records records;
    Json::Value jRequest;
    jRequest["limit"] = 1000;
    for (int iOffset = 0; iOffset < static_cast<int>(source_.size()); iOffset += 1000) {
        jRequest["offset"] = iOffset;
        records.merge(list(jRequest));
    }
    expectSame(source_, records);
    EXPECT_EQ(Lines(), takeLog());
}

TEST_P(RealData, IsListedByEveryValueOfAConditionAndOfTwo)
{
    for (const std::string& strMember : GetParam().conditions) {
        std::size_t nFound = 0;
        const std::set<std::string> values = this->values(strMember);
        ASSERT_FALSE(values.empty()) << strMember;
        for (const std::string& strValue : values) {
            Json::Value jCondition;
            jCondition[strMember] = strValue;
            const Records records = list(jCondition);
            expectSame(entries(jCondition), records);
            nFound += records.size();
            // The same as a list of one item.
            jCondition[strMember] = Json::Value(Json::arrayValue);
            jCondition[strMember].append(strValue);
            EXPECT_EQ(records, list(jCondition)) << strValue;
        }
        Json::Value jWithout;
        jWithout["vornSqlWhereFilter"] = strMember + " is null";
        EXPECT_EQ(source_.size(), nFound + list(jWithout).size()) << strMember;
    }

    // By two conditions at once.
    const auto& conditions = GetParam().conditions;
    const std::string strFirst = conditions[conditions.size() - 2];
    const std::string strSecond = conditions.back();
    std::set<std::pair<std::string, std::string>> pairs;
    for (const auto& [strKey, jEntry] : source_)
        if (jEntry.isMember(strFirst) && jEntry.isMember(strSecond))
            pairs.emplace(jEntry[strFirst].asString(), jEntry[strSecond].asString());
    ASSERT_LT(1U, pairs.size());
    for (const auto& [strOne, strTwo] : pairs) {
        Json::Value jCondition;
        jCondition[strFirst] = strOne;
        jCondition[strSecond] = strTwo;
        expectSame(entries(jCondition), list(jCondition));
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_P(RealData, IsFetchedByKey)
{
    for (const auto& [strKey, jEntry] : source_) {
        Json::Value jRequest;
        jRequest[key()] = strKey;
        Json::Value jRecord;
        ASSERT_EQ(1, api().recGetOne(jRequest, jRecord)) << strKey;
        ASSERT_EQ(jEntry, jRecord);
    }
    Json::Value jRequest;
    jRequest[key()] = "no such key";
    Json::Value jRecord;
    EXPECT_EQ(0, api().recGetOne(jRequest, jRecord));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_P(RealData, IsUpdatedByKey)
{
    Records expected = source_;
    transaction([&] {
        for (auto& [strKey, jEntry] : expected) {
            Json::Value jFilter;
            jFilter[key()] = strKey;
            Json::Value jValues;
            jValues["name"] = "'" + jEntry["name"].asString() + "' of " + strKey;
            jValues[GetParam().szOptional] = "was " + jEntry["name"].asString();
            ASSERT_EQ(0, api().recUpdateByFilter(jFilter, jValues)) << strKey;
            for (const std::string& strMember : jValues.getMemberNames())
                jEntry[strMember] = jValues[strMember];
        }
    });
    expectSame(expected, list(Json::nullValue));
}

TEST_P(RealData, IsUpdatedByCondition)
{
    Records expected = source_;
    const std::string& strMember = GetParam().conditions.back();
    transaction([&] {
        for (const std::string& strValue : values(strMember)) {
            Json::Value jFilter;
            jFilter[strMember] = strValue;
            Json::Value jValues;
            jValues[GetParam().szOptional] = "all of " + strValue;
            ASSERT_EQ(0, api().recUpdateByFilter(jFilter, jValues)) << strValue;
            for (auto& [strKey, jEntry] : expected)
                if (std::as_const(jEntry)[strMember] == strValue)
                    jEntry[GetParam().szOptional] = jValues[GetParam().szOptional];
        }
    });
    expectSame(expected, list(Json::nullValue));
}

TEST_P(RealData, IsDeletedByNameAndByCondition)
{
    // Every second record by its key.
    transaction([this] {
        bool blDelete = false;
        for (auto entry = source_.begin(); source_.end() != entry;) {
            blDelete = !blDelete;
            if (!blDelete) {
                ++entry;
                continue;
            }
            std::string strKey = entry->first;
            ASSERT_EQ(1, api().recDeleteByName(strKey, key())) << strKey;
            entry = source_.erase(entry);
        }
    });
    expectSame(source_, list(Json::nullValue));

    // The rest by every value of a condition.
    const std::string& strMember = GetParam().conditions.back();
    for (const std::string& strValue : values(strMember)) {
        Json::Value jCondition;
        jCondition[strMember] = strValue;
        const Records gone = entries(jCondition);
        ASSERT_EQ(static_cast<int>(gone.size()), api().recDelete(jCondition)) << strValue;
        for (const auto& [strKey, jEntry] : gone) source_.erase(strKey);
        EXPECT_EQ(std::to_string(source_.size()),
                  database_.value("select count(*) from " + pTable_->strName));
        EXPECT_TRUE(list(jCondition).empty()) << strValue;
    }
    EXPECT_TRUE(source_.empty());
    EXPECT_EQ(0, api().recDeleteAll());
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("ok", database_.value("pragma integrity_check"));
}

INSTANTIATE_TEST_SUITE_P(IsoCodes, RealData, testing::Values(kLanguages, kSubdivisions),
                         [](const auto& source) {
                             return 0 == source.index ? "Languages" : "Subdivisions";
                         });

}  // namespace
