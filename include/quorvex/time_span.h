#ifndef QUORVEX_TIME_SPAN_H
#define QUORVEX_TIME_SPAN_H

#include <cstdint>
#include <string>

#include "quorvex/export.h"

// A signed duration in 100-nanosecond ticks.
class QUORVEX_API CTimeSpan {
public:
    static constexpr int64_t kTicksPerMicrosecond = 10;
    static constexpr int64_t kTicksPerMillisecond = 10000;
    static constexpr int64_t kTicksPerSecond = 10000000;
    static constexpr int64_t kTicksPerMinute = 600000000;
    static constexpr int64_t kTicksPerHour = 36000000000;
    static constexpr int64_t kTicksPerDay = 864000000000;

    constexpr CTimeSpan() = default;
    constexpr explicit CTimeSpan(int64_t ticks) : m_ticks(ticks) {}

    static CTimeSpan FromComponents(int64_t weeks, int64_t days, int64_t hours, int64_t minutes,
                                    int64_t seconds, int64_t milliseconds);

    constexpr int64_t Ticks() const { return m_ticks; }
    // Components: whole days, then the part of the next unit below each.
    int64_t Days() const { return m_ticks / kTicksPerDay; }
    int Hours() const { return static_cast<int>(m_ticks / kTicksPerHour % 24); }
    int Minutes() const { return static_cast<int>(m_ticks / kTicksPerMinute % 60); }
    int Seconds() const { return static_cast<int>(m_ticks / kTicksPerSecond % 60); }
    int Milliseconds() const { return static_cast<int>(m_ticks / kTicksPerMillisecond % 1000); }
    int Microseconds() const { return static_cast<int>(m_ticks / kTicksPerMicrosecond % 1000); }
    // Totals, each truncated.
    int64_t TotalHours() const { return m_ticks / kTicksPerHour; }
    int64_t TotalSeconds() const { return m_ticks / kTicksPerSecond; }
    int64_t TotalMilliseconds() const { return m_ticks / kTicksPerMillisecond; }
    int64_t TotalMicroseconds() const { return m_ticks / kTicksPerMicrosecond; }

    // %D days, %H hours of the day, %M minutes, %S seconds, %L milliseconds, %C microseconds,
    // %T total hours, %F a readable text; lower-case letters take printf flags ("%3d");
    // "%%" is a percent sign.
    std::string Format(const char* pattern) const;
    // The readable text of %F, such as "2 days", "1.5 days", "3 hours" or "1 day 2:03:04".
    std::string Readable() const;

    CTimeSpan operator+(CTimeSpan other) const { return CTimeSpan(m_ticks + other.m_ticks); }
    CTimeSpan operator-(CTimeSpan other) const { return CTimeSpan(m_ticks - other.m_ticks); }
    CTimeSpan operator-() const { return CTimeSpan(-m_ticks); }
    bool operator==(const CTimeSpan& other) const = default;
    auto operator<=>(const CTimeSpan& other) const = default;

private:
    int64_t m_ticks = 0;
};

#endif  // QUORVEX_TIME_SPAN_H
