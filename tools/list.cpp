// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "list.h"

#include "commands.h"
#include "failure.h"
#include "json_text.h"

#include <algorithm>
#include <sstream>

namespace tool {

namespace {

// Records of a page. SQLite may sort all of them for each page if an order is asked for.
constexpr long long kPage = 1000;
constexpr long long kSortedPage = 10000;

// -created,name
Json::Value sortOf(const std::string& strNames)
{
    Json::Value jSort(Json::arrayValue);
    std::istringstream names(strNames);
    for (std::string strName; std::getline(names, strName, ',');) jSort.append(strName);
    return jSort;
}

// What "after" needs of the last record: the order and the key.
Json::Value placeOf(const Json::Value& jRecord, const Json::Value& jSort, const Table& table)
{
    Json::Value jPlace;
    const auto copy = [&](const std::string& strMember) {
        if (jRecord.isMember(strMember)) jPlace[strMember] = jRecord[strMember];
    };
    for (const Json::Value& jName : jSort) {
        const std::string strName = jName.asString();
        copy('-' == strName[0] ? strName.substr(1) : strName);
    }
    for (const std::string& strMember : table.pRecords->key()) {
        if (!jRecord.isMember(strMember))
            throw Failure("member " + toText(strMember) +
                          ": null in the key of a record, which no page can follow");
        copy(strMember);
    }
    return jPlace;
}

}  // namespace

void forEachRecord(const Table& table, const Arguments& arguments,
                   const std::function<void(const Json::Value& jRecord)>& use)
{
    const Json::Value jCondition = parseArgument(arguments.value(2, "{}"), "CONDITION");
    Json::Value jOptions;
    jOptions["sort"] = sortOf(arguments.option("sort"));
    if (arguments.has("after"))
        jOptions["after"] = parseJson(arguments.option("after"), {"option --after"});
    jOptions["offset"] = Json::Int64(arguments.number("offset", 0, 0));
    long long nLeft = arguments.number("limit", 0, INT64_MAX);
    const long long nPage = jOptions["sort"].empty() ? kPage : kSortedPage;
    const Transaction sameState(table.database.get(), "begin");
    for (bool blMore = true; blMore;) {
        const long long nAsked = std::min(nLeft, nPage);
        jOptions["limit"] = Json::Int64(nAsked);
        Json::Value jRecords;
        table.checked(table.pRecords->list(jCondition, jOptions, jRecords));
        for (const Json::Value& jRecord : jRecords) use(jRecord);
        nLeft -= nAsked;
        blMore = 0 < nLeft && nAsked == static_cast<long long>(jRecords.size());
        if (blMore)
            jOptions["after"] = placeOf(jRecords[jRecords.size() - 1], jOptions["sort"], table);
        jOptions["offset"] = 0;
    }
}

int list(const Arguments& arguments, Output& output)
{
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kExisting);
    forEachRecord(table, arguments, [&](const Json::Value& jRecord) { output.line(jRecord); });
    return kDone;
}

}  // namespace tool
