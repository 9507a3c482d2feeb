// SPDX-License-Identifier: MIT
#include "support/log.h"

#include "support/doubles.h"

#include <VornJsonDbApi.h>

#include <syslog.h>
#include <unistd.h>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <regex>

namespace {

using doubles::LogRecord;

struct Parsed {
    bool blError = false;
    std::string strComponent;
    int iLine = 0;
    std::string strMessage;
};

std::string squeezed(const std::string& strText)
{
    std::string strOut;
    for (char c : strText)
        if (' ' != c && '\n' != c && '\\' != c) strOut += c;
    return strOut;
}

std::vector<std::vector<std::string>> readSources(const std::string& strComponent)
{
    std::vector<std::vector<std::string>> files;
    for (const auto& entry : std::filesystem::directory_iterator(VORN_SOURCES "/" + strComponent)) {
        // A line that is logged from a header would have the same number in every operation.
        if (".cpp" != entry.path().extension()) continue;
        std::ifstream file(entry.path());
        std::vector<std::string> lines;
        for (std::string strLine; std::getline(file, strLine);) lines.push_back(strLine);
        files.push_back(lines);
    }
    return files;
}

const char* macroOf(const Parsed& parsed)
{
    if (parsed.blError) return "LOG_ERROR(";
    return 0 == parsed.strMessage.compare(0, 15, "sql error, err=") ? "LOG_SQL_ERROR("
                                                                    : "LOG_PLAIN(";
}

// Whether a source file of the component has the check or message at that line.
bool leadsToSource(const Parsed& parsed)
{
    static const auto api = readSources("VornJsonDbApi");
    static const auto util = readSources("util");
    std::smatch match;
    static const std::regex condition(R"(^Failed \[([\s\S]*)\])");
    const bool blFailed = 0 == parsed.strMessage.compare(0, 8, "Failed [");
    const std::string strWanted = blFailed && std::regex_search(parsed.strMessage, match, condition)
                                      ? squeezed(match[1])
                                      : macroOf(parsed);
    const auto iLine = static_cast<std::size_t>(parsed.iLine);
    for (const auto& file : "util" == parsed.strComponent ? util : api) {
        if (0 == iLine || file.size() < iLine) continue;
        std::string strAround;
        for (std::size_t i = iLine < 3 ? 0 : iLine - 3; i < file.size() && i < iLine + 2; ++i)
            strAround += file[i];
        if (std::string::npos != squeezed(strAround).find(strWanted)) return true;
    }
    return false;
}

// Removes strHead from the front of strText; false when it does not stand there.
bool take(std::string& strText, const std::string& strHead)
{
    if (0 != strText.compare(0, strHead.size(), strHead)) return false;
    strText.erase(0, strHead.size());
    return true;
}

// "util:12" at the front.
bool takeLocation(std::string& strText, Parsed& parsed)
{
    static const std::regex location(R"(^(VornJsonDbApi|util):(\d+))");
    std::smatch match;
    if (!std::regex_search(strText, match, location)) return false;
    parsed.strComponent = match[1];
    parsed.iLine = std::stoi(match[2]);
    strText = match.suffix();
    return true;
}

// What stands between the location and the message, by variant and family.
bool takeForm(std::string& strText, const LogRecord& record, Parsed& parsed)
{
    const std::string strPid = "(" + std::to_string(static_cast<unsigned>(getpid())) + ")";
    const std::string strErrno = std::string("(") + strerror(record.iErrno) + ")";
    if (!record.blSyslog && !take(strText, strPid + " ")) return false;
    if (!takeLocation(strText, parsed)) return false;
    const std::string strAgain =
        "(" + parsed.strComponent + ":" + std::to_string(parsed.iLine) + ")";
    std::string strEnd;
    if (record.blSyslog) {
        if (!take(strText, " " + strPid)) return false;
        if (0 != record.iErrno && !take(strText, strErrno)) return false;
        parsed.blError = take(strText, strAgain + strErrno);
        strEnd = parsed.blError ? "\n" : "";
    } else {
        if (!take(strText, " ")) return false;
        parsed.blError = take(strText, strAgain + strErrno);
        strEnd = parsed.blError ? "\n\n" : "\n";
    }
    const std::size_t nText = strText.size() - std::min(strText.size(), strEnd.size());
    if (strText.substr(nText) != strEnd) return false;
    parsed.strMessage = strText.substr(0, nText);
    return true;
}

// "Failed [x], err=Success" loses what the form has already told.
bool takeErrno(const LogRecord& record, Parsed& parsed)
{
    if (!parsed.blError || 0 != parsed.strMessage.compare(0, 8, "Failed [")) return true;
    const std::string strTail = std::string(", err=") + strerror(record.iErrno);
    const std::size_t nTail = parsed.strMessage.rfind(strTail);
    if (std::string::npos == nTail || nTail + strTail.size() != parsed.strMessage.size())
        return false;
    parsed.strMessage.erase(nTail);
    return true;
}

// "errno=2" in a message has to be the errno of the line; it depends on the kind of database, so it
// becomes "errno=?".
bool takeErrnoNumber(const LogRecord& record, Parsed& parsed)
{
    static const std::regex number(R"((^|[ ,])errno=(\d+),)");
    std::smatch match;
    if (std::string::npos == parsed.strMessage.find("errno=")) return true;
    if (!std::regex_search(parsed.strMessage, match, number)) return true;
    if (match[2] != std::to_string(record.iErrno)) return false;
    parsed.strMessage.replace(static_cast<std::size_t>(match.position(2)), match[2].str().size(),
                              "?");
    return true;
}

std::string readable(const LogRecord& record)
{
    Parsed parsed;
    std::string strText = record.strText;
    if (record.blSyslog && LOG_ERR != record.iPriority) return "BROKEN priority: " + record.strText;
    if (!takeForm(strText, record, parsed)) return "BROKEN form: " + record.strText;
    if (!takeErrno(record, parsed) || !takeErrnoNumber(record, parsed))
        return "BROKEN errno: " + record.strText;
    if (!leadsToSource(parsed)) return "BROKEN line number: " + record.strText;
    return (parsed.blError ? "E " : "P ") + parsed.strComponent + ": " + parsed.strMessage;
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
    return "E VornJsonDbApi: Failed [" + strCondition + "]";
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
