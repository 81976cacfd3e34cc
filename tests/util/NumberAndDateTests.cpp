#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <limits>
#include <string>

#include "util/Dates.h"
#include "util/Numbers.h"

namespace {

TEST(Numbers, GroupsThousands) {
    const float infinity = std::numeric_limits<float>::infinity();
    const struct {
        float value;
        int decimals;
        const char* text;
    } cases[] = {{1234567.0F, 2, "1,234,567.00"},
                 {-1234.0F, 2, "-1,234.00"},
                 {1234.5F, 2, "1234.50"},
                 {12345.5F, 2, "12,345.50"},
                 {-123.0F, 2, "-123.00"},
                 {-123456792.0F, 0, "-123,456,792"},
                 {999.999F, 2, "1000.00"},
                 {-0.001F, 2, "-0.00"},
                 {0.125F, 2, "0.12"}, // halves go to the even digit
                 {0.375F, 2, "0.38"},
                 {1e13F, 1, "9999,999,827,968.0"}, // beyond thirteen digits the first group takes the rest
                 {1e27F, 2, "999999988484154753,734,934,528.00"},
                 {1e29F, 2, "1.00e+29"}, // more than 31 characters
                 {-std::numeric_limits<float>::max(), 2, "-3.40e+38"},
                 {1.0F, 1000, "1.00000000000000000000e+00"},
                 {infinity, 2, "inf"},
                 {-infinity, 2, "-inf"},
                 {std::nanf(""), 2, "nan"},
                 {-std::nanf(""), 2, "nan"}};
    for (const auto& c : cases) {
        char text[FormatNumberSize + 1];
        text[FormatNumberSize] = '#';
        FormatNumber(c.value, text, c.decimals);
        EXPECT_STREQ(text, c.text);
        EXPECT_EQ(text[FormatNumberSize], '#');
    }
}

TEST(Numbers, FixedTextIsCutAtTheBuffer) {
    char text[8];
    EXPECT_TRUE(FormatFixed(-12.3456, text, sizeof text, 3));
    EXPECT_STREQ(text, "-12.346");
    EXPECT_FALSE(FormatFixed(std::numeric_limits<double>::max(), text, sizeof text, 60));
    EXPECT_STREQ(text, "1797693");
}

TEST(Numbers, ReadsTheNumberAtTheStart) {
    const std::pair<const char*, double> cases[] = {
        {"12.50", 12.5}, {"1,234.50", 1}, {"N/A", 0}, {"", 0},     {" \t-3e2x", -300}, {"+4.", 4},
        {".5", 0.5},     {"+-4", 0},      {"inf", 0}, {"-nan", 0}, {"1e-999", 0},      {"0x10", 0},
        {"12 3/8", 12},  {"-", 0},        {"1e", 1},  {".", 0},    {"--1", 0}};
    for (const auto& [text, value] : cases) {
        double read = -1;
        EXPECT_TRUE(ReadDecimal(text, &read)) << text;
        EXPECT_EQ(read, value) << text;
    }
    double read = -1;
    EXPECT_FALSE(ReadDecimal("-0.5e999", &read));
    EXPECT_EQ(read, 0);
}

TEST(Dates, KnowsTheCalendar) {
    const struct {
        int year, month, day, missing;
    } cases[] = {{1900, 2, 29, 1}, {2000, 2, 29, 0}, {2004, 2, 29, 0},  {2001, 2, 29, 1},
                 {2001, 4, 31, 1}, {2001, 4, 30, 0}, {2001, 12, 31, 0}, {2001, 12, 32, 1},
                 {2001, 13, 1, 1}, {2001, 0, 1, 1},  {2001, 1, 0, 1}};
    for (const auto& c : cases)
        EXPECT_EQ(CheckDate(c.year, c.month, c.day), c.missing) << c.year << "-" << c.month << "-" << c.day;
}

TEST(Dates, WritesDateTexts) {
    const struct {
        const char* date;
        int style;
        const char* text;
    } cases[] = {{"20240305", 0, "Mar 05, 2024"},
                 {"20240305", 1, "03-05-2024"},
                 {"20240305", 2, "March 05, 2024"},
                 {"19991231", 1, "12-31-1999"},
                 {"", 0, ""},
                 {"20241305", 0, "13 05, 2024"},
                 {"20240005", 2, "00 05, 2024"},
                 {"abc", 1, "00-00-0"},
                 {"-999-9-9", 1, "-9--9--999"}};
    for (const auto& c : cases) {
        char text[FormatDateSize] = "old";
        EXPECT_EQ(FormatDate(c.date, text, c.style), 0);
        EXPECT_STREQ(text, c.text);
    }
    char text[FormatDateSize] = "20240905";
    EXPECT_EQ(FormatDate(text, text, 5), 0);
    EXPECT_STREQ(text, "20240905");
    FormatDate(text, text, 2);
    EXPECT_STREQ(text, "September 05, 2024");
}

// A time zone fixed distance away turns the running clock into any time of day.
void MoveClockTo(int hour) {
    const std::time_t now = std::time(nullptr);
    std::tm utc{};
    gmtime_r(&now, &utc);
    const int west = ((utc.tm_hour - hour) % 24 + 24) % 24;
    setenv("TZ", ("TST" + std::to_string(west)).c_str(), 1);
    tzset();
}

TEST(Dates, TellsTheTimeOnATwelveHourClock) {
    const std::pair<int, int> cases[] = {{0, 0}, {1, 1}, {11, 11}, {12, 12}, {13, 1}, {23, 11}};
    for (const auto& [clock, shown] : cases) {
        int hour = -1, minute = -1, second = -1;
        std::time_t before = 0;
        do { // again should the clock strike in between
            before = std::time(nullptr);
            MoveClockTo(clock);
            GetTime(&hour, &minute, &second);
        } while (std::time(nullptr) != before);
        EXPECT_EQ(hour, shown);
        EXPECT_EQ(minute, before / 60 % 60);
        EXPECT_EQ(second, before % 60);
    }
    int year = 0;
    GetDate(&year, nullptr, nullptr);
    EXPECT_GE(year, 2024);
}

} // namespace
