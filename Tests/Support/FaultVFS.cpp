#include "Support/FaultVFS.h"

#include <sqlite3.h>

#include <cstring>
#include <stdexcept>

namespace Support {

namespace {

FaultVFS* sCurrent = nullptr;

/// A file of ours: behind it in memory stands the real one.
struct File {
    sqlite3_file base;
    sqlite3_file* real() { return reinterpret_cast<sqlite3_file*>(this + 1); }
};

sqlite3_vfs* realVFS(sqlite3_vfs* vfs) {
    return static_cast<sqlite3_vfs*>(vfs->pAppData);
}
sqlite3_file* real(sqlite3_file* file) {
    return reinterpret_cast<File*>(file)->real();
}

int meet(FaultVFS::Call call) {
    return sCurrent ? sCurrent->meet(call) : SQLITE_OK;
}

int closeFile(sqlite3_file* file) {
    return real(file)->pMethods->xClose(real(file));
}

int readFile(sqlite3_file* file, void* buffer, int amount, sqlite3_int64 offset) {
    const int code = meet(FaultVFS::Call::Read);
    if (code == SQLITE_IOERR_SHORT_READ) {
        std::memset(buffer, 0, static_cast<std::size_t>(amount));
        real(file)->pMethods->xRead(real(file), buffer, amount / 2, offset);
        return code;
    }
    return code ? code : real(file)->pMethods->xRead(real(file), buffer, amount, offset);
}

int writeFile(sqlite3_file* file, const void* buffer, int amount, sqlite3_int64 offset) {
    const int code = meet(FaultVFS::Call::Write);
    return code ? code : real(file)->pMethods->xWrite(real(file), buffer, amount, offset);
}

int truncateFile(sqlite3_file* file, sqlite3_int64 size) {
    const int code = meet(FaultVFS::Call::Truncate);
    return code ? code : real(file)->pMethods->xTruncate(real(file), size);
}

/// What survives a power cut is not looked at here, and waiting for the disk takes time.
int syncFile(sqlite3_file*, int) {
    return meet(FaultVFS::Call::Sync);
}

int fileSize(sqlite3_file* file, sqlite3_int64* size) {
    return real(file)->pMethods->xFileSize(real(file), size);
}

int lockFile(sqlite3_file* file, int level) {
    const int code = meet(FaultVFS::Call::Lock);
    return code ? code : real(file)->pMethods->xLock(real(file), level);
}

int unlockFile(sqlite3_file* file, int level) {
    return real(file)->pMethods->xUnlock(real(file), level);
}

int checkReservedLock(sqlite3_file* file, int* result) {
    return real(file)->pMethods->xCheckReservedLock(real(file), result);
}

int fileControl(sqlite3_file* file, int operation, void* argument) {
    return real(file)->pMethods->xFileControl(real(file), operation, argument);
}

int sectorSize(sqlite3_file* file) {
    return real(file)->pMethods->xSectorSize(real(file));
}

int deviceCharacteristics(sqlite3_file* file) {
    return real(file)->pMethods->xDeviceCharacteristics(real(file));
}

int mapSharedMemory(sqlite3_file* file, int page, int size, int extend, void volatile** memory) {
    return real(file)->pMethods->xShmMap(real(file), page, size, extend, memory);
}

/// The locks of the write-ahead log are locks like others; giving one up never fails.
int lockSharedMemory(sqlite3_file* file, int offset, int n, int flags) {
    const int code = (flags & SQLITE_SHM_LOCK) ? meet(FaultVFS::Call::Lock) : SQLITE_OK;
    return code ? code : real(file)->pMethods->xShmLock(real(file), offset, n, flags);
}

void sharedMemoryBarrier(sqlite3_file* file) {
    real(file)->pMethods->xShmBarrier(real(file));
}

int unmapSharedMemory(sqlite3_file* file, int deleteFlag) {
    return real(file)->pMethods->xShmUnmap(real(file), deleteFlag);
}

// Version 2: no memory-mapped reads, which would go past us.
const sqlite3_io_methods sMethods = {2,
                                     closeFile,
                                     readFile,
                                     writeFile,
                                     truncateFile,
                                     syncFile,
                                     fileSize,
                                     lockFile,
                                     unlockFile,
                                     checkReservedLock,
                                     fileControl,
                                     sectorSize,
                                     deviceCharacteristics,
                                     mapSharedMemory,
                                     lockSharedMemory,
                                     sharedMemoryBarrier,
                                     unmapSharedMemory,
                                     nullptr,
                                     nullptr};

int openFile(sqlite3_vfs* vfs, sqlite3_filename name, sqlite3_file* file, int flags,
             int* outFlags) {
    file->pMethods = nullptr;
    if (const int code = meet(FaultVFS::Call::Open)) return code;
    const int result = realVFS(vfs)->xOpen(realVFS(vfs), name, real(file), flags, outFlags);
    if (result == SQLITE_OK) file->pMethods = &sMethods;
    return result;
}

int deleteFile(sqlite3_vfs* vfs, const char* name, int) {
    return realVFS(vfs)->xDelete(realVFS(vfs), name, 0);
}

/// Waits for nothing: a lock that is missing here is missing by plan.
int sleepFor(sqlite3_vfs*, int microseconds) {
    return microseconds;
}

sqlite3_vfs sVFS = {};

}  // namespace

FaultVFS::FaultVFS() {
    sqlite3_vfs* real = sqlite3_vfs_find(nullptr);
    if (!real || sCurrent) throw std::logic_error("one FaultVFS at a time, over a real one");
    sVFS = *real;
    sVFS.pNext = nullptr;
    sVFS.zName = "orvane-faults";
    sVFS.szOsFile = static_cast<int>(sizeof(File)) + real->szOsFile;
    sVFS.pAppData = real;
    sVFS.xOpen = openFile;
    sVFS.xDelete = deleteFile;
    sVFS.xSleep = sleepFor;
    sCurrent = this;
    sqlite3_vfs_register(&sVFS, 1);
}

FaultVFS::~FaultVFS() {
    auto* real = static_cast<sqlite3_vfs*>(sVFS.pAppData);
    sqlite3_vfs_unregister(&sVFS);
    sqlite3_vfs_register(real, 1);
    sCurrent = nullptr;
}

void FaultVFS::failAt(Call call, int n, int code, bool forEver) {
    clear();
    mFailing = call;
    mFailAt = n;
    mCode = code;
    mForEver = forEver;
}

void FaultVFS::clear() {
    mCounts.fill(0);
    mFailAt = 0;
    mHasFailed = false;
}

int FaultVFS::meet(Call call) {
    const int n = ++mCounts[static_cast<std::size_t>(call)];
    if (mFailAt == 0 || call != mFailing) return SQLITE_OK;
    if (n != mFailAt && !(mForEver && n > mFailAt)) return SQLITE_OK;
    mHasFailed = true;
    return mCode;
}

}  // namespace Support
