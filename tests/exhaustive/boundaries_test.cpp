// SPDX-License-Identifier: MIT
// The bounds of 32 and 64 bits for every integer word: what is written, checked, asked for and
// read.

#include "calls.h"

#include <algorithm>
#include <climits>
#include <cstdlib>

namespace {

const std::string kSigned = "int|long|long long";
const std::string kUnsigned = "unsigned int|unsigned|unsigned long|unsigned long long";
const std::string kEvery = kSigned + "|" + kUnsigned + "|uid_t|time_t";

// What a value becomes: T for a Json::LogicError.
struct Written {
    const char* szValue;
    const char* szSigned;
    const char* szUnsigned;
    const char* szChecked;  // as an integer
    const char* szBare;
    // Saved under these words and read back.
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
    {"-9223372036854775809",     "-9223372036854775808", "T",                    "0",  "-9.2233720368547758e+18", "-2147483648", "-9223372036854775808", "T",          "T"},
#else
    {"-9223372036854775809",     "T",                    "T",                    "-1", "-9.2233720368547758e+18", "T",           "T",                    "T",          "T"},
#endif
    {"-9223372036854775808",     "-9223372036854775808", "T",                    "0",  "-9223372036854775808",    "-2147483648", "-9223372036854775808", "T",          "T"},
    {"-4294967296",              "-4294967296",          "T",                    "0",  "-4294967296",             "-2147483648", "-4294967296",          "T",          "T"},
    {"-2147483649",              "-2147483649",          "T",                    "0",  "-2147483649",             "-2147483648", "-2147483649",          "T",          "T"},
    {"-2147483648",              "-2147483648",          "T",                    "0",  "-2147483648",             "-2147483648", "-2147483648",          "T",          "T"},
    {"-1",                       "-1",                   "T",                    "0",  "-1",                      "-1",          "-1",                   "T",          "T"},
    {"0",                        "0",                    "0",                    "0",  "0",                       "0",           "0",                    "0",          "0"},
    {"2147483647",               "2147483647",           "2147483647",           "0",  "2147483647",              "2147483647",  "2147483647",           "2147483647", "2147483647"},
    {"2147483648",               "2147483648",           "2147483648",           "0",  "2147483648",              "2147483647",  "2147483648",           "2147483647", "2147483648"},
    {"4294967295",               "4294967295",           "4294967295",           "0",  "4294967295",              "2147483647",  "4294967295",           "2147483647", "4294967295"},
    {"4294967296",               "4294967296",           "4294967296",           "0",  "4294967296",              "2147483647",  "4294967296",           "2147483647", "4294967296"},
    {"9223372036854775807",      "9223372036854775807",  "9223372036854775807",  "0",  "9223372036854775807",     "2147483647",  "9223372036854775807",  "2147483647", "9223372036854775807"},
    {"9223372036854775808",      "T",                    "9223372036854775808",  "0",  "9223372036854775808",     "T",           "T",                    "9",          "9"},
    {"18446744073709551615",     "T",                    "18446744073709551615", "0",  "18446744073709551615",    "T",           "T",                    "1",          "1"},
    {"36893488147419103232",     "T",                    "T",                    "-1", "3.6893488147419103e+19",  "T",           "T",                    "T",          "T"},
    {"-36893488147419103232",    "T",                    "T",                    "-1", "-3.6893488147419103e+19", "T",           "T",                    "T",          "T"},
    // Real numbers: the fraction is cut, and one without a fraction is an integer.
    {"2147483648.0",             "2147483648",           "2147483648",           "0",  "2147483648.0",            "2147483647",  "2147483648",           "2147483647", "2147483648"},
    {"2147483647.5",             "2147483647",           "2147483647",           "-1", "2147483647.5",            "2147483647",  "2147483647",           "2147483647", "2147483647"},
    {"-2147483648.5",            "-2147483648",          "T",                    "-1", "-2147483648.5",           "-2147483648", "-2147483648",          "T",          "T"},
    {"1e19",                     "T",                    "10000000000000000000", "0",  "1e+19",                   "T",           "T",                    "1",          "1"},
    // A text is never a number.
    {R"("2147483647")",          "T",                    "T",                    "-1", "2147483647",              "T",           "T",                    "T",          "T"},
    {R"("9223372036854775807")", "T",                    "T",                    "-1", "9223372036854775807",     "T",           "T",                    "T",          "T"},
};
// clang-format on

const std::string kSave = R"(recSave {"m":$,"undeclared":1} insert)";

// A call with each value in place of "$", on a table of each word. Its result and output are the
// column's text between the last two texts.
const struct {
    std::string strWords;
    std::string strCall;
    const char* Written::*pszColumn;
    std::string strBefore, strAfter;
} kCalls[] = {
    {kSigned, R"(SqlExpandMemberSymbol before {"m":$})", &Written::szSigned, "0 ", ") "},
    {kUnsigned, R"(SqlExpandMemberSymbol before {"m":$})", &Written::szUnsigned, "0 ", ") "},
    {"int|long long|uid_t|time_t", R"(checkJsonType {"m":$})", &Written::szChecked, "", ""},
    {kEvery, "SqlMakeByMatchField m $", &Written::szBare, "0 m=", ""},
    {kEvery, "SqlMakeByListField m [$]", &Written::szBare, "0 m in (", " )"},
    {"int", kSave, &Written::szInt, R"(0 {"m":)", "}"},
    {"long long", kSave, &Written::szLongLong, R"(0 {"m":)", "}"},
    {"unsigned int", kSave, &Written::szUnsignedInt, R"(0 {"m":)", "}"},
    {"unsigned long long", kSave, &Written::szUnsignedLongLong, R"(0 {"m":)", "}"},
};

class IntegerBounds : public TableTest {};

TEST_F(IntegerBounds, HoldInEveryCall)
{
    for (const auto& call : kCalls)
        for (const std::string& strWord : split(call.strWords, '|')) {
            Table table(database_, R"({"m":{"cpptype":")" + strWord + "\"}}", "m");
            for (const Written& row : kWritten) {
                const std::string strCall = replaced(call.strCall, '$', row.szValue);
                SCOPED_TRACE(strWord + ", " + strCall);
                const std::string strEnd = row.*call.pszColumn;
                const Ended ended = called(table.api, strCall);
                EXPECT_EQ("T" == strEnd ? strEnd : call.strBefore + strEnd + call.strAfter,
                          ended.whole());
                EXPECT_EQ("-1" == ended.strEnd, !takeLog().empty());
            }
        }
}

// Integers that another program stored, as text.
TEST_F(IntegerBounds, HoldInRowsWrittenByAnotherProgram)
{
    for (const char* szWord : {"int", "unsigned int", "long long", "unsigned long long"}) {
        Table table(database_, std::string(R"({"m":{"cpptype":")") + szWord + "\"}}", "m");
        const bool blLong = std::string::npos != std::string(szWord).find("long");
        for (const char* szStored :
             {"-99999999999999999999", "-9223372036854775809", "-9223372036854775808",
              "-2147483649", "-2147483648", "2147483647", "2147483648", "4294967295", "4294967296",
              "9223372036854775807", "9223372036854775808", "18446744073709551615",
              "18446744073709551616"}) {
            SCOPED_TRACE(std::string(szWord) + " " + szStored);
            database_.run("delete from " + table.strName + "; insert into " + table.strName +
                          " values ('" + szStored + "')");
            Json::Value jRequest;
            Json::Value jRecord;
            EXPECT_EQ(1, table.api.recGetOne(jRequest, jRecord));
            const long long iRead = strtoll(szStored, nullptr, 10);
            EXPECT_EQ(blLong ? iRead : std::clamp<long long>(iRead, INT_MIN, INT_MAX),
                      jRecord["m"].asInt64());
            EXPECT_EQ(Json::intValue, jRecord["m"].type());
        }
    }
}

}  // namespace
