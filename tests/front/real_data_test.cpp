// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every record of Debian's package iso-codes, created in batches and handed out again, and every
// text that the reader of JSON is tested with.
#include "front/exact.h"
#include "front/front.h"
#include "support/figures.h"

#include <filesystem>
#include <fstream>
#include <iterator>

namespace {

std::string contentOf(const std::filesystem::path& path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

// The records of a file, each with its number as the key. An entry that lacks a member stays so.
Json::Value recordsOf(const std::filesystem::path& path)
{
    const Json::Value jFile = json(contentOf(path));
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

class Texts : public FrontTest {
protected:
    // As a string and as what the reader makes of it: it comes back, or is refused.
    void expectKept(const std::string& strText)
    {
        SCOPED_TRACE(testing::PrintToString(strText.substr(0, 100)));
        const bool blString = isUtf8(strText) && std::string::npos == strText.find('\0');
        expectKept("text", strText, blString);
        Json::Value jRead;
        try {
            jRead = leftByReader(strText);
        } catch (const Json::RuntimeError&) {
            return;  // too many levels for the reader
        }
        expectKept("any", jRead, isStorable(jRead));
    }

private:
    void expectKept(const char* szMember, const Json::Value& jValue, bool blStorable)
    {
        Json::Value jRecord;
        jRecord["id"] = 1;
        jRecord[szMember] = jValue;
        const std::string strOutcome = front_.create(jRecord);
        Figures::of(std::string("front, JSON texts ") + (blStorable ? "kept" : "refused"))++;
        if (!blStorable) {
            EXPECT_EQ(std::string("refused: member \"") + szMember,
                      strOutcome.substr(0, strOutcome.find('"', 17)));
            return;
        }
        EXPECT_EQ("0", strOutcome);
        EXPECT_EQ("1", front_.list({}));
        EXPECT_EQ(exactRecord(jRecord), exactRecord(front_.jStored[0]));
        front_.run("delete from @");
    }

    static bool isStorable(const Json::Value& jValue)
    {
        if (jValue.isString()) return isUtf8(jValue.asString());
        if (Json::realValue == jValue.type()) return std::isfinite(jValue.asDouble());
        for (auto it = jValue.begin(); it != jValue.end(); ++it)
            if (!isStorable(*it) || !isUtf8(it.name())) return false;
        return true;
    }

    Front front_{database_,
                 R"({"any":  {"cpptype": "Json::Value"},
                     "id":   {"cpptype": "long long"},
                     "text": {"cpptype": "string"}})",
                 "any text, id integer primary key, text text"};
};

TEST_F(Texts, OfTheFuzzTargetsAreKept)
{
    // The first byte of an input for JSON is no text: it chooses the locales.
    const std::filesystem::path corpus = VORN_SOURCES "/../fuzz/corpus";
    for (const auto& entry : std::filesystem::directory_iterator(corpus / "json"))
        expectKept(contentOf(entry.path()).substr(1));
    for (const char* szTarget : {"column", "definition", "record", "request"})
        for (const auto& entry : std::filesystem::directory_iterator(corpus / szTarget))
            expectKept(contentOf(entry.path()));
    EXPECT_LT(300, Figures::of("front, JSON texts kept"));
}

TEST_F(Texts, OfWholeFilesAreKept)
{
    for (const auto& entry : std::filesystem::directory_iterator("/usr/share/iso-codes/json"))
        expectKept(contentOf(entry.path()));
}

}  // namespace
