#ifndef QUORVEX_DATE_TIME_H
#define QUORVEX_DATE_TIME_H

#include <cstdint>
#include <ctime>
#include <string>

#include "quorvex/export.h"
#include "quorvex/time_span.h"

// Calendar fields of a point in time, in UTC or in local time.
struct SSystemTime {
    int year = 0;
    int month = 0;      // 1..12
    int dayOfWeek = 0;  // 0 Sunday .. 6 Saturday
    int day = 0;        // 1..31
    int hour = 0;
    int minute = 0;
    int second = 0;
    int milliseconds = 0;
};

// A point in time: 100-nanosecond ticks since 1601-01-01 00:00:00 UTC. The value 0 is the
// zero value, standing for "no time". Local time is the process's time zone (TZ), daylight
// saving included.
class QUORVEX_API CDateTime {
public:
    // Ticks from 1601-01-01 to 1970-01-01.
    static constexpr uint64_t kUnixEpochTicks = 116444736000000000ull;
    // No further pattern element is started once this many characters are written, and no
    // conversion writes past kFormatLimit.
    static constexpr size_t kFormatStartLimit = 241;
    static constexpr size_t kFormatLimit = 255;

    constexpr CDateTime() = default;
    constexpr explicit CDateTime(uint64_t ticks) : m_ticks(ticks) {}

    static CDateTime Now();
    // Calendar fields as UTC or as local time; the zero value when a field is out of range
    // (month 1-12, day within the month, hour < 24, minute and second < 60, millisecond and
    // microsecond < 1000, year 1601-30827) or when the local time cannot be converted.
    static CDateTime FromComponents(int year, int month, int day, int hour, int minute, int second,
                                    int millisecond, int microsecond, bool utc);
    // Seconds since 1970; with timeOnly the date becomes 2000-01-01 (local).
    static CDateTime FromTimeT(time_t seconds, bool timeOnly = false);
    // "%u-%u-%u %u:%u:%u.%u": at least five numbers, a two-digit year taken as 2000 + n;
    // the zero value otherwise.
    static CDateTime Parse(const char* text, bool utc);

    constexpr uint64_t Ticks() const { return m_ticks; }
    constexpr bool IsZero() const { return m_ticks == 0; }
    // Seconds since 1970 from the local fields (date 2000-01-01 with timeOnly); -1 for the zero
    // value or when the system cannot represent it.
    time_t ToTimeT(bool timeOnly = false) const;
    bool ToLocalSystemTime(SSystemTime& out) const;
    bool ToUtcSystemTime(SSystemTime& out) const;
    // 1..366 from the local date, -1 when it cannot be had.
    int DayOfYear() const;
    // ISO 8601 week of the local date (weeks from Monday, week 1 holds the first Thursday);
    // the year the week belongs to goes to weekYear when given. -1 when it cannot be had.
    int WeekOfYear(int* weekYear = nullptr) const;
    // The pattern with each "%" code replaced (see the library's documentation of codes:
    // %Y %y %O %o %D %d %H %h %M %m %S %s %L %l %A %a %B %b %N %n %X %x %W %w %G %g %%).
    std::string Format(const char* pattern, bool utc) const;

    CDateTime operator+(CTimeSpan span) const {
        return CDateTime(m_ticks + static_cast<uint64_t>(span.Ticks()));
    }
    CDateTime operator-(CTimeSpan span) const {
        return CDateTime(m_ticks - static_cast<uint64_t>(span.Ticks()));
    }
    CTimeSpan operator-(CDateTime other) const {
        return CTimeSpan(static_cast<int64_t>(m_ticks - other.m_ticks));
    }
    bool operator==(const CDateTime& other) const = default;
    auto operator<=>(const CDateTime& other) const = default;

private:
    uint64_t m_ticks = 0;
};

#endif  // QUORVEX_DATE_TIME_H
