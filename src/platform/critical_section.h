#ifndef QUORVEX_PLATFORM_CRITICAL_SECTION_H
#define QUORVEX_PLATFORM_CRITICAL_SECTION_H

#include <mutex>

namespace plat {

// A re-entrant lock: the owning thread may take it again, as the callers nest their
// operations (a public member calling another public member of the same object).
// It satisfies Lockable, so take it through std::lock_guard / std::unique_lock.
class CCriticalSection {
public:
    CCriticalSection() = default;
    CCriticalSection(const CCriticalSection&) = delete;
    CCriticalSection& operator=(const CCriticalSection&) = delete;

    void lock() { m_mutex.lock(); }
    void unlock() { m_mutex.unlock(); }
    bool try_lock() { return m_mutex.try_lock(); }

private:
    std::recursive_mutex m_mutex;
};

using CScopedLock = std::lock_guard<CCriticalSection>;

}  // namespace plat

#endif  // QUORVEX_PLATFORM_CRITICAL_SECTION_H
