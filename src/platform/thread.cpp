#include "platform/thread.h"

#include <pthread.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <climits>

#include "platform/event.h"

namespace plat {

struct CThread::SImpl {
    pthread_t handle{};
    bool joinable = false;
    std::function<void()> body;
    CEvent started{true, false};
    // Holds the new thread back until the creator has recorded its handle, so that
    // IsCurrent and Join work from the very first instruction of the body.
    CEvent recorded{true, false};
};

namespace {

void* ThreadEntry(void* arg) {
    auto* impl = static_cast<CThread::SImpl*>(arg);
    impl->recorded.Wait(kWaitInfinite);
    std::function<void()> body = std::move(impl->body);
    impl->started.Set();
    body();
    return nullptr;
}

}  // namespace

CThread::CThread() : m_impl(std::make_unique<SImpl>()) {}

CThread::~CThread() {
    Join();
}

size_t CThread::EffectiveStackBytes(size_t requested) {
#ifdef QUORVEX_SANITIZED_BUILD
    requested *= 8;
#endif
    if (requested < static_cast<size_t>(PTHREAD_STACK_MIN)) {
        requested = PTHREAD_STACK_MIN;
    }
    return requested;
}

bool CThread::Start(std::function<void()> body, size_t stackBytes) {
    if (m_impl->joinable) {
        return false;
    }
    pthread_attr_t attr;
    if (pthread_attr_init(&attr) != 0) {
        return false;
    }
    bool ok = pthread_attr_setstacksize(&attr, EffectiveStackBytes(stackBytes)) == 0;
    m_impl->body = std::move(body);
    m_impl->started.Reset();
    m_impl->recorded.Reset();
    ok = ok && pthread_create(&m_impl->handle, &attr, ThreadEntry, m_impl.get()) == 0;
    pthread_attr_destroy(&attr);
    if (!ok) {
        m_impl->body = nullptr;
        return false;
    }
    m_impl->joinable = true;
    m_impl->recorded.Set();
    m_impl->started.Wait(kWaitInfinite);
    return true;
}

void CThread::Join() {
    if (!m_impl->joinable || IsCurrent()) {
        return;
    }
    pthread_join(m_impl->handle, nullptr);
    m_impl->joinable = false;
}

bool CThread::Joinable() const {
    return m_impl->joinable;
}

bool CThread::IsCurrent() const {
    return m_impl->joinable && pthread_equal(m_impl->handle, pthread_self()) != 0;
}

uint64_t CurrentThreadId() {
    return static_cast<uint64_t>(syscall(SYS_gettid));
}

}  // namespace plat
