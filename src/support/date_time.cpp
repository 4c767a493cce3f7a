#include "quorvex/date_time.h"

#include <cstdio>
#include <cstring>

#include "platform/clock.h"
#include "platform/local_time.h"
#include "support/civil_calendar.h"
#include "support/pattern_formatter.h"

namespace {

constexpr int64_t kTicksPerSecond = CTimeSpan::kTicksPerSecond;
constexpr int64_t kEpochSeconds = static_cast<int64_t>(CDateTime::kUnixEpochTicks / 10000000);
constexpr int kMinYear = 1601;
constexpr int kMaxYear = 30827;

const char* const kWeekdayFull[] = {"Unknown",   "Sunday",   "Monday", "Tuesday",
                                    "Wednesday", "Thursday", "Friday", "Saturday"};
const char* const kWeekdayShort[] = {"***", "Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
const char* const kMonthFull[] = {"Unknown", "January",  "February", "March",  "April",
                                  "May",     "June",     "July",     "August", "September",
                                  "October", "November", "December"};
const char* const kMonthShort[] = {"***", "Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                   "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
const char* const kMonthFullDutch[] = {"onbekend", "januari",  "februari", "maart",    "april",
                                       "mei",      "juni",     "juli",     "augustus", "september",
                                       "oktober",  "november", "december"};
const char* const kMonthShortDutch[] = {"***", "jan", "feb", "maa", "apr", "mei", "jun",
                                        "jul", "aug", "sep", "okt", "nov", "dec"};

const char* Named(const char* const* table, int count, int index) {
    return index >= 1 && index < count ? table[index] : table[0];
}

// Seconds since 1970 and the sub-second ticks of a value (floor division).
void SplitTicks(uint64_t ticks, int64_t* unixSeconds, int64_t* subTicks) {
    const int64_t seconds = static_cast<int64_t>(ticks / kTicksPerSecond);
    *unixSeconds = seconds - kEpochSeconds;
    *subTicks = static_cast<int64_t>(ticks % kTicksPerSecond);
}

bool FieldsValid(int year, int month, int day, int hour, int minute, int second, int ms) {
    return year >= kMinYear && year <= kMaxYear && month >= 1 && month <= 12 && day >= 1 &&
           day <= civil::DaysInMonth(year, month) && hour >= 0 && hour < 24 && minute >= 0 &&
           minute < 60 && second >= 0 && second < 60 && ms >= 0 && ms < 1000;
}

bool FromTm(const std::tm& tm, int milliseconds, SSystemTime& out) {
    out.year = tm.tm_year + 1900;
    out.month = tm.tm_mon + 1;
    out.dayOfWeek = tm.tm_wday;
    out.day = tm.tm_mday;
    out.hour = tm.tm_hour;
    out.minute = tm.tm_min;
    out.second = tm.tm_sec;
    out.milliseconds = milliseconds;
    return true;
}

// Local calendar fields to seconds since 1970; the zone decides whether daylight saving
// applies. A local time that a spring change skips comes out one hour later, as the
// system's mktime moves it.
bool LocalToUnix(int year, int month, int day, int hour, int minute, int second, int64_t* out) {
    std::tm tm{};
    tm.tm_year = year - 1900;
    tm.tm_mon = month - 1;
    tm.tm_mday = day;
    tm.tm_hour = hour;
    tm.tm_min = minute;
    tm.tm_sec = second;
    tm.tm_isdst = -1;
    int64_t t = plat::UnixFromLocalTime(&tm);
    if (t == -1) {
        // -1 is also a real instant (23:59:59 UTC on 1969-12-31); tell them apart.
        std::tm check{};
        if (!plat::LocalTimeFromUnix(-1, &check) || check.tm_year != year - 1900 ||
            check.tm_mon != month - 1 || check.tm_mday != day || check.tm_hour != hour ||
            check.tm_min != minute || check.tm_sec != second) {
            return false;
        }
    }
    *out = t;
    return true;
}

CDateTime FromUnix(int64_t unixSeconds, int64_t subTicks) {
    const int64_t ticks = (unixSeconds + kEpochSeconds) * kTicksPerSecond + subTicks;
    if (ticks < 0) {
        return CDateTime();
    }
    return CDateTime(static_cast<uint64_t>(ticks));
}

}  // namespace

CDateTime CDateTime::Now() {
    return CDateTime(kUnixEpochTicks + static_cast<uint64_t>(plat::UnixTime100nsNow()));
}

CDateTime CDateTime::FromComponents(int year, int month, int day, int hour, int minute, int second,
                                    int millisecond, int microsecond, bool utc) {
    // The microseconds are added to the instant as given, so a value beyond a millisecond
    // carries into the next one.
    if (!FieldsValid(year, month, day, hour, minute, second, millisecond)) {
        return CDateTime();
    }
    int64_t unixSeconds;
    if (utc) {
        unixSeconds =
            civil::DaysFromCivil(year, month, day) * 86400 + hour * 3600 + minute * 60 + second;
    } else if (!LocalToUnix(year, month, day, hour, minute, second, &unixSeconds)) {
        return CDateTime();
    }
    return FromUnix(unixSeconds, static_cast<int64_t>(millisecond) * 10000 + microsecond * 10);
}

CDateTime CDateTime::FromTimeT(time_t seconds, bool timeOnly) {
    std::tm tm{};
    if (!plat::LocalTimeFromUnix(static_cast<int64_t>(seconds), &tm)) {
        return CDateTime();
    }
    if (timeOnly) {
        return FromComponents(2000, 1, 1, tm.tm_hour, tm.tm_min, tm.tm_sec, 0, 0, false);
    }
    // Built from the instant itself, so an hour repeated by a change in autumn keeps its
    // own offset rather than the one local fields would pick.
    return FromUnix(static_cast<int64_t>(seconds), 0);
}

CDateTime CDateTime::Parse(const char* text, bool utc) {
    if (text == nullptr) {
        return CDateTime();
    }
    unsigned v[7] = {0, 0, 0, 0, 0, 0, 0};
    int n =
        std::sscanf(text, "%u-%u-%u %u:%u:%u.%u", &v[0], &v[1], &v[2], &v[3], &v[4], &v[5], &v[6]);
    if (n < 5) {
        return CDateTime();
    }
    unsigned year = v[0] < 100 ? 2000 + v[0] : v[0];
    if (year > 30827 || v[1] > 12 || v[2] > 31 || v[3] > 23 || v[4] > 59 || v[5] > 59 ||
        v[6] > 999) {
        return CDateTime();
    }
    return FromComponents(static_cast<int>(year), static_cast<int>(v[1]), static_cast<int>(v[2]),
                          static_cast<int>(v[3]), static_cast<int>(v[4]), static_cast<int>(v[5]),
                          static_cast<int>(v[6]), 0, utc);
}

time_t CDateTime::ToTimeT(bool timeOnly) const {
    if (IsZero()) {
        return static_cast<time_t>(-1);
    }
    if (!timeOnly) {
        int64_t unixSeconds;
        int64_t sub;
        SplitTicks(m_ticks, &unixSeconds, &sub);
        return static_cast<time_t>(unixSeconds);
    }
    SSystemTime local;
    if (!ToLocalSystemTime(local)) {
        return static_cast<time_t>(-1);
    }
    int64_t out;
    if (!LocalToUnix(2000, 1, 1, local.hour, local.minute, local.second, &out)) {
        return static_cast<time_t>(-1);
    }
    return static_cast<time_t>(out);
}

bool CDateTime::ToUtcSystemTime(SSystemTime& out) const {
    int64_t unixSeconds;
    int64_t sub;
    SplitTicks(m_ticks, &unixSeconds, &sub);
    const int64_t days = (unixSeconds >= 0 ? unixSeconds : unixSeconds - 86399) / 86400;
    const int64_t secOfDay = unixSeconds - days * 86400;
    int64_t year;
    civil::CivilFromDays(days, &year, &out.month, &out.day);
    out.year = static_cast<int>(year);
    out.dayOfWeek = civil::WeekdayFromDays(days);
    out.hour = static_cast<int>(secOfDay / 3600);
    out.minute = static_cast<int>(secOfDay / 60 % 60);
    out.second = static_cast<int>(secOfDay % 60);
    out.milliseconds = static_cast<int>(sub / 10000);
    return true;
}

bool CDateTime::ToLocalSystemTime(SSystemTime& out) const {
    int64_t unixSeconds;
    int64_t sub;
    SplitTicks(m_ticks, &unixSeconds, &sub);
    std::tm tm{};
    if (!plat::LocalTimeFromUnix(unixSeconds, &tm)) {
        return false;
    }
    return FromTm(tm, static_cast<int>(sub / 10000), out);
}

int CDateTime::DayOfYear() const {
    SSystemTime local;
    if (!ToLocalSystemTime(local) || local.month < 1 || local.month > 12) {
        return -1;
    }
    return civil::DaysBeforeMonth(local.year, local.month) + local.day;
}

int CDateTime::WeekOfYear(int* weekYear) const {
    SSystemTime local;
    if (!ToLocalSystemTime(local)) {
        return -1;
    }
    int64_t wy;
    int week = civil::IsoWeek(local.year, local.month, local.day, &wy);
    if (weekYear != nullptr) {
        *weekYear = static_cast<int>(wy);
    }
    return week;
}

std::string CDateTime::Format(const char* pattern, bool utc) const {
    SSystemTime st;
    bool ok = utc ? ToUtcSystemTime(st) : ToLocalSystemTime(st);
    if (!ok) {
        st = SSystemTime();
    }
    int64_t weekYear = 0;
    int week = 0;
    if (st.month >= 1 && st.month <= 12) {
        week = civil::IsoWeek(st.year, st.month, st.day, &weekYear);
    }
    const int dayOfYear = civil::DaysBeforeMonth(st.year, st.month) + st.day;
    CPatternFormatter formatter(kFormatStartLimit, kFormatLimit);
    return formatter.Run(pattern, [&](char code, const std::string& flags, CPatternFormatter& f) {
        switch (code) {
            case 'Y':
                f.AppendFixed("%04lld", st.year);
                break;
            case 'y':
                f.AppendFixed("%02lld", st.year % 100);
                break;
            case 'O':
                f.AppendFixed("%02lld", st.month);
                break;
            case 'o':
                f.AppendWithFlags(flags, "d", st.month);
                break;
            case 'D':
                f.AppendFixed("%02lld", st.day);
                break;
            case 'd':
                f.AppendWithFlags(flags, "d", st.day);
                break;
            case 'H':
                f.AppendFixed("%02lld", st.hour);
                break;
            case 'h':
                f.AppendWithFlags(flags, "d", st.hour);
                break;
            case 'M':
                f.AppendFixed("%02lld", st.minute);
                break;
            case 'm':
                f.AppendWithFlags(flags, "d", st.minute);
                break;
            case 'S':
                f.AppendFixed("%02lld", st.second);
                break;
            case 's':
                f.AppendWithFlags(flags, "d", st.second);
                break;
            case 'L':
                f.AppendWithFlags(flags, "d", st.milliseconds);
                break;
            case 'l':
                f.AppendFixed("%02lld", std::min((st.milliseconds + 5) / 10, 99));
                break;
            case 'A':
                f.Append(std::string(Named(kWeekdayFull, 8, st.dayOfWeek + 1)));
                break;
            case 'a':
                f.Append(std::string(Named(kWeekdayShort, 8, st.dayOfWeek + 1)));
                break;
            case 'B':
                f.Append(std::string(Named(kMonthFull, 13, st.month)));
                break;
            case 'b':
                f.Append(std::string(Named(kMonthShort, 13, st.month)));
                break;
            case 'N':
                f.Append(std::string(Named(kMonthFullDutch, 13, st.month)));
                break;
            case 'n':
                f.Append(std::string(Named(kMonthShortDutch, 13, st.month)));
                break;
            case 'X':
                f.AppendWithFlags(flags, "d", dayOfYear);
                break;
            case 'x':
                f.AppendWithFlags(flags, "d", civil::DaysInMonth(st.year, st.month));
                break;
            case 'W':
                f.AppendFixed("%02lld", week);
                break;
            case 'w':
                f.AppendWithFlags(flags, "d", week);
                break;
            case 'G':
                f.AppendFixed("%04lld", weekYear);
                break;
            case 'g':
                f.AppendFixed("%02lld", weekYear % 100);
                break;
            default:
                return false;
        }
        return true;
    });
}
