// Critical sections, constructed inside the caller's storage.
#include "platform/lock.h"

#include <windows.h>

namespace vt {

static_assert(sizeof(CRITICAL_SECTION) <= sizeof(CriticalSection::storage));
static_assert(alignof(CRITICAL_SECTION) <= alignof(CriticalSection));

namespace {
CRITICAL_SECTION* Native(CriticalSection* lock) { return reinterpret_cast<CRITICAL_SECTION*>(lock->storage); }
}  // namespace

bool InitializeLock(CriticalSection* lock, uint32_t spinCount) {
    return InitializeCriticalSectionAndSpinCount(Native(lock), spinCount) != FALSE;
}

void EnterLock(CriticalSection* lock) { EnterCriticalSection(Native(lock)); }
void LeaveLock(CriticalSection* lock) { LeaveCriticalSection(Native(lock)); }
void DeleteLock(CriticalSection* lock) { DeleteCriticalSection(Native(lock)); }

}  // namespace vt
