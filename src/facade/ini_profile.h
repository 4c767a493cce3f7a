#ifndef QUORVEX_FACADE_INI_PROFILE_H
#define QUORVEX_FACADE_INI_PROFILE_H

// The facade's reader of its INI file: one key per call, the file scanned from the top each
// time. Values are taken as they stand (no trimming, quotes or escapes); once the wanted
// section has been seen, a matching key line is found in any later section as well.
class CIniProfile {
public:
    // 1 found and copied; -1001 bad arguments; -1004 file cannot be opened; -1007 key not
    // found; -1002 value longer than outSize - 1; -1028 value empty. The third argument is
    // not used.
    static int GetMyProfile(const char* section, const char* key, const char* unused, char* out,
                            unsigned long outSize, const char* file);
    // The value, or def (with a Warning) when it cannot be read. Returns outSize - 1 when the
    // value was too long, else the length of what out holds.
    static unsigned long GetMyProfileString(const char* section, const char* key, const char* def,
                                            char* out, unsigned long outSize, const char* file);
    // A decimal integer from the start of the value (leading blanks and a sign accepted), or
    // def when the value is missing, too long, empty, not a number or out of range.
    static int GetMyProfileInt(const char* section, const char* key, int def, const char* file);

    // Longest piece of a line that one read takes; a longer line is read as several lines.
    static constexpr int kLineBufferSize = 512;
};

#endif  // QUORVEX_FACADE_INI_PROFILE_H
