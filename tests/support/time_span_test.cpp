#include "quorvex/time_span.h"

#include <gtest/gtest.h>

TEST(TimeSpan, ComponentsAndTotals) {
    CTimeSpan s = CTimeSpan::FromComponents(1, 2, 3, 4, 5, 678) + CTimeSpan(9 * 10 + 3);
    EXPECT_EQ(9, s.Days());
    EXPECT_EQ(3, s.Hours());
    EXPECT_EQ(4, s.Minutes());
    EXPECT_EQ(5, s.Seconds());
    EXPECT_EQ(678, s.Milliseconds());
    EXPECT_EQ(9, s.Microseconds());
    EXPECT_EQ(9 * 24 + 3, s.TotalHours());
    EXPECT_EQ(((9 * 24 + 3) * 60 + 4) * 60 + 5, s.TotalSeconds());
    EXPECT_EQ(s.TotalSeconds() * 1000 + 678, s.TotalMilliseconds());
    EXPECT_EQ(s.TotalMilliseconds() * 1000 + 9, s.TotalMicroseconds());
}

TEST(TimeSpan, PatternUsesComponentsOfTheDay) {
    CTimeSpan h25 = CTimeSpan::FromComponents(0, 0, 25, 0, 0, 0);
    EXPECT_EQ("01:00:00", h25.Format("%H:%M:%S"));
    EXPECT_EQ("'01:00:00'", h25.Format("'%H:%M:%S'"));
    EXPECT_EQ("1 25 025", h25.Format("%D %T %03t"));
    CTimeSpan s = CTimeSpan::FromComponents(0, 3, 4, 5, 6, 7) + CTimeSpan(80);
    EXPECT_EQ("3 04:05:06.007.008", s.Format("%D %H:%M:%S.%L.%C"));
    EXPECT_EQ("  3|4|5|6|7|8|%|%Z", s.Format("%3d|%h|%m|%s|%l|%c|%%|%Z"));
    EXPECT_EQ("003 04", s.Format("%03D %H"));
}

TEST(TimeSpan, ReadableTexts) {
    using T = CTimeSpan;
    EXPECT_EQ("1 day", T::FromComponents(0, 1, 0, 0, 0, 0).Readable());
    EXPECT_EQ("14 days", T::FromComponents(2, 0, 0, 0, 0, 0).Readable());
    EXPECT_EQ("1.5 days", T::FromComponents(0, 1, 12, 0, 0, 0).Readable());
    EXPECT_EQ("3 hours", T::FromComponents(0, 0, 3, 0, 0, 0).Readable());
    EXPECT_EQ("1 hour", T::FromComponents(0, 0, 1, 0, 0, 0).Readable());
    EXPECT_EQ("45 minutes", T::FromComponents(0, 0, 0, 45, 0, 0).Readable());
    EXPECT_EQ("1 second", T::FromComponents(0, 0, 0, 0, 1, 0).Readable());
    EXPECT_EQ("250 milliseconds", T::FromComponents(0, 0, 0, 0, 0, 250).Readable());
    EXPECT_EQ("2 days 1:02:03", T::FromComponents(0, 2, 1, 2, 3, 0).Readable());
    EXPECT_EQ("1 day 1:02:03", T::FromComponents(0, 1, 1, 2, 3, 0).Readable());
    EXPECT_EQ("0:01:30", T::FromComponents(0, 0, 0, 1, 30, 0).Readable());
    EXPECT_EQ("0:00:00", T().Readable());
    EXPECT_EQ("took 3 hours", T::FromComponents(0, 0, 3, 0, 0, 0).Format("took %F"));
}
