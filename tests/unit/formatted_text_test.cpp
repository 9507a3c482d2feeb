// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Value lists after texts that hold conversions of SQLite's formatter: what a "%" in the text so
// far makes of the values that follow.

#include "support/database.h"

#include <cstring>
#include <utility>

namespace {

constexpr long long kIntegerValue = 0x123456789abcdef;
constexpr double kFloatValue = 1234567.890625;
const char kTextValue[] = "O'Br\"i\xc3\xa9n";

class FormattedLists : public TableTest {
protected:
    // What a value list makes of the text before it.
    static std::string values(Table& table, Json::Value jRecord, std::string strSql = "(")
    {
        EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ(Lines(), takeLog());
        return strSql;
    }

    // The same for a record that holds one value, without the ") " that closes the list.
    static std::string with(Table& table, const Json::Value& jValue, const std::string& strPrefix)
    {
        Json::Value jRecord;
        jRecord["b"] = jValue;
        const std::string strSql = values(table, jRecord, strPrefix);
        const std::size_t nText = strSql.size() < 2 ? 0 : strSql.size() - 2;
        EXPECT_EQ(") ", strSql.substr(nText)) << strPrefix;
        return strSql.substr(0, nText);
    }

    std::string withInteger(const std::string& strPrefix, long long iValue = kIntegerValue)
    {
        return with(integer_, Json::Int64(iValue), strPrefix);
    }
    std::string withText(const std::string& strPrefix, const std::string& strValue = kTextValue)
    {
        return with(text_, strValue, strPrefix);
    }

    Table integer_{database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"long long"}})", "a,b"};
    Table text_{database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"string"}})", "a,b"};
    Table float_{database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"double"}})", "a,b"};
    Table json_{database_, R"({"a":{"cpptype":"Json::objectValue"},"b":{"cpptype":"int"}})", "a,b"};
    Table three_{database_,
                 R"({"a":{"cpptype":"string"},"b":{"cpptype":"int"},"c":{"cpptype":"string"}})",
                 "a,b,c"};
};

// Kept: the text is never escaped between the values.
TEST_F(FormattedLists, ReadAPercentSignAsAConversion)
{
    const struct {
        Table& table;
        const char* szRecord;
        const char* szText;
    } cases[] = {
        {integer_, R"({"a":"100%","b":5})", "('100) "},
        {integer_, R"({"a":"100%d","b":5})", "('1005',0) "},
        {integer_, R"({"a":"100%%","b":5})", "('100%',5) "},
        {integer_, R"({"a":"%c","b":39})", "(''',0) "},
        {integer_, R"({"a":"%c","b":0})", "(') "},
        {integer_, R"({"a":"50% discount","b":5})", "('50 5iscount',0) "},
        {text_, R"({"a":"%Q","b":"it's"})", "(''it''s'',NULL) "},
        {text_, R"({"a":"%d","b":"x"})", "('0',NULL) "},
        {text_, R"({"a":"a","b":"100%"})", "('a','100%') "},
        {text_, R"({"a":"100%%","b":"%d"})", "('100%','%d') "},
        {float_, R"({"a":"%g","b":1.5})", "('1.5',0.000000) "},
        {float_, R"({"a":"%d","b":1.5})", "('0',0.000000) "},
        {json_, R"({"a":{"k%d":1},"b":5})", R"(('{"k5":1}',0) )"},
        {json_, R"({"a":{"k":"%"},"b":5})", R"(('{"k":") )"},
        {three_, R"({"a":"100%%%%","b":5,"c":"x"})", "('100%',5,'x') "},
        {three_, R"({"a":"100%%","b":5,"c":"x"})", "('100) "},
        {three_, R"({"a":"%%d","b":5,"c":"x"})", "('0',5,NULL) "},
        {three_, R"({"a":"%%s","b":5,"c":"x"})", "('x',5,NULL) "},
        {three_, R"({"a":"%d","b":5,"c":"x%"})", "('5',0,'x%') "},
        {three_, R"({"a":"%","b":5,"c":"x"})", "(','x') "},
        {three_, R"({"a":"%s","c":"x"})", "('x',NULL) "},
    };
    for (const auto& c : cases) EXPECT_EQ(c.szText, values(c.table, json(c.szRecord)));
}

TEST_F(FormattedLists, ReadAPercentSignInTheStatementToo)
{
    const Json::Value jRecord = json(R"({"a":"x","b":5})");
    EXPECT_EQ("%('x',5) ", values(integer_, jRecord, "%%%%("));
    EXPECT_EQ(") ", values(integer_, jRecord, "%%("));
    EXPECT_EQ("x(NULL,5) ", values(integer_, jRecord, "%s("));
    EXPECT_EQ(",5) ", values(integer_, jRecord, "%k"));
    EXPECT_EQ("100NULL,0) ", values(integer_, jRecord, "100%"));
}

TEST_F(FormattedLists, MakeASaveFailIfTheTextIsCut)
{
    Json::Value jRecord = json(R"({"a":"100%","b":5})");
    EXPECT_EQ(-1, integer_.api.recSave(jRecord, true));
    const std::string strCut =
        "'100) ;select * from " + integer_.strName + " where rowid == last_insert_rowid();";
    const std::string strSql = "INSERT INTO " + integer_.strName + " (a,b) VALUES (" + strCut;
    EXPECT_EQ(Lines{strSql}, takeStatements());
    EXPECT_EQ(plain("sql error, err=unrecognized token: \"" + strCut + "\", sql=" + strSql),
              takeLog().back());
}

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

// One conversion on its own, given the value if it is of the value's kind.
std::string piece(const std::string& strHead, const std::string& strLength, char cType, Kind kind)
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

TEST_F(FormattedLists, FormatEachConversionOnItsOwn)
{
    const auto expectAll = [this](const std::string& strHead, const std::string& strLength,
                                  char cType) {
        const std::string strPrefix = "<" + strHead + strLength + cType + ">";
        SCOPED_TRACE(strPrefix);
        const auto expected = [&](Kind kind, const char* szValue, const char* szNone) {
            const std::string strPiece = "<" + piece(strHead, strLength, cType, kind);
            // A character of code 0 ends the text.
            if ('c' == cType && Kind::kInteger != kind) return strPiece;
            return strPiece + ">" + ('%' == cType ? szValue : szNone);
        };
        EXPECT_EQ(expected(Kind::kInteger, "81985529216486895", "0"), withInteger(strPrefix));
        EXPECT_EQ(expected(Kind::kFloat, "1234567.890625", "0.000000"),
                  with(float_, kFloatValue, strPrefix));
        EXPECT_EQ(expected(Kind::kText, "'O''Br\"i\xc3\xa9n'", "NULL"), withText(strPrefix));
    };
    for (const std::string strFlags :
         {"", "-", "+", " ", "#", "!", "0", ",", "-0", "+,", "#0!", "--", "- +#!0,"})
        for (const char* szWidth : {"", "1", "7", "30"})
            for (const char* szPrecision : {"", ".", ".0", ".3", ".25"})
                for (const char* szLength : {"", "l", "ll"})
                    for (const char cType : std::string("diuxXoprfeEgGcszqQwn%"))
                        expectAll("%" + strFlags + szWidth + szPrecision, szLength, cType);
}

TEST_F(FormattedLists, GiveTheFirstSlotToTheValueOnlyInItsOwnKind)
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
        {"%z,%z,", ",,0", "x,,NULL"},
        {"%f,%d,", "0.000000,0,0", "0.000000,0,NULL"},
        {"%s,%d,", ",0,0", "x,0,NULL"},
        {"%n%d,", "0,0", "0,NULL"},
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
        {"%*.3d,", "000,0", "000,NULL"},
        {"%5.*d,", "    0,0", "    0,NULL"},
        {"%c|", "\a|0", ""},
        {"%d%c|", "7", "0"},
        {"%d%5c|", "7    ", "0    "},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szPrefix);
        EXPECT_EQ(c.szInteger, withInteger(c.szPrefix, 7));
        EXPECT_EQ(c.szText, withText(c.szPrefix, "x"));
    }
}

TEST_F(FormattedLists, NarrowTheValueByTheLengthOfTheConversion)
{
    EXPECT_EQ("4294967295,0", withInteger("%u,", -1));
    EXPECT_EQ("18446744073709551615,0", withInteger("%llu,", -1));
    EXPECT_EQ("0,0", withInteger("%d,", 0x100000000));
    EXPECT_EQ("1st,0", withInteger("%r,", 1));
    EXPECT_EQ("112th,0", withInteger("%r,", 112));
    EXPECT_EQ("A,0", withInteger("%c,", 65));
    EXPECT_EQ("\xf0\x9f\x90\x8e,0", withInteger("%c,", 0x1f40e));
    // Its low 32 bits are 0.
    EXPECT_EQ("<", withInteger("<%c,", 0x100000000));
    EXPECT_EQ("<", withInteger("<%c,", 0));
}

TEST_F(FormattedLists, EndAtAnUnknownConversion)
{
    for (const std::string strUnknown :
         {"%k",        "%T",   "%S",    "%lT",  "%llS", "%5S",  "% T",     "%-",   "%5",
          "%.5",       "%.",   "%l",    "%ll",  "%lll", "%5-d", "%-5+d",   "%..d", "%.-5d",
          "%**d",      "%*5d", "%.*5d", "%5*d", "%l5d", "%L",   "%h",      "%'",   "%)",
          "%\xc3\xa9", "%\n",  "%D",    "%F",   "%a",   "%I",   "%5.5.5d", "%;"}) {
        SCOPED_TRACE(strUnknown);
        // A control character keeps the new conversion's "%" from being merged.
        const std::string strEnd = strUnknown + '\x01';
        EXPECT_EQ("<", withInteger("<" + strEnd));
        EXPECT_EQ("<7|", withInteger("<%lld|" + strEnd + "%d", 7));
        EXPECT_EQ("<x|", withText("<%s|" + strEnd + "%s", "x"));
        EXPECT_EQ("<%", withText("<%%" + strEnd));
    }
}

TEST_F(FormattedLists, MergeAPercentSignAtTheEndWithTheNewConversion)
{
    EXPECT_EQ("100%lld", withInteger("100%"));
    EXPECT_EQ("100%Q", withText("100%"));
    EXPECT_EQ("100%lf", with(float_, kFloatValue, "100%"));
    EXPECT_EQ("    %lld", withInteger("%5"));
    EXPECT_EQ("%    lld", withInteger("%-5"));
    EXPECT_EQ("%Q", withText("%l"));
    EXPECT_EQ("%Q", withText("%.3ll"));
    EXPECT_EQ("7%lld", withInteger("%lld%", 7));
    EXPECT_EQ("100%%lld", withInteger("100%%%"));
    EXPECT_EQ("%*NULL", withText("%*%*"));
}

TEST_F(FormattedLists, CutTheTextAtANulByte)
{
    const std::string strNul(1, '\0');
    EXPECT_EQ("a", withInteger("a" + strNul + "b"));
    EXPECT_EQ("a%", withInteger("a%" + strNul + "b"));
    EXPECT_EQ("a%", withInteger("a%%" + strNul + "b%d"));
    EXPECT_EQ("a7", withInteger("a%lld" + strNul + "%d", 7));
    EXPECT_EQ("ax", withText("a%s" + strNul + "%s", "x"));
    EXPECT_EQ("", withText(strNul + "%s%n%z", "x"));
    EXPECT_EQ("", withText("%5" + strNul + "d", "x"));
}

TEST_F(FormattedLists, LimitWidthAndPrecisionButNotText)
{
    const std::string strBlanks(4095, ' ');
    const std::string strZeros(4095, '0');
    for (const char* szWidth : {"4096", "4097", "5000", "2147483647", "99999999999999999999"})
        for (const char* szType : {"d|", "lld|"})
            EXPECT_EQ(strBlanks + "7|0", withInteger(std::string("%") + szWidth + szType, 7));
    const std::pair<const char*, std::string> cases[] = {
        // The number wraps at 32 bits and loses its sign, as in SQLite.
        {"%4294967301d|", "    7|0"},
        {"%2147483653d|", "    7|0"},
        {"%4294967296d|", "7|0"},
        {"%.4294967299d|", "007|0"},
        {"%-5000d|", "7" + strBlanks + "|0"},
        {"%05000d|", strZeros + "7|0"},
        {"%.4096d|", strZeros + "7|0"},
        {"%.2147483647d|", strZeros + "7|0"},
        {"%.1000000000f|", sqliteText("%.4096f", 0.0) + "|0"},
        {"%1000000000s|", strBlanks + " |0"},
        {"%1000000000%|", strBlanks + "%|7"},
        {"%1000000000n|", "|0"},
        {"%5000", strBlanks + "%lld"},
    };
    for (const auto& [szPrefix, strText] : cases)
        EXPECT_EQ(strText, withInteger(szPrefix, 7)) << szPrefix;
    EXPECT_EQ(strBlanks + "x|NULL", withText("%999999999s|", "x"));
    EXPECT_EQ("x|NULL", withText("%.999999999s|", "x"));
    EXPECT_EQ(std::string(4096, 'A') + "|0", withInteger("%.999999999c|", 'A'));

    const std::string strLong(100000, 'y');
    EXPECT_EQ(strLong + "|NULL", withText("%s|", strLong));
    EXPECT_EQ(strLong + "%'x'", withText(strLong + "%%", "x"));
    EXPECT_EQ("'" + strLong + "'", withText("", strLong));
}

}  // namespace
