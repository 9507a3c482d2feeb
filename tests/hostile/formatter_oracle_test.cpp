// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Value lists against SQLite's own formatter.

#include "support/formatter_oracle.h"
#include "support/database.h"

#include <cmath>
#include <cstring>
#include <map>
#include <random>

namespace {

using formatter_oracle::described;
using formatter_oracle::isComparable;
using formatter_oracle::Value;

constexpr int kTexts = 100000;

class Generator {
public:
    std::string text()
    {
        std::string strText;
        for (unsigned i = number(7); 0 < i; --i) strText += piece();
        // Where the new conversion is never reached, an earlier one may read the value.
        if (0 == number(4)) strText += conversion("diuxXoprfeEgGsqQw") + piece() + "%k";
        return strText;
    }

    Value value()
    {
        switch (number(4)) {
        case 0: return {"%Q", anyOf({"x", "", "it's", "100%", "%s%n", "\u017e\U0001f40e", "\"\n"})};
        case 1: return {"%lld", Json::Value(Json::Int64(random_() >> number(64)))};
        case 2: return {"%llu", Json::Value(Json::UInt64(random_() >> number(64)))};
        default: return {"%lf", Json::Value(real())};
        }
    }

    unsigned number(unsigned uBelow) { return static_cast<unsigned>(random_() % uBelow); }

private:
    std::string anyOf(std::initializer_list<const char*> texts)
    {
        return *(texts.begin() + number(static_cast<unsigned>(texts.size())));
    }

    double real()
    {
        const double dMantissa = static_cast<double>(number(2000000)) - 1000000;
        return std::ldexp(dMantissa, static_cast<int>(number(40)) - 20);
    }

    std::string conversion(const char* szTypes)
    {
        std::string strText = "%";
        for (unsigned i = number(3); 0 < i; --i) strText += "-+ #!0,"[number(7)];
        if (0 == number(3))
            strText += anyOf({"1", "5", "12", "40", "4096", "4097", "99999999999", "*"});
        if (0 == number(3))
            strText += anyOf({".", ".0", ".3", ".17", ".400", ".5000", ".*", "..", ".-1"});
        strText += anyOf({"", "", "l", "ll", "ll", "ll"});
        return strText + szTypes[number(static_cast<unsigned>(strlen(szTypes)))];
    }

    std::string piece()
    {
        switch (number(16)) {
        case 0: return conversion("diuxXoprfeEgGcszqQwn");
        case 1: return conversion("diuxXoprfeEgGsqQw");
        case 2: return conversion("%");
        case 3: return conversion("kTSDhL'\")(; \t*.l9");
        case 4: return "%%";
        case 5: return "%";
        case 6: return anyOf({"'", "\"", "''", "`", "\\"});
        case 7:
            return 0 == number(4) ? std::string(1, '\0')
                                  : anyOf({"\xc3\xa9", "\xf0\x9f\x90\x8e", "\xff", "\xe2\x80\xae"});
        case 8: return anyOf({"0", "17", "4096", "4294967301"});
        case 9: return std::string(1, "diuxXoprfeEgGcszqQwnl.*-+ #!0,"[number(30)]);
        default: return anyOf({"a", "INSERT INTO t (a,b) VALUES (", ",", ") ", "x y", "\n", "--"});
        }
    }

    std::mt19937_64 random_{20250131};
};

using FormatterOracle = TableTest;

TEST_F(FormatterOracle, AgreesWithSqliteWhereverTheResultIsDefined)
{
    std::map<std::string, Table> tables;
    for (const auto& [szConversion, szWord] :
         {std::pair("%Q", "string"), std::pair("%lld", "long long"),
          std::pair("%llu", "unsigned long long"), std::pair("%lf", "double")})
        tables.try_emplace(szConversion, database_,
                           std::string(R"({"v":{"cpptype":")") + szWord + R"("}})", "v");
    Generator generator;
    int iComparable = 0;
    int iWithPercent = 0;
    int iEarlierRead = 0;
    for (int i = 0; i < kTexts && !HasFailure(); ++i) {
        const std::string strText = generator.text();
        const Value value = generator.value();
        Json::Value jRecord;
        jRecord["v"] = value.jValue;
        std::string strSql = strText;
        ASSERT_EQ(0, tables.at(value.szConversion).api.SqlExpandMemberSymbol(strSql, jRecord));
        ASSERT_LE(2U, strSql.size());
        ASSERT_EQ(") ", strSql.substr(strSql.size() - 2));

        const std::string strFormat = strText + value.szConversion;
        if (!isComparable(strFormat, value)) continue;
        ++iComparable;
        if (std::string::npos != strText.find('%')) ++iWithPercent;
        if (1 == formatter_oracle::countReads(strText.c_str())) ++iEarlierRead;
        EXPECT_EQ(described(strFormat, value) + ") ", strSql)
            << "text " << testing::PrintToString(strText) << ", value " << text(value.jValue);
    }
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_LT(50000, iComparable);
    EXPECT_LT(25000, iWithPercent);
    EXPECT_LT(1000, iEarlierRead);
}

TEST_F(FormatterOracle, KnowsWhichCallsAreDefined)
{
    const struct {
        Value value;
        bool blDefined;
        std::vector<const char*> formats;
    } cases[] = {
        {{"%lld", 7},
         true,
         {"a%lld", "%lld%k%lld", "%%lld", "%%%lld", "%k%n%lld", "%4096lld", "%p%k%lld",
          "%004096lld", "%5", "%"}},
        {{"%lld", 7},
         false,
         {"%lld%lld", "%d%k%lld", "%n%lld", "%s%k%lld", "%*d%k%lld", "%*%%lld", "%4097lld",
          "%ld%k%lld", "%c%k%lld", "%4294967301lld"}},
        {{"%Q", "x"}, true, {"%s%k%Q"}},
        {{"%Q", "x"}, false, {"%z%k%Q"}},
        {{"%lf", 1.5}, true, {"%5.3f%k", "%f"}},
        {{"%lf", 1.5}, false, {"%.5000f", "%x%k%lf"}},
    };
    for (const auto& row : cases)
        for (const char* szFormat : row.formats)
            EXPECT_EQ(row.blDefined, isComparable(szFormat, row.value)) << szFormat;
}

}  // namespace
