// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/log.md: its list of lines is complete, and its forms and examples are what the library
// writes.

#include "docs/calls.h"
#include "support/markdown.h"

#include <unistd.h>
#include <cerrno>
#include <cstring>
#include <set>
#include <utility>

namespace {

using doubles::state;

// The page shows another process and other line numbers.
std::string withoutPlaces(const std::string& strText)
{
    const std::string strNoLines = replaced(strText, "(VornJsonDbApi|util):[0-9]+", "$1:LINE");
    return replaced(strNoLines, "\\((4711|" + std::to_string(getpid()) + ")\\)", "(PID)");
}

// What was logged since the last call, in one piece, without places.
std::string takeText()
{
    std::string strLog;
    for (const doubles::LogRecord& record : std::exchange(state().log, {})) {
        strLog += record.strText;
        if (record.blSyslog && '\n' != strLog.back()) strLog += '\n';
    }
    return withoutPlaces(strLog);
}

bool contains(const std::string& strText, const std::string& strPart)
{
    return std::string::npos != strText.find(strPart);
}

// Its tables are the forms, two of examples, and the list of lines in parts.
class LogPage : public HostTest {
protected:
    LogPage() { EXPECT_EQ(6U, page_.blocks.size()); }

    const MarkdownPage page_ = readPage("log.md");
    // The definition and CREATE statement of the examples; a JSON text and its log for each.
    const std::vector<MarkdownBlock>& blocks_ = page_.blocks;
    Json::Value jDefinition_ = json(blocks_.at(0).strText);
    std::string strCreate_ = blocks_.at(1).strText;
    std::string strName_ = jDefinition_.getMemberNames().at(0);
    // In memory, because the examples show errno.
    Database database_{std::string(":memory:")};
    VornJsonDbApi api_{database_.get(), strName_, jDefinition_, strCreate_};
};

TEST_F(LogPage, ListsEveryLineOnceWithItsMeaning)
{
    std::set<std::string> listed;
    std::set<std::string> traces;
    for (std::size_t i = 3; i < page_.tables.size(); ++i) {
        for (const auto& row : page_.tables[i].rows) {
            EXPECT_NE("", row.at(1)) << row[0];
            if (0 == row[1].find("Trace")) traces.insert(row[0]);
            // Several lines may share a cell.
            for (const std::string& strText : matches(row[0] + "`<br>`", "(.*?)`<br>`"))
                EXPECT_TRUE(listed.insert(strText).second) << "twice: " << strText;
        }
    }
    const auto messages = matches(fileText("tests/data/messages.txt"), "(?:^|\n)(?!# )(.+)");
    EXPECT_EQ(std::set<std::string>(messages.begin(), messages.end()), listed);
    const auto traced =
        matches(folderText("src"), R"re(if \(blDebugOutput\)\s+LOG_PLAIN\("([^"]*)")re");
    EXPECT_EQ(std::set<std::string>(traced.begin(), traced.end()), traces);
}

// Of each family: on standard output, on syslog with errno and without.
TEST_F(LogPage, ShowsTheFormsOfTheLines)
{
    const auto& forms = page_.tables.at(0).rows;
    ASSERT_EQ(6U, forms.size());
    for (std::size_t i = 0; i < forms.size(); ++i) {
        const bool blError = "error" == forms[i][0];
        EXPECT_EQ(i < 3, blError);
        blLogToStdout = 0 == i % 3;
        const int iErrno = 1 == i % 3 ? ENOENT : 0;
        errno = iErrno;
        EXPECT_EQ(-1, api_.runSqlEx(""));
        const auto lines = std::exchange(state().log, {});
        const doubles::LogRecord& line = lines.at(blError ? 0 : 1);
        EXPECT_EQ(blLogToStdout, !line.blSyslog);
        std::string strForm = replaced(withoutPlaces(line.strText), "(Failed|i=0,)[^\n]*", "TEXT");
        strForm = replaced(strForm, strerror(iErrno), "ERRNO");
        const std::string strEnd = std::string(blError, '\n') + std::string(blLogToStdout, '\n');
        EXPECT_EQ(forms[i].back() + strEnd, replaced(strForm, "VornJsonDbApi", "FILE"));
    }
}

TEST_F(LogPage, ShowsADuplicate)
{
    EXPECT_NE("-1", created(api_, blocks_[2].strText));
    blLogToStdout = true;
    EXPECT_EQ("-1", created(api_, blocks_[2].strText));
    EXPECT_EQ(withoutPlaces(blocks_[3].strText), takeText());
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", api_.getErrMsg());
}

TEST_F(LogPage, ShowsARowThatCannotBeRead)
{
    database_.run("insert into " + strName_ + " values (8,1,0.5,'x')");
    EXPECT_EQ("-1", listed(api_, blocks_[4].strText));
    EXPECT_EQ(withoutPlaces(blocks_[5].strText), takeText());
}

TEST_F(LogPage, QuotesSqliteCorrectly)
{
    for (const auto& row : page_.tables.at(1).rows) {
        SCOPED_TRACE(row[1]);
        EXPECT_EQ("-1", listed(api_, row[1]));
        EXPECT_PRED2(contains, takeText(), "run sql failed, error=" + row[0]);
    }
}

TEST_F(LogPage, ShowsAGapInTheStatement)
{
    const std::string strGap = "error=near \")\": syntax error, sql=";
    for (const auto& row : page_.tables.at(2).rows) {
        SCOPED_TRACE(row[1]);
        const bool blSave = "recSave" == row[0];
        EXPECT_TRUE(blSave || "recList" == row[0]);
        EXPECT_EQ("-1", blSave ? saved(api_, row[1]) : listed(api_, row[1]));
        const std::string strLog = takeText();
        EXPECT_PRED2(contains, strLog, strGap);
        EXPECT_PRED2(contains, strLog, row[2]);
        EXPECT_EQ(!blSave, "-1" == created(api_, row[1]));
        takeText();
    }
}

}  // namespace
