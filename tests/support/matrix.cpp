// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/matrix.h"

#include "support/calls.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <set>
#include <sstream>

std::vector<std::string> split(const std::string& strText, char cSeparator)
{
    std::vector<std::string> parts;
    std::istringstream stream(strText);
    for (std::string strPart; std::getline(stream, strPart, cSeparator);)
        if (!strPart.empty()) parts.push_back(strPart);
    return parts;
}

std::string replaced(const std::string& strText, char cOld, const std::string& strNew)
{
    std::string strOut;
    for (const char c : strText) strOut.append(cOld == c ? strNew : std::string(1, c));
    return strOut;
}

Json::Value argumentsOf(const Words& call)
{
    static const std::set<std::string> on = {"all", "callback", "check", "insert", "overwrite"};
    const std::string strFilled = "recList" == call[0] ? R"(["kept"])" : R"({"kept":1})";
    Json::Value jArguments;
    std::size_t i = 0;
    for (std::string strName : split(Call::parameters(call[0]), ' ')) {
        const bool blOutput = '>' == strName[0];
        if (blOutput) jArguments["output"] = strName.erase(0, 1);
        const bool blGiven = ++i < call.size();
        if (!blGiven && !blOutput) continue;
        if ("flag" == strName)
            jArguments["flag"] = 0 < on.count(call[i]);
        else if ("number" == strName)
            jArguments["number"] = std::stoi(call[i]);
        else if ("text" == strName || "key" == strName)
            jArguments[strName] = blGiven ? call[i] : "before";
        else
            jArguments["record" == strName ? "first" : strName] =
                json(blGiven ? call[i] : strFilled);
        if ("record" == strName) jArguments["flag"] = true;
    }
    return jArguments;
}

Ended called(VornJsonDbApi& api, const Words& words)
{
    Json::Value jBefore = argumentsOf(words);
    Call call;
    call.pApi = &api;
    call.setArguments(jBefore);
    Ended ended;
    ended.strEnd = endOf([&] { return Call::function(words[0])(call); });

    const Json::Value jAfter = call.arguments();
    Json::Value jOutput;
    if (jBefore.removeMember("output", &jOutput)) {
        const std::string strOutput = jOutput.asString();
        jBefore.removeMember(strOutput, &ended.jBefore);
        ended.jOut = jAfter[strOutput];
        if ("text" == strOutput) {
            const std::string strBefore = ended.jBefore.asString();
            const std::string strOut = ended.jOut.asString();
            EXPECT_EQ(strBefore, strOut.substr(0, strBefore.size()));
            ended.strChange = strOut.substr(std::min(strBefore.size(), strOut.size()));
        } else if (ended.jBefore != ended.jOut) {
            ended.strChange = text(ended.jOut);
        }
    }
    for (const std::string& strName : jBefore.getMemberNames())
        EXPECT_EQ(jBefore[strName], jAfter[strName]) << testing::PrintToString(words);
    return ended;
}

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
