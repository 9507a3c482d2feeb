// SPDX-License-Identifier: MIT
// Rows behind the first ones of a statement are decoded in a shorter way; a host sees no
// difference.

#include "support/rows.h"

#include <dlfcn.h>
#include <algorithm>
#include <random>

namespace {

// How many members were looked up by name, or made, as the library does it for a row by itself.
int iLookUps = 0;

}  // namespace

Json::Value& Json::Value::operator[](const StaticString& key)
{
    using LookUp = Value& (*)(Value*, const StaticString&);
    static const auto pReal =
        reinterpret_cast<LookUp>(dlsym(RTLD_NEXT, "_ZN4Json5ValueixERKNS_12StaticStringE"));
    ++iLookUps;
    return pReal(this, key);
}

namespace {

using doubles::state;

class ManyRows : public TableTest {
protected:
    // Rows of the double, one after the other.
    Json::Value decoded(std::vector<Row> rows)
    {
        state().exec = [&](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                           char**) {
            for (Row& row : rows)
                if (0 != row.handTo(callback, arg)) return SQLITE_ABORT;
            return SQLITE_OK;
        };
        Json::Value jRows;
        iResult_ = table_.api.runSqlEx("a text", callback_, &jRows);
        return jRows;
    }

    Table table_{database_,
                 R"({"b":{"cpptype":"bool"},"d":{"cpptype":"double"},"i":{"cpptype":"int"},
                     "j":{"cpptype":"Json::Value"},"l":{"cpptype":"long long"},
                     "s":{"cpptype":"string"}})",
                 "i"};
    doubles::RowCallback callback_ = rowCallback(table_);
    int iResult_ = 0;
};

TEST_F(ManyRows, AreDecodedAsEachAlone)
{
    std::mt19937 random(7);
    const std::vector<const char*> texts = {
        nullptr, "", "1", "-7", "99999999999999999999", "x", "{}", "[1,{\"a\":2}]"};
    std::vector<const char*> names = {"s", "b", "j", "i", "l"};
    for (int iRound = 0; iRound < 300; ++iRound) {
        std::shuffle(names.begin(), names.end(), random);
        const std::size_t nColumns = 1 + random() % names.size();
        std::vector<Row> rows(1 + random() % 6);
        Json::Value jAlone(Json::arrayValue);
        for (Row& row : rows) {
            row.names.assign(names.begin(), names.begin() + static_cast<long>(nColumns));
            for (std::size_t i = 0; i < nColumns; ++i)
                row.values.push_back(texts[random() % (0 == iRound % 2 ? 3 : texts.size())]);
            jAlone.append(decoded({row})[0]);
        }
        EXPECT_EQ(text(jAlone), text(decoded(rows))) << iRound;
        EXPECT_EQ(0, iResult_);
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(ManyRows, MayChangeTheirColumnsOnTheWay)
{
    const Row si{{"s", "i"}, {"1", "2"}};
    const Row is{{"i", "s"}, {"1", "2"}};
    const Row twice{{"i", "i"}, {"1", "2"}};
    const Row wide{{"s", "i", "l"}, {"1", "2", "3"}};
    EXPECT_EQ(R"([{"i":2,"s":"1"},{"i":2,"s":"1"},{"i":2,"s":"1"},{"i":1,"s":"2"},{"i":1,"s":"2"},)"
              R"({"i":2},{"i":2},{"i":2},{"i":2,"l":3,"s":"1"},{"i":2,"s":"1"}])",
              text(decoded({si, si, si, is, is, twice, twice, twice, wide, si})));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(ManyRows, StopAtTheFirstBadOne)
{
    const Row good{{"i", "d"}, {"1", nullptr}};
    const Row bad{{"i", "d"}, {"1", "0.5"}};
    EXPECT_EQ(R"([{"i":1},{"i":1},{"i":1}])", text(decoded({good, good, good, bad, good})));
    EXPECT_EQ(-1, iResult_);
    EXPECT_EQ(error("type error, strType=double"), takeLog()[0]);

    const Row sound{{"i", "s"}, {"1", "x"}};
    const Row unknown{{"i", "y"}, {"1", "x"}};
    EXPECT_EQ(R"([{"i":1,"s":"x"},{"i":1,"s":"x"}])", text(decoded({sound, sound, unknown})));
    EXPECT_EQ(-1, iResult_);
    EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog()[0]);

    const Row noName{{"i", nullptr}, {"1", "x"}};
    EXPECT_EQ(R"([{"i":1,"s":"x"},{"i":1,"s":"x"}])", text(decoded({sound, sound, noName})));
    EXPECT_EQ(failed("NULL == column_name[i]"), takeLog()[0]);
}

// A row behind the first ones costs no look-up of its members.
TEST_F(ManyRows, AreFilledWithoutLookingTheirMembersUp)
{
    const Row row{{"b", "i", "l", "s"}, {"1", "2", "3", "x"}};
    const auto lookUps = [&](std::size_t nRows) {
        iLookUps = 0;
        EXPECT_EQ(nRows, decoded(std::vector<Row>(nRows, row)).size());
        return iLookUps;
    };
    EXPECT_LE(4, lookUps(1));
    EXPECT_GE(12, lookUps(1000));
}

// A record is the host's own, whatever it shares with others inside the library.
TEST_F(ManyRows, AreRecordsOfTheirOwn)
{
    const Row row{{"i", "s"}, {"1", "x"}};
    Json::Value jRows = decoded({row, row, row});
    jRows[1]["s"] = "changed";
    jRows[1]["more"] = true;
    jRows[2].removeMember("i");
    EXPECT_EQ(R"([{"i":1,"s":"x"},{"i":1,"more":true,"s":"changed"},{"s":"x"}])", text(jRows));
    EXPECT_EQ(R"([{"i":1,"s":"x"},{"i":1,"s":"x"}])", text(decoded({row, row})));
}

}  // namespace
