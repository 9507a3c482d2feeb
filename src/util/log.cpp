// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "util/log.h"

#include <VornJsonDbApi.h>

#include <syslog.h>
#include <unistd.h>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>

namespace vorn {

LogLine::LogLine(Family family, const char* szComponent, int iLine)
    : family_(family), szComponent_(szComponent), iLine_(iLine), iErrno_(errno)
{
}

LogLine::~LogLine()
{
    errno = iErrno_;
}

void LogLine::write(const char* szFormat, ...)
{
    errno = iErrno_;
    char* szMessage = nullptr;
    va_list arguments;
    va_start(arguments, szFormat);
    const int iLength = vasprintf(&szMessage, szFormat, arguments);
    va_end(arguments);
    if (0 > iLength) return;

    // Kept(Log.WritesEachFamilyInItsForms): lines of the error family repeat their location
    const unsigned uPid = static_cast<unsigned>(getpid());
    errno = iErrno_;
    switch (family_) {
    case Family::kError:
        if (blLogToStdout)
            printf("(%u) %s:%d (%s:%d)(%m)%s\n\n", uPid, szComponent_, iLine_, szComponent_, iLine_,
                   szMessage);
        else if (0 != iErrno_)
            syslog(LOG_ERR, "%s:%d (%u)(%m)(%s:%d)(%m)%s\n", szComponent_, iLine_, uPid,
                   szComponent_, iLine_, szMessage);
        else
            syslog(LOG_ERR, "%s:%d (%u)(%s:%d)(%m)%s\n", szComponent_, iLine_, uPid, szComponent_,
                   iLine_, szMessage);
        break;
    case Family::kPlain:
        if (blLogToStdout)
            printf("(%u) %s:%d %s\n", uPid, szComponent_, iLine_, szMessage);
        else if (0 != iErrno_)
            syslog(LOG_ERR, "%s:%d (%u)(%m)%s", szComponent_, iLine_, uPid, szMessage);
        else
            syslog(LOG_ERR, "%s:%d (%u)%s", szComponent_, iLine_, uPid, szMessage);
        break;
    }
    free(szMessage);
}

}  // namespace vorn
