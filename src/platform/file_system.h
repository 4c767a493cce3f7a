#ifndef QUORVEX_PLATFORM_FILE_SYSTEM_H
#define QUORVEX_PLATFORM_FILE_SYSTEM_H

#include <cstdint>
#include <cstdio>
#include <string>

namespace plat {

// File-system calls on UTF-8 paths. On failure the system's error number is kept for
// FsLastError; the named ones are those the callers test for.
extern const int kFsErrDiskFull;       // no space left on the volume
extern const int kFsErrAlreadyExists;  // the directory or file exists already
extern const int kFsErrNotFound;

int FsLastError();

// Creates one directory level; false with FsLastError() == kFsErrAlreadyExists when it exists.
bool FsCreateDirectory(const char* path);
bool FsExists(const char* path);
bool FsIsDirectory(const char* path);
// Total free bytes of the volume holding path, blocks reserved for the superuser included.
bool FsFreeBytes(const char* path, uint64_t* freeBytes);
// fopen with a C mode string ("rb", "ab", "r+b", ...); null on failure.
std::FILE* FsOpen(const char* path, const char* mode);
bool FsRename(const char* from, const char* to);
bool FsDelete(const char* path);
// Length of an open file (its current end), or -1.
int64_t FsFileLength(std::FILE* file);
bool FsSeek(std::FILE* file, int64_t offset, int whence);
int64_t FsTell(std::FILE* file);
// Hands the C buffers of the file to the system.
bool FsFlush(std::FILE* file);
// Full path of the running executable; empty when it cannot be obtained.
std::string FsExecutablePath();

}  // namespace plat

#endif  // QUORVEX_PLATFORM_FILE_SYSTEM_H
