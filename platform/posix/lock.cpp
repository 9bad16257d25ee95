// Critical sections as recursive pthread mutexes, constructed inside the caller's storage.
#include "platform/lock.h"

#include <pthread.h>

namespace vt {

static_assert(sizeof(pthread_mutex_t) <= sizeof(CriticalSection::storage));
static_assert(alignof(pthread_mutex_t) <= alignof(CriticalSection));

namespace {
pthread_mutex_t* Native(CriticalSection* lock) { return reinterpret_cast<pthread_mutex_t*>(lock->storage); }
}  // namespace

bool InitializeLock(CriticalSection* lock, uint32_t /*spinCount: no spinning on this platform*/) {
    pthread_mutexattr_t attributes;
    if (pthread_mutexattr_init(&attributes) != 0) return false;
    pthread_mutexattr_settype(&attributes, PTHREAD_MUTEX_RECURSIVE);
    const bool ok = pthread_mutex_init(Native(lock), &attributes) == 0;
    pthread_mutexattr_destroy(&attributes);
    return ok;
}

void EnterLock(CriticalSection* lock) { pthread_mutex_lock(Native(lock)); }
void LeaveLock(CriticalSection* lock) { pthread_mutex_unlock(Native(lock)); }
void DeleteLock(CriticalSection* lock) { pthread_mutex_destroy(Native(lock)); }

}  // namespace vt
