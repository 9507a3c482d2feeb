// SPDX-License-Identifier: MIT
// The bounds of 32 and 64 bits for every integer word: what is written, checked, asked for and
// read.

#include "calls.h"

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <functional>

namespace {

const std::string kSigned = "int|long|long long";
const std::string kUnsigned = "unsigned int|unsigned|unsigned long|unsigned long long";

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
    std::unique_ptr<Table> tableOf(const std::string& strWord)
    {
        return std::make_unique<Table>(database_, R"({"m":{"cpptype":")" + strWord + "\"}}", "m");
    }

    // The call with each value at "$", on a table of each word: its end and output.
    void expect(const std::string& strWords, const std::string& strCall,
                const std::function<std::string(const Written& row)>& expected)
    {
        for (const std::string& strWord : split(strWords, '|')) {
            const auto pTable = tableOf(strWord);
            for (const Written& row : kWritten) {
                SCOPED_TRACE(strWord + " " + row.szValue);
                const Ended ended = called(pTable->api, replaced(strCall, '$', row.szValue));
                EXPECT_EQ(expected(row), ended.whole());
                EXPECT_EQ("-1" == ended.strEnd, !takeLog().empty());
            }
        }
    }

    void expectReadBack(const char* szWord, const char* Written::*pszRead)
    {
        expect(szWord, R"(recSave {"m":$} insert)", [pszRead](const Written& row) -> std::string {
            if (nullptr == row.*pszRead) return "T";
            const std::string strRead = row.*pszRead;
            return row.szValue == strRead ? "0" : R"(0 {"m":)" + strRead + "}";
        });
    }
};

TEST_F(Boundaries, OfIntegersInValueLists)
{
    const auto literal = [](const std::string& strValue) {
        return "T" == strValue ? strValue : "0 " + strValue + ") ";
    };
    const char szCall[] = R"(SqlExpandMemberSymbol before {"m":$})";
    expect(kSigned, szCall, [&](const Written& row) { return literal(row.szSigned); });
    expect(kUnsigned, szCall, [&](const Written& row) { return literal(row.szUnsigned); });
}

TEST_F(Boundaries, OfIntegersInTheTypeCheck)
{
    const char szCall[] = R"(checkJsonType {"m":$})";
    expect("int|long long|uid_t|time_t", szCall,
           [](const Written& row) { return row.blChecked ? "0" : "-1"; });
    expect(kUnsigned, szCall, [](const Written&) { return "-1"; });
}

TEST_F(Boundaries, OfIntegersInConditions)
{
    const std::string strWords = kSigned + "|" + kUnsigned + "|uid_t|time_t";
    expect(strWords, "SqlMakeByMatchField m $",
           [](const Written& row) { return std::string("0 m=") + row.szBare; });
    expect(strWords, "SqlMakeByListField m [$]",
           [](const Written& row) { return std::string("0 m in (") + row.szBare + " )"; });
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
    for (const char* szWord : {"int", "unsigned int", "long long", "unsigned long long"}) {
        const auto pTable = tableOf(szWord);
        const bool blLong = std::string::npos != std::string(szWord).find("long");
        for (const char* szStored :
             {"-99999999999999999999", "-9223372036854775809", "-9223372036854775808",
              "-2147483649", "-2147483648", "2147483647", "2147483648", "4294967295", "4294967296",
              "9223372036854775807", "9223372036854775808", "18446744073709551615",
              "18446744073709551616"}) {
            SCOPED_TRACE(std::string(szWord) + " " + szStored);
            database_.run("delete from " + pTable->strName + "; insert into " + pTable->strName +
                          " values ('" + szStored + "')");
            Json::Value jRequest;
            Json::Value jRecord;
            EXPECT_EQ(1, pTable->api.recGetOne(jRequest, jRecord));
            const long long iRead = strtoll(szStored, nullptr, 10);
            EXPECT_EQ(blLong ? iRead : std::clamp<long long>(iRead, INT_MIN, INT_MAX),
                      jRecord["m"].asInt64());
            EXPECT_EQ(Json::intValue, jRecord["m"].type());
        }
    }
}

}  // namespace
