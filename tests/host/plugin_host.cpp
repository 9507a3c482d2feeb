// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Loads a plugin that uses the library, unloads it and loads it again, and uses it a last time
// while the process exits: the library was loaded after this program's globals were made, so its
// own would be gone by then. The status tells which step failed.

#include <VornJsonDbApi.h>
#include <dlfcn.h>

#include <cstdlib>
#include <future>
#include <thread>

bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

using CreatesRecord = bool (*)(int);

void* pPlugin = nullptr;

bool createsRecord(int iId)
{
    const auto pFunction = reinterpret_cast<CreatesRecord>(dlsym(pPlugin, "createsRecord"));
    return nullptr != pFunction && pFunction(iId);
}

struct AtExit {
    ~AtExit()
    {
        if (!createsRecord(3)) _Exit(4);
    }
};
const AtExit atExit;

}  // namespace

int main(int argc, char** argv)
{
    if (2 != argc) return 1;
    pPlugin = dlopen(argv[1], RTLD_NOW);
    if (nullptr == pPlugin || !createsRecord(1)) _Exit(2);
    // A thread that has used the plugin ends after it was unloaded.
    std::promise<bool> used;
    std::promise<void> unloaded;
    std::thread thread([&] {
        used.set_value(createsRecord(4));
        unloaded.get_future().wait();
    });
    if (!used.get_future().get()) _Exit(5);
    dlclose(pPlugin);
    unloaded.set_value();
    thread.join();
    pPlugin = dlopen(argv[1], RTLD_NOW);
    if (nullptr == pPlugin || !createsRecord(2)) _Exit(3);
    return 0;
}
