#ifndef QUORVEX_DWB_LOCK_H
#define QUORVEX_DWB_LOCK_H

#include <atomic>

#include "quorvex/export.h"

namespace plat {
class CCriticalSection;
}

// A re-entrant lock created on first use. Threads may meet at that first use: exactly one
// lock is created and all of them take it. Initialize and Finish replace or drop the lock and
// must not race with its use. A copy never shares the lock of its original: it starts unheld
// and creates its own. Satisfies BasicLockable, so std::lock_guard<CDwbLock> serves as the
// scoped guard.
class QUORVEX_API CDwbLock {
public:
    explicit CDwbLock(bool autoInitialise = true, unsigned long spinCount = 4000);
    CDwbLock(const CDwbLock& other);
    CDwbLock& operator=(const CDwbLock& other);
    virtual ~CDwbLock();

    bool Initialize(unsigned long spinCount);
    void Lock();
    void Release();
    void Finish();
    bool IsInitialized() const { return m_section.load(std::memory_order_acquire) != nullptr; }

    void lock() { Lock(); }
    void unlock() { Release(); }

private:
    bool m_autoInitialise;
    unsigned long m_spinCount;
    std::atomic<plat::CCriticalSection*> m_section;
};

#endif  // QUORVEX_DWB_LOCK_H
