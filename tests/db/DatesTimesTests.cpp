#include <gtest/gtest.h>

#include <ctime>
#include <string>

#include "db/Database.h"

namespace {

const DATABASE Rules(nullptr);

template <class Value>
std::string Formatted(const Value& value, int style) {
    char text[FormattedDateSize] = "untouched";
    if constexpr (std::is_same_v<Value, dbDATE>)
        Rules.GetFormattedDateString(&value, text, style);
    else
        Rules.GetFormattedTimeString(&value, text, style);
    return text;
}

TEST(DatesAndTimes, AreMadeValid) {
    const std::pair<dbDATE, dbDATE> dates[] = {
        {{29, 2, 1900}, {1, 3, 1900}},  {{29, 2, 1999}, {1, 3, 1999}},    {{0, 3, 1999}, {28, 2, 1999}},
        {{0, 1, 2000}, {31, 12, 1999}}, {{1, 13, 1999}, {1, 1, 2000}},    {{1, 24, 1999}, {1, 12, 2000}},
        {{1, 0, 1999}, {1, 12, 1998}},  {{1, -12, 1999}, {1, 12, 1997}},  {{70, 1, 1999}, {39, 2, 1999}},
        {{32, 12, 1999}, {1, 1, 2000}}, {{-40, 3, 2000}, {-11, 2, 2000}}, {{1, 127, 32767}, {1, 7, -32759}}};
    for (auto [date, after] : dates) {
        Rules.MakeDateValid(&date);
        EXPECT_EQ(PackDate(date), PackDate(after)) << "case " << Formatted(after, 3);
    }
    const std::pair<dbTIME, dbTIME> times[] = {
        {{-60, 5, 5}, {0, 4, 5}}, {{125, 5, 5}, {5, 7, 5}},   {{125, 127, 0}, {5, 9, 2}},
        {{0, 0, -1}, {0, 0, 23}}, {{-1, 0, 0}, {59, 59, 23}}, {{60, 59, 23}, {0, 0, 0}},
        {{0, 0, 50}, {0, 0, 26}}, {{0, 0, -30}, {0, 0, -6}},  {{-128, 0, 1}, {52, 57, 0}}};
    for (auto [time, after] : times) {
        Rules.MakeTimeValid(&time);
        EXPECT_EQ(PackTime(time), PackTime(after)) << "case " << Formatted(after, 2);
    }
}

TEST(DatesAndTimes, AreFormatted) {
    const std::pair<dbDATE, std::string> dates[] = {
        {{5, 1, 1999}, "Jan 05, 1999|January 05, 1999|01-05-1999"},
        {{5, 0, 1999}, "Invalid date|Invalid date|Invalid date"},
        {{0, 5, 1999}, "Invalid date|Invalid date|Invalid date"},
        {{5, 13, 1999}, "Invalid date|Invalid date|13-05-1999"},
        {{127, 9, -32768}, "Sep 127, -32768|September 127, -32768|09-127--32768"}};
    for (const auto& [date, texts] : dates) {
        EXPECT_EQ(Formatted(date, 1) + '|' + Formatted(date, 2) + '|' + Formatted(date, 3), texts);
        EXPECT_EQ(Formatted(date, 0) + Formatted(date, 4), "untoucheduntouched");
    }
    const std::pair<dbTIME, std::string> times[] = {
        {{7, 5, 9}, "09:05:07 09:05:07"},  {{0, 30, 21}, "09:30:00 21:30:00"},
        {{0, 15, 0}, "12:15:00 00:15:00"}, {{0, 0, 12}, "12:00:00 12:00:00"},
        {{0, 0, 13}, "01:00:00 13:00:00"}, {{-128, -128, -128}, "-128:-128:-128 -128:-128:-128"}};
    for (const auto& [time, texts] : times)
        EXPECT_EQ(Formatted(time, 1) + ' ' + Formatted(time, 2), texts);
}

TEST(DatesAndTimes, AreCompared) {
    const dbDATE dates[] = {{31, 12, -1}, {31, 12, 1999}, {1, 1, 2000}, {2, 1, 2000}, {1, 2, 2000}};
    const dbTIME times[] = {{0, 0, -1}, {59, 59, 0}, {0, 0, 1}, {1, 0, 1}, {0, 1, 1}};
    for (int i = 0; i < 25; ++i) {
        const int a = i / 5, b = i % 5, sign = a < b ? -1 : (a > b ? 1 : 0);
        EXPECT_EQ(Rules.CompareDates(&dates[a], &dates[b]), sign);
        EXPECT_EQ(Rules.CompareTimes(&times[a], &times[b]), sign);
    }
}

TEST(DatesAndTimes, AreReadFromTheClock) {
    std::time_t now = 0;
    dbDATE date{};
    dbTIME time{};
    do { // until no second ends in between
        now = std::time(nullptr);
        Rules.SetToCurrentDate(&date);
        Rules.SetToCurrentTime(&time);
    } while (std::time(nullptr) != now);
    char text[40];
    std::strftime(text, sizeof(text), "%m-%d-%Y %H:%M:%S", std::localtime(&now));
    EXPECT_EQ(Formatted(date, 3) + " " + Formatted(time, 2), text);
}

} // namespace
