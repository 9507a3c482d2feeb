// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// races jsoncpp|sqlite|library: a race inside it, made by two threads that share what they must
// not. ThreadSanitizer has to report it, or it sees nothing there.

#include "host/task.h"

#include <functional>
#include <map>
#include <thread>

bool blLogToStdout = false;
bool blDebugOutput = false;

int main(int argc, char** argv)
{
    Task task;
    Json::Value jShared(Json::objectValue);
    const std::map<std::string, std::function<void()>> races = {
        {"jsoncpp", [&] { jShared["a"] = 2; }},
        {"sqlite", [&] { sqlite3_limit(task.pDb, SQLITE_LIMIT_LENGTH, 1000000); }},
        {"library", [&] { task.api().setErrMsg("a"); }},
    };
    const auto race = races.find(2 == argc ? argv[1] : "");
    if (races.end() == race) return 1;
    task.api();
    const auto runOften = [&] {
        for (int i = 0; i < 1000; ++i) race->second();
    };
    std::thread thread(runOften);
    runOften();
    thread.join();
    return 0;
}
