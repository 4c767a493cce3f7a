#ifndef QUORVEX_PLATFORM_ONCE_H
#define QUORVEX_PLATFORM_ONCE_H

#include <atomic>
#include <functional>

namespace plat {

// One-time initialisation on an atomic state word (not started, in progress, ready):
// the first caller runs the function; callers arriving meanwhile yield until it is ready.
// Usable as a constant-initialised static, before any constructor has run.
class COnce {
public:
    constexpr COnce() = default;
    COnce(const COnce&) = delete;
    COnce& operator=(const COnce&) = delete;

    void Run(const std::function<void()>& init);
    bool IsReady() const { return m_state.load(std::memory_order_acquire) == kReady; }

private:
    static constexpr int kNotStarted = 0;
    static constexpr int kInProgress = 1;
    static constexpr int kReady = 2;
    std::atomic<int> m_state{kNotStarted};
};

}  // namespace plat

#endif  // QUORVEX_PLATFORM_ONCE_H
