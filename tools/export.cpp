// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every record as JSON lines, or as CSV as RFC 4180 describes it.
#include "commands.h"
#include "failure.h"
#include "json_text.h"
#include "list.h"

namespace tool {

namespace {

void appendField(const std::string& strText, std::string& strOut)
{
    if (!strText.empty() && std::string::npos == strText.find_first_of(",\"\r\n")) {
        strOut += strText;
        return;
    }
    strOut += '"';
    for (const char c : strText) strOut.append('"' == c ? 2 : 1, c);
    strOut += '"';
}

// Text as it is, anything else as JSON, an absent member as nothing; an empty text is "".
std::string rowOf(const Json::Value& jRecord, const std::vector<std::string>& members,
                  const Json::Value& jMembers)
{
    std::string strRow;
    for (const std::string& strMember : members) {
        if (&strMember != &members.front()) strRow += ',';
        if (!jRecord.isMember(strMember)) continue;
        const Json::Value& jValue = jRecord[strMember];
        const bool blText = "string" == jMembers[strMember]["cpptype"].asString();
        appendField(blText ? jValue.asString() : toText(jValue), strRow);
    }
    return strRow + '\n';
}

}  // namespace

int exportRecords(const Arguments& arguments, Output& output)
{
    if (!arguments.has("csv")) return list(arguments, output);
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kExisting);
    const std::vector<std::string> members = table.jMembers.getMemberNames();
    std::string strHead;
    for (const std::string& strMember : members)
        strHead += (strHead.empty() ? "" : ",") + strMember;
    output.text(strHead + "\n");
    forEachRecord(table, arguments, [&](const Json::Value& jRecord) {
        output.text(rowOf(jRecord, members, table.jMembers));
    });
    return kDone;
}

}  // namespace tool
