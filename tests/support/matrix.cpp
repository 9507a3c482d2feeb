// SPDX-License-Identifier: MIT
#include "support/matrix.h"

#include <cstdlib>
#include <filesystem>
#include <sstream>

std::vector<std::string> split(const std::string& strText, char cSeparator)
{
    std::vector<std::string> parts;
    std::istringstream stream(strText);
    for (std::string strPart; std::getline(stream, strPart, cSeparator);)
        if (!strPart.empty()) parts.push_back(strPart);
    return parts;
}

void expectSound(Database& database, VornJsonDbApi& api, const std::string& strRecord)
{
    EXPECT_EQ(nullptr, sqlite3_next_stmt(database.get(), nullptr));
    EXPECT_NE(0, sqlite3_get_autocommit(database.get()));
    Json::Value jRecord = json(strRecord);
    EXPECT_EQ(0, api.recSave(jRecord, true));
    EXPECT_EQ(json(strRecord), jRecord);
    EXPECT_EQ(Lines(), takeLog());
}

void endProcess(const Database& database)
{
    if (!database.path().empty()) std::filesystem::remove(database.path());
    exit(testing::Test::HasFailure() ? 1 : 0);
}
