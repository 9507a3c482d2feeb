// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Loads two plugins that have flags of their own, and prints each step after what the library logs
// to standard output in it. With HOST_HAS_FLAGS it defines the flags, too. The status tells which
// step failed.

#include <dlfcn.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#ifdef HOST_HAS_FLAGS
#include <VornJsonDbApi.h>
bool blLogToStdout = false;
bool blDebugOutput = false;
#endif

namespace {

struct Plugin {
    Plugin(const char* szFile, int iMode) : pHandle(dlopen(szFile, RTLD_LAZY | iMode))
    {
        if (nullptr == pHandle) _Exit(2);
        set = reinterpret_cast<void (*)(bool)>(dlsym(pHandle, "setLogToStdout"));
        logs = reinterpret_cast<bool (*)()>(dlsym(pHandle, "logsOneFailure"));
        if (nullptr == set || nullptr == logs) _Exit(2);
    }

    void step(const char* szName, int iStatus) const
    {
        const bool blDone = logs();
        printf("step: %s\n", szName);
        if (!blDone) _Exit(iStatus);
    }

    void* pHandle;
    void (*set)(bool) = nullptr;
    bool (*logs)() = nullptr;
};

}  // namespace

int main(int argc, char** argv)
{
    if (4 != argc) return 1;
    const int iMode = std::string("global") == argv[1] ? RTLD_GLOBAL : RTLD_LOCAL;
    const Plugin first(argv[2], iMode);
    const Plugin second(argv[3], iMode);
    first.step("first", 3);
    second.step("second", 3);
    second.set(true);
    second.step("second sets true", 4);
    second.set(false);
    second.step("second sets false", 5);
    dlclose(first.pHandle);
    second.step("first is closed", 6);
    dlclose(second.pHandle);
}
