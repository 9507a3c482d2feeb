// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON text as the library reads and writes it, against jsoncpp's own reader and writer: the same
// kinds, values, order, offsets, text and exceptions. The first byte of the input chooses the
// locales, the rest is the text of a column.

#include "support/target.h"

#include <VornJsonDbApi.h>

#include <json/reader.h>
#include <json/writer.h>
#include <sqlite3.h>

#include <cerrno>
#include <clocale>
#include <cstdlib>
#include <cstring>
#include <locale>
#include <memory>

namespace {

// Null where no row is to be handed over.
const char* szColumn = nullptr;

struct Host {
    Host()
    {
        jDefinition["t"]["member"]["j"]["cpptype"] = "Json::Value";
        require(SQLITE_OK == sqlite3_open(":memory:", &pDb), "no database");
        pApi = std::make_unique<VornJsonDbApi>(pDb, strName, jDefinition, strCreate);
    }

    std::string strName = "t";
    std::string strCreate = "create table t (j)";
    Json::Value jDefinition;
    sqlite3* pDb = nullptr;
    std::unique_ptr<VornJsonDbApi> pApi;
};

struct DecimalComma : std::numpunct<char> {
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

// The C library's locale, the one of C++, or both have a decimal comma.
void chooseLocales(unsigned uChosen)
{
    static const bool blFound = [] {
        setenv("LOCPATH", VORN_LOCALES, 1);
        return nullptr != setlocale(LC_NUMERIC, "de_DE.UTF-8");
    }();
    require(blFound, "there is no locale with a decimal comma");
    static const std::locale comma(std::locale::classic(), new DecimalComma);
    std::locale::global(0 == (uChosen & 2) ? std::locale::classic() : comma);
    setlocale(LC_NUMERIC, 0 == (uChosen & 1) ? "C" : "de_DE.UTF-8");
}

bool isSame(const Json::Value& jLeft, const Json::Value& jRight)
{
    if (jLeft.type() != jRight.type() || jLeft.size() != jRight.size() ||
        jLeft.getOffsetStart() != jRight.getOffsetStart() ||
        jLeft.getOffsetLimit() != jRight.getOffsetLimit())
        return false;
    if (jLeft.isDouble()) {
        const double dLeft = jLeft.asDouble();
        const double dRight = jRight.asDouble();
        return 0 == memcmp(&dLeft, &dRight, sizeof(dLeft));
    }
    if (!jLeft.isArray() && !jLeft.isObject()) return jLeft == jRight;
    auto right = jRight.begin();
    for (auto left = jLeft.begin(); left != jLeft.end(); ++left, ++right)
        if (left.key() != right.key() || !isSame(*left, *right)) return false;
    return true;
}

// What a parse throws, or leaves in errno beside the value.
template <typename Parse>
std::string parsed(Json::Value& jValue, Parse parse)
{
    try {
        errno = 0;
        parse(jValue);
        return std::to_string(errno);
    } catch (const std::exception& error) {
        return error.what();
    }
}

Json::Value readByLibrary(VornJsonDbApi& api, const std::string& strText)
{
    Json::Value jRequest;
    Json::Value jRows;
    szColumn = strText.c_str();
    const int iResult = api.recList(jRequest, jRows);
    szColumn = nullptr;
    require(0 == iResult && 1 == jRows.size(), "recList");
    return jRows[0]["j"];
}

void readByJsoncpp(const std::string& strText, Json::Value& jValue)
{
    static const std::unique_ptr<Json::CharReader> pReader = [] {
        Json::CharReaderBuilder builder;
        builder["collectComments"] = false;
        builder["allowSpecialFloats"] = true;
        builder["stackLimit"] = 1000;
        return std::unique_ptr<Json::CharReader>(builder.newCharReader());
    }();
    try {
        pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, nullptr);
    } catch (const Json::RuntimeError& error) {
        if (nullptr == strstr(error.what(), "stackLimit")) throw;
        jValue = Json::Value();
    }
}

std::string writtenByLibrary(VornJsonDbApi& api, const Json::Value& jValue)
{
    Json::Value jRequest;
    jRequest["limit"] = jValue;
    std::string strText;
    require(0 == api.SqlFilterConditionFromJson(jRequest, strText), "limit");
    return strText;
}

std::string writtenByJsoncpp(const Json::Value& jValue)
{
    Json::StreamWriterBuilder builder;
    builder["commentStyle"] = "None";
    builder["indentation"] = "";
    builder["emitUTF8"] = true;
    builder["useSpecialFloats"] = true;
    builder["precision"] = 17;
    return " LIMIT " + Json::writeString(builder, jValue);
}

}  // namespace

// Hands a row over instead of running a statement.
extern "C" int sqlite3_exec(sqlite3*, const char*, int (*callback)(void*, int, char**, char**),
                            void* arg, char**)
{
    char szName[] = "j";
    char* names[] = {szName};
    char* values[] = {const_cast<char*>(szColumn)};
    if (nullptr == callback || nullptr == szColumn) return SQLITE_OK;
    return 0 == callback(arg, 1, values, names) ? SQLITE_OK : SQLITE_ABORT;
}

void testInput(const std::string& strInput)
{
    static Host& host = *new Host;
    if (strInput.empty()) return;
    chooseLocales(static_cast<unsigned char>(strInput[0]));
    // A text ends at its first NUL byte.
    const std::string strText = strInput.c_str() + 1;
    Json::Value jOwn;
    Json::Value jReference;
    const std::string strReference =
        parsed(jReference, [&](Json::Value& jValue) { readByJsoncpp(strText, jValue); });
    // What the first reading has learnt of the text's objects is used by the second.
    for (int i = 0; i < 2; ++i) {
        const std::string strOwn =
            parsed(jOwn, [&](Json::Value& jValue) { jValue = readByLibrary(*host.pApi, strText); });
        require(strOwn == strReference, "thrown or errno: ", strOwn, " for ", strReference);
        require(isSame(jOwn, jReference), "read: ", writtenByJsoncpp(jOwn), " for ",
                writtenByJsoncpp(jReference));
    }
    const std::string strWritten = writtenByLibrary(*host.pApi, jReference);
    const std::string strExpected = writtenByJsoncpp(jReference);
    require(strWritten == strExpected, "written: ", strWritten, " for ", strExpected);
    chooseLocales(0);
}
