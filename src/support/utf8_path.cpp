#include "support/utf8_path.h"

#include "platform/file_system.h"

namespace utf8path {

SPathParts SplitPath(const std::string& path) {
    SPathParts parts;
    size_t slash = path.rfind(kPathSeparator);
    std::string name;
    if (slash == std::string::npos) {
        name = path;
    } else {
        parts.folder = path.substr(0, slash + 1);
        name = path.substr(slash + 1);
    }
    // A leading dot names a hidden file, not an extension (".profile").
    size_t dot = name.rfind('.');
    if (dot == std::string::npos || dot == 0) {
        parts.stem = name;
    } else {
        parts.stem = name.substr(0, dot);
        parts.ext = name.substr(dot);
    }
    return parts;
}

std::string JoinPath(const SPathParts& parts) {
    std::string out = parts.drive;
    out += WithTrailingSeparator(parts.folder);
    out += parts.stem;
    if (!parts.ext.empty() && parts.ext[0] != '.') {
        out += '.';
    }
    out += parts.ext;
    return out;
}

std::string WithTrailingSeparator(const std::string& folder) {
    if (folder.empty() || folder.back() == kPathSeparator) {
        return folder;
    }
    return folder + kPathSeparator;
}

std::string ExecutableFolder() {
    std::string exe = plat::FsExecutablePath();
    if (exe.empty()) {
        return exe;
    }
    return SplitPath(exe).folder;
}

}  // namespace utf8path
