// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/target.h"

#include <VornJsonDbApi.h>

#include <json/reader.h>
#include <sqlite3.h>
#include <syslog.h>
#include <unistd.h>
#include <cerrno>
#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

// Renders the line as syslog would, so that its arguments are read, and drops it.
__attribute__((format(printf, 1, 0))) void drop(const char* szFormat, va_list arguments)
{
    char* szLine = nullptr;
    if (0 <= vasprintf(&szLine, szFormat, arguments)) free(szLine);
    // The real one may leave anything in errno.
    errno = ENOTTY;
}

}  // namespace

extern "C" {

void __syslog_chk(int, int, const char*, ...) __attribute__((format(printf, 3, 4)));

void syslog(int /*iPriority*/, const char* szFormat, ...)
{
    va_list arguments;
    va_start(arguments, szFormat);
    drop(szFormat, arguments);
    va_end(arguments);
}

void __syslog_chk(int /*iPriority*/, int /*iFlag*/, const char* szFormat, ...)
{
    va_list arguments;
    va_start(arguments, szFormat);
    drop(szFormat, arguments);
    va_end(arguments);
}

int usleep(useconds_t /*uMicroseconds*/)
{
    return 0;
}

int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize)
{
    // Tries both states of the flag, but each input always in the same one.
    blDebugOutput = 1 == nSize % 2;
    testInput(std::string(reinterpret_cast<const char*>(pData), nSize));

    // With every connection closed nothing may be left but what the first input needed too.
    static const sqlite3_int64 iFirst = sqlite3_memory_used();
    require(sqlite3_memory_used() <= iFirst, "memory of SQLite was not released");
    return 0;
}

}  // extern "C"

void finding(const std::string& strText)
{
    fprintf(stderr, "finding: %s\n", strText.c_str());
    abort();
}

bool parseJson(const std::string& strText, Json::Value& jValue)
{
    static const std::unique_ptr<Json::CharReader> pReader = [] {
        Json::CharReaderBuilder builder;
        Json::CharReaderBuilder::strictMode(&builder.settings_);
        builder["strictRoot"] = false;
        return std::unique_ptr<Json::CharReader>(builder.newCharReader());
    }();
    try {
        return pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, nullptr);
    } catch (const Json::RuntimeError&) {
        return false;
    }
}

void requireResult(const Outcome& outcome, int iLow, int iHigh, const char* szCall)
{
    const bool blDocumented = outcome.blThrew || -1 == outcome.iResult ||
                              (iLow <= outcome.iResult && outcome.iResult <= iHigh);
    require(blDocumented, szCall, " gave ", outcome.iResult);
}
