// SPDX-License-Identifier: MIT
#include "support/hostile_more.h"

#include <iterator>

namespace {

const char* const kLogLines[] = {
    "\n",
    "\r\n",
    "a\n",
    "\nb",
    "\n\n(1) VornJsonDbApi:1 forged",
    "x\n(1) VornJsonDbApi:1 (VornJsonDbApi:1)(Success)Failed [!pDb], err=Success\n\n",
    "x\nVornJsonDbApi:1 (1)i=0,errno=none, run sql failed, error=none, sql=select 1",
    "x\nutil:1 (1)(util:1)(Success)Failed [jTableDef.empty()], err=Success",
    "x\nsql error, err=UNIQUE constraint failed: t.id, sql=",
    "x, sql=select 1",
    "Failed [!pDb], err=Success",
    "<3>kernel: forged",
    "Jan  1 00:00:00 host program[1]: forged",
    "x\rforged over the line",
    "x\033[2K\033[1Aforged",
    "\033]0;title\007",
    "\033[31mred\033[0m",
    "x\b\b\b\bforged",
    "x\v\fy",
    "err=%m",
    "%m%m%m%m",
    "errno=eleven,",
};

const char* const kSql[] = {
    "1",
    "1=1",
    "1;",
    "1; select 1",
    "1); select 1; --",
    "1); drop table victim; --",
    "1); delete from victim where (1",
    "1) or (1",
    "1) order by (1",
    "0) union select 1 from (select 1",
    "(select 1)",
    "(select count(*) from sqlite_master)",
    "exists (select 1)",
    "case when 1 then 1 end",
    "1 collate nocase",
    "1 limit 0",
    "1 limit 1 offset 1",
    "1 group by 1",
    "1 -- x",
    "1 /* x",
    "1 /* x */",
    "'' or ''=''",
    "'; select 1; '",
    "x' or 'x'='x",
    "'x' || 'y",
    "\" or \"\"=\"",
    "\"; select 1; \"",
    "`; select 1; `",
    "] or [1",
    "x''y",
    "'''; select 1; '''",
    "\\'; select 1; --",
    "values (1)",
    "with x as (select 1) select * from x",
    "explain select 1",
    "savepoint x",
    "release x",
    "begin immediate",
    "end;",
    "vacuum",
    "reindex",
    "analyze",
    "pragma user_version",
    "pragma foreign_keys=on;",
    "detach main",
    "create table victim (a)",
    "create temp table victim (a)",
    "drop table victim",
    "load_extension('x')",
    "randomblob(10)",
    "zeroblob(10)",
    "printf('%s%n', 'x')",
    "raise(abort, 'x')",
    "abs(-9223372036854775808)",
    "likelihood(1, 2)",
    "1 = ?",
    "1 = :x",
    "1e400",
    "-9223372036854775809",
    "18446744073709551616",
    "0x8000000000000000",
    "0x",
    "1_000",
    "1e",
    ".5.",
    "vornSqlWhereFilter",
    "sort_by",
    "member",
    "cpptype",
    "Json::Value ",
    " string",
    "STRING",
    "int ",
    "long  long",
    "{\"vornSqlWhereFilter\":\"1\"}",
    "{\"a\":1,}",
    "[[[[[[[[[[",
    "\"unterminated",
    "\"\\ud800\"",
    "/* c */ 1",
};

const char* const kBidirectionalAndWidths[] = {
    "\xe2\x80\xae'; select 1; --",
    "'\xe2\x80\xae--",
    "\xe2\x81\xa6%s\xe2\x81\xa9",
    "\xe2\x80\x8f%\xe2\x80\x8f",
    "\xd7\x90%n\xd7\x90",
    "\xef\xbb\xbf'",
    "\xe2\x80\x8b'\xe2\x80\x8b",
    "\xc2\xad",
    "\xe1\xa0\x8e",
    "\xf0\x9f\x8f\xb4\xf3\xa0\x81\xa7\xf3\xa0\x81\xbf",
    "\xcc\x80\xcc\x80\xcc\x80\xcc\x80\xcc\x80",
    "\xe1\x84\x80\xe1\x85\xa1\xe1\x86\xa8",
    "\xef\xb7\xba",
    "\xc4\xb0i\xc4\xb1I",
    "\xef\xac\x80",
    "\xe2\x84\xaa",
};

}  // namespace

std::vector<std::string> moreHostileStrings()
{
    std::vector<std::string> strings;
    strings.insert(strings.end(), std::begin(kLogLines), std::end(kLogLines));
    strings.insert(strings.end(), std::begin(kSql), std::end(kSql));
    strings.insert(strings.end(), std::begin(kBidirectionalAndWidths),
                   std::end(kBidirectionalAndWidths));
    // Each letter as a conversion that an earlier argument has used up.
    for (char c = 'a'; c <= 'z'; ++c) strings.push_back(std::string("%d%d%") + c + "'");
    // The second block of controls.
    for (int i = 0x80; i < 0xa0; ++i) strings.push_back({'\xc2', static_cast<char>(i)});
    for (int nNuls : {2, 1000}) strings.emplace_back(static_cast<std::size_t>(nNuls), '\0');
    strings.emplace_back("\0'; select 1; --", 16);
    strings.emplace_back("%\0%s\0%n", 7);
    strings.emplace_back("a\nb\0c\nd", 7);
    strings.emplace_back(50000, '\n');
    strings.emplace_back(30000, '"');
    strings.emplace_back(30000, '\\');
    strings.emplace_back(30000, '\xff');
    strings.emplace_back(5000, ';');
    strings.push_back(std::string(900, '(') + "1" + std::string(900, ')'));
    return strings;
}
