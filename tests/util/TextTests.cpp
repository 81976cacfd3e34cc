#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <string>

#include "TemporaryFolder.h"
#include "util/CharacterBuffer.h"
#include "util/DebugLog.h"
#include "util/Paths.h"
#include "util/Strings.h"

namespace {

TEST(Strings, AreChangedInPlace) {
    const auto replace = [](char* text) { ReplaceCharacter(text, '/', '_'); };
    const struct {
        std::function<void(char*)> change;
        const char *text, *changed;
    } cases[] = {{Trim, "abc \n", "abc"},
                 {Trim, "   ", ""},
                 {Trim, "", ""},
                 {Trim, "abc\t", "abc\t"},
                 {Trim, "abc\r\n", "abc\r"},
                 {Trim, "  a b \n \n", "  a b"},
                 {strlwr, "ABC[Z@`{", "abc[z@`{"},
                 {strupr, "abc`z{@[", "ABC`Z{@["},
                 {strlwr, "A\xC3\x84Z", "a\xC3\x84Z"}, // the first byte beyond ASCII ends it
                 {strupr, "a\xC3\xA4z", "A\xC3\xA4z"},
                 {replace, "a/b/", "a_b_"}};
    for (const auto& c : cases) {
        std::string text = c.text;
        c.change(text.data());
        EXPECT_STREQ(text.c_str(), c.changed) << c.text;
    }
}

TEST(Strings, ComparesWithoutLetterCase) {
    const std::string longText(200, 'x');
    const struct {
        std::string a, b;
        int sign;
    } cases[] = {{"Stock", "STOCK", 0},
                 {"apple", "Banana", -1},
                 {"ab", "ABC", -1},
                 {"", "", 0},
                 {"Z", "_", 1},         // compared as lower case, not as upper case
                 {"a", "\xC3\xA4", -1}, // bytes are unsigned
                 {"\xC3\xA4X", "\xC3\xA4x", -1},
                 {"X\xC3\xA4", "x\xC3\xA4", 0},
                 {longText + "A", longText + "a", 0},
                 {longText + "a", longText + "b", -1}};
    for (const auto& c : cases) {
        const auto sign = [](int number) { return (number > 0) - (number < 0); };
        EXPECT_EQ(sign(strcmpi(c.a.c_str(), c.b.c_str())), c.sign) << c.a << " " << c.b;
        EXPECT_EQ(sign(strcmpi(c.b.c_str(), c.a.c_str())), -c.sign) << c.b << " " << c.a;
    }
}

TEST(CharacterBuffer, CutsBetweenWholeCharacters) {
    const struct {
        const char* text;
        std::size_t bytes;
        const char* kept;
    } cases[] = {{"abc", 3, "abc"},
                 {"abc", 2, "ab"},
                 {"abc", 0, ""},
                 {"a\xC3\xA4", 2, "a"},
                 {"a\xC3\xA4z", 3, "a\xC3\xA4"},
                 {"\xE2\x82\xAC!", 2, ""},
                 {"\xE2\x82\xAC!", 3, "\xE2\x82\xAC"},
                 {"x\xF0\x9F\x92\xB0y", 4, "x"},
                 {"x\xF0\x9F\x92\xB0y", 5, "x\xF0\x9F\x92\xB0"},
                 {"\x80\x80\x80\x80\x80", 3, "\x80\x80\x80"}, // no UTF-8: any cut is as good
                 {"\xC3zzz", 2, "\xC3z"},
                 {"a\xFF\xFF", 2, "a\xFF"}};
    for (const auto& c : cases) {
        EXPECT_EQ(CutToBytes(c.text, c.bytes), c.kept) << c.text << " " << c.bytes;
        const bool whole = std::strlen(c.text) <= c.bytes;
        for (const bool format : {false, true}) {
            std::string buffer(16, '#');
            EXPECT_EQ(format ? FormatInto(buffer.data(), c.bytes + 1, "%s", c.text)
                             : CopyText(buffer.data(), c.bytes + 1, c.text),
                      whole);
            EXPECT_STREQ(buffer.c_str(), c.kept);
            EXPECT_EQ(buffer[c.bytes + 1], '#');
        }
    }
    char untouched = '#';
    EXPECT_FALSE(CopyText(&untouched, 0, "a"));
    EXPECT_EQ(untouched, '#');
}

TEST(CharacterBuffer, FieldsAreZeroedAndMayLackTheirEnd) {
    char field[4] = {'a', 'b', 'c', 'd'};
    EXPECT_EQ(FieldText(field), "abcd");
    EXPECT_TRUE(CopyTextZeroed(field, "x"));
    EXPECT_EQ(std::string(field, sizeof field), std::string("x\0\0\0", 4));
    EXPECT_EQ(FieldText(field), "x");
}

TEST(Paths, SplitAndJoin) {
    const struct {
        const char *path, *dir, *name, *extension, *joined;
    } cases[] = {{"/opt/app/invest.db", "/opt/app", "invest", "db", "/opt/app/invest.db"},
                 {"invest.db", "", "invest", "db", "/invest.db"},
                 {"/opt/app/README", "/opt/app", "README", "", "/opt/app/README"},
                 {"/opt/app.d/README", "/opt/app.d", "README", "", "/opt/app.d/README"},
                 {"/invest.db", "", "invest", "db", "/invest.db"},
                 {"a.b.c", "", "a.b", "c", "/a.b.c"},
                 {"dir/", "dir", "", "", "dir/"},
                 {"", "", "", "", "/"}};
    for (const auto& c : cases) {
        char drive = '#';
        char dir[PathBufferSize], name[PathBufferSize], extension[PathBufferSize], joined[PathBufferSize];
        _splitpath(c.path, &drive, dir, name, extension);
        EXPECT_STREQ(dir, c.dir);
        EXPECT_STREQ(name, c.name);
        EXPECT_STREQ(extension, c.extension);
        EXPECT_EQ(drive, '#');
        _makepath(joined, "", dir, name, extension);
        EXPECT_STREQ(joined, c.joined);
    }
}

TEST(Paths, WhatDoesNotFitIsEmptyRatherThanAnotherPath) {
    const std::string fits = "/" + std::string(123, 'd') + "/fn";
    char dir[PathBufferSize], name[PathBufferSize], extension[PathBufferSize], joined[PathBufferSize];
    _splitpath(fits.c_str(), nullptr, dir, name, extension);
    _makepath(joined, nullptr, dir, name, extension);
    EXPECT_EQ(joined, fits);
    _makepath(joined, nullptr, dir, name, "x");
    EXPECT_STREQ(joined, "");
    _splitpath((fits + "x").c_str(), nullptr, dir, name, extension);
    EXPECT_STREQ(dir, "");
    EXPECT_STREQ(name, "");
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

} // namespace
