// SPDX-License-Identifier: MIT
// An update by filter as its tests run it, and the lines that its failures end with.
#pragma once

#include "support/records.h"

#include <string>

class UpdateByFilterTest : public RecordsTest {
protected:
    inline static const std::string kNoUpdate = failed("0 > recUpdateByWhere(jParamIn, strSql)");
    inline static const std::string kNotRun = failed("0 > runSqlEx(strSql, NULL, NULL)");

    int update(const std::string& strFilter, const std::string& strValues)
    {
        jFilter_ = json(strFilter);
        jValues_ = json(strValues);
        const int iResult = table_.api.recUpdateByFilter(jFilter_, jValues_);
        EXPECT_EQ(json(strFilter), jFilter_) << "the filter was changed";
        EXPECT_EQ(json(strValues), jValues_) << "the values were changed";
        return iResult;
    }

    std::string statement(const std::string& strTail) const
    {
        return "UPDATE " + table_.strName + " SET " + strTail;
    }

    static std::string summary(const std::string& strValues)
    {
        return plain("recUpdateByFilter failed, jParamIn=" + strValues);
    }

    // The lines of a statement that SQLite refused, down to the summary.
    static Lines refused(const std::string& strError, const std::string& strSql,
                         const std::string& strValues)
    {
        return {runFailed(strError, strSql), kNotRun,   plain("jRecIn=" + strValues),
                sqlError(strError, strSql),  kNoUpdate, summary(strValues)};
    }

    Json::Value jFilter_;
    Json::Value jValues_;
};
