// SPDX-License-Identifier: MIT
// The header as the only thing that a host includes.
#include <VornJsonDbApi.h>

bool blLogToStdout = false;
bool blDebugOutput = false;

int useHeader(VornJsonDbApi& api);

int useHeader(VornJsonDbApi& api)
{
    std::string strNames;
    return api.SqlExpandMemberName(strNames) + api.runSqlEx("select 1");
}
