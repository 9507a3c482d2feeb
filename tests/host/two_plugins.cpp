// SPDX-License-Identifier: MIT
// Loads two plugins that have flags of their own, and prints each step behind what the library logs
// to standard output in it. With HOST_HAS_FLAGS it defines the flags, too. The status tells which
// step failed.

#include <dlfcn.h>

#include <cstdio>
#include <string>

#ifdef HOST_HAS_FLAGS
#include <VornJsonDbApi.h>
bool blLogToStdout = false;
bool blDebugOutput = false;
#endif

namespace {

class Plugin {
public:
    Plugin(const char* szFile, int iMode) : pHandle_(dlopen(szFile, RTLD_LAZY | iMode))
    {
        if (nullptr == pHandle_) return;
        set = reinterpret_cast<void (*)(bool)>(dlsym(pHandle_, "setLogToStdout"));
        logs = reinterpret_cast<bool (*)()>(dlsym(pHandle_, "logsOneFailure"));
    }
    ~Plugin() { close(); }
    Plugin(const Plugin&) = delete;
    Plugin& operator=(const Plugin&) = delete;

    bool isWhole() const { return nullptr != set && nullptr != logs; }
    void close()
    {
        if (nullptr != pHandle_) dlclose(pHandle_);
        pHandle_ = nullptr;
    }

    void (*set)(bool) = nullptr;
    bool (*logs)() = nullptr;

private:
    void* pHandle_;
};

bool step(const char* szName, const Plugin& plugin)
{
    const bool blDone = plugin.logs();
    printf("step: %s\n", szName);
    return blDone;
}

}  // namespace

int main(int argc, char** argv)
{
    if (4 != argc) return 1;
    const int iMode = std::string("global") == argv[1] ? RTLD_GLOBAL : RTLD_LOCAL;
    Plugin first(argv[2], iMode);
    Plugin second(argv[3], iMode);
    if (!first.isWhole() || !second.isWhole()) return 2;
    if (!step("first", first) || !step("second", second)) return 3;
    second.set(true);
    if (!step("second sets true", second)) return 4;
    second.set(false);
    if (!step("second sets false", second)) return 5;
    first.close();
    return step("first is closed", second) ? 0 : 6;
}
