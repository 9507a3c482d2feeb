// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/rows.h"

#include <algorithm>
#include <cerrno>
#include <utility>

doubles::RowCallback rowCallback(Table& table)
{
    doubles::RowCallback taken = nullptr;
    doubles::state().exec = [&](sqlite3*, const char*, doubles::RowCallback callback, void*,
                                char**) {
        taken = callback;
        return SQLITE_ERROR;
    };
    Json::Value jRecord(Json::objectValue);
    EXPECT_EQ(-1, table.api.recSave(jRecord, true));
    doubles::state().exec = nullptr;
    doubles::state().statements.clear();
    takeLog();
    EXPECT_NE(nullptr, taken);
    return taken;
}

int Row::handTo(doubles::RowCallback callback, void* arg)
{
    const auto texts = [](std::vector<const char*>& list) {
        return list.empty() ? nullptr : const_cast<char**>(list.data());
    };
    const auto nLonger = static_cast<int>(std::max(names.size(), values.size()));
    return callback(arg, nColumns.value_or(nLonger), texts(values), texts(names));
}

doubles::Exec execOfRows(std::vector<Row> rows)
{
    return [rows = std::move(rows)](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                                    char** errText) mutable {
        const bool blStopped = std::any_of(
            rows.begin(), rows.end(), [&](Row& row) { return 0 != row.handTo(callback, arg); });
        return blStopped ? End{SQLITE_ABORT, "query aborted"}.leaveIn(errText) : SQLITE_OK;
    };
}

int End::leaveIn(char** errText) const
{
    if (nullptr != szError) *errText = doubles::errorText(szError);
    if (0 != iErrno) errno = iErrno;
    return iStatus;
}

doubles::Exec execOfEnds(std::vector<End> ends)
{
    return [ends = std::move(ends), n = std::size_t{0}](sqlite3*, const char*, doubles::RowCallback,
                                                        void*, char** errText) mutable {
        return ends[std::min(n++, ends.size() - 1)].leaveIn(errText);
    };
}

doubles::Exec execCalledLocked(int nTimes)
{
    return [nTimes](sqlite3* pDb, const char* szSql, doubles::RowCallback callback, void* arg,
                    char** errText) mutable {
        const int iStatus = doubles::realExec(pDb, szSql, callback, arg, errText);
        return 0 > --nTimes ? iStatus : End{SQLITE_BUSY, "database is locked"}.leaveIn(errText);
    };
}

Lines statementStopped(const Lines& field, const Row& row)
{
    Lines traced;
    if (1 < row.names.size()) {
        const std::string strPlace = "[" + std::to_string(row.names.size() - 1) + "]=";
        const auto shown = [](const char* szText) { return szText ? szText : "(null)"; };
        traced = {plain("column_name" + strPlace + shown(row.names.back())),
                  plain("column_value" + strPlace + shown(row.values.back()))};
    }
    return rowRefused(field, traced) + Lines{runFailed("query aborted", "a text")};
}

Lines takeLogWithoutTypes()
{
    const std::string strHead = utilPlain("jType={");
    Lines lines = takeLog();
    for (std::string& strLine : lines)
        if (0 == strLine.compare(0, strHead.size(), strHead)) strLine = strHead + "...}";
    return lines;
}

std::string RunSqlTest::lastSqlError()
{
    doubles::state().log.clear();
    Json::Value jRecord = json(R"({"Unsavable":1})");
    EXPECT_EQ(-1, table_.api.recSave(jRecord, true));
    const std::string strHead = plain("sql error, err=");
    const std::string strTail = ", sql=INSERT INTO " + table_.strName + " (Unsavable,) VALUES (";
    for (const std::string& strLine : takeLog()) {
        if (0 != strLine.compare(0, strHead.size(), strHead)) continue;
        const std::size_t nTail = strLine.rfind(strTail);
        EXPECT_NE(std::string::npos, nTail) << strLine;
        return strLine.substr(strHead.size(), nTail - strHead.size());
    }
    return std::string();
}

const char DecoderTest::kMembers[] = R"({
    "s": {"cpptype": "string"}, "i": {"cpptype": "int"}, "ui": {"cpptype": "unsigned int"},
    "u": {"cpptype": "unsigned"}, "l": {"cpptype": "long"}, "ul": {"cpptype": "unsigned long"},
    "ll": {"cpptype": "long long"}, "ull": {"cpptype": "unsigned long long"},
    "f": {"cpptype": "float"}, "d": {"cpptype": "double"}, "b": {"cpptype": "bool"},
    "j": {"cpptype": "Json::Value"}, "jo": {"cpptype": "Json::objectValue"},
    "ja": {"cpptype": "Json::arrayValue"}, "uid": {"cpptype": "uid_t"},
    "t": {"cpptype": "time_t"}, "none": {"cpptype": "no such word"}, "case": {"cpptype": "Int"},
    "empty": {"cpptype": ""}, "other": {"cpptype": "string"}})";

std::string DecoderTest::rowsOf(const std::string& strSql)
{
    rows_ = Json::nullValue;
    EXPECT_EQ(0, run(strSql)) << strSql;
    EXPECT_EQ(Lines(), takeLog()) << strSql;
    return text(rows_);
}

std::string DecoderTest::decoded(std::vector<Row> rows, const char* szBefore)
{
    doubles::state().exec = execOfRows(std::move(rows));
    return decoded(table_, szBefore);
}

std::string DecoderTest::decoded(Table& table, const char* szBefore)
{
    rows_ = json(szBefore);
    try {
        iResult_ = table.api.runSqlEx("a text", callback_, &rows_);
    } catch (const Json::LogicError&) {
        return "Json::LogicError after " + text(rows_);
    }
    return text(rows_);
}
