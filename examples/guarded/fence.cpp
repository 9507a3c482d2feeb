// SPDX-License-Identifier: MIT
#include "fence.h"

#include <utility>

namespace {

constexpr int kMaxBytes = 64 * 1024;  // a command of guard::kMaxLine, escaped twice
constexpr int kStepsPerTick = 1000;
constexpr int kMaxTicks = 100;

struct Limit {
    int iId;
    int iMost;
};

constexpr Limit kLimits[] = {
    {SQLITE_LIMIT_LENGTH, kMaxBytes},
    {SQLITE_LIMIT_SQL_LENGTH, kMaxBytes},
    {SQLITE_LIMIT_COMPOUND_SELECT, 1},
    {SQLITE_LIMIT_EXPR_DEPTH, 20},
};

void setLimits(sqlite3* pDb)
{
    for (const Limit& limit : kLimits) sqlite3_limit(pDb, limit.iId, limit.iMost);
}

void setDefenses(sqlite3* pDb)
{
    sqlite3_db_config(pDb, SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr);
    sqlite3_db_config(pDb, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr);
    // Refuses double-quoted texts: the library writes such texts after LIMIT.
    sqlite3_db_config(pDb, SQLITE_DBCONFIG_DQS_DML, 0, nullptr);
}

// No copy: SQLite calls this, and std::bad_alloc must not pass through it.
std::string_view textOf(const char* szText)
{
    return nullptr == szText ? std::string_view() : szText;
}

}  // namespace

Fence::Fence(sqlite3* pDb, std::string strTable) : pDb_(pDb), strTable_(std::move(strTable))
{
    setLimits(pDb_);
    setDefenses(pDb_);
    sqlite3_set_authorizer(pDb_, authorize, this);
    sqlite3_progress_handler(pDb_, kStepsPerTick, countSteps, this);
}

Fence::~Fence()
{
    sqlite3_progress_handler(pDb_, 0, nullptr, nullptr);
    sqlite3_set_authorizer(pDb_, nullptr, nullptr);
}

int Fence::run(Access access, const std::function<int()>& work)
{
    const int iChanges = sqlite3_total_changes(pDb_);
    int iResult = -1;
    try {
        if (!begin(access)) return -1;
        access_ = access;
        iResult = work();
    } catch (...) {
        rollBack();
        throw;
    }
    const bool blMany = 1 < sqlite3_total_changes(pDb_) - iChanges;
    if (0 <= iResult && !blMany && execute(Access::kTransaction, "commit")) return iResult;
    rollBack();
    return -1;
}

// Stops what takes too many steps, for whatever reason.
int Fence::countSteps(void* pFence)
{
    return kMaxTicks < ++static_cast<Fence*>(pFence)->iTicks_;
}

int Fence::authorize(void* pFence, int iAction, const char* szFirst, const char* szSecond,
                     const char* szDatabase, const char* szTrigger)
{
    const bool blPlain =
        nullptr == szTrigger && (nullptr == szDatabase || "main" == textOf(szDatabase));
    const Fence& fence = *static_cast<Fence*>(pFence);
    return blPlain && fence.allows(iAction, textOf(szFirst), textOf(szSecond)) ? SQLITE_OK
                                                                               : SQLITE_DENY;
}

bool Fence::allows(int iAction, std::string_view first, std::string_view second) const
{
    switch (iAction) {
    case SQLITE_TRANSACTION: return Access::kTransaction == access_;
    case SQLITE_SELECT: return Access::kRead == access_ || Access::kInsert == access_;
    case SQLITE_READ: return strTable_ == first;
    case SQLITE_INSERT: return Access::kInsert == access_ && strTable_ == first;
    case SQLITE_UPDATE: return Access::kUpdate == access_ && strTable_ == first;
    case SQLITE_DELETE: return Access::kDelete == access_ && strTable_ == first;
    // The library reads back the row that it inserted.
    case SQLITE_FUNCTION: return Access::kInsert == access_ && "last_insert_rowid" == second;
    default: return false;
    }
}

// Takes the lock here, where a locked database is an answer and not a wait.
bool Fence::begin(Access access)
{
    if (0 == sqlite3_get_autocommit(pDb_)) rollBack();  // there was no memory for it
    if (Access::kRead != access) return execute(Access::kTransaction, "begin immediate");
    if (!execute(Access::kTransaction, "begin")) return false;
    if (execute(access, ("select 1 from main." + strTable_ + " limit 1").c_str())) return true;
    rollBack();
    return false;
}

// Fails if SQLite has already rolled back by itself.
void Fence::rollBack()
{
    execute(Access::kTransaction, "rollback");
}

// Runs one statement of the fence's own.
bool Fence::execute(Access access, const char* szSql)
{
    iTicks_ = 0;
    access_ = access;
    const int iStatus = sqlite3_exec(pDb_, szSql, nullptr, nullptr, nullptr);
    access_ = Access::kNothing;
    return SQLITE_OK == iStatus;
}
