// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Later rows and statements, which are decoded by what is already known of their columns: a host
// sees no difference.

#include "support/rows.h"

#include <dlfcn.h>
#include <algorithm>
#include <random>

namespace {

// How many members were looked up by name or made, as decoding a row from scratch does.
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

const Row kUsual = {{"s", "i"}, {"7", "8"}};
const Row kSeven = {{"s"}, {"7"}};
const Row kOtherSeven = {{"other"}, {"7"}};

class KeptColumns : public DecoderTest {
protected:
    // Repeats the row until nothing about its columns is new.
    void warmUp()
    {
        for (int i = 0; i < 3; ++i) EXPECT_EQ(R"([{"i":8,"s":"7"}])", decoded({kUsual}));
    }
};

// What a host changes through recType's reference takes effect with the next statement.
TEST_F(KeptColumns, FollowChangedTypes)
{
    struct Case {
        const char* szChange;  // members of the types; null removes one
        const char* szRows;
        std::string strFirst;  // of the log
    };
    const std::string strNoType = error("type error, strType=");
    for (const Case& row :
         {Case{R"({"s":{"cpptype":"bool"}})", R"([{"i":8,"s":false}])", ""},
          {R"({"s":{"cpptype":"long long"}})", R"([{"i":8,"s":7}])", ""},
          {R"({"i":{"cpptype":"string"}})", R"([{"i":"8","s":"7"}])", ""},
          {R"({"s":{"cpptype":"string","zzz":1}})", R"([{"i":8,"s":"7"}])", ""},
          {R"({"s":{"cpptype":"bool","zzz":1}})", R"([{"i":8,"s":false}])", ""},
          {R"({"s":{"zzz":1}})", "null", strNoType},
          {R"({"s":{"zzz":"string"}})", "null", strNoType},
          {R"({"s":{"":"string"}})", "null", strNoType},
          {R"({"s":{}})", "null", strNoType},
          {R"({"s":{"cpptype":"double"}})", "null", strNoType + "double"},
          {R"({"s":{"cpptype":""}})", "null", strNoType},
          {R"({"s":{"cpptype":5}})", "null", strNoType + "5"},
          {R"({"s":{"cpptype":null}})", "null", strNoType},
          // Not a text at all, and jsoncpp refuses to convert it.
          {R"({"s":{"cpptype":[]}})", "Json::LogicError after null", ""},
          // The columns are checked in the order of the row.
          {R"({"i":{"cpptype":[]},"s":{"cpptype":"double"}})", "null", strNoType + "double"},
          {R"({"s":null})", "null", failed("!jType.isMember(strName)")},
          {R"({"i":null})", "null", failed("!jType.isMember(strName)")},
          {"null", "null", utilFailed("jType[strJsonName].type() != Json::objectValue")}}) {
        SCOPED_TRACE(row.szChange);
        warmUp();
        const Json::Value jChange = json(row.szChange);
        if (jChange.isNull()) jTypes_ = jChange;
        for (const std::string& strName : jChange.getMemberNames()) {
            jTypes_[strName] = jChange[strName];
            if (jChange[strName].isNull()) jTypes_.removeMember(strName);
        }
        for (int i = 0; i < 2; ++i) {
            EXPECT_EQ(row.szRows, decoded({kUsual}));
            const Lines lines = takeLog();
            EXPECT_EQ(row.strFirst, lines.empty() ? "" : lines[0]);
        }
        jTypes_ = jTypesBefore_;
    }
    warmUp();
}

TEST_F(KeptColumns, BelongToTheRow)
{
    for (const char* szName : {"s", "s", "s", "other", "other", "other", "s", "s", "s", "other"})
        EXPECT_EQ("[{\"" + std::string(szName) + "\":\"7\"}]", decoded({{{szName}, {"7"}}}));
    jTypes_["s"]["cpptype"] = "bool";
    EXPECT_EQ(R"([{"s":false}])", decoded({kSeven}));
    jTypes_["s"]["cpptype"] = "string";
    for (int i = 0; i < 3; ++i) {
        warmUp();
        EXPECT_EQ(R"([{"other":"7"}])", decoded({kOtherSeven}));
        EXPECT_EQ("[{},{}]", decoded({{{nullptr}, {nullptr}, 0}, {{nullptr}, {nullptr}, -1}}));
    }
    // A first row with one column checks the type of that column only.
    warmUp();
    jTypes_["i"]["cpptype"] = "string";
    EXPECT_EQ(R"([{"s":"7"},{"i":"8","s":"7"}])", decoded({kSeven, kUsual}));
}

TEST_F(KeptColumns, KeepTheirTypesUntilTheStatementEnds)
{
    // Its column is new at this position.
    EXPECT_EQ(R"([{"other":"7"}])", decoded({kOtherSeven}));
    state().exec = [this](sqlite3*, const char*, doubles::RowCallback callback, void* arg, char**) {
        Row row = kSeven;
        EXPECT_EQ(0, row.handTo(callback, arg));
        jTypes_["s"]["cpptype"] = "int";
        return row.handTo(callback, arg) + row.handTo(callback, arg);
    };
    EXPECT_EQ(R"([{"s":"7"},{"s":"7"},{"s":"7"}])", decoded(table_));
    EXPECT_EQ(R"([{"s":7},{"s":7},{"s":7}])", decoded(table_));
}

TEST_F(KeptColumns, BelongToTheRunningTable)
{
    Table other(database_, R"({"i":{"cpptype":"string"},"s":{"cpptype":"bool"}})", "i");
    VORN_JSON_DB::recType(other.jDefinition, other.strName);
    for (int i = 0; i < 3; ++i) {
        warmUp();
        EXPECT_EQ(R"([{"i":"8","s":false}])", decoded(other));
    }
}

// Also where a row has to be decoded by name.
TEST_F(KeptColumns, KeepARefusedTypeUntilTheStatementEnds)
{
    state().exec = [this](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                          char** errText) {
        Row first{{"s", "d"}, {"7", nullptr}};
        EXPECT_EQ(0, first.handTo(callback, arg));
        jTypes_["d"]["cpptype"] = "string";
        Row second{{"s", "d"}, {"7", "8"}};
        EXPECT_EQ(-1, second.handTo(callback, arg));
        return End{SQLITE_ABORT, "query aborted"}.leaveIn(errText);
    };
    EXPECT_EQ(R"([{"s":"7"}])", decoded(table_));
    EXPECT_EQ(error("type error, strType=double"), takeLog()[0]);
    jTypes_ = jTypesBefore_;
}

TEST_F(KeptColumns, NoticeAnEmptyWordThatBecomesAnArray)
{
    const Row row{{"s", "empty"}, {"7", nullptr}};
    for (int i = 0; i < 2; ++i) EXPECT_EQ(R"([{"s":"7"}])", decoded({row}));
    jTypes_["empty"]["cpptype"] = Json::arrayValue;
    EXPECT_EQ("Json::LogicError after null", decoded({row}));
    jTypes_ = jTypesBefore_;
}

class ManyRows : public DecoderTest {};

TEST_F(ManyRows, AreDecodedLikeSingleOnes)
{
    std::mt19937 random(7);
    const std::vector<const char*> texts = {
        nullptr, "", "1", "-7", "99999999999999999999", "x", "{}", "[1,{\"a\":2}]"};
    std::vector<const char*> names = {"s", "b", "j", "i", "ll"};
    for (int iRound = 0; iRound < 300; ++iRound) {
        std::shuffle(names.begin(), names.end(), random);
        const std::size_t nColumns = 1 + random() % names.size();
        std::vector<Row> rows(1 + random() % 6);
        Json::Value jAlone(Json::arrayValue);
        for (Row& row : rows) {
            row.names.assign(names.begin(), names.begin() + static_cast<long>(nColumns));
            for (std::size_t i = 0; i < nColumns; ++i)
                row.values.push_back(texts[random() % (0 == iRound % 2 ? 3 : texts.size())]);
            decoded({row});
            jAlone.append(rows_[0]);
        }
        EXPECT_EQ(text(jAlone), decoded(rows)) << iRound;
        EXPECT_EQ(0, iResult_);
    }
}

TEST_F(ManyRows, MayChangeTheirColumns)
{
    const Row si{{"s", "i"}, {"1", "2"}};
    const Row is{{"i", "s"}, {"1", "2"}};
    const Row twice{{"i", "i"}, {"1", "2"}};
    const Row wide{{"s", "i", "ll"}, {"1", "2", "3"}};
    EXPECT_EQ(R"([{"i":2,"s":"1"},{"i":2,"s":"1"},{"i":2,"s":"1"},{"i":1,"s":"2"},{"i":1,"s":"2"},)"
              R"({"i":2},{"i":2},{"i":2},{"i":2,"ll":3,"s":"1"},{"i":2,"s":"1"}])",
              decoded({si, si, si, is, is, twice, twice, twice, wide, si}));
}

// A row after the first ones costs no look-up of its members.
TEST_F(ManyRows, AreFilledWithoutLookingUpMembers)
{
    const auto lookUps = [this](std::size_t nRows) {
        iLookUps = 0;
        decoded(std::vector<Row>(nRows, {{"b", "i", "ll", "s"}, {"1", "2", "3", "x"}}));
        EXPECT_EQ(nRows, rows_.size());
        return iLookUps;
    };
    EXPECT_LE(4, lookUps(1));
    EXPECT_GE(12, lookUps(1000));
}

TEST_F(ManyRows, LookUpEqualNamesOnce)
{
    const Row twice{{"i", "i"}, {"1", "2"}};
    decoded({twice});
    iLookUps = 0;
    EXPECT_EQ(R"([{"i":2}])", decoded({twice}));
    EXPECT_EQ(0, iLookUps);
}

TEST_F(ManyRows, OfTwoTablesInTurnAreLookedUpOnceEvenAmongAThousand)
{
    for (int i = 0; i < 1000; ++i) {
        std::string strOther = "B" + std::to_string(i);
        VornJsonDbApi(database_.get(), strOther, table_.jDefinition, table_.strCreate);
    }
    const char szMembers[] = R"({"s":{"cpptype":"string"}})";
    Table first(database_, "A0", szMembers, "s");
    Table second(database_, "A1", szMembers, "s");
    for (Table* pTable : {&first, &second})
        VORN_JSON_DB::recType(pTable->jDefinition, pTable->strName);
    state().exec = execOfRows({kSeven});
    for (int i = 0; i < 4; ++i) {
        if (2 == i) iLookUps = 0;
        for (Table* pTable : {&first, &second}) EXPECT_EQ(R"([{"s":"7"}])", decoded(*pTable));
    }
    EXPECT_EQ(0, iLookUps);
}

// A record is the host's own, whatever it shares with others inside the library.
TEST_F(ManyRows, AreIndependentRecords)
{
    decoded({kUsual, kUsual, kUsual});
    rows_[1]["s"] = "changed";
    rows_[1]["more"] = true;
    rows_[2].removeMember("i");
    EXPECT_EQ(R"([{"i":8,"s":"7"},{"i":8,"more":true,"s":"changed"},{"s":"7"}])", text(rows_));
    EXPECT_EQ(R"([{"i":8,"s":"7"},{"i":8,"s":"7"}])", decoded({kUsual, kUsual}));
}

}  // namespace
