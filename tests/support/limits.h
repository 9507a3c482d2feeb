// SPDX-License-Identifier: MIT
// What the tests of docs/limits.md share: they take their examples from the page.
#pragma once

#include "support/database.h"
#include "support/markdown.h"

#include <set>

class Limits : public TableTest {
protected:
    Limits() : table_(database_, example("json", 0, "Limits"), example("sql", 0, "Limits")) {}
    // Each example of the section has been read.
    ~Limits() override
    {
        takeLog();
        std::size_t nExamples = 0;
        for (const MarkdownFence& block : ownSection("").fences)
            nExamples += "json" == block.strLanguage || "sql" == block.strLanguage;
        EXPECT_EQ(nExamples, read_.size());
    }

    // The n-th JSON, or SQL, of the section that names the running test.
    Json::Value jExample(std::size_t n = 0) { return json(example("json", n)); }
    std::string sqlExample() { return example("sql", 0); }

    // The ids that a request lists, in their order; "-1" for a failure.
    std::string ids(Json::Value jRequest)
    {
        Json::Value jRecords;
        if (0 != table_.api.recList(jRequest, jRecords)) return "-1";
        std::string strIds;
        for (const Json::Value& jRecord : jRecords)
            strIds.append(strIds.empty() ? "" : ",").append(jRecord["id"].asString());
        return strIds;
    }

    // The record of that id as the library reads it.
    std::string stored(int iId)
    {
        Json::Value jRequest;
        jRequest["id"] = iId;
        Json::Value jRecord;
        EXPECT_EQ(1, table_.api.recGetOne(jRequest, jRecord));
        return text(jRecord);
    }

    // A column of the page's table, over all rows.
    std::string column(const std::string& strColumn)
    {
        return database_.value("select group_concat(" + strColumn + ") from " + table_.strName);
    }

private:
    // The section of that heading; without one, that which names the running test.
    static const MarkdownSection& ownSection(const std::string& strHeading)
    {
        static const MarkdownPage page = readPage("limits.md");
        static const MarkdownSection none;
        const std::string strTest = std::string("`Limits.") +
                                    testing::UnitTest::GetInstance()->current_test_info()->name() +
                                    "`";
        for (const MarkdownSection& candidate : page)
            if (strHeading.empty() ? std::string::npos != candidate.strText.find(strTest)
                                   : strHeading == candidate.strHeading)
                return candidate;
        ADD_FAILURE() << "limits.md has no section for " << strTest << strHeading;
        return none;
    }

    std::string example(const std::string& strLanguage, std::size_t n,
                        const std::string& strHeading = "")
    {
        for (const MarkdownFence& block : ownSection(strHeading).fences) {
            if (block.strLanguage != strLanguage || 0 != n--) continue;
            if (strHeading.empty()) read_.insert(&block);
            return block.strText;
        }
        ADD_FAILURE() << "limits.md has no such example of " << strLanguage;
        return "null";
    }

    std::set<const MarkdownFence*> read_;

protected:
    Table table_;
};
