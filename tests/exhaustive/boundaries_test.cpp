// SPDX-License-Identifier: MIT
// The bounds of 32 and 64 bits for every integer word: what is written, checked, asked for and
// read.

#include "support/matrix.h"

namespace {

const char* const kSignedWords[] = {"int", "long", "long long"};
const char* const kUnsignedWords[] = {"unsigned int", "unsigned", "unsigned long",
                                      "unsigned long long"};
const char* const kCheckedWords[] = {"int", "long long", "uid_t", "time_t"};

// What a value becomes: T for a Json::LogicError.
struct Written {
    const char* szValue;
    const char* szSigned;
    const char* szUnsigned;
    bool blChecked;  // passes as an integer
    const char* szBare;
    // Saved under these words and read back; null where it cannot be written.
    const char* szInt;
    const char* szLongLong;
    const char* szUnsignedInt;
    const char* szUnsignedLongLong;
};

// A number beyond what SQLite holds as an integer is read from the digits before its point.
// clang-format off
const Written kWritten[] = {
    // jsoncpp's reader rounds to -2^63, a real number, which 1.9.8 no longer takes for an integer.
#if JSONCPP_VERSION_HEXA < 0x01090800
    {"-9223372036854775809",   "-9223372036854775808", "T",  true,  "-9.2233720368547758e+18", "-2147483648", "-9223372036854775808", nullptr, nullptr},
#else
    {"-9223372036854775809",   "T",                    "T",  false, "-9.2233720368547758e+18", nullptr, nullptr, nullptr, nullptr},
#endif
    {"-9223372036854775808",   "-9223372036854775808", "T",  true,  "-9223372036854775808",    "-2147483648", "-9223372036854775808", nullptr, nullptr},
    {"-4294967296",            "-4294967296",          "T",  true,  "-4294967296",             "-2147483648", "-4294967296",          nullptr, nullptr},
    {"-2147483649",            "-2147483649",          "T",  true,  "-2147483649",             "-2147483648", "-2147483649",          nullptr, nullptr},
    {"-2147483648",            "-2147483648",          "T",  true,  "-2147483648",             "-2147483648", "-2147483648",          nullptr, nullptr},
    {"-1",                     "-1",                   "T",  true,  "-1",                      "-1",          "-1",                   nullptr, nullptr},
    {"0",                      "0",                    "0",  true,  "0",                       "0",           "0",                    "0",     "0"},
    {"2147483647",             "2147483647",           "2147483647", true, "2147483647",       "2147483647",  "2147483647",           "2147483647", "2147483647"},
    {"2147483648",             "2147483648",           "2147483648", true, "2147483648",       "2147483647",  "2147483648",           "2147483647", "2147483648"},
    {"4294967295",             "4294967295",           "4294967295", true, "4294967295",       "2147483647",  "4294967295",           "2147483647", "4294967295"},
    {"4294967296",             "4294967296",           "4294967296", true, "4294967296",       "2147483647",  "4294967296",           "2147483647", "4294967296"},
    {"9223372036854775807",    "9223372036854775807",  "9223372036854775807",  true, "9223372036854775807",  "2147483647", "9223372036854775807", "2147483647", "9223372036854775807"},
    {"9223372036854775808",    "T",                    "9223372036854775808",  true, "9223372036854775808",  nullptr, nullptr, "9", "9"},
    {"18446744073709551615",   "T",                    "18446744073709551615", true, "18446744073709551615", nullptr, nullptr, "1", "1"},
    {"36893488147419103232",   "T",                    "T",          false, "3.6893488147419103e+19", nullptr, nullptr, nullptr, nullptr},
    {"-36893488147419103232",  "T",                    "T",          false, "-3.6893488147419103e+19", nullptr, nullptr, nullptr, nullptr},
    // Real numbers: the fraction is cut, and one without a fraction is an integer.
    {"2147483648.0",           "2147483648",           "2147483648", true,  "2147483648.0",    "2147483647",  "2147483648",           "2147483647", "2147483648"},
    {"2147483647.5",           "2147483647",           "2147483647", false, "2147483647.5",    "2147483647",  "2147483647",           "2147483647", "2147483647"},
    {"-2147483648.5",          "-2147483648",          "T",          false, "-2147483648.5",   "-2147483648", "-2147483648",          nullptr, nullptr},
    {"1e19",                   "T",                    "10000000000000000000", true, "1e+19",  nullptr, nullptr, "1", "1"},
    // A text is never a number.
    {R"("2147483647")",        "T",                    "T",          false, "2147483647",           nullptr, nullptr, nullptr, nullptr},
    {R"("9223372036854775807")", "T",                  "T",          false, "9223372036854775807",  nullptr, nullptr, nullptr, nullptr},
};
// clang-format on

class Boundaries : public TableTest {
protected:
    std::unique_ptr<Table> tableOf(const char* szWord)
    {
        return std::make_unique<Table>(database_,
                                       std::string(R"({"m":{"cpptype":")") + szWord + "\"}}", "m");
    }

    template <typename Check>
    void forEach(const char* szWord, Check check)
    {
        const auto pTable = tableOf(szWord);
        for (const Written& row : kWritten) {
            SCOPED_TRACE(std::string(szWord) + " " + row.szValue);
            check(*pTable, row, filledIn(R"({"m":$})", row.szValue));
        }
    }

    static std::string valueList(Table& table, Json::Value jRecord)
    {
        std::string strOut = "(";
        const std::string strEnd =
            endOf([&] { return table.api.SqlExpandMemberSymbol(strOut, jRecord); });
        if ("0" != strEnd) {
            EXPECT_EQ("(", strOut);
            return strEnd;
        }
        return strOut.substr(1, strOut.size() - 3);
    }

    void expectReadBack(const char* szWord, const char* Written::*pszExpected)
    {
        forEach(szWord, [&](Table& table, const Written& row, Json::Value jRecord) {
            const std::string strEnd = endOf([&] { return table.api.recSave(jRecord, true); });
            EXPECT_EQ(nullptr == row.*pszExpected ? "T" : "0", strEnd);
            if ("0" == strEnd && nullptr != row.*pszExpected) {
                EXPECT_EQ(row.*pszExpected, text(jRecord["m"]));
            }
        });
    }
};

TEST_F(Boundaries, OfIntegersInValueLists)
{
    for (const char* szWord : kSignedWords)
        forEach(szWord, [](Table& table, const Written& row, const Json::Value& jRecord) {
            EXPECT_EQ(row.szSigned, valueList(table, jRecord));
        });
    for (const char* szWord : kUnsignedWords)
        forEach(szWord, [](Table& table, const Written& row, const Json::Value& jRecord) {
            EXPECT_EQ(row.szUnsigned, valueList(table, jRecord));
        });
}

TEST_F(Boundaries, OfIntegersInTheTypeCheck)
{
    for (const char* szWord : kCheckedWords)
        forEach(szWord, [](Table& table, const Written& row, Json::Value jRecord) {
            EXPECT_EQ(row.blChecked ? 0 : -1, table.api.checkJsonType(jRecord));
            EXPECT_EQ(row.blChecked, takeLog().empty());
        });
    for (const char* szWord : kUnsignedWords)
        forEach(szWord, [](Table& table, const Written&, Json::Value jRecord) {
            EXPECT_EQ(-1, table.api.checkJsonType(jRecord));
            EXPECT_EQ(Lines{error("type not found!!, key=m")}, takeLog());
        });
}

TEST_F(Boundaries, OfIntegersInConditions)
{
    for (const char* szWord : {"int", "long", "long long", "unsigned int", "unsigned",
                               "unsigned long", "unsigned long long", "uid_t", "time_t"})
        forEach(szWord, [](Table& table, const Written& row, Json::Value jRecord) {
            std::string strField = "m";
            std::string strOut;
            EXPECT_EQ(0, table.api.SqlMakeByMatchField(strField, jRecord["m"], strOut));
            Json::Value jList(Json::arrayValue);
            jList.append(jRecord["m"]);
            EXPECT_EQ(0, table.api.SqlMakeByListField("m", jList, strOut));
            EXPECT_EQ(std::string("m=") + row.szBare + "m in (" + row.szBare + " )", strOut);
        });
}

TEST_F(Boundaries, OfIntegersSavedAndReadBack)
{
    expectReadBack("int", &Written::szInt);
    expectReadBack("long long", &Written::szLongLong);
    expectReadBack("unsigned int", &Written::szUnsignedInt);
    expectReadBack("unsigned long long", &Written::szUnsignedLongLong);
}

// Integers that another program stored, as text.
TEST_F(Boundaries, OfIntegersInARow)
{
    const struct {
        const char* szStored;
        const char* szOf32Bits;
        const char* szOf64Bits;
    } cases[] = {
        {"-99999999999999999999", "-2147483648", "-9223372036854775808"},
        {"-9223372036854775809", "-2147483648", "-9223372036854775808"},
        {"-9223372036854775808", "-2147483648", "-9223372036854775808"},
        {"-2147483649", "-2147483648", "-2147483649"},
        {"-2147483648", "-2147483648", "-2147483648"},
        {"2147483647", "2147483647", "2147483647"},
        {"2147483648", "2147483647", "2147483648"},
        {"4294967295", "2147483647", "4294967295"},
        {"4294967296", "2147483647", "4294967296"},
        {"9223372036854775807", "2147483647", "9223372036854775807"},
        {"9223372036854775808", "2147483647", "9223372036854775807"},
        {"18446744073709551615", "2147483647", "9223372036854775807"},
        {"18446744073709551616", "2147483647", "9223372036854775807"},
    };
    for (const char* szWord : {"int", "unsigned int", "long long", "unsigned long long"}) {
        const auto pTable = tableOf(szWord);
        const bool blLong = std::string::npos != std::string(szWord).find("long");
        for (const auto& row : cases) {
            SCOPED_TRACE(std::string(szWord) + " " + row.szStored);
            database_.run("delete from " + pTable->strName + "; insert into " + pTable->strName +
                          " values ('" + row.szStored + "')");
            Json::Value jRequest;
            Json::Value jRecord;
            EXPECT_EQ(1, pTable->api.recGetOne(jRequest, jRecord));
            EXPECT_EQ(blLong ? row.szOf64Bits : row.szOf32Bits, text(jRecord["m"]));
            EXPECT_EQ(Json::intValue, jRecord["m"].type());
        }
    }
}

}  // namespace
