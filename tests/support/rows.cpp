// SPDX-License-Identifier: MIT
#include "support/rows.h"

#include <utility>

doubles::RowCallback rowCallback(Table& table)
{
    doubles::RowCallback taken = nullptr;
    const doubles::Exec before =
        std::exchange(doubles::state().exec,
                      [&](sqlite3*, const char*, doubles::RowCallback callback, void*, char**) {
                          taken = callback;
                          return SQLITE_ERROR;
                      });
    Json::Value jRecord(Json::objectValue);
    EXPECT_EQ(-1, table.api.recSave(jRecord, true));
    doubles::state().exec = before;
    doubles::state().statements.clear();
    takeLog();
    EXPECT_NE(nullptr, taken);
    return taken;
}

int Row::handTo(doubles::RowCallback callback, void* arg)
{
    return callback(arg, static_cast<int>(names.size()), const_cast<char**>(values.data()),
                    const_cast<char**>(names.data()));
}

doubles::Exec execOfRow(Row row)
{
    return [row](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                 char** errText) mutable {
        if (0 == row.handTo(callback, arg)) return SQLITE_OK;
        *errText = doubles::errorText("query aborted");
        return SQLITE_ABORT;
    };
}

doubles::Exec execOfStatus(int iStatus, const char* szError)
{
    return [=](sqlite3*, const char*, doubles::RowCallback, void*, char** errText) {
        if (nullptr != szError) *errText = doubles::errorText(szError);
        return iStatus;
    };
}

// No value list can hold a member of this type. Its name sorts before those of other members, which
// keeps their column lists complete.
const char kUnsavable[] = R"("Unsavable":{"cpptype":"Json::Value"})";

std::string lastSqlError(Table& table)
{
    doubles::state().log.clear();
    Json::Value jRecord = json(R"({"Unsavable":1})");
    EXPECT_EQ(-1, table.api.recSave(jRecord, true));
    const std::string strHead = plain("sql error, err=");
    const std::string strTail = ", sql=INSERT INTO " + table.strName + " (Unsavable,) VALUES (";
    for (const std::string& strLine : takeLog()) {
        if (0 != strLine.compare(0, strHead.size(), strHead)) continue;
        const std::size_t nTail = strLine.rfind(strTail);
        EXPECT_NE(std::string::npos, nTail) << strLine;
        return strLine.substr(strHead.size(), nTail - strHead.size());
    }
    return std::string();
}
