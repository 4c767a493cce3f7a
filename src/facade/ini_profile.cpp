#include "facade/ini_profile.h"

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "platform/file_system.h"
#include "support/meta_file_logger.h"

namespace {

constexpr const char* kTagProfile = "CQuorvex::GetMyProfile";
constexpr const char* kTagString = "CQuorvex::GetMyProfileString";
constexpr const char* kTagInt = "CQuorvex::GetMyProfileInt";

bool StartsWith(const char* line, const std::string& prefix) {
    return std::strncmp(line, prefix.c_str(), prefix.size()) == 0;
}

// Drops the line feed and a carriage return before it (files written on Windows).
void StripLineEnd(char* line) {
    size_t len = std::strlen(line);
    if (len > 0 && line[len - 1] == '\n') {
        line[--len] = '\0';
    }
    if (len > 0 && line[len - 1] == '\r') {
        line[--len] = '\0';
    }
}

}  // namespace

int CIniProfile::GetMyProfile(const char* section, const char* key, const char* /*unused*/,
                              char* out, unsigned long outSize, const char* file) {
    CMetaFileLogger& log = CMetaFileLogger::Instance();
    if (section == nullptr) {
        log.Print(kLogWarning, kTagProfile, "pAppName is NULL.");
        return -1001;
    }
    if (key == nullptr) {
        log.Print(kLogWarning, kTagProfile, "pKeyName is NULL.");
        return -1001;
    }
    if (*section == '\0') {
        log.Print(kLogWarning, kTagProfile, "pAppName is empty.");
        return -1001;
    }
    if (*key == '\0') {
        log.Print(kLogWarning, kTagProfile, "pKeyName is empty.");
        return -1001;
    }
    if (out == nullptr || outSize == 0) {
        log.Print(kLogWarning, kTagProfile, "No output buffer.");
        return -1001;
    }
    std::FILE* fp = plat::FsOpen(file, "r");
    if (fp == nullptr) {
        log.Print(kLogWarning, kTagProfile, "No INI file: %s.", file != nullptr ? file : "");
        return -1004;
    }
    const std::string sectionPattern = std::string("[") + section + "]";
    const std::string keyPattern = std::string(key) + "=";
    char line[kLineBufferSize];
    bool sectionSeen = false;
    bool found = false;
    while (std::fgets(line, sizeof(line), fp) != nullptr) {
        StripLineEnd(line);
        if (!sectionSeen) {
            sectionSeen = StartsWith(line, sectionPattern);
        } else if (StartsWith(line, keyPattern)) {
            found = true;
            break;
        }
    }
    std::fclose(fp);
    if (!found) {
        return -1007;
    }
    const char* value = line + keyPattern.size();
    size_t len = std::strlen(value);
    if (len > outSize - 1) {
        log.Print(kLogError, kTagProfile, "Too long data.");
        return -1002;
    }
    if (len == 0) {
        return -1028;
    }
    std::memcpy(out, value, len + 1);
    return 1;
}

unsigned long CIniProfile::GetMyProfileString(const char* section, const char* key, const char* def,
                                              char* out, unsigned long outSize, const char* file) {
    if (out == nullptr || outSize == 0) {
        return 0;
    }
    int rc = GetMyProfile(section, key, nullptr, out, outSize, file);
    if (rc != 1) {
        const char* fallback = def != nullptr ? def : "";
        CMetaFileLogger::Instance().Print(
            kLogWarning, kTagString, "Return default value for [%s]%s=%s.",
            section != nullptr ? section : "", key != nullptr ? key : "", fallback);
        if (out != def) {
            std::snprintf(out, outSize, "%s", fallback);
        }
    }
    if (rc == -1002) {
        return outSize - 1;
    }
    return static_cast<unsigned long>(std::strlen(out));
}

int CIniProfile::GetMyProfileInt(const char* section, const char* key, int def, const char* file) {
    CMetaFileLogger& log = CMetaFileLogger::Instance();
    char value[16];
    if (GetMyProfile(section, key, nullptr, value, sizeof(value), file) != 1) {
        log.Print(kLogWarning, kTagInt, "Return default value for [%s]%s=%d.",
                  section != nullptr ? section : "", key != nullptr ? key : "", def);
        return def;
    }
    char* end = nullptr;
    errno = 0;
    long number = std::strtol(value, &end, 10);
    if (end == value) {
        log.Print(kLogWarning, kTagInt, "Not digit: %s.", value);
        return def;
    }
    if (errno == ERANGE || number < INT_MIN || number > INT_MAX) {
        log.Print(kLogWarning, kTagInt, "Return default value for [%s]%s=%d.", section, key, def);
        return def;
    }
    return static_cast<int>(number);
}
