#include "quorvex/dwb_lock.h"

#include <new>

#include "platform/critical_section.h"

CDwbLock::CDwbLock(bool autoInitialise, unsigned long spinCount)
    : m_autoInitialise(autoInitialise),
      m_spinCount(spinCount),
      m_section(nullptr),
      m_initialised(false) {}

CDwbLock::CDwbLock(const CDwbLock& other)
    : m_autoInitialise(other.m_autoInitialise),
      m_spinCount(other.m_spinCount),
      m_section(nullptr),
      m_initialised(false) {}

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
    m_section = new (std::nothrow) plat::CCriticalSection();
    m_initialised = m_section != nullptr;
    return m_initialised;
}

void CDwbLock::Lock() {
    if (!m_initialised && m_autoInitialise) {
        Initialize(m_spinCount);
    }
    if (m_section != nullptr) {
        m_section->lock();
    }
}

void CDwbLock::Release() {
    if (m_section != nullptr) {
        m_section->unlock();
    }
}

void CDwbLock::Finish() {
    delete m_section;
    m_section = nullptr;
    m_initialised = false;
}
