// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/row_callback.h"
#include "util/log.h"
#include "util/sqlite_text.h"

#include <VornJsonDbApi.h>

#include <unistd.h>
#include <cerrno>
#include <cstring>
#include <exception>

using namespace vorn;

namespace {

constexpr int kMaxAttempts = 500;
constexpr useconds_t kRetryDelayMicroseconds = 10000;
// Kept(Execution.ReportsAnEmptyTextWithoutRunningIt): the message is spelt "Unknow Error!!"
constexpr char kUnknownError[] = "Unknow Error!!";

const char* textOrUnknown(const char* szText)
{
    return nullptr == szText ? kUnknownError : szText;
}

// Kept(Retry.LooksForTheWordsAnywhereInTheText, Retry.TreatsTheErrnoOfALockAsALock): an error text
// that mentions a locked database counts as a lock, whoever wrote it, and so does EAGAIN in errno,
// whatever failed
bool isLocked(const char* errText)
{
    return (nullptr != errText && nullptr != strstr(errText, "database is locked")) ||
           EAGAIN == errno;
}

}  // namespace

int VornJsonDbApi::runSqlEx(std::string strSql, int (*callback)(void*, int, char**, char**),
                            void* arg)
{
    int i = 0;
    SqliteText errText;
    const auto fail = [&](int iResult) {
        strSqlError = textOrUnknown(errText);
        const char* szError = strSqlError.c_str();
        const char* szSql = strSql.c_str();
        LOG_PLAIN("i=%d,errno=%d, run sql failed, error=%s, sql=%s", i, errno, szError, szSql);
        if (blDebugOutput) LOG_PLAIN("run sql fail, err=%s", static_cast<const char*>(errText));
        return iResult;
    };

    if (FAILED(0 >= strSql.length())) return fail(-1);
    strSqlError.clear();
    // Kept(Retry.RunsTheWholeTextAgain): a retry runs the whole text again
    for (;;) {
        if (nullptr != errText) strSqlError = errText;
        beginStatement(strName);
        errno = 0;
        const int iStatus = sqlite3_exec(pDb, strSql.c_str(), callback, arg, errText.receive());

        if (const std::exception_ptr pThrown = takeThrown()) {
            strSqlError = textOrUnknown(errText);
            std::rethrow_exception(pThrown);
        }
        if (SQLITE_OK == iStatus) {
            const int iChanges = nullptr == callback ? sqlite3_changes(pDb) : 0;
            if (0 > iChanges) return fail(iChanges);
            strSqlError.clear();
            return iChanges;
        }
        if (!isLocked(errText)) return fail(-1);

        if (blDebugOutput)
            LOG_PLAIN("retry, i=%d, errno=%d, run sql failed, error=%s, sql=%s", i, errno,
                      static_cast<const char*>(errText), strSql.c_str());
        ++i;
        usleep(kRetryDelayMicroseconds);
        if (kMaxAttempts == i) return fail(-1);
    }
}
