// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Fails malloc, n-th call by n-th call, while a host creates and lists records: jsoncpp takes its
// texts from malloc and throws Json::RuntimeError when there is none. After each the handle works
// and no statement is open. The status tells which check failed.

#include "task.h"

#include <json/json.h>
#include <cstdio>
#include <cstdlib>
#include <new>
#include <stdexcept>

bool blLogToStdout = false;
bool blDebugOutput = false;

extern "C" {

void* __libc_malloc(size_t nSize);

int iFailMalloc = 0;
int iMallocs = 0;

void* malloc(size_t nSize)
{
    if (0 < iFailMalloc && ++iMallocs == iFailMalloc) return nullptr;
    return __libc_malloc(nSize);
}

}  // extern "C"

namespace {

// Each malloc in turn until none fails. The handle and the connection have to be sound in between.
template <typename Operation>
void failEach(const char* szName, Task& task, Operation operation)
{
    int iGood = 0;
    int iRuntimeErrors = 0;
    for (int iFail = 1;; ++iFail) {
        iMallocs = 0;
        iFailMalloc = iFail;
        try {
            iGood += 0 <= operation();
        } catch (const Json::RuntimeError&) {
            ++iRuntimeErrors;
        } catch (const std::bad_alloc&) {
        } catch (const std::logic_error&) {
        }
        iFailMalloc = 0;
        if (iMallocs < iFail) break;
        if (nullptr != sqlite3_next_stmt(task.pDb, nullptr)) exit(2);
        Json::Value jAll;
        Json::Value jList;
        if (0 != task.api().recList(jAll, jList) || 1 > jList.size()) exit(3);
    }
    printf("%s: %d good, %d RuntimeError\n", szName, iGood, iRuntimeErrors);
    if (1 > iRuntimeErrors || 1 > iGood) exit(4);
}

}  // namespace

int main()
{
    Task task;
    Json::Value jRecord = Task::record(1);
    if (0 != task.api().recSave(jRecord, true)) return 1;
    failEach("save", task, [&] {
        Json::Value jCopy = jRecord;
        return task.api().recSave(jCopy, false);
    });
    failEach("list", task, [&] {
        Json::Value jAll;
        Json::Value jList;
        const int iResult = task.api().recList(jAll, jList);
        // A list that succeeds lacks nothing.
        if (0 == iResult && jRecord != jList[0]) exit(6);
        return iResult;
    });
}
