#ifndef QUORVEX_SUPPORT_CIVIL_CALENDAR_H
#define QUORVEX_SUPPORT_CIVIL_CALENDAR_H

#include <cstdint>

// Proleptic Gregorian calendar arithmetic, independent of the system's time functions.
namespace civil {

bool IsLeapYear(int64_t year);
int DaysInMonth(int64_t year, int month);
// Days before the month in that year (0 for January).
int DaysBeforeMonth(int64_t year, int month);
// Days since 1970-01-01 of a date, and back.
int64_t DaysFromCivil(int64_t year, int month, int day);
void CivilFromDays(int64_t days, int64_t* year, int* month, int* day);
// 0 Sunday .. 6 Saturday.
int WeekdayFromDays(int64_t days);
// ISO 8601 week number and week-based year of a date.
int IsoWeek(int64_t year, int month, int day, int64_t* weekYear);

}  // namespace civil

#endif  // QUORVEX_SUPPORT_CIVIL_CALENDAR_H
