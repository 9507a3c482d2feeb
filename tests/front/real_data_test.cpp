// SPDX-License-Identifier: MIT
// Every record of Debian's package iso-codes, created in batches and handed out again.
#include "front/front.h"
#include "support/figures.h"

#include <filesystem>
#include <fstream>
#include <iterator>

namespace {

// The records of a file, each with its number as the key. An entry that lacks a member stays so.
Json::Value recordsOf(const std::filesystem::path& path)
{
    std::ifstream file(path);
    const std::string strText{std::istreambuf_iterator<char>(file), {}};
    const Json::Value jFile = json(strText);
    Json::Value jRecords(Json::arrayValue);
    for (const Json::Value& jEntry : jFile[jFile.getMemberNames().at(0)]) {
        Json::Value jRecord = jEntry;
        jRecord["nr"] = jRecords.size();
        jRecords.append(jRecord);
    }
    return jRecords;
}

TEST_F(FrontTest, KeepsEveryRecordOfIsoCodes)
{
    const std::filesystem::path folder = "/usr/share/iso-codes/json";
    ASSERT_TRUE(std::filesystem::exists(folder)) << "install the package iso-codes";
    for (const auto& entry : std::filesystem::directory_iterator(folder)) {
        if (0 != entry.path().filename().string().find("iso_")) continue;
        SCOPED_TRACE(entry.path());
        const Json::Value jRecords = recordsOf(entry.path());
        Json::Value jMembers = json(R"({"nr": {"cpptype": "long long"}})");
        std::string strColumns = "nr integer primary key";
        for (const Json::Value& jRecord : jRecords)
            for (const std::string& strName : jRecord.getMemberNames()) {
                if (jMembers.isMember(strName)) continue;
                jMembers[strName]["cpptype"] = "Json::Value";
                strColumns += ", " + strName + " text";
            }
        Front front(database_, text(jMembers), strColumns);
        ASSERT_EQ("", front.table->reason());
        EXPECT_EQ(std::to_string(jRecords.size()), front.createMany(jRecords));
        Json::ArrayIndex uNext = 0;
        EXPECT_EQ(jRecords.size(), front.table->each({}, {}, [&](const Json::Value& jRecord) {
            EXPECT_EQ(jRecords[uNext++]["nr"].asInt64(), jRecord["nr"].asInt64());
            Json::Value jExpected = jRecords[uNext - 1];
            jExpected["nr"] = jRecord["nr"];
            EXPECT_EQ(jExpected, jRecord);
            return true;
        }));
        Figures::of("front, real records") += jRecords.size();
    }
    EXPECT_LT(10000, Figures::of("front, real records"));
}

}  // namespace
