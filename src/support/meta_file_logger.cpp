#include "support/meta_file_logger.h"

#include <cstring>

#include "platform/file_system.h"
#include "platform/local_time.h"
#include "platform/once.h"
#include "support/utf8_path.h"

namespace {

// The lock outlives every instance (it is never deleted): a line logged from a static
// destructor at process exit must still find it.
plat::COnce g_lockOnce;
plat::CCriticalSection* g_lock = nullptr;

const char* HeaderPattern(int level) {
    switch (level) {
        case kLogError:
            return "%s\tError\t%s\t";
        case kLogWarning:
            return "%s\tWarning\t%s\t";
        case kLogInfo:
            return "%s\tInfo\t%s\t";
        case kLogDebug:
            return "%s\tDebug\t%s\t";
        default:
            // Level 5 passes the range check but has no word of its own.
            return "%s\t\t%s\t";
    }
}

}  // namespace

CMetaFileLogger& CMetaFileLogger::Instance() {
    static CMetaFileLogger instance;
    return instance;
}

CMetaFileLogger::CMetaFileLogger()
    : m_maxSizeKB(512), m_generations(3), m_level(kLogInfo), m_file(nullptr), m_lock(nullptr) {
    m_lineBuffer[0] = '\0';
    std::snprintf(m_fileName, sizeof(m_fileName), "%s", kFileName);
    m_directory[0] = '\0';
    g_lockOnce.Run([] { g_lock = new plat::CCriticalSection(); });
    m_lock = g_lock;
}

CMetaFileLogger::~CMetaFileLogger() {
    plat::CScopedLock guard(*m_lock);
    if (m_file != nullptr) {
        std::fclose(m_file);
        m_file = nullptr;
    }
    // The directory is cleared so that a line logged after destruction is refused.
    m_directory[0] = '\0';
}

int CMetaFileLogger::GenerationPath(unsigned n, char* out, size_t size) const {
    if (out == nullptr || size == 0) {
        return -1001;
    }
    std::string current = std::string(m_directory) + m_fileName;
    if (n == 0) {
        std::snprintf(out, size, "%s", current.c_str());
        return 1;
    }
    utf8path::SPathParts parts = utf8path::SplitPath(current);
    parts.stem += std::to_string(n);
    std::snprintf(out, size, "%s", utf8path::JoinPath(parts).c_str());
    return 1;
}

int CMetaFileLogger::OpenForAppend() {
    char path[kPathSize * 2];
    GenerationPath(0, path, sizeof(path));
    m_file = plat::FsOpen(path, "ab");
    return m_file != nullptr ? 1 : -1014;
}

int CMetaFileLogger::Configure(const char* dir, unsigned maxSizeKB, unsigned generations,
                               unsigned level) {
    if (level == 0 || level > 4) {
        return -1001;
    }
    m_level = static_cast<int>(level);
    if (maxSizeKB == 0 || generations == 0) {
        return -1001;
    }
    // Both are kept as 32-bit ints; larger values would turn negative.
    if (maxSizeKB > 0x7FFFFFFFu || generations > 0x7FFFFFFFu) {
        return -1001;
    }
    m_maxSizeKB = static_cast<int>(maxSizeKB);
    m_generations = static_cast<int>(generations);
    if (dir == nullptr || *dir == '\0') {
        return -1014;
    }
    plat::CScopedLock guard(*m_lock);
    std::string directory = utf8path::WithTrailingSeparator(dir);
    if (directory.size() >= sizeof(m_directory)) {
        return -1014;
    }
    std::snprintf(m_directory, sizeof(m_directory), "%s", directory.c_str());
    if (m_file != nullptr) {
        std::fclose(m_file);
        m_file = nullptr;
    }
    if (OpenForAppend() != 1) {
        return -1014;
    }
    std::fclose(m_file);
    m_file = nullptr;
    return 1;
}

int CMetaFileLogger::Print(int level, const char* tag, const char* format, ...) {
    va_list args;
    va_start(args, format);
    int rc = VPrint(level, tag, format, args);
    va_end(args);
    return rc;
}

int CMetaFileLogger::VPrint(int level, const char* tag, const char* format, va_list args) {
    if (m_directory[0] == '\0') {
        return -1013;
    }
    if (level <= 0 || level > 5) {
        return -1001;
    }
    if (level > m_level) {
        return 1;
    }
    {
        plat::CScopedLock guard(*m_lock);
        if (m_file == nullptr && OpenForAppend() != 1) {
            return -1014;
        }
        uint64_t freeBytes = 0;
        uint64_t needed = (static_cast<uint64_t>(m_generations) + 2u) *
                          static_cast<uint64_t>(m_maxSizeKB) * 1024u;
        if (plat::FsFreeBytes(m_directory, &freeBytes) && freeBytes < needed) {
            return -1015;
        }
        char stamp[64];
        plat::FormatLocalNow("%d-%m-%Y\t%H:%M:%S", stamp, sizeof(stamp));
        std::snprintf(m_lineBuffer, sizeof(m_lineBuffer), HeaderPattern(level), stamp,
                      tag != nullptr ? tag : "");
        bool ok = std::fputs(m_lineBuffer, m_file) >= 0;
        if (format == nullptr) {
            m_lineBuffer[0] = '\0';
        } else {
            std::vsnprintf(m_lineBuffer, sizeof(m_lineBuffer), format, args);
        }
        ok = ok && std::fputs(m_lineBuffer, m_file) >= 0;
        ok = ok && std::fputc('\n', m_file) != EOF;
        ok = ok && plat::FsFlush(m_file);
        if (!ok) {
            return -1016;
        }
    }
    return CheckRotation();
}

int CMetaFileLogger::CheckRotation() {
    plat::CScopedLock guard(*m_lock);
    if (m_file == nullptr) {
        return -1008;
    }
    if (m_directory[0] == '\0') {
        return -1013;
    }
    // Opened for appending, so the position after a write is the end of the file.
    int64_t length = plat::FsTell(m_file);
    if (length >= 0 && length < static_cast<int64_t>(m_maxSizeKB) * 1024) {
        return 1;
    }
    std::fclose(m_file);
    m_file = nullptr;
    char target[kPathSize * 2];
    char source[kPathSize * 2];
    for (int n = m_generations; n >= 1; --n) {
        GenerationPath(static_cast<unsigned>(n), target, sizeof(target));
        if (plat::FsExists(target) && !plat::FsDelete(target)) {
            return -1019;
        }
        GenerationPath(static_cast<unsigned>(n - 1), source, sizeof(source));
        if (plat::FsExists(source) && !plat::FsRename(source, target)) {
            return -1019;
        }
    }
    return OpenForAppend();
}

void CMetaFileLogger::GetLastLine(char* buf, unsigned size) {
    if (buf == nullptr || size == 0) {
        return;
    }
    plat::CScopedLock guard(*m_lock);
    std::snprintf(buf, size, "%s", m_lineBuffer);
}
