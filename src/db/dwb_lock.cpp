#include "quorvex/dwb_lock.h"

#include <new>

#include "platform/critical_section.h"

CDwbLock::CDwbLock(bool autoInitialise, unsigned long spinCount)
    : m_autoInitialise(autoInitialise), m_spinCount(spinCount), m_section(nullptr) {}

CDwbLock::CDwbLock(const CDwbLock& other)
    : m_autoInitialise(other.m_autoInitialise),
      m_spinCount(other.m_spinCount),
      m_section(nullptr) {}

CDwbLock& CDwbLock::operator=(const CDwbLock& other) {
    if (this != &other) {
        Finish();
        m_autoInitialise = other.m_autoInitialise;
        m_spinCount = other.m_spinCount;
    }
    return *this;
}

CDwbLock::~CDwbLock() {
    Finish();
}

bool CDwbLock::Initialize(unsigned long spinCount) {
    Finish();
    // The spin count tunes a Windows critical section; the lock here blocks at once.
    m_spinCount = spinCount;
    m_section.store(new (std::nothrow) plat::CCriticalSection(), std::memory_order_release);
    return IsInitialized();
}

void CDwbLock::Lock() {
    plat::CCriticalSection* section = m_section.load(std::memory_order_acquire);
    if (section == nullptr && m_autoInitialise) {
        // Several threads may get here on the first use: the first to publish its lock wins
        // and the others take that one.
        auto* created = new (std::nothrow) plat::CCriticalSection();
        if (created != nullptr) {
            if (m_section.compare_exchange_strong(section, created, std::memory_order_acq_rel)) {
                section = created;
            } else {
                delete created;
            }
        }
    }
    if (section != nullptr) {
        section->lock();
    }
}

void CDwbLock::Release() {
    plat::CCriticalSection* section = m_section.load(std::memory_order_acquire);
    if (section != nullptr) {
        section->unlock();
    }
}

void CDwbLock::Finish() {
    delete m_section.exchange(nullptr, std::memory_order_acq_rel);
}
