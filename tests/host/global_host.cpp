// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A host whose handles are globals, in several language versions: they work before main, in main
// and while the process exits. The status tells which step failed.

#include "task.h"

bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

// Made before the library's first use, so it is gone after whatever that use has made: what main
// took is still there, and the handle of main works.
struct Late {
    ~Late()
    {
        if ("long long" != (*pjTypes)["id"]["cpptype"].asString()) std::_Exit(6);
        Json::Value jNone;
        if (pjTypes != &VORN_JSON_DB::recType(jNone, strName)) std::_Exit(7);
        if (!task.works(2)) std::_Exit(8);
    }

    Task task;
    std::string strName = "first used in main";
    const Json::Value* pjTypes = nullptr;
};

// Uses the library before main.
struct Early {
    Early()
    {
        if (!task.works(1)) std::_Exit(3);
    }
    ~Early()
    {
        if (!task.works(3)) std::_Exit(4);
    }

    Task task;
};

Late late;
Early early;

}  // namespace

int main()
{
    Json::Value jDefinition;
    jDefinition[late.strName]["member"]["id"]["cpptype"] = "long long";
    late.pjTypes = &VORN_JSON_DB::recType(jDefinition, late.strName);
    return early.task.works(2) && late.task.works(1) ? 0 : 5;
}
