#ifndef QUORVEX_DWB_LOG_H
#define QUORVEX_DWB_LOG_H

#include <cstdio>

#include "quorvex/dwb_lock.h"
#include "quorvex/export.h"

// A small debug log file for the host: each line is prefixed with the local date and time
// and the calling thread's id.
class QUORVEX_API CDwbLog {
public:
    CDwbLog() = default;
    ~CDwbLog();
    CDwbLog(const CDwbLog&) = delete;
    CDwbLog& operator=(const CDwbLog&) = delete;

    // Opens the file for appending; an already open file is closed first.
    bool Open(const char* path);
    void Print(const char* text);
    void Close();
    bool IsOpen() const { return m_pFile != nullptr; }

private:
    std::FILE* m_pFile = nullptr;
    CDwbLock m_lock{true, 4000};
};

#endif  // QUORVEX_DWB_LOG_H
