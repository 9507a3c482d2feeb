// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "hostile/hostile_roles.h"

#include <iterator>
#include <utility>

namespace {

const char* const kTexts[] = {
    // Quotes and SQL.
    "", " ", "'", "''", "'''", "\"", "\"\"", "`", "[", "]", "\\", "\\'", "\\\"", "\\\\", "/", "//",
    "/*", "*/", "/* x", "--", "-- x", ";", ";;", ",", "(", ")", ") ", "()", "')", "')--", "');--",
    "'; drop table x; --", "\"; drop table x; --", "x'); delete from sqlite_master; --", "1 or 1=1",
    "' or '1'='1", "' or 1=1 --", "'||'", "' union select 1 --", "null", "NULL", "x'00'", "X'27'",
    "char(39)", "?1", ":a", "@a", "$a", "last_insert_rowid()", "rowid", "pragma writable_schema=1",
    "attach ':memory:' as y", "select * from sqlite_master", "commit", "rollback;", "begin;", "{}",
    "[]", "{\"k\":1}", "[1", "true", "0", "-1", "1e999", "9223372036854775808", "0x7fffffff", "NaN",
    "Infinity", "UNIQUE constraint failed: x.y", "database is locked", "DUPLICATE_PRIMARY_KEY",
    "../../etc/x", "<script>x</script>", "&amp;", "${HOME}", "$(id)", "`id`", "\\u0000", "\\x00",
    "\\0", "\\n", "a\r\nb", "a\n\nb", "\ttab\t", "1", "1=1", "1;", "1; select 1",
    "1); select 1; --", "1); drop table victim; --", "1); delete from victim where (1", "1) or (1",
    "1) order by (1", "0) union select 1 from (select 1", "(select 1)",
    "(select count(*) from sqlite_master)", "exists (select 1)", "case when 1 then 1 end",
    "1 collate nocase", "1 limit 0", "1 limit 1 offset 1", "1 group by 1", "1 -- x", "1 /* x",
    "1 /* x */", "'' or ''=''", "'; select 1; '", "x' or 'x'='x", "'x' || 'y", "\" or \"\"=\"",
    "\"; select 1; \"", "`; select 1; `", "] or [1", "x''y", "'''; select 1; '''",
    "\\'; select 1; --", "values (1)", "with x as (select 1) select * from x", "explain select 1",
    "savepoint x", "release x", "begin immediate", "end;", "vacuum", "reindex", "analyze",
    "pragma user_version", "pragma foreign_keys=on;", "detach main", "create table victim (a)",
    "create temp table victim (a)", "drop table victim", "load_extension('x')", "randomblob(10)",
    "zeroblob(10)", "printf('%s%n', 'x')", "raise(abort, 'x')", "abs(-9223372036854775808)",
    "likelihood(1, 2)", "1 = ?", "1 = :x", "1e400", "-9223372036854775809", "18446744073709551616",
    "0x8000000000000000", "0x", "1_000", "1e", ".5.", "vornSqlWhereFilter", "sort_by", "member",
    "cpptype", "Json::Value ", " string", "STRING", "int ", "long  long",
    "{\"vornSqlWhereFilter\":\"1\"}", "{\"a\":1,}", "[[[[[[[[[[", "\"unterminated", "\"\\ud800\"",
    "/* c */ 1",
    // Lines that look like those of a log, and what a terminal obeys.
    "\n", "\r\n", "a\n", "\nb", "\n\n(1) VornJsonDbApi:1 forged",
    "x\n(1) VornJsonDbApi:1 (VornJsonDbApi:1)(Success)Failed [!pDb], err=Success\n\n",
    "x\nVornJsonDbApi:1 (1)i=0,errno=none, run sql failed, error=none, sql=select 1",
    "x\nutil:1 (1)(util:1)(Success)Failed [jTableDef.empty()], err=Success",
    "x\nsql error, err=UNIQUE constraint failed: t.id, sql=", "x, sql=select 1",
    "Failed [!pDb], err=Success", "<3>kernel: forged", "Jan  1 00:00:00 host program[1]: forged",
    "x\rforged over the line", "x\033[2K\033[1Aforged", "\033]0;title\007", "\033[31mred\033[0m",
    "x\b\b\b\bforged", "\x7f", "x\v\fy", "err=%m", "%m%m%m%m", "errno=eleven,",
    // Unicode: no width, another direction, look-alikes of quotes and percent signs.
    "\u017elu\u0165ou\u010dk\u00fd k\u016f\u0148", "\u041f\u0440\u0438", "\u4e2d\u6587",
    "\U0001f40e", "\U0001f469\u200d\U0001f469", "e\u0301", "\uff07", "\u02bc", "\u2018x\u2019",
    "\uff05s", "\ufe6ad", "\u200e", "\u200f", "\u061c", "\u202a", "\u202b", "\u202c", "\u202d",
    "\u202e", "a\u202eb", "\u2066", "\u2067", "\u2068", "\u2069", "\u200b", "\u200c", "\u200d",
    "\ufeff", "\u2060", "\u00a0", "\u2028", "\u2029", "\ufffd", "\uffff",
    "\u05e9\u05dc\u05d5\u05dd", "\U0010ffff", "\U000e0001", "\u202e'; select 1; --", "'\u202e--",
    "\u2066%s\u2069", "\u200f%\u200f", "\u05d0%n\u05d0", "\ufeff'", "\u200b'\u200b", "\u00ad",
    "\u180e", "\U0001f3f4\U000e0067\U000e007f", "\u0300\u0300\u0300\u0300\u0300",
    "\u1100\u1161\u11a8", "\ufdfa", "\u0130i\u0131I", "\ufb00", "\u212a",
    // Not UTF-8.
    "\x80", "\xbf", "\xff", "\xfe", "\xff\xfe", "\xc3", "a\xc3", "\xc3'", "\xe2\x80", "\xe2\x80'",
    "\xf0\x9f\x90", "\xf0", "\xc0\xa7", "\xc0\x80", "\xe0\x80\xa7", "\xed\xa0\x80", "\xed\xbf\xbf",
    "\xf4\x90\x80\x80", "\xf8\x88\x80\x80\x80", "\xc0\xa5s", "x\x80y\xffz", "\x80\"", "\xc3\\",
    // Conversions.
    "%", "%%", "%%%", "%%%%", "100%", "100% sure", "% d", "%-5", "%5s", "%.5s", "%.0s", "%*d",
    "%*s", "%.*s", "%*.*s", "%ll", "%lld", "%llu", "%lf", "%ls", "%ln", "%lln", "%!s", "%#Q",
    "%0999d", "%99999999d", "%2147483647d", "%2147483648s", "%4294967295d", "%.2147483647d",
    "%.999999999f", "%.99999999c", "%s%s%s%s%s%s%s%s", "%n%n%n%n%n%n", "%z%z%z%z%z%z",
    "%d%n%s%z%c%p%f", "%c%c%c%c", "%1$s", "%1$n", "%hn", "%hhn", "%jd", "%Lf", "%\u00e9",
    "\xff%s\xff", "'%s'; drop table x; --", "%Q; --", "%'q", "x%20y", "50%off", "%%s%%n",
    "%%%s%%%n", "a%nb%nc"};

std::vector<std::string> made()
{
    std::vector<std::string> strings(std::begin(kTexts), std::end(kTexts));
    for (const char c : std::string("sznqQwdiuxXoprcfeEgGTSk'\"),laCm-5.*"))
        strings.push_back(std::string("%") + c);
    // Each letter as a conversion for which no argument is left.
    for (char c = 'a'; c <= 'z'; ++c) strings.push_back(std::string("%d%d%") + c + "'");
    // Control characters, one byte and two bytes long.
    for (char c = 1; c < 32; ++c) strings.push_back(std::string("a") + c + "b");
    for (int i = 0x80; i < 0xa0; ++i) strings.push_back({'\xc2', static_cast<char>(i)});
    using namespace std::string_literals;
    for (const std::string& strWithNul : {"\0"s, "\0\0"s, "a\0b"s, "%\0s"s, "'\0'"s,
                                          "\0'; select 1; --"s, "%\0%s\0%n"s, "a\nb\0c\nd"s})
        strings.push_back(strWithNul);
    constexpr std::pair<std::size_t, char> kLong[] = {
        {1000, '\0'},    {2000, '%'},   {5000, ';'},    {30000, '"'}, {30000, '\\'},
        {30000, '\xff'}, {50000, '\n'}, {100000, '\''}, {100000, 'x'}};
    for (const auto& [nLength, c] : kLong) strings.emplace_back(nLength, c);
    strings.push_back(std::string(900, '(') + "1" + std::string(900, ')'));
    return strings;
}

}  // namespace

const std::vector<std::string>& hostileStrings()
{
    static const std::vector<std::string> strings = made();
    return strings;
}
