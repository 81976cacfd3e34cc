#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <ctime>
#include <limits>
#include <string>
#include <tuple>

#include "util/Dates.h"
#include "util/Numbers.h"

namespace {

// The values as FormatNumber writes them, a blank behind each.
std::string Grouped(std::initializer_list<float> values, int decimals) {
    std::string all;
    for (const float value : values) {
        std::string text(FormatNumberSize + 1, '#');
        FormatNumber(value, text.data(), decimals);
        EXPECT_EQ(text.back(), '#');
        all.append(text.c_str()).append(" ");
    }
    return all;
}

TEST(Numbers, GroupsThousands) {
    constexpr float infinity = std::numeric_limits<float>::infinity();
    EXPECT_EQ(Grouped({1234567.0F, -1234.0F, 1234.5F, 12345.5F, -123.0F, 999.999F, -0.001F}, 2),
              "1,234,567.00 -1,234.00 1234.50 12,345.50 -123.00 1000.00 -0.00 ");
    EXPECT_EQ(Grouped({0.125F, 0.375F}, 2), "0.12 0.38 "); // halves go to the even digit
    EXPECT_EQ(Grouped({infinity, -infinity, std::nanf(""), -std::nanf("")}, 2), "inf -inf nan nan ");
    EXPECT_EQ(Grouped({-123456792.0F}, 0), "-123,456,792 ");
    // Beyond thirteen digits the first group takes the rest, and more than 31 characters get an exponent.
    EXPECT_EQ(Grouped({1e13F}, 1), "9999,999,827,968.0 ");
    EXPECT_EQ(Grouped({1e27F, 1e29F, -std::numeric_limits<float>::max()}, 2),
              "999999988484154753,734,934,528.00 1.00e+29 -3.40e+38 ");
    EXPECT_EQ(Grouped({1.0F}, 1000), "1.00000000000000000000e+00 ");
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
    const std::tuple<int, int, int, int> cases[] = {{1900, 2, 29, 1},  {2000, 2, 29, 0},  {2004, 2, 29, 0},
                                                    {2001, 2, 29, 1},  {2001, 4, 31, 1},  {2001, 4, 30, 0},
                                                    {2001, 12, 31, 0}, {2001, 12, 32, 1}, {2001, 13, 1, 1},
                                                    {2001, 0, 1, 1},   {2001, 1, 0, 1}};
    for (const auto& [year, month, day, missing] : cases)
        EXPECT_EQ(CheckDate(year, month, day), missing) << year << "-" << month << "-" << day;
}

TEST(Dates, WritesDateTexts) {
    char text[FormatDateSize] = "20240905";
    const auto written = [&](const char* date, int style) {
        EXPECT_EQ(FormatDate(date, text, style), 0);
        return std::string(text);
    };
    EXPECT_EQ(written(text, 5), "20240905");
    EXPECT_EQ(written(text, 2), "September 05, 2024");
    EXPECT_EQ(written("20240305", 0), "Mar 05, 2024");
    EXPECT_EQ(written("19991231", 1), "12-31-1999");
    EXPECT_EQ(written("", 0), "");
    EXPECT_EQ(written("20241305", 0), "13 05, 2024");
    EXPECT_EQ(written("20240005", 2), "00 05, 2024");
    EXPECT_EQ(written("abc", 1), "00-00-0");
    EXPECT_EQ(written("-999-9-9", 1), "-9--9--999");
}

TEST(Dates, TellsTheTimeOnATwelveHourClock) {
    const std::pair<int, int> cases[] = {{0, 0}, {1, 1}, {11, 11}, {12, 12}, {13, 1}, {23, 11}};
    for (const auto& [clock, shown] : cases) {
        int hour = -1, minute = -1, second = -1;
        std::time_t before = 0;
        do { // again should the clock strike in between
            before = std::time(nullptr);
            // A time zone that far west turns the running clock into any time of day.
            setenv("TZ", ("TST" + std::to_string((before / 3600 - clock) % 24)).c_str(), 1);
            tzset();
            GetTime(&hour, &minute, &second);
        } while (std::time(nullptr) != before);
        EXPECT_EQ(std::tuple(hour, minute, second), std::tuple(shown, before / 60 % 60, before % 60));
    }
    int year = 0;
    GetDate(&year, nullptr, nullptr);
    EXPECT_GE(year, 2024);
}

} // namespace
