#include <gtest/gtest.h>

#include <ctime>

#include "db/Database.h"

namespace {

const DATABASE Rules(nullptr);

TEST(Dates, AreMadeValid) {
    const struct {
        dbDATE before, after;
    } cases[] = {
        {{29, 2, 2000}, {29, 2, 2000}},   {{29, 2, 1900}, {1, 3, 1900}},  {{29, 2, 1996}, {29, 2, 1996}},
        {{29, 2, 1999}, {1, 3, 1999}},    {{0, 3, 1999}, {28, 2, 1999}},  {{0, 1, 2000}, {31, 12, 1999}},
        {{1, 13, 1999}, {1, 1, 2000}},    {{1, 24, 1999}, {1, 12, 2000}}, {{1, 0, 1999}, {1, 12, 1998}},
        {{1, -12, 1999}, {1, 12, 1997}},  {{70, 1, 1999}, {39, 2, 1999}}, {{32, 12, 1999}, {1, 1, 2000}},
        {{-40, 3, 2000}, {-11, 2, 2000}}, {{31, 4, 2001}, {1, 5, 2001}},  {{1, 127, 32767}, {1, 7, -32759}},
    };
    for (const auto& date : cases) {
        dbDATE made = date.before;
        Rules.MakeDateValid(&made);
        EXPECT_EQ(PackDate(made), PackDate(date.after))
            << static_cast<int>(date.before.day) << "." << static_cast<int>(date.before.month);
    }
}

TEST(Times, AreMadeValid) {
    const struct {
        dbTIME before, after;
    } cases[] = {
        {{0, 0, 0}, {0, 0, 0}},     {{-60, 5, 5}, {0, 4, 5}},    {{125, 5, 5}, {5, 7, 5}},
        {{125, 127, 0}, {5, 9, 2}}, {{0, 0, 24}, {0, 0, 0}},     {{0, 0, -1}, {0, 0, 23}},
        {{-1, 0, 0}, {59, 59, 23}}, {{60, 59, 23}, {0, 0, 0}},   {{0, 0, 50}, {0, 0, 26}},
        {{0, 0, -30}, {0, 0, -6}},  {{-128, 0, 1}, {52, 57, 0}},
    };
    for (const auto& time : cases) {
        dbTIME made = time.before;
        Rules.MakeTimeValid(&made);
        EXPECT_EQ(PackTime(made), PackTime(time.after));
    }
}

TEST(Dates, AreFormatted) {
    const struct {
        dbDATE date;
        int style;
        const char* text;
    } cases[] = {
        {{5, 1, 1999}, 1, "Jan 05, 1999"},
        {{5, 1, 1999}, 2, "January 05, 1999"},
        {{5, 1, 1999}, 3, "01-05-1999"},
        {{5, 1, 1999}, 0, "untouched"},
        {{5, 1, 1999}, 4, "untouched"},
        {{5, 0, 1999}, 1, "Invalid date"},
        {{5, 0, 1999}, 3, "Invalid date"},
        {{0, 5, 1999}, 2, "Invalid date"},
        {{5, 13, 1999}, 1, "Invalid date"},
        {{5, 13, 1999}, 2, "Invalid date"},
        {{5, 13, 1999}, 3, "13-05-1999"},
        {{127, 9, -32768}, 2, "September 127, -32768"},
        {{127, 127, -32768}, 3, "127-127--32768"},
    };
    for (const auto& format : cases) {
        char text[FormattedDateSize] = "untouched";
        Rules.GetFormattedDateString(&format.date, text, format.style);
        EXPECT_STREQ(text, format.text);
    }
}

TEST(Times, AreFormatted) {
    const struct {
        dbTIME time;
        const char *clock12, *clock24;
    } cases[] = {
        {{7, 5, 9}, "09:05:07", "09:05:07"},  {{0, 30, 21}, "09:30:00", "21:30:00"},
        {{0, 15, 0}, "12:15:00", "00:15:00"}, {{0, 0, 12}, "12:00:00", "12:00:00"},
        {{0, 0, 13}, "01:00:00", "13:00:00"}, {{-128, -128, -128}, "-128:-128:-128", "-128:-128:-128"},
    };
    for (const auto& format : cases) {
        char text[FormattedTimeSize];
        Rules.GetFormattedTimeString(&format.time, text, 1);
        EXPECT_STREQ(text, format.clock12);
        Rules.GetFormattedTimeString(&format.time, text, 2);
        EXPECT_STREQ(text, format.clock24);
    }
}

TEST(DatesAndTimes, AreCompared) {
    const dbDATE dates[] = {{31, 12, -1}, {31, 12, 1999}, {1, 1, 2000}, {2, 1, 2000}, {1, 2, 2000}};
    const dbTIME times[] = {{0, 0, -1}, {59, 59, 0}, {0, 0, 1}, {1, 0, 1}, {0, 1, 1}};
    for (int i = 0; i < 5; ++i) {
        for (int j = 0; j < 5; ++j) {
            const int sign = i < j ? -1 : (i > j ? 1 : 0);
            EXPECT_EQ(Rules.CompareDates(&dates[i], &dates[j]), sign);
            EXPECT_EQ(Rules.CompareTimes(&times[i], &times[j]), sign);
        }
    }
}

TEST(DatesAndTimes, AreReadFromTheClock) {
    const std::time_t before = std::time(nullptr);
    std::tm now{};
    dbDATE date{};
    dbDATE dateAfter{};
    dbTIME time{};
    do { // until no midnight lies between
        Rules.SetToCurrentDate(&date);
        Rules.SetToCurrentTime(&time);
        Rules.SetToCurrentDate(&dateAfter);
    } while (Rules.CompareDates(&date, &dateAfter) != 0);
    now.tm_year = date.year - 1900;
    now.tm_mon = int{date.month} - 1;
    now.tm_mday = int{date.day};
    now.tm_hour = int{time.hour};
    now.tm_min = int{time.minute};
    now.tm_sec = int{time.second};
    now.tm_isdst = -1;
    const double late = std::difftime(std::mktime(&now), before);
    EXPECT_TRUE(late >= 0 && late < 100) << late;
}

} // namespace
