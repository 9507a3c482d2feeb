// SPDX-License-Identifier: MIT
// races jsoncpp|sqlite|library: a race inside it, made by two threads that share what they must
// not. ThreadSanitizer has to report it, or it sees nothing there.

#include <VornJsonDbApi.h>

#include <cstdio>
#include <cstring>
#include <functional>
#include <thread>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

constexpr int kRounds = 1000;

int raceOf(const std::function<void()>& work)
{
    const auto workOften = [&work] {
        for (int i = 0; i < kRounds; ++i) work();
    };
    std::thread thread(workOften);
    workOften();
    thread.join();
    return 0;
}

}  // namespace

int main(int argc, char** argv)
{
    const char* szWhere = 2 == argc ? argv[1] : "";
    if (0 == strcmp("jsoncpp", szWhere)) {
        Json::Value jShared;
        jShared["a"] = 1;
        return raceOf([&] { jShared["a"] = 2; });
    }
    sqlite3* pDb = nullptr;
    const int iFlags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE | SQLITE_OPEN_NOMUTEX;
    if (SQLITE_OK != sqlite3_open_v2(":memory:", &pDb, iFlags, nullptr)) return 1;
    if (0 == strcmp("sqlite", szWhere)) return raceOf([&] { sqlite3_limit(pDb, 0, kRounds); });

    // The handle's message.
    std::string strName = "t";
    std::string strCreate = "create table t (a)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["a"]["cpptype"] = "int";
    VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
    if (0 == strcmp("library", szWhere)) return raceOf([&] { api.setErrMsg("a"); });
    fprintf(stderr, "usage: races jsoncpp|sqlite|library\n");
    return 1;
}
