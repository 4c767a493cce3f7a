#include "platform/once.h"

#include <sched.h>

namespace plat {

void COnce::Run(const std::function<void()>& init) {
    int expected = kNotStarted;
    if (m_state.compare_exchange_strong(expected, kInProgress, std::memory_order_acq_rel)) {
        init();
        m_state.store(kReady, std::memory_order_release);
        return;
    }
    while (m_state.load(std::memory_order_acquire) != kReady) {
        sched_yield();
    }
}

}  // namespace plat
