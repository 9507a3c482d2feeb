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
using TableRows = std::vector<std::vector<std::string>>;

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

class DocsLog : public HostTest {
protected:
    // Sorts the tables of the page by what they contain.
    DocsLog()
    {
        for (const MarkdownTable& table : tablesOf(page_)) {
            const auto& first = table.rows.at(0);
            const bool blRequests = '{' == first.at(1)[0];
            TableRows& rows = blRequests ? (3U == first.size() ? requests_ : gaps_)
                              : contains(first.back(), "FILE:LINE") ? forms_
                                                                    : lines_;
            rows.insert(rows.end(), table.rows.begin(), table.rows.end());
        }
        EXPECT_EQ(6U, forms_.size());
        EXPECT_FALSE(requests_.empty() || gaps_.empty());
        EXPECT_EQ(6U, blocks_.size());
    }

    const MarkdownPage page_ = readPage("log.md");
    TableRows lines_;
    TableRows forms_;
    TableRows requests_;
    TableRows gaps_;
    // The definition and CREATE statement of the examples; a JSON text and its log for each.
    const std::vector<MarkdownBlock> blocks_ = blocksOf(page_);
    Json::Value jDefinition_ = json(blocks_.at(0).strText);
    std::string strCreate_ = blocks_.at(1).strText;
    std::string strName_ = jDefinition_.getMemberNames().at(0);
    // In memory, because the examples show errno.
    Database database_{std::string(":memory:")};
    VornJsonDbApi api_{database_.get(), strName_, jDefinition_, strCreate_};
};

TEST_F(DocsLog, ListsEveryLineOnceWithItsMeaning)
{
    std::set<std::string> listed;
    for (const auto& row : lines_) {
        EXPECT_NE("", row.at(1)) << row[0];
        // Several lines may share a cell.
        for (const std::string& strText : matches(row[0] + "`<br>`", "(.*?)`<br>`"))
            EXPECT_TRUE(listed.insert(strText).second) << "twice: " << strText;
    }
    std::set<std::string> messages;
    for (const std::string& strLine : matches(fileText("tests/data/messages.txt"), "(.+)\n"))
        if (0 != strLine.find("# ")) messages.insert(strLine);
    EXPECT_EQ(messages, listed);
    EXPECT_FALSE(listed.empty());
}

TEST_F(DocsLog, NamesTheTraceLines)
{
    std::set<std::string> onThePage;
    for (const auto& row : lines_)
        if (0 == row.at(1).find("Trace")) onThePage.insert(row[0]);

    const auto inTheSources =
        matches(folderText("src"), R"re(if \(blDebugOutput\)\s+LOG_PLAIN\("([^"]*)")re");
    EXPECT_EQ(std::set<std::string>(inTheSources.begin(), inTheSources.end()), onThePage);
    EXPECT_FALSE(onThePage.empty());
}

// Of each family: on standard output, on syslog with errno and without.
TEST_F(DocsLog, HasTheFormsOfThePage)
{
    for (std::size_t i = 0; i < forms_.size(); ++i) {
        const std::string& strForm = forms_[i].back();
        SCOPED_TRACE(strForm);
        const bool blError = i < 3;
        blLogToStdout = 0 == i % 3;
        const int iErrno = 1 == i % 3 ? ENOENT : 0;
        errno = iErrno;
        EXPECT_EQ(-1, api_.runSqlEx(""));
        const auto lines = std::exchange(state().log, {});
        ASSERT_EQ(2U, lines.size());
        EXPECT_EQ(blLogToStdout, !lines[blError ? 0 : 1].blSyslog);

        const std::string strErrno = strerror(iErrno);
        std::string strLine = replaced(strForm, "FILE", "VornJsonDbApi");
        strLine = replaced(strLine, "ERRNO", strErrno);
        strLine = replaced(strLine, "TEXT",
                           blError ? "Failed [0 >= strSql.length()], err=" + strErrno + "\n"
                                   : "i=0,errno=" + std::to_string(iErrno) +
                                         ", run sql failed, error=Unknow Error!!, sql=");
        EXPECT_EQ(strLine + (blLogToStdout ? "\n" : ""),
                  withoutPlaces(lines[blError ? 0 : 1].strText));
        EXPECT_EQ(blError ? "error" : "plain", forms_[i][0]);
    }
}

TEST_F(DocsLog, ShowsADuplicate)
{
    EXPECT_NE("-1", created(api_, blocks_[2].strText));
    blLogToStdout = true;
    EXPECT_EQ("-1", created(api_, blocks_[2].strText));
    EXPECT_EQ(withoutPlaces(blocks_[3].strText), takeText());
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", api_.getErrMsg());
}

TEST_F(DocsLog, ShowsARowThatCannotBeRead)
{
    database_.run("insert into " + strName_ + " values (8,1,0.5,'x')");
    EXPECT_EQ("-1", listed(api_, blocks_[4].strText));
    EXPECT_EQ(withoutPlaces(blocks_[5].strText), takeText());
}

TEST_F(DocsLog, SaysWhatSqliteSays)
{
    for (const auto& row : requests_) {
        SCOPED_TRACE(row[1]);
        EXPECT_EQ("-1", listed(api_, row[1]));
        EXPECT_PRED2(contains, takeText(), "run sql failed, error=" + row[0]);
    }
}

TEST_F(DocsLog, ShowsAGapInTheStatement)
{
    const std::string strGap = "error=near \")\": syntax error, sql=";
    for (const auto& row : gaps_) {
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
