// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/log.h"

#include "support/doubles.h"

#include <syslog.h>
#include <unistd.h>
#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <map>
#include <regex>

namespace {

using doubles::LogRecord;

bool startsWith(const std::string& strText, const std::string& strStart)
{
    return 0 == strText.compare(0, strStart.size(), strStart);
}

bool endsWith(const std::string& strText, const std::string& strEnd)
{
    return strText.size() >= strEnd.size() &&
           0 == strText.compare(strText.size() - strEnd.size(), strEnd.size(), strEnd);
}

std::string squeezed(const std::string& strText)
{
    std::string strOut;
    for (char c : strText)
        if (' ' != c && '\n' != c && '\\' != c) strOut += c;
    return strOut;
}

// The source files of a component, each as its lines without blanks.
const std::vector<std::vector<std::string>>& sourcesOf(const std::string& strComponent)
{
    static thread_local std::map<std::string, std::vector<std::vector<std::string>>> components;
    auto& files = components[strComponent];
    if (!files.empty()) return files;
    for (const auto& entry : std::filesystem::directory_iterator(VORN_SOURCES "/" + strComponent)) {
        // A line that is logged from a header would have the same number in every operation.
        if (".cpp" != entry.path().extension()) continue;
        std::ifstream file(entry.path());
        auto& lines = files.emplace_back();
        for (std::string strLine; std::getline(file, strLine);) lines.push_back(squeezed(strLine));
    }
    return files;
}

// Whether a source file of the component has the check or message near that line.
bool leadsToSource(const std::string& strComponent, std::size_t nLine, const std::string& strWanted)
{
    for (const auto& lines : sourcesOf(strComponent)) {
        if (0 == nLine || lines.size() < nLine) continue;
        std::string strAround;
        for (std::size_t n = nLine < 3 ? 0 : nLine - 3; n < std::min(lines.size(), nLine + 2); ++n)
            strAround += lines[n];
        if (std::string::npos != strAround.find(squeezed(strWanted))) return true;
    }
    return false;
}

// The line in the form that takeLog() promises.
std::string readable(const LogRecord& record)
{
    const std::string& strLine = record.strText;
    const auto broken = [&](const char* szRule) {
        return "BROKEN " + std::string(szRule) + ": " + strLine;
    };
    if (record.blSyslog && LOG_ERR != record.iPriority) return broken("priority");

    const std::string strPid = "(" + std::to_string(static_cast<unsigned>(getpid())) + ")";
    const std::string strErrno = strerror(record.iErrno);
    const std::size_t nLocation = record.blSyslog ? 0 : strPid.size() + 1;
    static const std::regex location(R"((VornJsonDbApi|util):(\d+))");
    std::cmatch match;
    if (strLine.size() < nLocation ||
        !std::regex_search(strLine.c_str() + nLocation, match, location,
                           std::regex_constants::match_continuous))
        return broken("form");
    const std::string strLocation = match[0];
    const std::string strComponent = match[1];

    std::string strHead = strPid + " " + strLocation + " ";
    if (record.blSyslog)
        strHead = strLocation + " " + strPid + (0 == record.iErrno ? "" : "(" + strErrno + ")");
    const std::string strErrorHead = strHead + "(" + strLocation + ")(" + strErrno + ")";
    const bool blError = startsWith(strLine, strErrorHead);
    if (blError) strHead = strErrorHead;
    const std::string strEnd((blError ? 1U : 0U) + (record.blSyslog ? 0U : 1U), '\n');
    if (!startsWith(strLine, strHead) || !endsWith(strLine, strEnd) ||
        strLine.size() < strHead.size() + strEnd.size())
        return broken("form");
    std::string strMessage =
        strLine.substr(strHead.size(), strLine.size() - strHead.size() - strEnd.size());

    const bool blFailed = startsWith(strMessage, "Failed [");
    if (blFailed && blError) {
        const std::string strTail = ", err=" + strErrno;
        if (!endsWith(strMessage, strTail)) return broken("errno");
        strMessage.erase(strMessage.size() - strTail.size());
    }
    static const std::regex number(R"((?:retry, )?i=\d+, ?errno=(\d+),)");
    if (std::regex_search(strMessage.c_str(), match, number,
                          std::regex_constants::match_continuous)) {
        if (match[1] != std::to_string(record.iErrno)) return broken("errno");
        strMessage.replace(static_cast<std::size_t>(match.position(1)),
                           static_cast<std::size_t>(match.length(1)), "?");
    }

    const std::string strWanted = blFailed  ? strMessage.substr(8, strMessage.size() - 9)
                                  : blError ? "LOG_ERROR("
                                  : startsWith(strMessage, "sql error, err=") ? "LOG_SQL_ERROR("
                                                                              : "LOG_PLAIN(";
    const std::size_t nLine = std::stoul(strLocation.substr(strComponent.size() + 1));
    if (!leadsToSource(strComponent, nLine, strWanted)) return broken("line number");
    return (blError ? "E " : "P ") + strComponent + ": " + strMessage;
}

}  // namespace

Lines takeLog()
{
    Lines lines;
    for (const LogRecord& record : doubles::state().log) lines.push_back(readable(record));
    doubles::state().log.clear();
    return lines;
}

std::string failed(const std::string& strCondition)
{
    return error("Failed [" + strCondition + "]");
}

std::string utilFailed(const std::string& strCondition)
{
    return "E util: Failed [" + strCondition + "]";
}

std::string error(const std::string& strMessage)
{
    return "E VornJsonDbApi: " + strMessage;
}

std::string plain(const std::string& strMessage)
{
    return "P VornJsonDbApi: " + strMessage;
}

std::string utilPlain(const std::string& strMessage)
{
    return "P util: " + strMessage;
}

std::multiset<std::string> placesOf(const std::string& strComponent, const std::string& strText)
{
    std::multiset<std::string> places;
    for (const auto& lines : sourcesOf(strComponent))
        for (std::size_t n = 0; n < lines.size(); ++n)
            if (std::string::npos != lines[n].find(squeezed(strText)))
                places.insert(strComponent + ":" + std::to_string(n + 1));
    return places;
}
