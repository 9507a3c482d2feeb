// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "faults/files/fault_vfs.h"

#include <sqlite3.h>

#include <cerrno>

namespace {

using namespace fault_vfs;

Plan plan;

// Counts an operation, and tells whether it has to fail.
bool isDue(Kind kind)
{
    if (0 == (plan.uKinds & kind)) return false;
    const int nBeyond = ++counts.nAll - plan.nFirst;
    if (0 == plan.nFirst || 0 > nBeyond) return false;
    if (0 != nBeyond % plan.nStep || nBeyond / plan.nStep >= plan.nTimes) return false;
    ++counts.nFailed;
    errno = plan.blDiskFull ? ENOSPC : EIO;
    return true;
}

// The real file follows this one in the memory that SQLite provides.
struct File : sqlite3_file {
    sqlite3_file* real() { return reinterpret_cast<sqlite3_file*>(this + 1); }
};

sqlite3_file* real(sqlite3_file* pFile)
{
    return static_cast<File*>(pFile)->real();
}

// A method of the file, which fails with that status if the plan says so.
template <auto method, Kind kind, int iStatus, typename... Arguments>
int pass(sqlite3_file* pFile, Arguments... arguments)
{
    if (isDue(kind)) return iStatus;
    return (real(pFile)->pMethods->*method)(real(pFile), arguments...);
}

// One that never fails.
template <auto method, typename... Arguments>
int pass(sqlite3_file* pFile, Arguments... arguments)
{
    return (real(pFile)->pMethods->*method)(real(pFile), arguments...);
}

int writeFile(sqlite3_file* pFile, const void* pBytes, int nBytes, sqlite3_int64 lOffset)
{
    const auto write = real(pFile)->pMethods->xWrite;
    if (!isDue(kWrite)) return write(real(pFile), pBytes, nBytes, lOffset);
    const int iErrno = errno;
    write(real(pFile), pBytes, nBytes / 2, lOffset);
    errno = iErrno;
    return plan.blDiskFull ? SQLITE_FULL : SQLITE_IOERR_WRITE;
}

// There is no power failure here, so the real disk need not be waited for.
int syncFile(sqlite3_file*, int)
{
    return isDue(kSync) ? SQLITE_IOERR_FSYNC : SQLITE_OK;
}

int lockShared(sqlite3_file* pFile, int iOffset, int n, int iFlags)
{
    if (0 != (iFlags & SQLITE_SHM_LOCK) && isDue(kLockShared)) return SQLITE_BUSY;
    return real(pFile)->pMethods->xShmLock(real(pFile), iOffset, n, iFlags);
}

void barrier(sqlite3_file* pFile)
{
    real(pFile)->pMethods->xShmBarrier(real(pFile));
}

using Methods = sqlite3_io_methods;
const Methods kMethods = {2,
                          pass<&Methods::xClose>,
                          pass<&Methods::xRead, kRead, SQLITE_IOERR_READ>,
                          writeFile,
                          pass<&Methods::xTruncate, kTruncate, SQLITE_IOERR_TRUNCATE>,
                          syncFile,
                          pass<&Methods::xFileSize, kFileSize, SQLITE_IOERR_FSTAT>,
                          pass<&Methods::xLock, kLock, SQLITE_BUSY>,
                          pass<&Methods::xUnlock>,
                          pass<&Methods::xCheckReservedLock>,
                          pass<&Methods::xFileControl>,
                          pass<&Methods::xSectorSize>,
                          pass<&Methods::xDeviceCharacteristics>,
                          pass<&Methods::xShmMap, kMapShared, SQLITE_IOERR_SHMMAP>,
                          lockShared,
                          barrier,
                          pass<&Methods::xShmUnmap>,
                          nullptr,
                          nullptr};

sqlite3_vfs* realVfs(sqlite3_vfs* pVfs)
{
    return static_cast<sqlite3_vfs*>(pVfs->pAppData);
}

int openFile(sqlite3_vfs* pVfs, const char* szName, sqlite3_file* pFile, int iFlags, int* pOutFlags)
{
    pFile->pMethods = nullptr;
    if (isDue(kOpen)) return SQLITE_CANTOPEN;
    const int iStatus = realVfs(pVfs)->xOpen(realVfs(pVfs), szName, real(pFile), iFlags, pOutFlags);
    if (nullptr != real(pFile)->pMethods) pFile->pMethods = &kMethods;
    return iStatus;
}

int deleteFile(sqlite3_vfs* pVfs, const char* szName, int iSyncFolder)
{
    if (isDue(kDelete)) return SQLITE_IOERR_DELETE;
    return realVfs(pVfs)->xDelete(realVfs(pVfs), szName, iSyncFolder);
}

int accessFile(sqlite3_vfs* pVfs, const char* szName, int iFlags, int* pOut)
{
    if (isDue(kAccess)) return SQLITE_IOERR_ACCESS;
    return realVfs(pVfs)->xAccess(realVfs(pVfs), szName, iFlags, pOut);
}

// Everything without a file is left to the default VFS: it ignores its first argument.
sqlite3_vfs overDefault()
{
    sqlite3_vfs* const pDefault = sqlite3_vfs_find(nullptr);
    sqlite3_vfs vfs = *pDefault;
    vfs.zName = "fault";
    vfs.pNext = nullptr;
    vfs.pAppData = pDefault;
    vfs.szOsFile = static_cast<int>(sizeof(File)) + pDefault->szOsFile;
    vfs.xOpen = openFile;
    vfs.xDelete = deleteFile;
    vfs.xAccess = accessFile;
    return vfs;
}

}  // namespace

const char* fault_vfs::name()
{
    static sqlite3_vfs vfs = overDefault();
    static const int iRegistered = sqlite3_vfs_register(&vfs, 0);
    return SQLITE_OK == iRegistered ? vfs.zName : nullptr;
}

void fault_vfs::follow(const Plan& newPlan)
{
    plan = newPlan;
    counts = {};
}

void fault_vfs::lift()
{
    plan = Plan();
}
