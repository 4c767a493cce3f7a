#ifndef QUORVEX_PLATFORM_EVENT_H
#define QUORVEX_PLATFORM_EVENT_H

#include <condition_variable>
#include <cstdint>
#include <mutex>

namespace plat {

constexpr uint32_t kWaitInfinite = 0xFFFFFFFFu;

// A signalling event. An auto-reset event releases one waiter and clears itself; a
// manual-reset event stays signalled, releasing every waiter, until Reset.
class CEvent {
public:
    CEvent(bool manualReset, bool initiallySignalled);
    CEvent(const CEvent&) = delete;
    CEvent& operator=(const CEvent&) = delete;

    void Set();
    void Reset();
    // True when the event was signalled within timeoutMs (kWaitInfinite waits forever).
    bool Wait(uint32_t timeoutMs);
    bool IsSignalled();

private:
    std::mutex m_mutex;
    std::condition_variable m_cond;
    bool m_manualReset;
    bool m_signalled;
};

}  // namespace plat

#endif  // QUORVEX_PLATFORM_EVENT_H
