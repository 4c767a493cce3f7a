#ifndef QUORVEX_PLATFORM_LOCAL_TIME_H
#define QUORVEX_PLATFORM_LOCAL_TIME_H

#include <cstdint>
#include <ctime>

namespace plat {

// Calendar conversions in the process's time zone (TZ). Each returns false (or -1)
// when the system cannot represent the value.
bool LocalTimeFromUnix(int64_t unixSeconds, std::tm* out);
bool UtcTimeFromUnix(int64_t unixSeconds, std::tm* out);
// mktime: fields read as local time, tm_isdst < 0 lets the zone decide; normalises *fields.
int64_t UnixFromLocalTime(std::tm* fields);
// timegm: fields read as UTC.
int64_t UnixFromUtcTime(const std::tm* fields);
// Offset of local time from UTC at that instant, in seconds (east positive).
bool UtcOffsetAt(int64_t unixSeconds, long* offsetSeconds);
// Re-read TZ after it changed (tests switch zones).
void ReloadTimeZone();
// strftime of local time now, into buf of size bytes; returns the length written (0 on failure).
size_t FormatLocalNow(const char* pattern, char* buf, size_t size);

}  // namespace plat

#endif  // QUORVEX_PLATFORM_LOCAL_TIME_H
