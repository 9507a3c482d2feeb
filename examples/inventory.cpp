// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// An inventory on VornJsonTable.h: creates items, finds a duplicate, changes a quantity, reads
/// pages, and imports JSON lines, all of them or none.
///
/// Prices are integers of the smallest unit, so they are compared and sorted as numbers.
#include <VornJsonTable.h>

#include <json/reader.h>
#include <json/writer.h>

#include <iostream>
#include <sstream>
#include <stdexcept>

// The library reads these two flags, and the host defines them. False and false: what SQLite
// refuses is logged to syslog, and nothing else is logged.
bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

constexpr char kDefinition[] = R"({"item": {"member": {
    "cents": {"cpptype": "long long"},
    "name":  {"cpptype": "string"},
    "qty":   {"cpptype": "long long", "cppDefaultValue": 0},
    "sku":   {"cpptype": "string"},
    "tags":  {"cpptype": "Json::arrayValue"}}}})";
constexpr char kCreate[] =
    "create table if not exists item (sku text primary key, name text not null unique, cents "
    "integer, qty integer, "
    "tags json text)";

constexpr char kGood[] = R"({"sku": "C-1", "name": "Chisel", "cents": 1250, "qty": 5}
{"sku": "D-1", "name": "Drill", "cents": 8999, "tags": ["tool", "sale"]}
{"sku": "E-1", "name": "Easel", "cents": 4500}
)";
constexpr char kBad[] = R"({"sku": "F-1", "name": "File", "cents": 700}
{"sku": "G-1", "name": "Glue", "cents": 3.5}
)";

// Reads JSON strictly: no name twice in an object, nothing after the value.
Json::Value parsed(const std::string& strText)
{
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jValue;
    std::string strErrors;
    const char* szText = strText.data();
    if (!pReader->parse(szText, szText + strText.size(), &jValue, &strErrors))
        throw std::runtime_error(strErrors);
    return jValue;
}

void print(const char* szWhat, const Json::Value& jValue)
{
    Json::StreamWriterBuilder oneLine;
    oneLine["indentation"] = "";
    std::cout << szWhat << ' ' << Json::writeString(oneLine, jValue) << '\n';
}

// After -1, the reason: here it ends the program.
long long done(const VornJsonTable& items, long long iResult)
{
    if (0 > iResult) throw std::runtime_error(items.reason());
    return iResult;
}

void run(sqlite3* pDb, const char* szSql)
{
    if (SQLITE_OK != sqlite3_exec(pDb, szSql, nullptr, nullptr, nullptr))
        throw std::runtime_error(sqlite3_errmsg(pDb));
}

// Prints the number of the line that failed, and why. Batches keep the memory small, and the host's
// transaction makes them one import.
void importLines(sqlite3* pDb, VornJsonTable& items, std::istream& stream)
{
    constexpr Json::ArrayIndex kBatch = 500;
    long long nLines = 0;
    run(pDb, "begin immediate");
    try {
        std::string strLine;
        Json::Value jBatch(Json::arrayValue);
        for (bool blMore = true; blMore;) {
            blMore = static_cast<bool>(std::getline(stream, strLine));
            if (blMore) {
                ++nLines;
                jBatch.append(parsed(strLine));
                if (kBatch > jBatch.size()) continue;
            }
            if (0 > items.createMany(jBatch)) {
                const long long iRecord = items.record();
                if (0 > iRecord) done(items, -1);
                // The batch ends with this line. The reason begins with "record 7: ".
                nLines -= jBatch.size() - 1 - iRecord;
                const std::string& strReason = items.reason();
                throw std::runtime_error(strReason.substr(strReason.find(": ") + 2));
            }
            jBatch.clear();
        }
        run(pDb, "commit");
        std::cout << "imported " << nLines << '\n';
    } catch (const std::exception& failure) {
        // SQLite may have rolled back by itself.
        if (0 == sqlite3_get_autocommit(pDb)) run(pDb, "rollback");
        std::cout << "not imported, line " << nLines << ": " << failure.what() << '\n';
    }
}

void useItems(sqlite3* pDb)
{
    VornJsonTable items(pDb, "item", parsed(kDefinition), kCreate);
    if (!items.reason().empty()) throw std::runtime_error(items.reason());

    Json::Value jHammer;
    Json::Value jStored;
    jHammer["sku"] = "A-1";
    jHammer["name"] = "Hammer";
    jHammer["cents"] = 1999;
    jHammer["qty"] = 10;
    done(items, items.create(jHammer, jStored));
    print("created", jStored);

    // columns() names the constraint: what to tell the user is up to the host.
    jHammer["sku"] = "A-2";
    if (0 > items.create(jHammer, jStored)) {
        if (VornJsonTable::Cause::kDuplicate != items.cause()) done(items, -1);
        for (const std::string& strColumn : items.columns())
            std::cout << "taken: " << strColumn << '\n';
    }

    std::istringstream bad(kBad);
    importLines(pDb, items, bad);
    std::istringstream good(kGood);
    importLines(pDb, items, good);

    // Five are sold. 0: somebody else has changed the quantity, so read it again.
    done(items, items.get(parsed(R"({"sku": "A-1"})"), jStored));
    Json::Value jAsRead;
    Json::Value jLess;
    jAsRead["sku"] = jStored["sku"];
    jAsRead["qty"] = jStored["qty"];
    jLess["qty"] = jStored["qty"].asInt64() - 5;
    std::cout << "sold " << done(items, items.update(jAsRead, jLess)) << '\n';
    std::cout << "sold " << done(items, items.update(jAsRead, jLess)) << '\n';

    // Pages of two, the cheapest first. The first page has no "after".
    const Json::Value jCondition = parsed(R"({"cents": {"$lt": 5000}})");
    Json::Value jOptions = parsed(R"({"sort": ["cents"], "limit": 2})");
    Json::Value jPage;
    while (0 < done(items, items.list(jCondition, jOptions, jPage))) {
        print("page", jPage);
        jOptions["after"] = jPage[jPage.size() - 1];
    }
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb);
    try {
        if (blDone) useItems(pDb);
    } catch (const std::exception& failure) {
        std::cerr << failure.what() << '\n';
        blDone = false;
    }
    // A connection is closed even when it could not be opened.
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
