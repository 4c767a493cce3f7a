#include "quorvex/time_span.h"

#include <cstdio>
#include <cstdlib>

#include "support/pattern_formatter.h"

namespace {

constexpr size_t kStartLimit = 241;
constexpr size_t kLimit = 255;

const char* Plural(long long n) {
    return n == 1 || n == -1 ? "" : "s";
}

}  // namespace

CTimeSpan CTimeSpan::FromComponents(int64_t weeks, int64_t days, int64_t hours, int64_t minutes,
                                    int64_t seconds, int64_t milliseconds) {
    int64_t ms =
        ((((weeks * 7 + days) * 24 + hours) * 60 + minutes) * 60 + seconds) * 1000 + milliseconds;
    return CTimeSpan(ms * kTicksPerMillisecond);
}

std::string CTimeSpan::Readable() const {
    char buf[96];
    const long long days = Days();
    if (m_ticks != 0 && m_ticks % kTicksPerDay == 0) {
        std::snprintf(buf, sizeof(buf), "%lld day%s", days, Plural(days));
    } else if (days != 0 && m_ticks % kTicksPerDay == kTicksPerHour * 12) {
        std::snprintf(buf, sizeof(buf), "%.1f days", static_cast<double>(days) + 0.5);
    } else if (m_ticks != 0 && m_ticks % kTicksPerHour == 0 && days == 0) {
        long long h = TotalHours();
        std::snprintf(buf, sizeof(buf), "%lld hour%s", h, Plural(h));
    } else if (m_ticks != 0 && m_ticks % kTicksPerMinute == 0 && m_ticks / kTicksPerHour == 0) {
        int m = static_cast<int>(m_ticks / kTicksPerMinute);
        std::snprintf(buf, sizeof(buf), "%d minute%s", m, Plural(m));
    } else if (m_ticks % kTicksPerSecond == 0 && m_ticks / kTicksPerSecond >= 1 &&
               m_ticks / kTicksPerSecond <= 59) {
        int s = static_cast<int>(m_ticks / kTicksPerSecond);
        std::snprintf(buf, sizeof(buf), "%d second%s", s, Plural(s));
    } else if (m_ticks % kTicksPerMillisecond == 0 && m_ticks / kTicksPerMillisecond >= 1 &&
               m_ticks / kTicksPerMillisecond <= 999) {
        int ms = static_cast<int>(m_ticks / kTicksPerMillisecond);
        std::snprintf(buf, sizeof(buf), "%d millisecond%s", ms, Plural(ms));
    } else if (days > 1 || days < -1) {
        std::snprintf(buf, sizeof(buf), "%lld days %d:%02d:%02d", days, Hours(),
                      std::abs(Minutes()), std::abs(Seconds()));
    } else if (days != 0) {
        std::snprintf(buf, sizeof(buf), "%lld day %d:%02d:%02d", days, Hours(), std::abs(Minutes()),
                      std::abs(Seconds()));
    } else {
        std::snprintf(buf, sizeof(buf), "%d:%02d:%02d", Hours(), std::abs(Minutes()),
                      std::abs(Seconds()));
    }
    return buf;
}

std::string CTimeSpan::Format(const char* pattern) const {
    CPatternFormatter formatter(kStartLimit, kLimit);
    return formatter.Run(pattern,
                         [this](char code, const std::string& flags, CPatternFormatter& f) {
                             switch (code) {
                                 case 'D':
                                 case 'd':
                                     f.AppendWithFlags(flags, "d", Days());
                                     break;
                                 case 'H':
                                     f.AppendFixed("%02lld", Hours());
                                     break;
                                 case 'h':
                                     f.AppendWithFlags(flags, "d", Hours());
                                     break;
                                 case 'M':
                                     f.AppendFixed("%02lld", Minutes());
                                     break;
                                 case 'm':
                                     f.AppendWithFlags(flags, "d", Minutes());
                                     break;
                                 case 'S':
                                     f.AppendFixed("%02lld", Seconds());
                                     break;
                                 case 's':
                                     f.AppendWithFlags(flags, "d", Seconds());
                                     break;
                                 case 'L':
                                     f.AppendFixed("%03lld", Milliseconds());
                                     break;
                                 case 'l':
                                     f.AppendWithFlags(flags, "d", Milliseconds());
                                     break;
                                 case 'C':
                                     f.AppendFixed("%03lld", Microseconds());
                                     break;
                                 case 'c':
                                     f.AppendWithFlags(flags, "d", Microseconds());
                                     break;
                                 case 'T':
                                     f.AppendFixed("%lld", TotalHours());
                                     break;
                                 case 't':
                                     f.AppendWithFlags(flags, "d", TotalHours());
                                     break;
                                 case 'F':
                                 case 'f':
                                     f.Append(Readable());
                                     break;
                                 default:
                                     return false;
                             }
                             return true;
                         });
}
