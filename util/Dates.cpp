#include "util/Dates.h"

#include <cstdio>
#include <ctime>

#include "util/CharacterBuffer.h"

namespace {

std::tm LocalNow() {
    const std::time_t now = std::time(nullptr);
    std::tm parts{};
    localtime_r(&now, &parts);
    return parts;
}

// A month name, or its number where there is none, with the day and the year.
void FormatWithName(char* out, const std::array<const char*, 12>& names, int year, int month, int day) {
    if (month >= 1 && month <= 12)
        FormatInto(out, FormatDateSize, "%s %02d, %d", names[static_cast<std::size_t>(month - 1)], day, year);
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

int DaysInMonth(int year, int month) {
    constexpr std::array<int, 12> days = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    return days[static_cast<std::size_t>(month - 1)] + (month == 2 ? IsLeapYear(year) : 0);
}

int CheckDate(int year, int month, int day) {
    if (month < 1 || month > 12 || day < 1)
        return 1;
    return day <= DaysInMonth(year, month) ? 0 : 1;
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
    static_cast<void>(std::sscanf(yyyymmdd, "%4d%2d%2d", &year, &month, &day));
    if (style == 0)
        FormatWithName(out, ShortMonthNames, year, month, day);
    else if (style == 1)
        FormatInto(out, FormatDateSize, "%02d-%02d-%d", month, day, year);
    else if (style == 2)
        FormatWithName(out, LongMonthNames, year, month, day);
    return 0;
}
