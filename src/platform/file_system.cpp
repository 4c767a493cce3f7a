#include "platform/file_system.h"

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <cerrno>
#include <climits>

namespace plat {

const int kFsErrDiskFull = ENOSPC;
const int kFsErrAlreadyExists = EEXIST;
const int kFsErrNotFound = ENOENT;

namespace {

thread_local int t_lastError = 0;

bool Fail() {
    t_lastError = errno;
    return false;
}

bool Valid(const char* path) {
    if (path == nullptr || *path == '\0') {
        t_lastError = ENOENT;
        return false;
    }
    return true;
}

}  // namespace

int FsLastError() {
    return t_lastError;
}

bool FsCreateDirectory(const char* path) {
    if (!Valid(path)) {
        return false;
    }
    return mkdir(path, 0777) == 0 || Fail();
}

bool FsExists(const char* path) {
    if (!Valid(path)) {
        return false;
    }
    struct stat st {};
    return stat(path, &st) == 0 || Fail();
}

bool FsIsDirectory(const char* path) {
    if (!Valid(path)) {
        return false;
    }
    struct stat st {};
    if (stat(path, &st) != 0) {
        return Fail();
    }
    return S_ISDIR(st.st_mode);
}

bool FsFreeBytes(const char* path, uint64_t* freeBytes) {
    if (!Valid(path) || freeBytes == nullptr) {
        return false;
    }
    struct statvfs vfs {};
    if (statvfs(path, &vfs) != 0) {
        return Fail();
    }
    *freeBytes = static_cast<uint64_t>(vfs.f_bfree) * static_cast<uint64_t>(vfs.f_frsize);
    return true;
}

std::FILE* FsOpen(const char* path, const char* mode) {
    if (!Valid(path) || mode == nullptr) {
        return nullptr;
    }
    std::FILE* f = std::fopen(path, mode);
    if (f == nullptr) {
        Fail();
    }
    return f;
}

bool FsRename(const char* from, const char* to) {
    if (!Valid(from) || !Valid(to)) {
        return false;
    }
    return std::rename(from, to) == 0 || Fail();
}

bool FsDelete(const char* path) {
    if (!Valid(path)) {
        return false;
    }
    return unlink(path) == 0 || Fail();
}

int64_t FsFileLength(std::FILE* file) {
    if (file == nullptr) {
        return -1;
    }
    std::fflush(file);
    struct stat st {};
    if (fstat(fileno(file), &st) != 0) {
        Fail();
        return -1;
    }
    return static_cast<int64_t>(st.st_size);
}

bool FsSeek(std::FILE* file, int64_t offset, int whence) {
    if (file == nullptr) {
        return false;
    }
    return fseeko(file, static_cast<off_t>(offset), whence) == 0 || Fail();
}

int64_t FsTell(std::FILE* file) {
    if (file == nullptr) {
        return -1;
    }
    off_t pos = ftello(file);
    if (pos < 0) {
        Fail();
    }
    return static_cast<int64_t>(pos);
}

bool FsFlush(std::FILE* file) {
    if (file == nullptr) {
        return false;
    }
    if (std::fflush(file) != 0) {
        return Fail();
    }
    return true;
}

std::string FsExecutablePath() {
    char buf[PATH_MAX + 1];
    ssize_t n = readlink("/proc/self/exe", buf, PATH_MAX);
    if (n <= 0) {
        Fail();
        return std::string();
    }
    return std::string(buf, static_cast<size_t>(n));
}

}  // namespace plat
