#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <ctime>
#include <functional>
#include <limits>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "TemporaryFolder.h"
#include "util/CharacterBuffer.h"
#include "util/Dates.h"
#include "util/DebugLog.h"
#include "util/Numbers.h"
#include "util/Paths.h"
#include "util/Strings.h"

namespace {

using Pairs = std::vector<std::pair<std::string, std::string>>;

TEST(Strings, AreChangedInPlace) {
    const auto replace = [](char* text) { ReplaceCharacter(text, '/', '_'); };
    // The first byte beyond ASCII ends the changing of letters.
    const std::pair<std::function<void(char*)>, Pairs> cases[] = {
        {Trim, {{"abc \n", "abc"}, {"   ", ""}, {"", ""}, {"abc\t", "abc\t"}, {"abc\r\n", "abc\r"}}},
        {Trim, {{"  a b \n \n", "  a b"}}},
        {strlwr, {{"ABC[Z@`{", "abc[z@`{"}, {"A\xC3\x84Z", "a\xC3\x84Z"}}},
        {strupr, {{"abc`z{@[", "ABC`Z{@["}, {"a\xC3\xA4z", "A\xC3\xA4z"}}},
        {replace, {{"a/b/", "a_b_"}}}};
    for (const auto& [change, texts] : cases) {
        for (const auto& [before, after] : texts) {
            std::string text = before;
            change(text.data());
            EXPECT_EQ(text.c_str(), after) << before;
        }
    }
}

TEST(Strings, ComparesWithoutLetterCase) {
    const std::string longText(200, 'x');
    const Pairs equal = {
        {"Stock", "STOCK"}, {"", ""}, {"X\xC3\xA4", "x\xC3\xA4"}, {longText + "A", longText + "a"}};
    for (const auto& [a, b] : equal)
        EXPECT_EQ(strcmpi(a.c_str(), b.c_str()), 0) << a << " " << b;
    // Compared as lower case, not as upper case, and as unsigned bytes.
    const Pairs ordered = {{"apple", "Banana"},
                           {"ab", "ABC"},
                           {"_", "Z"},
                           {"a", "\xC3\xA4"},
                           {"\xC3\xA4X", "\xC3\xA4x"},
                           {longText + "a", longText + "b"}};
    for (const auto& [a, b] : ordered) {
        EXPECT_LT(strcmpi(a.c_str(), b.c_str()), 0) << a << " " << b;
        EXPECT_GT(strcmpi(b.c_str(), a.c_str()), 0) << a << " " << b;
    }
}

TEST(CharacterBuffer, CutsBetweenWholeCharacters) {
    // What is kept of the text in this many bytes, one more, and so on. Of what is no UTF-8 any cut is as
    // good.
    const std::tuple<std::string, std::size_t, std::vector<std::string>> cases[] = {
        {"abc", 0, {"", "a", "ab", "abc"}},
        {"a\xC3\xA4z", 2, {"a", "a\xC3\xA4"}},
        {"\xE2\x82\xAC!", 1, {"", "", "\xE2\x82\xAC"}},
        {"x\xF0\x9F\x92\xB0", 2, {"x", "x", "x", "x\xF0\x9F\x92\xB0"}},
        {"x\xF0\x9F\x92\xB0y", 5, {"x\xF0\x9F\x92\xB0"}},
        {"\x80\x80\x80\x80\x80", 3, {"\x80\x80\x80"}},
        {"\xC3zzz", 2, {"\xC3z"}},
        {"a\xFF\xFF", 2, {"a\xFF"}}};
    for (const auto& [text, first, all] : cases) {
        for (std::size_t bytes = first; const std::string& kept : all) {
            EXPECT_EQ(CutToBytes(text, bytes), kept);
            for (const bool format : {false, true}) {
                std::string buffer(16, '#');
                EXPECT_EQ(format ? FormatInto(buffer.data(), bytes + 1, "%s", text.c_str())
                                 : CopyText(buffer.data(), bytes + 1, text),
                          text.size() <= bytes);
                EXPECT_EQ(buffer.c_str(), kept);
                EXPECT_EQ(buffer[bytes + 1], '#');
            }
            ++bytes;
        }
    }
    char field[4] = {'a', 'b', 'c', 'd'};
    EXPECT_FALSE(CopyText(field, 0, "x") || FormatInto(field, 0, "x"));
    EXPECT_EQ(FieldText(field), "abcd"); // a field may lack its end
    EXPECT_TRUE(CopyTextZeroed(field, "x"));
    EXPECT_EQ(std::string(field, sizeof field), std::string("x\0\0\0", 4));
    EXPECT_EQ(FieldText(field), "x");
}

TEST(Paths, SplitAndJoin) {
    const std::string longDir = "/" + std::string(123, 'd'), tooLong = longDir + "/fnx";
    const struct {
        std::string path, dir, name, extension, joined;
    } cases[] = {{"/opt/app/invest.db", "/opt/app", "invest", "db", "/opt/app/invest.db"},
                 {"invest.db", "", "invest", "db", "/invest.db"},
                 {"/invest.db", "", "invest", "db", "/invest.db"},
                 {"/opt/app.d/README", "/opt/app.d", "README", "", "/opt/app.d/README"},
                 {"a.b.c", "", "a.b", "c", "/a.b.c"},
                 {"dir/", "dir", "", "", "dir/"},
                 {longDir + "/fn", longDir, "fn", "", longDir + "/fn"},
                 {tooLong, "", "", "", "/"}}; // empty rather than another path
    char dir[PathBufferSize], name[PathBufferSize], extension[PathBufferSize], joined[PathBufferSize];
    for (const auto& each : cases) {
        char drive = '#';
        _splitpath(each.path.c_str(), &drive, dir, name, extension);
        EXPECT_EQ(std::tuple(drive, dir, name, extension),
                  std::tuple('#', each.dir, each.name, each.extension));
        _makepath(joined, nullptr, dir, name, extension);
        EXPECT_EQ(joined, each.joined);
    }
    _makepath(joined, nullptr, longDir.c_str(), "fn", "x");
    EXPECT_STREQ(joined, "");
}

TEST(DebugLog, AppendsAsGivenAndClears) {
    const TemporaryFolder folder;
    const std::string log = folder.File("Quorvan.log");
    PrintDebugStatement("100% %s\n", log.c_str());
    PrintDebugStatement("CLEARX", log.c_str());
    EXPECT_EQ(std::filesystem::status(log).permissions(), std::filesystem::perms{0600});
    EXPECT_EQ(folder.Read("Quorvan.log"), "100% %s\nCLEARX");
    PrintDebugStatement("CLEAR", log.c_str());
    EXPECT_EQ(folder.Read("Quorvan.log"), "");
    PrintDebugStatement("lost", folder.File("missing/Quorvan.log").c_str());
    EXPECT_FALSE(folder.Has("missing"));
}

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
    const std::tuple<int, int, int, int> cases[] = {
        {1900, 2, 29, 1}, {2000, 2, 29, 0},  {2004, 2, 29, 0},  {2001, 2, 29, 1}, {2001, 4, 31, 1},
        {2001, 4, 30, 0}, {2001, 12, 31, 0}, {2001, 12, 32, 1}, {2001, 13, 1, 1}, {2001, 0, 1, 1},
        {2001, 1, 0, 1},  {2001, 6, 31, 1},  {2001, 9, 31, 1},  {2001, 11, 31, 1}};
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
    EXPECT_EQ(written("19991231", 0), "Dec 31, 1999");
    EXPECT_EQ(written("", 0), "");
    EXPECT_EQ(written("20241305", 0), "13 05, 2024");
    EXPECT_EQ(written("20240005", 2), "00 05, 2024");
    EXPECT_EQ(written("abc", 1), "00-00-0");
    EXPECT_EQ(written("-999-9-9", 1), "-9--9--999");
}

TEST(Dates, TellsTheDayAndTheTimeOnATwelveHourClock) {
    const std::pair<int, int> cases[] = {{0, 0}, {1, 1}, {11, 11}, {12, 12}, {13, 1}, {23, 11}};
    for (const auto& [clock, shown] : cases) {
        int year = 0, month = 0, day = 0, hour = -1, minute = -1, second = -1;
        std::time_t before = 0;
        do { // again should the clock strike in between
            before = std::time(nullptr);
            // A time zone that far west turns the running clock into any time of day.
            setenv("TZ", ("TST" + std::to_string((before / 3600 - clock) % 24)).c_str(), 1);
            tzset();
            GetTime(&hour, &minute, &second);
            GetDate(&year, &month, &day);
        } while (std::time(nullptr) != before);
        EXPECT_EQ(std::tuple(hour, minute, second), std::tuple(shown, before / 60 % 60, before % 60));
        char today[9];
        std::strftime(today, sizeof today, "%Y%m%d", std::localtime(&before));
        EXPECT_EQ(std::to_string(year * 10000 + month * 100 + day), today);
    }
    GetDate(nullptr, nullptr, nullptr);
}

} // namespace
