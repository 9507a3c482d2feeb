// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The header as the only thing that a host includes: it declares what the host needs to open its
// connection and to read and write JSON.
#include <VornJsonDbApi.h>

bool blLogToStdout = false;
bool blDebugOutput = false;

std::string useHeader(const std::string& strDefinition);

std::string useHeader(const std::string& strDefinition)
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) return sqlite3_errmsg(pDb);

    Json::Value jDefinition;
    Json::CharReaderBuilder reader;
    Json::CharReader* pReader = reader.newCharReader();
    const char* szBegin = strDefinition.c_str();
    pReader->parse(szBegin, szBegin + strDefinition.size(), &jDefinition, nullptr);
    delete pReader;

    std::string strName = "task";
    std::string strCreate = "create table task (id integer primary key)";
    VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
    return Json::writeString(Json::StreamWriterBuilder(), jDefinition);
}
