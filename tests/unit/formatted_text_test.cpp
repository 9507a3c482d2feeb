// SPDX-License-Identifier: MIT
// Value lists behind texts that hold conversions of SQLite's formatter: what a "%" in the text so
// far makes of the values that follow.

#include "support/database.h"

#include <cstring>

namespace {

constexpr long long kIntegerValue = 0x123456789abcdef;
constexpr double kFloatValue = 1234567.890625;
const char kTextValue[] = "O'Br\"i\xc3\xa9n";

// One handle per kind of value; each has the one member "v".
class FormattedValues : public TableTest {
protected:
    // The value list behind strPrefix without the ") " that closes it.
    std::string expand(Table& table, const std::string& strPrefix, const Json::Value& jValue)
    {
        Json::Value jRecord;
        jRecord["v"] = jValue;
        std::string strSql = strPrefix;
        EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strSql, jRecord)) << strPrefix;
        EXPECT_EQ(Lines(), takeLog());
        const std::size_t nText = strSql.size() < 2 ? 0 : strSql.size() - 2;
        EXPECT_EQ(") ", strSql.substr(nText)) << strPrefix;
        return strSql.substr(0, nText);
    }

    std::string behindInteger(const std::string& strPrefix, long long iValue = kIntegerValue)
    {
        return expand(integer_, strPrefix, Json::Int64(iValue));
    }
    std::string behindFloat(const std::string& strPrefix)
    {
        return expand(floating_, strPrefix, kFloatValue);
    }
    std::string behindText(const std::string& strPrefix, const char* szValue = kTextValue)
    {
        return expand(text_, strPrefix, szValue);
    }

    Table integer_{database_, R"({"v":{"cpptype":"long long"}})", "v"};
    Table floating_{database_, R"({"v":{"cpptype":"double"}})", "v"};
    Table text_{database_, R"({"v":{"cpptype":"string"}})", "v"};
};

// SQLite's own formatter with an argument of the right type.
template <typename... Arguments>
std::string sqliteText(const std::string& strFormat, Arguments... arguments)
{
    char* szText = sqlite3_mprintf(strFormat.c_str(), arguments...);
    const std::string strText = szText;
    sqlite3_free(szText);
    return strText;
}

enum class Kind { kInteger, kFloat, kText };

// One conversion on its own, given the value where it is of the value's kind.
std::string expectedPiece(const std::string& strHead, const std::string& strLength, char cType,
                          Kind kind)
{
    const std::string strFormat = strHead + strLength + ('z' == cType ? 's' : cType);
    if ('n' == cType) return "";
    if ('%' == cType) return sqliteText(strFormat);
    if (nullptr != strchr("feEgG", cType))
        return sqliteText(strFormat, Kind::kFloat == kind ? kFloatValue : 0.0);
    if (nullptr != strchr("szqQw", cType))
        return sqliteText(strFormat, Kind::kText == kind ? kTextValue : nullptr);
    const long long iValue = Kind::kInteger == kind ? kIntegerValue : 0;
    if ('c' == cType) return sqliteText(strFormat, static_cast<unsigned>(iValue));
    if ('p' == cType || "ll" == strLength) return sqliteText(strFormat, iValue);
    if ("l" == strLength) return sqliteText(strFormat, static_cast<long>(iValue));
    return sqliteText(strFormat, static_cast<int>(iValue));
}

class FormattedGrammar : public FormattedValues, public testing::WithParamInterface<char> {
protected:
    void expectAll(const std::string& strHead, const std::string& strLength);
};

void FormattedGrammar::expectAll(const std::string& strHead, const std::string& strLength)
{
    const char cType = GetParam();
    const std::string strPrefix = "<" + strHead + strLength + cType + ">";
    const bool blTakes = '%' != cType;
    const auto expected = [&](Kind kind, const std::string& strValue, const std::string& strNone) {
        const std::string strPiece = expectedPiece(strHead, strLength, cType, kind);
        // A character of code 0 ends the text.
        if ('c' == cType && Kind::kInteger != kind) return "<" + strPiece;
        return "<" + strPiece + ">" + (blTakes ? strNone : strValue);
    };
    EXPECT_EQ(expected(Kind::kInteger, std::to_string(kIntegerValue), "0"),
              behindInteger(strPrefix))
        << strPrefix;
    EXPECT_EQ(expected(Kind::kFloat, "1234567.890625", "0.000000"), behindFloat(strPrefix))
        << strPrefix;
    EXPECT_EQ(expected(Kind::kText, "'O''Br\"i\xc3\xa9n'", "NULL"), behindText(strPrefix))
        << strPrefix;
}

TEST_P(FormattedGrammar, FormatsEachConversionOnItsOwn)
{
    for (const char* szFlags :
         {"", "-", "+", " ", "#", "!", "0", ",", "-0", "+,", "#0!", "--", "- +#!0,"})
        for (const char* szWidth : {"", "1", "7", "30"})
            for (const char* szPrecision : {"", ".", ".0", ".3", ".25"})
                for (const char* szLength : {"", "l", "ll"})
                    expectAll(std::string("%") + szFlags + szWidth + szPrecision, szLength);
}

std::string typeName(const testing::TestParamInfo<char>& type)
{
    return '%' == type.param ? "percent" : std::string(1, type.param);
}

INSTANTIATE_TEST_SUITE_P(Types, FormattedGrammar,
                         testing::Values('d', 'i', 'u', 'x', 'X', 'o', 'p', 'r', 'f', 'e', 'E', 'g',
                                         'G', 'c', 's', 'z', 'q', 'Q', 'w', 'n', '%'),
                         typeName);

TEST_F(FormattedValues, GiveTheFirstSlotToTheValueOnlyInItsOwnKind)
{
    const struct {
        const char* szPrefix;
        const char* szInteger;  // 7
        const char* szText;     // x
    } cases[] = {
        {"%d,%d,", "7,0,0", "0,0,NULL"},
        {"%s,%s,", ",,0", "x,,NULL"},
        {"%Q,%Q,", "NULL,NULL,0", "'x',NULL,NULL"},
        {"%q,", "(NULL),0", "x,NULL"},
        {"%w,", "(NULL),0", "x,NULL"},
        {"%z,%z,", ",,0", "x,,NULL"},
        {"%f,%d,", "0.000000,0,0", "0.000000,0,NULL"},
        {"%s,%d,", ",0,0", "x,0,NULL"},
        {"%d,%s,", "7,,0", "0,,NULL"},
        {"%n%d,", "0,0", "0,NULL"},
        {"%d%n,", "7,0", "0,NULL"},
        {"%n", "0", "NULL"},
        {"%%%d,", "%7,0", "%0,NULL"},
        {"%d%%,", "7%,0", "0%,NULL"},
        {"%d%d%d%d%d%d%d%d%d%d,", "7000000000,0", "0000000000,NULL"},
        {"%*d,", "0,0", "0,NULL"},
        {"%*s,", ",0", ",NULL"},
        {"%.*d,", "0,0", "0,NULL"},
        {"%.*s,", ",0", ",NULL"},
        {"%*.*d,%d,", "0,0,0", "0,0,NULL"},
        {"%*%,", "%,0", "%,NULL"},
        {"%*n,", ",0", ",NULL"},
        {"%-*d,", "0,0", "0,NULL"},
        {"%*lld,", "0,0", "0,NULL"},
        {"%.*lld,", "0,0", "0,NULL"},
        {"%*.3d,", "000,0", "000,NULL"},
        {"%5.*d,", "    0,0", "    0,NULL"},
        {"%c|", "\a|0", ""},
        {"%d%c|", "7", "0"},
        {"%d%5c|", "7    ", "0    "},
        {"%d%-5c|", "7", "0"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szPrefix);
        EXPECT_EQ(c.szInteger, behindInteger(c.szPrefix, 7));
        EXPECT_EQ(c.szText, behindText(c.szPrefix, "x"));
    }
}

TEST_F(FormattedValues, NarrowTheValueByItsLength)
{
    const bool blLong64 = 8 == sizeof(long);
    EXPECT_EQ("-1985229329,0", behindInteger("%d,"));
    EXPECT_EQ(blLong64 ? "81985529216486895,0" : "-1985229329,0", behindInteger("%ld,"));
    EXPECT_EQ("81985529216486895,0", behindInteger("%lld,"));
    EXPECT_EQ("89abcdef,0", behindInteger("%x,"));
    EXPECT_EQ(blLong64 ? "123456789abcdef,0" : "89abcdef,0", behindInteger("%lx,"));
    EXPECT_EQ("123456789abcdef,0", behindInteger("%llx,"));
    EXPECT_EQ(8 == sizeof(void*) ? "123456789ABCDEF,0" : "89ABCDEF,0", behindInteger("%p,"));
    EXPECT_EQ("4294967295,0", behindInteger("%u,", -1));
    EXPECT_EQ("18446744073709551615,0", behindInteger("%llu,", -1));
    EXPECT_EQ("0,0", behindInteger("%d,", 0x100000000));
    EXPECT_EQ("1st,0", behindInteger("%r,", 1));
    EXPECT_EQ("112th,0", behindInteger("%r,", 112));
    EXPECT_EQ("A,0", behindInteger("%c,", 65));
    EXPECT_EQ("\xf0\x9f\x90\x8e,0", behindInteger("%c,", 0x1f40e));
    // Its low 32 bits are 0.
    EXPECT_EQ("<", behindInteger("<%c,", 0x100000000));
    EXPECT_EQ("<", behindInteger("<%c,", 0));
}

TEST_F(FormattedValues, EndAtAConversionThatIsNone)
{
    for (const char* szEnd :
         {"%k",        "%T",   "%S",    "%lT",  "%llS", "%5S",  "% T",     "%-",   "%5",
          "%.5",       "%.",   "%l",    "%ll",  "%lll", "%5-d", "%-5+d",   "%..d", "%.-5d",
          "%**d",      "%*5d", "%.*5d", "%5*d", "%l5d", "%L",   "%h",      "%'",   "%)",
          "%\xc3\xa9", "%\n",  "%D",    "%F",   "%a",   "%I",   "%5.5.5d", "%;"}) {
        SCOPED_TRACE(szEnd);
        // A control character keeps the new conversion's "%" from being merged.
        const std::string strEnd = std::string(szEnd) + '\x01';
        EXPECT_EQ("<", behindInteger("<" + strEnd));
        EXPECT_EQ("<7|", behindInteger("<%lld|" + strEnd + "%d", 7));
        EXPECT_EQ("<x|", behindText("<%s|" + strEnd + "%s", "x"));
        EXPECT_EQ("<%", behindText("<%%" + strEnd));
    }
}

TEST_F(FormattedValues, MergeAPercentSignAtTheEndWithTheNewConversion)
{
    EXPECT_EQ("100%lld", behindInteger("100%"));
    EXPECT_EQ("100%Q", behindText("100%"));
    EXPECT_EQ("100%lf", behindFloat("100%"));
    EXPECT_EQ("    %lld", behindInteger("%5"));
    EXPECT_EQ("%    lld", behindInteger("%-5"));
    EXPECT_EQ("%Q", behindText("%l"));
    EXPECT_EQ("%Q", behindText("%.3ll"));
    EXPECT_EQ("7%lld", behindInteger("%lld%", 7));
    EXPECT_EQ("100%7", behindInteger("100%%", 7));
    EXPECT_EQ("100%%lld", behindInteger("100%%%"));
    EXPECT_EQ("%*NULL", behindText("%*%*"));
}

TEST_F(FormattedValues, CutAtANulByte)
{
    const auto withNul = [](const char* szBefore, const char* szBehind) {
        return szBefore + std::string(1, '\0') + szBehind;
    };
    EXPECT_EQ("a", behindInteger(withNul("a", "b")));
    EXPECT_EQ("a%", behindInteger(withNul("a%", "b")));
    EXPECT_EQ("a%", behindInteger(withNul("a%%", "b%d")));
    EXPECT_EQ("a7", behindInteger(withNul("a%lld", "%d"), 7));
    EXPECT_EQ("ax", behindText(withNul("a%s", "%s"), "x"));
    EXPECT_EQ("", behindText(withNul("", "%s%n%z"), "x"));
    EXPECT_EQ("", behindText(withNul("%5", "d"), "x"));
}

TEST_F(FormattedValues, LimitWidthAndPrecision)
{
    const std::string strBlanks(4095, ' ');
    const std::string strZeros(4096, '0');
    const struct {
        const char* szPrefix;
        std::string strInteger;  // 7
    } cases[] = {
        {"%4096d|", strBlanks + "7|0"},
        {"%4097d|", strBlanks + "7|0"},
        {"%5000lld|", strBlanks + "7|0"},
        {"%1000000000d|", strBlanks + "7|0"},
        {"%2147483647d|", strBlanks + "7|0"},
        {"%99999999999999999999d|", strBlanks + "7|0"},
        // The number wraps at 32 bits and loses its sign, as in SQLite.
        {"%4294967301d|", "    7|0"},
        {"%2147483653d|", "    7|0"},
        {"%4294967296d|", "7|0"},
        {"%.4294967299d|", "007|0"},
        {"%-5000d|", "7" + strBlanks + "|0"},
        {"%05000d|", strZeros.substr(1) + "7|0"},
        {"%.4096d|", strZeros.substr(1) + "7|0"},
        {"%.5000d|", strZeros.substr(1) + "7|0"},
        {"%.2147483647d|", strZeros.substr(1) + "7|0"},
        {"%.1000000000f|", sqliteText("%.4096f", 0.0) + "|0"},
        {"%1000000000s|", strBlanks + " |0"},
        {"%1000000000%|", strBlanks + "%|7"},
        {"%1000000000n|", "|0"},
        // Also where the described call reads the value alone, or nothing.
        {"%5000lld|%k", strBlanks + "7|"},
        {"%5000", strBlanks + "%lld"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szPrefix);
        EXPECT_EQ(c.strInteger, behindInteger(c.szPrefix, 7));
    }
    EXPECT_EQ(strBlanks + "x|NULL", behindText("%999999999s|", "x"));
    EXPECT_EQ("x|NULL", behindText("%.999999999s|", "x"));
    EXPECT_EQ(std::string(4096, 'A') + "|0", behindInteger("%.999999999c|", 'A'));
}

TEST_F(FormattedValues, KeepTextOfAnyLength)
{
    // A limit is on fields, not on texts.
    const std::string strLong(100000, 'y');
    EXPECT_EQ(strLong + "|NULL", behindText("%s|", strLong.c_str()));
    EXPECT_EQ(strLong + "%'x'", behindText(strLong + "%%", "x"));
    EXPECT_EQ("'" + strLong + "'", behindText("", strLong.c_str()));
}

}  // namespace
