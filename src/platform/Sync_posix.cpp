// Locking primitives on POSIX: pthread mutexes, and named mutexes in shared memory.
#include "platform/Fault.h"
#include "platform/Sync.h"

#include <cerrno>
#include <ctime>
#include <fcntl.h>
#include <new>
#include <pthread.h>
#include <sched.h>
#include <string>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

namespace tekit::platform {

static_assert(sizeof(pthread_mutex_t) <= kCriticalSectionSize &&
              alignof(pthread_mutex_t) <= kCriticalSectionAlign);

namespace {

pthread_mutex_t* AsMutex(void* section) {
    return static_cast<pthread_mutex_t*>(section);
}

/// Initialises a recursive mutex, robust and process-shared when asked.
int InitializeMutex(pthread_mutex_t* mutex, bool shared) {
    pthread_mutexattr_t attributes;
    pthread_mutexattr_init(&attributes);
    pthread_mutexattr_settype(&attributes, PTHREAD_MUTEX_RECURSIVE);
    if (shared) {
        pthread_mutexattr_setpshared(&attributes, PTHREAD_PROCESS_SHARED);
        pthread_mutexattr_setrobust(&attributes, PTHREAD_MUTEX_ROBUST);
    }
    int const rc = pthread_mutex_init(mutex, &attributes);
    pthread_mutexattr_destroy(&attributes);
    return rc;
}

} // namespace

void InitializeCriticalSectionObject(void* section, std::uint32_t) {
    InitializeMutex(new (section) pthread_mutex_t, false);
}

void DeleteCriticalSectionObject(void* section) {
    pthread_mutex_destroy(AsMutex(section));
}

void EnterCriticalSectionObject(void* section) {
    pthread_mutex_lock(AsMutex(section));
}

bool TryEnterCriticalSectionObject(void* section) {
    return pthread_mutex_trylock(AsMutex(section)) == 0;
}

void LeaveCriticalSectionObject(void* section) {
    pthread_mutex_unlock(AsMutex(section));
}

void YieldTimeSlice() {
    sched_yield();
}

// ---- Named mutexes ----------------------------------------------------------------------
//
// The shared-memory object holds the mutex. Its first byte, locked exclusively (open file
// description locks, which a dying process drops), serialises opening and closing; its second
// byte is locked shared by every handle that is open. A close that can lock the second byte
// exclusively is the last user anywhere and removes the name, as closing a Windows mutex's
// last handle does; a process that dies never counts as a user again.

namespace {

struct SharedMutex {
    pthread_mutex_t mutex;
    std::uint32_t initialized; // written and read only under the first byte's lock
};

struct NamedMutex {
    int fd = -1; // -1: anonymous, `shared` is on the heap
    SharedMutex* shared = nullptr;
    std::string objectName;
};

enum : off_t { kGuardByte = 0, kUserByte = 1 };

int LockByte(int fd, off_t byte, short type, bool wait) {
    struct flock lock = {};
    lock.l_type = type;
    lock.l_whence = SEEK_SET;
    lock.l_start = byte;
    lock.l_len = 1;
    return ::fcntl(fd, wait ? F_OFD_SETLKW : F_OFD_SETLK, &lock);
}

/// "/tekit.mutex.<name>" with '/' (not allowed in the name) replaced, short enough for any
/// file system.
std::string ObjectNameFor(char const* name) {
    std::string object = "/tekit.mutex.";
    for (char const* c = name; *c != '\0' && object.size() < 240; ++c)
        object += *c == '/' ? '_' : *c;
    return object;
}

/// Opens the object with its guard byte locked, retrying when the last user removed it while
/// this call waited for the guard.
SystemError OpenGuarded(std::string const& object, int& fd) {
    for (;;) {
        fd = ::shm_open(object.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
        if (fd < 0)
            return {"shm_open", errno};
        struct stat info = {};
        if (LockByte(fd, kGuardByte, F_WRLCK, true) != 0 || ::fstat(fd, &info) != 0) {
            int const code = errno;
            ::close(fd);
            return {"fcntl", code};
        }
        if (info.st_nlink > 0)
            return {};
        ::close(fd);
    }
}

SystemError MapShared(int fd, SharedMutex*& shared) {
    struct stat info = {};
    if (::fstat(fd, &info) != 0)
        return {"fstat", errno};
    if (info.st_size < off_t(sizeof(SharedMutex)) && ::ftruncate(fd, sizeof(SharedMutex)) != 0)
        return {"ftruncate", errno};
    void* const address =
        ::mmap(nullptr, sizeof(SharedMutex), PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    if (address == MAP_FAILED)
        return {"mmap", errno};
    shared = static_cast<SharedMutex*>(address);
    if (!shared->initialized) {
        if (int const rc = InitializeMutex(&shared->mutex, true)) {
            ::munmap(address, sizeof(SharedMutex));
            return {"pthread_mutex_init", rc};
        }
        shared->initialized = 1;
    }
    return {};
}

int LockWithin(pthread_mutex_t* mutex, std::uint32_t timeoutMs) {
    timespec until = {};
    clock_gettime(CLOCK_REALTIME, &until);
    until.tv_sec += timeoutMs / 1000;
    until.tv_nsec += long(timeoutMs % 1000) * 1000000L;
    if (until.tv_nsec >= 1000000000L) {
        until.tv_sec += 1;
        until.tv_nsec -= 1000000000L;
    }
    return pthread_mutex_timedlock(mutex, &until);
}

SystemError OpenNamed(NamedMutex& named) {
    if (SystemError const error = OpenGuarded(named.objectName, named.fd))
        return error;
    SystemError error = MapShared(named.fd, named.shared);
    if (!error && LockByte(named.fd, kUserByte, F_RDLCK, false) != 0)
        error = {"fcntl", errno};
    if (error) {
        if (named.shared)
            ::munmap(named.shared, sizeof(SharedMutex));
        ::close(named.fd); // drops the guard
        return error;
    }
    LockByte(named.fd, kGuardByte, F_UNLCK, false);
    return {};
}

} // namespace

SystemError CreateNamedMutex(char const* name, NamedMutexHandle& handle) {
    if (SystemError const injected = InjectedFailure(FaultKind::Open, "shm_open"))
        return injected;
    auto* named = new (std::nothrow) NamedMutex;
    if (!named)
        return {"new", ENOMEM};
    if (name == nullptr || *name == '\0') {
        named->shared = new (std::nothrow) SharedMutex{};
        if (!named->shared || InitializeMutex(&named->shared->mutex, false) != 0) {
            delete named->shared;
            delete named;
            return {"pthread_mutex_init", ENOMEM};
        }
    } else {
        named->objectName = ObjectNameFor(name);
        if (SystemError const error = OpenNamed(*named)) {
            delete named;
            return error;
        }
    }
    handle = named;
    return {};
}

std::uint32_t WaitForNamedMutex(NamedMutexHandle handle, std::uint32_t timeoutMs,
                                SystemError& error) {
    pthread_mutex_t* const mutex = &static_cast<NamedMutex*>(handle)->shared->mutex;
    // A free or abandoned mutex is taken without a deadline. (This also keeps the race
    // detector right: it understands a dead owner's mutex from trylock and lock, not timedlock.)
    int rc = pthread_mutex_trylock(mutex);
    if (rc == EBUSY && timeoutMs != 0)
        rc = timeoutMs == kWaitForever ? pthread_mutex_lock(mutex) : LockWithin(mutex, timeoutMs);
    switch (rc) {
    case 0:
        return kWaitAcquired;
    case EOWNERDEAD: // the holder died: the mutex is ours, and usable again
        pthread_mutex_consistent(mutex);
        return kWaitAbandoned;
    case EBUSY:
    case ETIMEDOUT:
        return kWaitTimeout;
    default:
        error = {"pthread_mutex_lock", rc};
        return kWaitFailed;
    }
}

void ReleaseNamedMutex(NamedMutexHandle handle) {
    pthread_mutex_unlock(&static_cast<NamedMutex*>(handle)->shared->mutex);
}

void CloseNamedMutex(NamedMutexHandle handle) {
    auto* const named = static_cast<NamedMutex*>(handle);
    if (named->fd < 0) {
        pthread_mutex_destroy(&named->shared->mutex);
        delete named->shared;
    } else {
        LockByte(named->fd, kGuardByte, F_WRLCK, true);
        if (LockByte(named->fd, kUserByte, F_WRLCK, false) == 0)
            ::shm_unlink(named->objectName.c_str());
        ::munmap(named->shared, sizeof(SharedMutex));
        ::close(named->fd); // drops both locks
    }
    delete named;
}

} // namespace tekit::platform
