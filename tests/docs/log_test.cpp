// SPDX-License-Identifier: MIT
// docs/log.md: its list of lines is complete, and its forms and examples are what the library
// writes.

#include "support/database.h"
#include "support/markdown.h"

#include <unistd.h>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <regex>
#include <set>

namespace {

using doubles::LogRecord;
using doubles::state;

std::string replaced(const std::string& strText, const std::string& strPattern,
                     const std::string& strBy)
{
    return std::regex_replace(strText, std::regex(strPattern), strBy);
}

// The lines as the page shows them: another process, other line numbers.
std::string withoutPlaces(const std::string& strText)
{
    const std::string strNoLines = replaced(strText, "(VornJsonDbApi|util):[0-9]+", "$1:LINE");
    return replaced(strNoLines, "\\((4711|" + std::to_string(getpid()) + ")\\)", "(PID)");
}

// Several lines of the list may share a cell.
std::vector<std::string> textsOf(const std::string& strCell)
{
    static const std::string strBetween = "`<br>`";
    std::vector<std::string> texts;
    std::size_t nBegin = 0;
    for (std::size_t nEnd; std::string::npos != (nEnd = strCell.find(strBetween, nBegin));
         nBegin = nEnd + strBetween.size())
        texts.push_back(strCell.substr(nBegin, nEnd - nBegin));
    texts.push_back(strCell.substr(nBegin));
    return texts;
}

std::set<std::string> goldenList()
{
    std::set<std::string> texts;
    std::ifstream file(VORN_TEST_DATA "/messages.txt");
    for (std::string strLine; std::getline(file, strLine);)
        if (0 != strLine.find("# ")) texts.insert(strLine);
    return texts;
}

class DocsLog : public HostTest {
protected:
    // The rows of the list: every table that begins with a column "Line" or "Text".
    std::vector<std::vector<std::string>> listRows() const
    {
        std::vector<std::vector<std::string>> rows;
        for (const MarkdownSection& candidate : page_)
            for (const MarkdownTable& table : candidate.tables)
                if ("Line" == table.header.at(0) || "Text" == table.header.at(0))
                    rows.insert(rows.end(), table.rows.begin(), table.rows.end());
        return rows;
    }

    std::set<std::string> listedTexts() const
    {
        std::set<std::string> texts;
        for (const auto& row : listRows())
            for (const std::string& strText : textsOf(row.at(0)))
                EXPECT_TRUE(texts.insert(strText).second) << "twice: " << strText;
        return texts;
    }

    // What the host of the examples has logged since the last call, in one piece.
    static std::string logged()
    {
        std::string strLog;
        for (const LogRecord& record : std::exchange(state().log, {})) {
            strLog += record.strText;
            if (record.blSyslog && '\n' != strLog.back()) strLog += '\n';
        }
        return strLog;
    }

    // The errno of what is logged is part of the examples, so the database is in memory.
    Database database_{std::string(":memory:")};
    MarkdownPage page_ = readPage("log.md");
};

// With the table of the examples.
class DocsLogExamples : public DocsLog {
protected:
    Json::Value jDefinition_ = json(fence(page_, "How to read a chain", "json"));
    std::string strName_ = jDefinition_.getMemberNames().at(0);
    std::string strCreate_ = fence(page_, "How to read a chain", "sql");
    VornJsonDbApi api_{database_.get(), strName_, jDefinition_, strCreate_};
};

TEST_F(DocsLog, ListsEveryTextOfTheLibrary)
{
    const std::set<std::string> listed = listedTexts();
    for (const std::string& strText : goldenList())
        EXPECT_EQ(1U, listed.count(strText)) << "not on the page: " << strText;
}

TEST_F(DocsLog, ListsNoOtherText)
{
    const std::set<std::string> golden = goldenList();
    EXPECT_LT(90U, golden.size());
    for (const std::string& strText : listedTexts())
        EXPECT_EQ(1U, golden.count(strText)) << "not in the library: " << strText;
}

// Context and trace lines need nothing to be done.
TEST_F(DocsLog, SaysOfEveryLineWhatItMeans)
{
    for (const auto& row : listRows()) {
        ASSERT_LE(2U, row.size());
        EXPECT_NE("", row[1]) << row[0];
        const bool blNothingToDo = 0 == row[1].find("Context") || 0 == row[1].find("Trace");
        EXPECT_TRUE(2 == row.size() || blNothingToDo || !row[2].empty()) << row[0];
    }
}

TEST_F(DocsLog, NamesTheTraceLines)
{
    std::set<std::string> onThePage;
    for (const auto& row : listRows())
        if (0 == row.at(1).find("Trace:")) onThePage.insert(row[0]);

    std::set<std::string> inTheSources;
    const std::regex trace(R"re(if \(blDebugOutput\)\s+LOG_PLAIN\("([^"]*)")re");
    for (const auto& entry : std::filesystem::recursive_directory_iterator(VORN_SOURCES)) {
        if (!entry.is_regular_file()) continue;
        std::ifstream file(entry.path());
        const std::string strSource{std::istreambuf_iterator<char>(file), {}};
        for (std::sregex_iterator it(strSource.begin(), strSource.end(), trace), end; it != end;
             ++it)
            inTheSources.insert((*it)[1]);
    }
    EXPECT_EQ(inTheSources, onThePage);
    EXPECT_EQ(4U, onThePage.size());
}

TEST_F(DocsLogExamples, TheForms)
{
    const std::string strError = "Failed [0 >= strSql.length()], err=";
    const std::string strPlain = ", run sql failed, error=Unknow Error!!, sql=";
    for (const auto& row : table(page_, "The forms", 6).rows) {
        const std::string strFamily = row[0];
        const std::string strWhere = row[1];
        SCOPED_TRACE(strFamily + ", " + strWhere);
        blLogToStdout = "standard output" == strWhere;
        const int iErrno = "syslog, `errno` set" == strWhere ? ENOENT : 0;
        errno = iErrno;
        EXPECT_EQ(-1, api_.runSqlEx(""));
        const auto lines = std::exchange(state().log, {});
        ASSERT_EQ(2U, lines.size());
        const LogRecord& line = lines["plain" == strFamily];
        EXPECT_EQ(blLogToStdout, !line.blSyslog);

        const std::string strErrno = strerror(iErrno);
        const std::string strText = "error" == strFamily
                                        ? strError + strErrno
                                        : "i=0,errno=" + std::to_string(iErrno) + strPlain;
        std::string strForm = replaced(row[2], "FILE", "VornJsonDbApi");
        strForm = replaced(strForm, "ERRNO", strErrno);
        strForm = replaced(strForm, "TEXT", strText);
        const std::string strEnd =
            std::string("error" == strFamily, '\n') + std::string(blLogToStdout, '\n');
        EXPECT_EQ(strForm + strEnd, withoutPlaces(line.strText));
    }
}

TEST_F(DocsLogExamples, ADuplicate)
{
    const char* szHeading = "Example: a duplicate";
    Json::Value jRecord = json(fence(page_, szHeading, "json"));
    Json::Value jStored;
    EXPECT_EQ(0, api_.recCreate(jRecord, jStored));
    blLogToStdout = true;
    EXPECT_EQ(-1, api_.recCreate(jRecord, jStored));
    EXPECT_EQ(withoutPlaces(fence(page_, szHeading, "log")), withoutPlaces(logged()));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", api_.getErrMsg());
}

TEST_F(DocsLogExamples, ARowThatCannotBeRead)
{
    const char* szHeading = "Example: a row that cannot be read";
    database_.run("insert into " + strName_ + " values (8,1,0.5,'x')");
    Json::Value jRequest = json(fence(page_, szHeading, "json"));
    Json::Value jRecords;
    EXPECT_EQ(-1, api_.recList(jRequest, jRecords));
    EXPECT_EQ(withoutPlaces(fence(page_, szHeading, "log")), withoutPlaces(logged()));
}

TEST_F(DocsLogExamples, WhatSqliteSays)
{
    for (const auto& row : table(page_, "What SQLite says", 4).rows) {
        SCOPED_TRACE(row[1]);
        Json::Value jRequest = json(row[1]);
        Json::Value jRecords;
        EXPECT_EQ(-1, api_.recList(jRequest, jRecords));
        const std::string strLog = logged();
        EXPECT_NE(std::string::npos, strLog.find("run sql failed, error=" + row[0])) << strLog;
    }
}

TEST_F(DocsLogExamples, AGapInTheStatement)
{
    for (const auto& row : table(page_, "A gap in the statement", 3).rows) {
        SCOPED_TRACE(row[1]);
        Json::Value jParam = json(row[1]);
        Json::Value jOut;
        const bool blSave = "recSave" == row[0];
        EXPECT_TRUE(blSave || "recList" == row[0]);
        EXPECT_EQ(-1, blSave ? api_.recSave(jParam, true) : api_.recList(jParam, jOut));
        const std::string strLog = logged();
        EXPECT_NE(std::string::npos, strLog.find("error=near \")\": syntax error, sql=")) << strLog;
        EXPECT_NE(std::string::npos, strLog.find(row[2])) << strLog;
        EXPECT_EQ(blSave ? 0 : -1, api_.recCreate(jParam, jOut));
        logged();
    }
    for (const char* szRequest : {R"({"id":null,"who":"x"})", R"({"id":[],"who":"x"})"}) {
        Json::Value jRequest = json(szRequest);
        Json::Value jRecords;
        EXPECT_EQ(-1, api_.recList(jRequest, jRecords));
        EXPECT_NE(std::string::npos, logged().find("error=near \"and\": syntax error"));
    }
    for (const char* szMembers : {"", R"("member":{})"}) {
        std::string strName = freshName();
        std::string strCreate = "create table " + strName + " (a)";
        Json::Value jDefinition = json("{\"" + strName + "\":{" + szMembers + "}}");
        VornJsonDbApi api(database_.get(), strName, jDefinition, strCreate);
        Json::Value jRecord = json(R"({"a":1})");
        Json::Value jStored;
        EXPECT_EQ(-1, api.recCreate(jRecord, jStored));
        EXPECT_NE(std::string::npos,
                  logged().find("error=near \")\": syntax error, sql=INSERT INTO " + strName +
                                " () VALUES (;"));
    }
}

// A table or block that the tests above do not know would be compared by nobody.
TEST_F(DocsLog, HasNoOtherTableOrBlock)
{
    std::size_t nTables = 0;
    std::size_t nBlocks = 0;
    for (const MarkdownSection& candidate : page_) {
        nBlocks += candidate.fences.size();
        for (const MarkdownTable& table : candidate.tables)
            nTables += "Line" != table.header.at(0) && "Text" != table.header.at(0);
    }
    EXPECT_EQ(3U, nTables);
    EXPECT_EQ(6U, nBlocks);
}

}  // namespace
