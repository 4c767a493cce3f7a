#ifndef QUORVEX_SUPPORT_UTF8_PATH_H
#define QUORVEX_SUPPORT_UTF8_PATH_H

#include <string>

// Paths are UTF-8 texts throughout the library. These helpers take them apart and put
// them together again; every place that builds a path uses kPathSeparator.
namespace utf8path {

constexpr char kPathSeparator = '/';
constexpr const char* kPathSeparatorText = "/";
// Longest path the library keeps (its fixed path buffers hold 1020 characters).
constexpr size_t kMaxPath = 1020;

struct SPathParts {
    std::string drive;   // always empty on this platform
    std::string folder;  // with its trailing separator, or empty
    std::string stem;    // file name without extension
    std::string ext;     // extension with its dot, or empty
};

SPathParts SplitPath(const std::string& path);
std::string JoinPath(const SPathParts& parts);
// The folder with a separator appended when it does not end in one (empty stays empty).
std::string WithTrailingSeparator(const std::string& folder);
// Folder of the running executable, with its trailing separator; empty when unknown.
std::string ExecutableFolder();

}  // namespace utf8path

#endif  // QUORVEX_SUPPORT_UTF8_PATH_H
