// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// bench_texts CONTENDER KIND BYTES, run under callgrind like bench_count: what it takes to list
// rows with one JSON member whose text has about so many bytes ("library"), and what jsoncpp's own
// reader, kept and without comments, takes to parse the texts alone ("jsoncpp").
#include "workload.h"

#include <VornJsonDbApi.h>

#include <json/reader.h>
#include <valgrind/callgrind.h>

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>

namespace {

constexpr int kRows = 10;

// No string is longer than 40 bytes.
std::string item(const std::string& strKind, int i)
{
    const std::string strNumber = std::to_string(i * 7919 % 1000003);
    if ("objects" == strKind)
        return R"({"done":true,"group":"g)" + std::to_string(i % 5) + R"(","id":)" + strNumber +
               R"(,"name":"item )" + strNumber + "\"}";
    if ("nested" == strKind)
        return R"({"at":{"in":{"k":null,"l":[1,2]},"x":)" + strNumber +
               R"(,"y":1},"tags":["a","b"],"z":{"deep":{"deeper":false}}})";
    if ("integers" == strKind) return strNumber;
    if ("doubles" == strKind) return strNumber + "." + std::to_string(i * 7919LL % 999983);
    bench::must("escapes" == strKind, "no such kind");
    return R"("line )" + strNumber + R"(\n\t\"q\u00e9\" end")";
}

std::string textOf(const std::string& strKind, std::size_t nBytes)
{
    std::string strText = "[";
    for (int i = 0; strText.size() < nBytes; ++i)
        strText.append(1 < strText.size() ? "," : "").append(item(strKind, i));
    return strText + "]";
}

void listRows(const std::string& strText)
{
    sqlite3* const pDb = bench::openInMemory();
    std::string strName = "texts";
    std::string strCreate = "CREATE TABLE texts (j)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["j"]["cpptype"] = "Json::arrayValue";
    VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
    for (int i = 0; i < kRows; ++i) bench::run(pDb, "INSERT INTO texts VALUES ('" + strText + "')");
    const auto list = [&] {
        Json::Value jRequest;
        Json::Value jRows;
        bench::must(0 == api.recList(jRequest, jRows) && kRows == jRows.size(), "recList");
    };
    list();
    CALLGRIND_START_INSTRUMENTATION;
    list();
    CALLGRIND_STOP_INSTRUMENTATION;
}

void parseTexts(const std::string& strText)
{
    Json::CharReaderBuilder builder;
    builder["collectComments"] = false;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    const auto parse = [&] {
        Json::Value jRows;
        for (int i = 0; i < kRows; ++i)
            bench::must(pReader->parse(strText.data(), strText.data() + strText.size(),
                                       &jRows.append(Json::Value()), nullptr),
                        "parse");
    };
    parse();
    CALLGRIND_START_INSTRUMENTATION;
    parse();
    CALLGRIND_STOP_INSTRUMENTATION;
}

}  // namespace

int main(int argc, char** argv)
{
    bench::must(4 == argc, "usage: bench_texts CONTENDER KIND BYTES");
    const std::string strText = textOf(argv[2], static_cast<std::size_t>(atol(argv[3])));
    if (std::string("library") == argv[1])
        listRows(strText);
    else
        parseTexts(strText);
    printf("{\"calls\": %d}\n", kRows);
    return 0;
}
