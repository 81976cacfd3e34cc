#include "db/DatesTimes.h"

#include <compare>
#include <cstdio>
#include <ctime>
#include <tuple>

#include "db/Database.h"
#include "util/Dates.h"

namespace {

constexpr int MonthsPerYear = 12;
constexpr int SecondsPerMinute = 60;
constexpr int MinutesPerHour = 60;
constexpr int HoursPerDay = 24;

struct Division {
    int quotient; // rounded down
    int rest;     // 0 or above
};

constexpr Division DivideDown(int number, int divisor) {
    const int rest = (number % divisor + divisor) % divisor;
    return {(number - rest) / divisor, rest};
}

void CarryMonth(dbDATE* date) {
    const auto [years, month] = DivideDown(date->month - 1, MonthsPerYear);
    date->year = static_cast<std::int16_t>(date->year + years);
    date->month = static_cast<std::int8_t>(month + 1);
}

int Sign(std::strong_ordering order) {
    return std::is_lt(order) ? -1 : (std::is_gt(order) ? 1 : 0);
}

} // namespace

void NormaliseDate(dbDATE* date) {
    CarryMonth(date);
    const int length = DaysInMonth(date->year, date->month);
    if (date->day > length) {
        date->day = static_cast<std::int8_t>(date->day - length);
        ++date->month;
        CarryMonth(date);
    } else if (date->day < 1) {
        --date->month;
        CarryMonth(date);
        date->day = static_cast<std::int8_t>(date->day + DaysInMonth(date->year, date->month));
    }
}

void NormaliseTime(dbTIME* time) {
    // In full numbers: a carry may take a minute beyond what its byte holds.
    const auto [minutes, second] = DivideDown(time->second, SecondsPerMinute);
    const auto [hours, minute] = DivideDown(time->minute + minutes, MinutesPerHour);
    int hour = time->hour + hours;
    if (hour >= HoursPerDay)
        hour -= HoursPerDay;
    else if (hour < 0)
        hour += HoursPerDay;
    *time = {static_cast<std::int8_t>(second), static_cast<std::int8_t>(minute),
             static_cast<std::int8_t>(hour)};
}

void DATABASE::MakeDateValid(dbDATE* date) const {
    NormaliseDate(date);
}

void DATABASE::MakeTimeValid(dbTIME* time) const {
    NormaliseTime(time);
}

void DATABASE::GetFormattedDateString(const dbDATE* date, char* out, int style) const {
    if (style < 1 || style > 3)
        return;
    if (date->month < 1 || date->day < 1 || (style != 3 && date->month > MonthsPerYear)) {
        std::snprintf(out, FormattedDateSize, "Invalid date");
    } else if (style == 3) {
        std::snprintf(out, FormattedDateSize, "%02d-%02d-%d", date->month, date->day, date->year);
    } else {
        const auto& names = style == 1 ? ShortMonthNames : LongMonthNames;
        const char* name = names[static_cast<std::size_t>(date->month - 1)];
        std::snprintf(out, FormattedDateSize, "%s %02d, %d", name, date->day, date->year);
    }
}

void DATABASE::GetFormattedTimeString(const dbTIME* time, char* out, int style) const {
    dbTIME shown = *time;
    if (style != 2)
        ConvertTo12HourTime(time, &shown);
    std::snprintf(out, FormattedTimeSize, "%.2d:%.2d:%.2d", shown.hour, shown.minute, shown.second);
}

dbDATE Today() {
    int year = 0;
    int month = 0;
    int day = 0;
    GetDate(&year, &month, &day);
    return {static_cast<std::int8_t>(day), static_cast<std::int8_t>(month), static_cast<std::int16_t>(year)};
}

void DATABASE::SetToCurrentDate(dbDATE* date) const {
    *date = Today();
}

void DATABASE::SetToCurrentTime(dbTIME* time) const {
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    localtime_r(&now, &local);
    *time = {static_cast<std::int8_t>(local.tm_sec), static_cast<std::int8_t>(local.tm_min),
             static_cast<std::int8_t>(local.tm_hour)};
}

int DATABASE::CompareDates(const dbDATE* a, const dbDATE* b) const {
    return Sign(std::tie(a->year, a->month, a->day) <=> std::tie(b->year, b->month, b->day));
}

int DATABASE::CompareTimes(const dbTIME* a, const dbTIME* b) const {
    return Sign(std::tie(a->hour, a->minute, a->second) <=> std::tie(b->hour, b->minute, b->second));
}

void DATABASE::ConvertTo12HourTime(const dbTIME* in, dbTIME* out) const {
    *out = *in;
    if (in->hour > 12 && in->hour < HoursPerDay)
        out->hour = static_cast<std::int8_t>(in->hour - 12);
    else if (in->hour == 0)
        out->hour = 12;
}
