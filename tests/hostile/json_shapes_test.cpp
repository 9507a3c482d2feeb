// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What a process has learnt of nested objects must not show in those that it reads later. Every
// process starts afresh, so that there is room for what it learns.

#include "support/database.h"
#include "support/json_text.h"

#include <unistd.h>
#include <random>
#include <string>

namespace {

constexpr unsigned kProcesses = 200;
constexpr int kTexts = 50;

class Texts {
public:
    explicit Texts(unsigned uSeed) : random_(uSeed) {}

    std::string array()
    {
        std::string strArray = "[";
        for (int i = upTo(6); 0 <= i; --i) strArray += value(3) + (0 == i ? "]" : ",");
        // Some end too early.
        if (0 == upTo(9)) strArray.resize(static_cast<std::size_t>(upTo(40)) % strArray.size());
        return strArray;
    }

private:
    int upTo(int iMost) { return std::uniform_int_distribution<int>(0, iMost)(random_); }

    std::string value(int nLevels)
    {
        switch (upTo(0 == nLevels ? 3 : 9)) {
        case 0: return std::to_string(upTo(100));
        case 1: return R"("text\n")";
        case 2: return "1.5";
        case 3: return 0 == upTo(9) ? "NaN" : "null";
        case 4: return "[" + value(nLevels - 1) + "," + value(nLevels - 1) + "]";
        default: return object(nLevels - 1);
        }
    }

    std::string object(int nLevels)
    {
        std::string strObject = "{";
        for (char c = 'a'; 'e' > c; ++c)
            if (0 != upTo(3)) strObject += member(c, nLevels);
        if (0 == upTo(5)) strObject += member('a', nLevels);
        if (',' == strObject.back()) strObject.pop_back();
        return strObject + "}";
    }

    std::string member(char c, int nLevels)
    {
        return std::string(R"("json shape )") + c + "\":" + value(nLevels) + ",";
    }

    std::mt19937 random_;
};

// With the places of all values in the text.
std::string described(const Json::Value& jValue)
{
    std::string strAll = std::to_string(jValue.type()) + "@" +
                         std::to_string(jValue.getOffsetStart()) + "-" +
                         std::to_string(jValue.getOffsetLimit());
    if (!jValue.isArray() && !jValue.isObject()) return strAll + "=" + jValue.asString() + " ";
    for (auto it = jValue.begin(); it != jValue.end(); ++it)
        strAll += "(" + it.name() + ":" + described(*it) + ")";
    return strAll;
}

using JsonShapes = TableTest;

TEST_F(JsonShapes, DoNotShowInWhatIsRead)
{
    Table table(database_, R"({"a":{"cpptype":"Json::arrayValue"}})", "a text");
    const auto read = [&](const std::string& strText) {
        database_.run("delete from " + table.strName + "; insert into " + table.strName +
                      " values ('" + strText + "')");
        Json::Value jRequest;
        Json::Value jRecord;
        EXPECT_EQ(1, table.api.recGetOne(jRequest, jRecord));
        return described(jRecord["a"]);
    };
    const auto readTexts = [&](unsigned uSeed) {
        Texts texts(uSeed);
        for (int i = 0; i < kTexts; ++i) {
            const std::string strText = texts.array();
            EXPECT_EQ(described(leftByReader(strText)), read(strText)) << strText;
        }
        _exit(HasFailure() ? 1 : 0);
    };
    for (unsigned uSeed = 0; uSeed < kProcesses; ++uSeed)
        EXPECT_EXIT(readTexts(uSeed), testing::ExitedWithCode(0), "");
}

}  // namespace
