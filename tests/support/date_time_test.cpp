#include "quorvex/date_time.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "platform/local_time.h"

namespace {

// Switches the process's time zone for one test and restores it afterwards.
class ScopedTimeZone {
public:
    explicit ScopedTimeZone(const char* zone) {
        const char* old = std::getenv("TZ");
        m_had = old != nullptr;
        if (m_had) {
            m_old = old;
        }
        setenv("TZ", zone, 1);
        plat::ReloadTimeZone();
    }
    ~ScopedTimeZone() {
        if (m_had) {
            setenv("TZ", m_old.c_str(), 1);
        } else {
            unsetenv("TZ");
        }
        plat::ReloadTimeZone();
    }

private:
    bool m_had = false;
    std::string m_old;
};

constexpr const char* kDbPattern = "%Y-%O-%D %H:%M:%S";

CDateTime Utc(int y, int mo, int d, int h = 0, int mi = 0, int s = 0, int ms = 0) {
    return CDateTime::FromComponents(y, mo, d, h, mi, s, ms, 0, true);
}

}  // namespace

TEST(DateTime, UtcComponentsAndTheDatabasePattern) {
    EXPECT_EQ("2026-01-01 00:00:00", Utc(2026, 1, 1).Format(kDbPattern, true));
    EXPECT_EQ("1601-01-01 00:00:00", CDateTime().Format(kDbPattern, true));
    EXPECT_EQ(CDateTime::kUnixEpochTicks, Utc(1970, 1, 1).Ticks());
    EXPECT_EQ(CDateTime::kUnixEpochTicks + 10,
              CDateTime::FromComponents(1970, 1, 1, 0, 0, 0, 0, 1, true).Ticks());
    // Microseconds are added to the instant as given and carry over.
    EXPECT_EQ(Utc(1970, 1, 1, 0, 0, 1).Ticks() + 5000,
              CDateTime::FromComponents(1970, 1, 1, 0, 0, 0, 999, 1500, true).Ticks());
    EXPECT_EQ(CDateTime::kUnixEpochTicks - 10,
              CDateTime::FromComponents(1970, 1, 1, 0, 0, 0, 0, -1, true).Ticks());
    EXPECT_TRUE(CDateTime::FromComponents(1601, 1, 1, 0, 0, 0, 0, -1, true).IsZero());
    // Out-of-range fields give the zero value.
    EXPECT_TRUE(Utc(2026, 2, 29).IsZero());
    EXPECT_FALSE(Utc(2024, 2, 29).IsZero());
    EXPECT_TRUE(Utc(2026, 13, 1).IsZero());
    EXPECT_TRUE(Utc(2026, 1, 1, 24).IsZero());
    EXPECT_TRUE(Utc(1600, 12, 31).IsZero());
    EXPECT_TRUE(Utc(2026, 1, 1, 0, 0, 0, 1000).IsZero());
}

TEST(DateTime, PatternCodes) {
    CDateTime t = Utc(2026, 3, 5, 7, 8, 9, 994);
    EXPECT_EQ("26|03|3|05|5|07|7|08|8|09|9|994|99",
              t.Format("%y|%O|%o|%D|%d|%H|%h|%M|%m|%S|%s|%L|%l", true));
    EXPECT_EQ("Thursday Thu March Mar maart maa", t.Format("%A %a %B %b %N %n", true));
    EXPECT_EQ("  3|064|31|10|10|2026|26", t.Format("%3o|%03X|%x|%W|%w|%G|%g", true));
    EXPECT_EQ("100% %Q %-", t.Format("100%% %Q %-", true));
    EXPECT_EQ("99", Utc(2026, 1, 1, 0, 0, 0, 995).Format("%l", true));
    EXPECT_EQ("00", Utc(2026, 1, 1, 0, 0, 0, 4).Format("%l", true));
    EXPECT_EQ("01", Utc(2026, 1, 1, 0, 0, 0, 5).Format("%l", true));
    // Multibyte characters pass whole; flags beyond reason are cut, not overflowed.
    EXPECT_EQ("\xE6\x97\xA5 2026\xC3\xBC", t.Format("\xE6\x97\xA5 %Y\xC3\xBC", true));
    EXPECT_EQ("    5", t.Format("%5d", true));
    EXPECT_EQ(std::string(255, ' '), t.Format("%99999999999d", true));
    EXPECT_EQ("", CDateTime().Format(nullptr, true));
}

TEST(DateTime, OutputIsBounded) {
    CDateTime t = Utc(2026, 3, 5);
    // Nothing new starts once 241 characters stand; a conversion begun before may run to 255.
    EXPECT_EQ(241u, t.Format(std::string(400, 'x').c_str(), true).size());
    EXPECT_EQ(std::string(240, 'x') + "Thursday",
              t.Format((std::string(240, 'x') + "%A%A").c_str(), true));
    EXPECT_EQ(255u, t.Format((std::string(240, 'x') + "%-30d|").c_str(), true).size());
    std::string pattern = std::string(240, 'x') + "%Y%Y%Y";
    EXPECT_EQ(std::string(240, 'x') + "2026", t.Format(pattern.c_str(), true));
    std::string wide = std::string(254, 'x') + "%B";
    EXPECT_EQ(241u, t.Format(wide.c_str(), true).size());
}

TEST(DateTime, IsoWeeksAroundTheTurnOfTheYear) {
    ScopedTimeZone utc("UTC");
    int weekYear = 0;
    EXPECT_EQ(1, Utc(2026, 1, 1, 12).WeekOfYear(&weekYear));  // a Thursday
    EXPECT_EQ(2026, weekYear);
    EXPECT_EQ(53, Utc(2021, 1, 3, 12).WeekOfYear(&weekYear));  // Sunday after 2020's week 53
    EXPECT_EQ(2020, weekYear);
    EXPECT_EQ(1, Utc(2024, 12, 30, 12).WeekOfYear(&weekYear));  // Monday of 2025's week 1
    EXPECT_EQ(2025, weekYear);
    EXPECT_EQ("2025-W01", Utc(2024, 12, 30, 12).Format("%G-W%W", false));
}

TEST(DateTime, DayOfYearOnLocalDate) {
    ScopedTimeZone tokyo("Asia/Tokyo");
    EXPECT_EQ(60, Utc(2026, 3, 1, 12).DayOfYear());
    EXPECT_EQ(61, Utc(2024, 3, 1, 12).DayOfYear());
    EXPECT_EQ(366, Utc(2024, 12, 31, 12).DayOfYear());
    // 20:00 UTC on 31 December is already 1 January in Tokyo.
    EXPECT_EQ(1, Utc(2025, 12, 31, 20).DayOfYear());
}

TEST(DateTime, LocalAndUtcAcrossDaylightSavingChanges) {
    ScopedTimeZone amsterdam("Europe/Amsterdam");
    // Before the spring change (UTC+1) and after it (UTC+2).
    CDateTime winter = CDateTime::FromComponents(2026, 3, 28, 12, 0, 0, 0, 0, false);
    CDateTime summer = CDateTime::FromComponents(2026, 3, 30, 12, 0, 0, 0, 0, false);
    EXPECT_EQ("2026-03-28 11:00:00", winter.Format(kDbPattern, true));
    EXPECT_EQ("2026-03-30 10:00:00", summer.Format(kDbPattern, true));
    EXPECT_EQ("2026-03-28 12:00:00", winter.Format(kDbPattern, false));
    EXPECT_EQ("2026-03-30 12:00:00", summer.Format(kDbPattern, false));
    // Either side of the autumn change, local 01:30 and 03:30 are 2 hours of local time apart
    // but 3 hours of real time.
    CDateTime before = CDateTime::FromComponents(2026, 10, 25, 1, 30, 0, 0, 0, false);
    CDateTime after = CDateTime::FromComponents(2026, 10, 25, 3, 30, 0, 0, 0, false);
    EXPECT_EQ(3 * CTimeSpan::kTicksPerHour, (after - before).Ticks());
    // Instants on both sides round-trip through time_t.
    for (CDateTime t : {winter, summer, before, after}) {
        EXPECT_EQ(t, CDateTime::FromTimeT(t.ToTimeT()));
    }
    // Both instants of the repeated hour keep their own offset.
    time_t first = Utc(2026, 10, 25, 0, 30).ToTimeT();   // 02:30 CEST
    time_t second = Utc(2026, 10, 25, 1, 30).ToTimeT();  // 02:30 CET
    EXPECT_EQ(3600, second - first);
    EXPECT_EQ("02:30", CDateTime::FromTimeT(first).Format("%H:%M", false));
    EXPECT_EQ("02:30", CDateTime::FromTimeT(second).Format("%H:%M", false));
}

TEST(DateTime, NewYorkAndTokyoOffsets) {
    {
        ScopedTimeZone ny("America/New_York");
        CDateTime july = CDateTime::FromComponents(2026, 7, 1, 9, 0, 0, 0, 0, false);
        CDateTime january = CDateTime::FromComponents(2026, 1, 15, 9, 0, 0, 0, 0, false);
        EXPECT_EQ("13:00", july.Format("%H:%M", true));
        EXPECT_EQ("14:00", january.Format("%H:%M", true));
    }
    ScopedTimeZone tokyo("Asia/Tokyo");
    CDateTime t = CDateTime::FromComponents(2026, 7, 1, 9, 0, 0, 0, 0, false);
    EXPECT_EQ("2026-07-01 00:00:00", t.Format(kDbPattern, true));
}

TEST(DateTime, TimeTConversions) {
    ScopedTimeZone amsterdam("Europe/Amsterdam");
    EXPECT_EQ(static_cast<time_t>(-1), CDateTime().ToTimeT());
    EXPECT_EQ(static_cast<time_t>(1767225600), Utc(2026, 1, 1).ToTimeT());
    EXPECT_EQ(Utc(2026, 1, 1), CDateTime::FromTimeT(1767225600));
    // Time only: the local time of day on 2000-01-01.
    CDateTime timeOnly = CDateTime::FromTimeT(Utc(2026, 7, 1, 10, 15, 30).ToTimeT(), true);
    EXPECT_EQ("2000-01-01 12:15:30", timeOnly.Format(kDbPattern, false));
    EXPECT_EQ(timeOnly.ToTimeT(), Utc(2026, 7, 1, 10, 15, 30).ToTimeT(true));
}

TEST(DateTime, ParseAndArithmetic) {
    EXPECT_EQ(Utc(2026, 4, 5, 6, 7, 8, 9), CDateTime::Parse("2026-04-05 06:07:08.009", true));
    EXPECT_EQ(Utc(2026, 4, 5, 6, 7), CDateTime::Parse("26-4-5 6:7", true));
    EXPECT_TRUE(CDateTime::Parse("2026-04-05 06", true).IsZero());
    EXPECT_TRUE(CDateTime::Parse("garbage", true).IsZero());
    EXPECT_TRUE(CDateTime::Parse("2026-13-05 06:07:08", true).IsZero());
    EXPECT_TRUE(CDateTime::Parse(nullptr, true).IsZero());
    CDateTime t = Utc(2026, 12, 31, 23, 0);
    EXPECT_EQ(Utc(2027, 1, 1, 1, 0), t + CTimeSpan(2 * CTimeSpan::kTicksPerHour));
    EXPECT_EQ(t, (t + CTimeSpan(5)) - CTimeSpan(5));
    EXPECT_EQ(-CTimeSpan::kTicksPerDay, (Utc(2026, 1, 1) - Utc(2026, 1, 2)).Ticks());
    EXPECT_LT(Utc(2026, 1, 1), Utc(2026, 1, 2));
    CDateTime now = CDateTime::Now();
    EXPECT_GT(now, Utc(2025, 1, 1));
}
