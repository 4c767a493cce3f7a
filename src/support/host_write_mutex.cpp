#include "support/host_write_mutex.h"

#include <atomic>

namespace hostmutex {

namespace {
std::atomic<void**> g_writeMutex{nullptr};
}  // namespace

void SetWriteMutex(void** mutex) {
    g_writeMutex.store(mutex, std::memory_order_release);
}

void** WriteMutex() {
    return g_writeMutex.load(std::memory_order_acquire);
}

}  // namespace hostmutex
