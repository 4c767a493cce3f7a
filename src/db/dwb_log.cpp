#include "quorvex/dwb_log.h"

#include <ctime>
#include <mutex>

#include "platform/clock.h"
#include "platform/file_system.h"
#include "platform/local_time.h"
#include "platform/thread.h"

CDwbLog::~CDwbLog() {
    Close();
}

bool CDwbLog::Open(const char* path) {
    Close();
    m_pFile = plat::FsOpen(path, "ab");
    if (m_pFile == nullptr) {
        std::printf("File open error. [%s] \n", path != nullptr ? path : "");
        return false;
    }
    std::printf("Log file opend. [%s] \n", path);
    return true;
}

void CDwbLog::Print(const char* text) {
    std::lock_guard<CDwbLock> guard(m_lock);
    if (m_pFile == nullptr) {
        return;
    }
    std::tm tm{};
    if (!plat::LocalTimeFromUnix(plat::UnixTimeNow(), &tm)) {
        return;
    }
    char prefix[64];
    std::snprintf(prefix, sizeof(prefix), "%02d/%02d/%02d-%02d:%02d:%02d %06d ",
                  (tm.tm_year + 1900 - 2000) % 100, tm.tm_mon + 1, tm.tm_mday, tm.tm_hour,
                  tm.tm_min, tm.tm_sec, static_cast<int>(plat::CurrentThreadId() % 1000000));
    std::fputs(prefix, m_pFile);
    std::fputs(text != nullptr ? text : "", m_pFile);
    std::fputs("\n", m_pFile);
    std::fflush(m_pFile);
}

void CDwbLog::Close() {
    std::lock_guard<CDwbLock> guard(m_lock);
    if (m_pFile != nullptr) {
        std::fclose(m_pFile);
        m_pFile = nullptr;
    }
}
