// Recursive locks with the semantics of Windows critical sections. The storage lives inside
// records the host owns (GlobalState), so it is a fixed-size opaque block initialised in place.
#pragma once

#include <cstdint>

namespace vt {

struct CriticalSection {
    alignas(8) unsigned char storage[64];
};

// The spin count with the pre-allocate-event bit, as the module's locks are created.
inline constexpr uint32_t kLockSpinCount = 0x80000400;

bool InitializeLock(CriticalSection* lock, uint32_t spinCount = kLockSpinCount);
void EnterLock(CriticalSection* lock);
void LeaveLock(CriticalSection* lock);
void DeleteLock(CriticalSection* lock);

// Holds a lock for the life of a scope.
class LockGuard {
public:
    explicit LockGuard(CriticalSection* lock) : m_lock(lock) { EnterLock(m_lock); }
    ~LockGuard() { LeaveLock(m_lock); }
    LockGuard(const LockGuard&) = delete;
    LockGuard& operator=(const LockGuard&) = delete;

private:
    CriticalSection* m_lock;
};

}  // namespace vt
