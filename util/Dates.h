#pragma once

#include <array>
#include <cstddef>

// The calendar as the program shows it: local time, four-digit years, months and days counted from 1.

// What FormatDate writes at most, its NUL included.
inline constexpr std::size_t FormatDateSize = 32;

// January first.
inline constexpr std::array<const char*, 12> ShortMonthNames = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                                                "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
inline constexpr std::array<const char*, 12> LongMonthNames = {
    "January", "February", "March",     "April",   "May",      "June",
    "July",    "August",   "September", "October", "November", "December"};

// Today's local date; a null pointer skips that part.
void GetDate(int* year, int* month, int* day);

// The local time of day on a twelve-hour clock without a morning/afternoon mark: hours 0 to 12 stay as they
// are, 13 to 23 become 1 to 11. No pointer may be null.
void GetTime(int* hour, int* minute, int* second);

// 1 for a leap year of the Gregorian calendar, else 0.
[[nodiscard]] int IsLeapYear(int year);

// The days of that month, which is 1 to 12.
[[nodiscard]] int DaysInMonth(int year, int month);

// 0 when the date exists, 1 when it does not.
[[nodiscard]] int CheckDate(int year, int month, int day);

// Writes the date text `yyyymmdd` ("20240305") into the FormatDateSize bytes at `out`, which may be the same
// buffer. Style 0: "Mar 05, 2024"; 1: "03-05-2024"; 2: "March 05, 2024"; any other leaves `out` as it is.
// Empty text gives empty text; a month that has no name is written as its number ("13 05, 2024"); what is no
// digit counts as 0. Returns 0.
int FormatDate(const char* yyyymmdd, char* out, int style);
