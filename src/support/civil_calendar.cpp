#include "support/civil_calendar.h"

namespace civil {

namespace {
constexpr int kDaysBefore[12] = {0, 31, 59, 90, 120, 151, 181, 212, 243, 273, 304, 334};
constexpr int kDaysIn[12] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};

int64_t FloorDiv(int64_t a, int64_t b) {
    return (a >= 0 ? a : a - (b - 1)) / b;
}
}  // namespace

bool IsLeapYear(int64_t year) {
    return year % 4 == 0 && (year % 100 != 0 || year % 400 == 0);
}

int DaysInMonth(int64_t year, int month) {
    if (month < 1 || month > 12) {
        return 0;
    }
    return kDaysIn[month - 1] + (month == 2 && IsLeapYear(year) ? 1 : 0);
}

int DaysBeforeMonth(int64_t year, int month) {
    if (month < 1 || month > 12) {
        return 0;
    }
    return kDaysBefore[month - 1] + (month > 2 && IsLeapYear(year) ? 1 : 0);
}

// Counting from 1 March makes the leap day the last day of the year.
int64_t DaysFromCivil(int64_t year, int month, int day) {
    year -= month <= 2 ? 1 : 0;
    const int64_t era = FloorDiv(year, 400);
    const int64_t yoe = year - era * 400;
    const int64_t doy = (153 * (month + (month > 2 ? -3 : 9)) + 2) / 5 + day - 1;
    const int64_t doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
    return era * 146097 + doe - 719468;
}

void CivilFromDays(int64_t days, int64_t* year, int* month, int* day) {
    days += 719468;
    const int64_t era = FloorDiv(days, 146097);
    const int64_t doe = days - era * 146097;
    const int64_t yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
    const int64_t doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
    const int64_t mp = (5 * doy + 2) / 153;
    const int d = static_cast<int>(doy - (153 * mp + 2) / 5 + 1);
    const int m = static_cast<int>(mp < 10 ? mp + 3 : mp - 9);
    *year = yoe + era * 400 + (m <= 2 ? 1 : 0);
    *month = m;
    *day = d;
}

int WeekdayFromDays(int64_t days) {
    // 1970-01-01 was a Thursday.
    int64_t w = (days + 4) % 7;
    return static_cast<int>(w < 0 ? w + 7 : w);
}

int IsoWeek(int64_t year, int month, int day, int64_t* weekYear) {
    const int64_t days = DaysFromCivil(year, month, day);
    const int isoWeekday = (WeekdayFromDays(days) + 6) % 7;  // 0 Monday .. 6 Sunday
    // The week belongs to the year of its Thursday.
    const int64_t thursday = days - isoWeekday + 3;
    int64_t ty;
    int tm;
    int td;
    CivilFromDays(thursday, &ty, &tm, &td);
    if (weekYear != nullptr) {
        *weekYear = ty;
    }
    const int64_t firstOfYear = DaysFromCivil(ty, 1, 1);
    return static_cast<int>((thursday - firstOfYear) / 7 + 1);
}

}  // namespace civil
