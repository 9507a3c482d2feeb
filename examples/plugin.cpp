// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// A plugin that uses the library, in a program that does not: this is the program, and
/// plugin_module.cpp is the plugin. The library looks for its two flags in the program, which has
/// to show them to what it loads: in CMake, ENABLE_EXPORTS.
///
/// Prints what the plugin says of two notes, and the log of the second, which is there already: the
/// program has turned the log to standard output before.
#include <VornJsonDbApi.h>
#include <dlfcn.h>

#include <cerrno>
#include <iostream>

// Declared by the header, which keeps them visible even if a program hides its symbols.
bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

using AddNote = int (*)(const char* szTitle);

bool useNotes(AddNote addNote)
{
    blLogToStdout = true;
    for (int i = 0; i < 2; ++i) {
        errno = 0;  // log lines show it, whoever set it
        const int iNotes = addNote("Water the plants");
        if (0 > iNotes) return false;
        std::cout << "notes: " << iNotes << '\n';
    }
    return true;
}

}  // namespace

int main(int argc, char** argv)
{
    if (2 != argc) {
        std::cerr << "usage: plugin MODULE\n";
        return 2;
    }
    // RTLD_NOW: a flag that cannot be found is reported here.
    void* pModule = dlopen(argv[1], RTLD_NOW | RTLD_LOCAL);
    if (nullptr == pModule) {
        std::cerr << dlerror() << '\n';
        return 1;
    }
    const auto addNote = reinterpret_cast<AddNote>(dlsym(pModule, "addNote"));
    const bool blDone = nullptr != addNote && useNotes(addNote);
    if (!blDone) std::cerr << "the plugin failed\n";
    // The plugin goes and the library stays: it is never unloaded.
    return 0 == dlclose(pModule) && blDone ? 0 : 1;
}
