// SPDX-License-Identifier: MIT
/// @file
/// What SQLite itself can refuse while a command of a stranger runs, should a check before it fail.
#ifndef EXAMPLES_GUARDED_FENCE_H
#define EXAMPLES_GUARDED_FENCE_H

#include <sqlite3.h>

#include <functional>
#include <string>
#include <string_view>

// What the statements of a call may do with the table.
enum class Access { kNothing, kTransaction, kRead, kInsert, kUpdate, kDelete };

// Between calls nothing can be done with the connection at all.
class Fence {
public:
    // The connection is the host's and has to outlive the fence.
    Fence(sqlite3* pDb, std::string strTable);
    ~Fence();
    Fence(const Fence&) = delete;
    Fence& operator=(const Fence&) = delete;

    // Does the work in a transaction of its own, with no more than that access. The work counts
    // only when its result is not negative and it changed at most one row; otherwise, also when it
    // throws, everything is as before. Returns the result of the work, or -1, which is also the
    // answer if another connection holds a lock. A transaction that is open is rolled back
    // first.
    int run(Access access, const std::function<int()>& work);

private:
    static int authorize(void* pFence, int iAction, const char* szFirst, const char* szSecond,
                         const char* szDatabase, const char* szTrigger);
    static int countSteps(void* pFence);
    bool allows(int iAction, std::string_view first, std::string_view second) const;
    bool begin(Access access);
    void rollBack();
    bool execute(Access access, const char* szSql);

    sqlite3* pDb_;
    std::string strTable_;
    Access access_ = Access::kNothing;
    int iTicks_ = 0;
};

#endif
