#include "util/Dates.h"

#include <cstdio>
#include <ctime>

#include "util/CharacterBuffer.h"

namespace {

constexpr const char* ShortMonthNames[] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                           "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
constexpr const char* LongMonthNames[] = {"January",   "February", "March",    "April",
                                          "May",       "June",     "July",     "August",
                                          "September", "October",  "November", "December"};
constexpr int DaysInMonth[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};

std::tm LocalNow() {
    const std::time_t now = std::time(nullptr);
    std::tm parts{};
    localtime_r(&now, &parts);
    return parts;
}

// A month name, or its number where there is none, with the day and the year.
void FormatWithName(char* out, const char* const (&names)[12], int year, int month, int day) {
    if (month >= 1 && month <= 12)
        FormatInto(out, FormatDateSize, "%s %02d, %d", names[month - 1], day, year);
    else
        FormatInto(out, FormatDateSize, "%02d %02d, %d", month, day, year);
}

} // namespace

void GetDate(int* year, int* month, int* day) {
    const std::tm now = LocalNow();
    if (year != nullptr)
        *year = now.tm_year + 1900;
    if (month != nullptr)
        *month = now.tm_mon + 1;
    if (day != nullptr)
        *day = now.tm_mday;
}

void GetTime(int* hour, int* minute, int* second) {
    const std::tm now = LocalNow();
    *hour = now.tm_hour > 12 ? now.tm_hour - 12 : now.tm_hour;
    *minute = now.tm_min;
    *second = now.tm_sec;
}

int IsLeapYear(int year) {
    return (year % 4 == 0 && year % 100 != 0) || year % 400 == 0 ? 1 : 0;
}

int CheckDate(int year, int month, int day) {
    if (month < 1 || month > 12 || day < 1)
        return 1;
    const int days = month == 2 ? DaysInMonth[1] + IsLeapYear(year) : DaysInMonth[month - 1];
    return day <= days ? 0 : 1;
}

int FormatDate(const char* yyyymmdd, char* out, int style) {
    if (*yyyymmdd == '\0') {
        *out = '\0';
        return 0;
    }
    int year = 0;
    int month = 0;
    int day = 0;
    // The widths bound every number, so none can be out of range.
    (void)std::sscanf(yyyymmdd, "%4d%2d%2d", &year, &month, &day);
    if (style == 0)
        FormatWithName(out, ShortMonthNames, year, month, day);
    else if (style == 1)
        FormatInto(out, FormatDateSize, "%02d-%02d-%d", month, day, year);
    else if (style == 2)
        FormatWithName(out, LongMonthNames, year, month, day);
    return 0;
}
