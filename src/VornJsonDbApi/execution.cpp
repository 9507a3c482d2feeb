#include "VornJsonDbApi/execution.h"

#include "util/json_members.h"
#include "util/json_text.h"
#include "util/sqlite_text.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

#include <unistd.h>
#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <utility>

namespace {

constexpr int kMaxAttempts = 500;
constexpr useconds_t kRetryDelayMicroseconds = 10000;
constexpr char kUnknownError[] = "Unknow Error!!";

// The table whose statement is running: SQLite calls the row callback without a handle.
std::string strCurJsonName;

// What was thrown in the row callback; nothing may unwind through SQLite's own frames.
std::exception_ptr pThrownInCallback;

const char* textOrUnknown(const char* szText)
{
    return nullptr == szText ? kUnknownError : szText;
}

bool isLocked(const char* errText)
{
    return (nullptr != errText && nullptr != strstr(errText, "database is locked")) ||
           EAGAIN == errno;
}

int saturatedToInt(const char* szText)
{
    return static_cast<int>(std::clamp<long>(strtol(szText, nullptr, 10), INT_MIN, INT_MAX));
}

int DbCallBackFillField(Json::Value& jRec, char** column_name, char** column_value, int idx)
{
    Json::Value jTableDef;
    const Json::Value& jType = VORN_JSON_DB::recType(jTableDef, strCurJsonName);
    if (FAILED(jRec.type() != Json::objectValue && jRec.type() != Json::nullValue)) return -1;
    if (FAILED(0 > idx)) return -1;

    const char* strName = column_name[idx];
    const Json::Value* pjMember = findMember(jType, strName);
    if (FAILED_AS(nullptr == pjMember, "!jType.isMember(strName)")) return -1;
    const std::string strType = typeWordOf(*pjMember);

    // NULL means absent, whatever the type word.
    const char* szValue = column_value[idx];
    if (nullptr == szValue) return 0;

    switch (typeWord(strType).decode) {
    case Decode::kText: jRec[strName] = szValue; return 0;
    case Decode::kInt32:
        // Kept: unsigned words too are read through the signed conversions and saturate there.
        jRec[strName] = saturatedToInt(szValue);
        return 0;
    case Decode::kInt64: jRec[strName] = Json::Int64(strtoll(szValue, nullptr, 10)); return 0;
    case Decode::kJson: fromString(szValue, jRec[strName]); return 0;
    case Decode::kBool: jRec[strName] = 1 == strtol(szValue, nullptr, 10); return 0;
    case Decode::kNo: break;
    }
    LOG_ERROR("type error, strType=%s", strType.c_str());
    return -1;
}

int DbCallBackFillRec(Json::Value* pjRec, int n_column, char** column_value, char** column_name)
{
    if (FAILED(NULL == column_name || NULL == column_value)) return -1;
    for (int i = 0; i < n_column; ++i) {
        int iTmp = 0;
        if (FAILED(NULL == column_name[i]) ||
                   FAILED(0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i)))) {
            // Kept: the first column is not traced.
            if (0 < i) {
                LOG_PLAIN("column_name[%d]=%s", i, column_name[i]);
                LOG_PLAIN("column_value[%d]=%s", i, column_value[i]);
            }
            return -1;
        }
    }
    return 0;
}

int fillList(Json::Value* pjRecArray, int n_column, char** column_value, char** column_name)
{
    Json::Value jTmp(Json::objectValue);
    if (FAILED(!pjRecArray)) return -1;
    if (FAILED(pjRecArray->type() != Json::arrayValue && pjRecArray->type() != Json::nullValue))
        return -1;
    if (FAILED(0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name))) return -1;
    pjRecArray->append(std::move(jTmp));
    return 0;
}

}  // namespace

int DbCallBackFillList(void* arg, int n_column, char** column_value, char** column_name)
{
    try {
        return fillList(static_cast<Json::Value*>(arg), n_column, column_value, column_name);
    } catch (...) {
        pThrownInCallback = std::current_exception();
        return -1;
    }
}

int VornJsonDbApi::runSqlEx(std::string strSql, int (*callback)(void*, int, char**, char**),
                            void* arg)
{
    int i = 0;
    SqliteText errText;
    const auto fail = [&](int iResult) {
        strSqlError = textOrUnknown(errText);
        LOG_PLAIN("i=%d,errno=%d, run sql failed, error=%s, sql=%s", i, errno, strSqlError.c_str(),
                  strSql.c_str());
        if (blDebugOutput) LOG_PLAIN("run sql fail, err=%s", static_cast<const char*>(errText));
        return iResult;
    };

    if (FAILED(0 >= strSql.length())) return fail(-1);
    strSqlError.clear();
    for (;;) {
        if (nullptr != errText) strSqlError = errText;
        errno = 0;
        strCurJsonName = strName;
        const int iStatus = sqlite3_exec(pDb, strSql.c_str(), callback, arg, errText.receive());

        if (nullptr != pThrownInCallback) {
            const std::exception_ptr pThrown = std::exchange(pThrownInCallback, nullptr);
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
