#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "TemporaryFolder.h"
#include "util/CharacterBuffer.h"
#include "util/DebugLog.h"
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
    EXPECT_FALSE(CopyText(field, 0, "x"));
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

} // namespace
