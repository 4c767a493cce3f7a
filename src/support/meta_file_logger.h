#ifndef QUORVEX_SUPPORT_META_FILE_LOGGER_H
#define QUORVEX_SUPPORT_META_FILE_LOGGER_H

#include <cstdarg>
#include <cstdio>

#include "platform/critical_section.h"

// Log levels: a line is written when its level is not above the configured one.
enum ELogLevel { kLogError = 1, kLogWarning = 2, kLogInfo = 3, kLogDebug = 4 };

// The library's one diagnostic log: tab-separated lines appended to one file, filtered by
// level, refused when the disk is nearly full, rotated by size into numbered generations.
// Nothing is written until Configure has given it a directory.
class CMetaFileLogger {
public:
    static constexpr const char* kFileName = "QuorvexLog.txt";
    static constexpr size_t kLineBufferSize = 1024;
    static constexpr size_t kPathSize = 1020;

    // The process-wide instance, created on first use.
    static CMetaFileLogger& Instance();

    virtual ~CMetaFileLogger();
    CMetaFileLogger(const CMetaFileLogger&) = delete;
    CMetaFileLogger& operator=(const CMetaFileLogger&) = delete;

    int Print(int level, const char* tag, const char* format, ...)
        __attribute__((format(printf, 4, 5)));
    int VPrint(int level, const char* tag, const char* format, va_list args)
        __attribute__((format(printf, 4, 0)));
    int Configure(const char* dir, unsigned maxSizeKB, unsigned generations, unsigned level);
    // Copies the message of the last written line, cut to the buffer and terminated.
    void GetLastLine(char* buf, unsigned size);

    // Full path of generation n (0 = the current file); for rotation and for tests.
    int GenerationPath(unsigned n, char* out, size_t size) const;
    int Level() const { return m_level; }

private:
    CMetaFileLogger();
    int OpenForAppend();
    int CheckRotation();

    char m_lineBuffer[kLineBufferSize];
    char m_fileName[kPathSize];
    char m_directory[kPathSize];
    int m_maxSizeKB;
    int m_generations;
    int m_level;
    std::FILE* m_file;
    plat::CCriticalSection* m_lock;
};

#endif  // QUORVEX_SUPPORT_META_FILE_LOGGER_H
