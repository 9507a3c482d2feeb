// SPDX-License-Identifier: MIT
#include "support/matrix.h"

#include <cstdlib>
#include <filesystem>

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
