#include "platform/local_time.h"

#include <time.h>

namespace plat {

bool LocalTimeFromUnix(int64_t unixSeconds, std::tm* out) {
    time_t t = static_cast<time_t>(unixSeconds);
    return localtime_r(&t, out) != nullptr;
}

bool UtcTimeFromUnix(int64_t unixSeconds, std::tm* out) {
    time_t t = static_cast<time_t>(unixSeconds);
    return gmtime_r(&t, out) != nullptr;
}

int64_t UnixFromLocalTime(std::tm* fields) {
    return static_cast<int64_t>(mktime(fields));
}

int64_t UnixFromUtcTime(const std::tm* fields) {
    std::tm copy = *fields;
    return static_cast<int64_t>(timegm(&copy));
}

bool UtcOffsetAt(int64_t unixSeconds, long* offsetSeconds) {
    std::tm local{};
    if (!LocalTimeFromUnix(unixSeconds, &local)) {
        return false;
    }
    *offsetSeconds = local.tm_gmtoff;
    return true;
}

void ReloadTimeZone() {
    tzset();
}

size_t FormatLocalNow(const char* pattern, char* buf, size_t size) {
    if (buf == nullptr || size == 0) {
        return 0;
    }
    time_t now = time(nullptr);
    std::tm local{};
    if (localtime_r(&now, &local) == nullptr) {
        buf[0] = '\0';
        return 0;
    }
    size_t n = strftime(buf, size, pattern, &local);
    if (n == 0) {
        buf[0] = '\0';
    }
    return n;
}

}  // namespace plat
