#ifndef QUORVEX_PLATFORM_THREAD_H
#define QUORVEX_PLATFORM_THREAD_H

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>

namespace plat {

// The stack size that the worker threads ask for.
constexpr size_t kWorkerStackBytes = 128 * 1024;

// A joinable worker thread with a chosen stack size. Start returns once the new thread
// runs (its start is confirmed through an event), so the creator may rely on it.
class CThread {
public:
    CThread();
    ~CThread();  // joins a thread that was started and not joined
    CThread(const CThread&) = delete;
    CThread& operator=(const CThread&) = delete;

    // False when the thread could not be created; body is not run then.
    bool Start(std::function<void()> body, size_t stackBytes = kWorkerStackBytes);
    void Join();
    bool Joinable() const;
    // True when called on this thread itself (a join from inside would deadlock).
    bool IsCurrent() const;
    // The stack size actually requested from the system for a given wish (sanitized
    // builds need more room than the release build).
    static size_t EffectiveStackBytes(size_t requested);

    struct SImpl;

private:
    std::unique_ptr<SImpl> m_impl;
};

// A small number identifying the calling thread, for log lines and assertions.
uint64_t CurrentThreadId();

}  // namespace plat

#endif  // QUORVEX_PLATFORM_THREAD_H
