#include <gtest/gtest.h>

#include <csignal>
#include <filesystem>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include "InChild.h"
#include "TemporaryFolder.h"
#include "util/IniFile.h"

namespace {

constexpr const char* Name = "Quorvan.ini";

class IniFileTest : public testing::Test {
  protected:
    std::string Value(const char* section, const char* key) const {
        char value[128];
        Settings().ReadString(section, key, "default", value);
        return value;
    }
    std::string After(const std::string& content, const char* value) const {
        folder_.Write(Name, content);
        EXPECT_EQ(Settings().WriteString("G", "K", value), 0);
        EXPECT_FALSE(folder_.Has("ini_file.tmp"));
        return folder_.Read(Name);
    }
    // Whether the entry is refused and the file as it was.
    bool Refuses(const std::string& section, const std::string& key, const std::string& value) const {
        const std::string before = folder_.Read(Name);
        return Settings().WriteString(section.c_str(), key.c_str(), value.c_str()) == 1 &&
               folder_.Read(Name) == before;
    }
    INI_FILEx Settings() const { return INI_FILEx(folder_.File(Name).c_str()); }

    TemporaryFolder folder_;
};

TEST_F(IniFileTest, ReadsTheFirstEntryOfTheSection) {
    folder_.Write(Name,
                  "Key=before any section\n;[GENERAL]\n [GENERAL]\nKey=blank\n[general]\nKey=small\n"
                  "[GENERALX]\nKey=longer\n[GENERAL] ; main\n;Key=comment\n\nno entry\nKey = blanks\n"
                  "Key=  a=b \t  \nKey=second\n[DISPLAY]\nKey=other\r\nWide=120\n[GENERAL]old\nLate=yes  ");
    EXPECT_EQ(Value("GENERAL", "Key"), "  a=b \t");
    EXPECT_EQ(Value("GENERAL", "Late"), "yes");
    EXPECT_EQ(Value("DISPLAY", "Key"), "other\r");
    EXPECT_EQ(Value("GENERAL", "Wide"), "default");
    EXPECT_EQ(Value("GENERAL", "no entry"), "default");
    EXPECT_EQ(Value("NONE", "Key"), "default");
}

TEST_F(IniFileTest, ReadsNumbers) {
    folder_.Write(Name, "[D]\na=120\nb=abc\nc= -7px\nd=\ne=99999999999999999999\nf=-99999999999\n");
    const std::pair<const char*, int> cases[] = {
        {"a", 120}, {"b", 0}, {"c", -7}, {"d", 0}, {"e", 2147483647}, {"f", -2147483647 - 1}, {"none", 50}};
    for (const auto& [key, number] : cases)
        EXPECT_EQ(Settings().ReadInt("D", key, 50), number) << key;
    EXPECT_EQ(Settings().WriteInt("D", "b", -12), 0);
    EXPECT_EQ(Settings().ReadInt("D", "b", 0), -12);
}

TEST_F(IniFileTest, CutsAtTheBufferAndLongLinesIntoSeveral) {
    folder_.Write(Name, "[G]\nPassword=12345678901234\xC3\xA4z\n");
    char small[16];
    Settings().ReadString("G", "Password", "", small);
    EXPECT_STREQ(small, "12345678901234");
    Settings().ReadString("G", "none", "a default that is too long", small);
    EXPECT_STREQ(small, "a default that ");
    const std::string longest = "[G]\nK=" + std::string(125, 'v') + "Other=tail\n";
    folder_.Write(Name, longest);
    EXPECT_EQ(Value("G", "K"), std::string(125, 'v'));
    EXPECT_EQ(Value("G", "Other"), "tail");
    EXPECT_EQ(After(longest, "x"), "[G]\nK=x\nOther=tail\n");
}

TEST_F(IniFileTest, WritesInPlace) {
    const std::pair<std::string, std::string> cases[] = {
        // the first occurrence of the key in its section, everything else untouched
        {"; top\n[G]\n;K=c\n\nK = 1\nK=1  \nK=2\n[D]\nK=3\n",
         "; top\n[G]\n;K=c\n\nK = 1\nK=v\nK=2\n[D]\nK=3\n"},
        // a new key goes before the next header, behind the blanks and comments that end its section, or to
        // the
        // end of the file, which may lack its line feed
        {"[G]\nA=1\n\n; end\n[D]\n", "[G]\nA=1\n\n; end\nK=v\n[D]\n"},
        {"[G]\nA=1\n", "[G]\nA=1\nK=v\n"},
        {"[G]\nA=1", "[G]\nA=1\nK=v\n"},
        {"[G]\nK=1", "[G]\nK=v\n"},
        // a new section goes to the end; of one that comes twice the first occurrence takes the key
        {"[D]\nA=1", "[D]\nA=1\n[G]\nK=v\n"},
        {"[G]\n[D]\n[G]\nK=1\n", "[G]\nK=v\n[D]\n[G]\nK=1\n"},
        {"[G]\n[G]x\nK=1\n", "[G]\n[G]x\nK=v\n"},
        {std::string("[G]\nA=\0x\r\n", 10), std::string("[G]\nA=\0x\r\nK=v\n", 14)}};
    for (const auto& [before, after] : cases)
        EXPECT_EQ(After(before, "v"), after);
    EXPECT_EQ(After("", ""), "[G]\nK=\n");
}

TEST_F(IniFileTest, RefusesWhatCouldNotBeReadBack) {
    folder_.Write(Name, "[G]\nK=1\n");
    const std::string longest(124, 'v');
    const std::string cases[][3] = {{"G", "K", longest + "v"}, {"G", "K", "a\nb"},
                                    {"G", "K", "a\r"},         {"G", "K", "\x1B[2J"},
                                    {"G", "K=", "v"},          {"G", ";K", "v"},
                                    {"G", "[K", "v"},          {"G", "", "v"},
                                    {"G\n", "K", "v"},         {std::string(62, 's'), "K", "v"}};
    for (const auto& [section, key, value] : cases)
        EXPECT_TRUE(Refuses(section, key, value)) << section << key << value;
    EXPECT_EQ(Settings().WriteString("G", "K", longest.c_str()), 0);
    EXPECT_EQ(Value("G", "K"), longest);
}

TEST_F(IniFileTest, AMissingFileGivesDefaultsAndIsNotCreated) {
    EXPECT_EQ(Value("G", "K"), "default");
    EXPECT_EQ(Settings().WriteString("G", "K", "v"), 1);
    EXPECT_FALSE(folder_.Has(Name));
    folder_.Write(Name, "[G]\nK=1\n");
    const INI_FILEx tooLong((folder_.Path() + std::string(128, '/') + Name).c_str());
    EXPECT_EQ(tooLong.ReadInt("G", "K", 7), 7);
    EXPECT_EQ(tooLong.WriteString("G", "K", "v"), 1);
    folder_.Write(Name, "[G]\nK=1\n" + std::string(4 << 20, ';')); // no settings file is as long
    EXPECT_EQ(Value("G", "K"), "default");
    std::filesystem::remove(folder_.File(Name));
    ASSERT_EQ(mkfifo(folder_.File(Name).c_str(), 0600), 0);
    EXPECT_EQ(Value("G", "K"), "default"); // and does not wait for a writer
}

TEST_F(IniFileTest, AFailedWriteKeepsTheOldSettings) {
    folder_.Write(Name, "[G]\nK=1\n" + std::string(5000, ';'));
    const auto refusesInLittleRoom = [&] {
        const rlimit room{4096, 4096};
        std::signal(SIGXFSZ, SIG_IGN);
        return setrlimit(RLIMIT_FSIZE, &room) == 0 && Refuses("G", "K", "v") ? 1 : 0;
    };
    EXPECT_EQ(ResultInChild(refusesInLittleRoom), 1);
    EXPECT_FALSE(folder_.Has("ini_file.tmp"));
    // The temporary cannot be created.
    std::filesystem::create_directory(folder_.File("ini_file.tmp"));
    EXPECT_TRUE(Refuses("G", "K", "v"));
    std::filesystem::remove(folder_.File("ini_file.tmp"));
    // What a killed program left is no obstacle, and is not written through when it is a link.
    folder_.Write("mine", "mine");
    std::filesystem::create_symlink("mine", folder_.File("ini_file.tmp"));
    EXPECT_EQ(Settings().WriteString("G", "K", "v"), 0);
    EXPECT_EQ(Value("G", "K"), "v");
    EXPECT_EQ(folder_.Read("mine"), "mine");
}

TEST_F(IniFileTest, KeepsPermissionsAndLinksAndLeaksNothing) {
    std::filesystem::create_directory(folder_.File("elsewhere"));
    folder_.Write("elsewhere/real.ini", "[G]\nK=1\n");
    std::filesystem::create_symlink("elsewhere/real.ini", folder_.File(Name));
    std::filesystem::permissions(folder_.File(Name), std::filesystem::perms{0640});
    const auto openFiles = [] {
        return std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {});
    };
    const auto before = openFiles();
    EXPECT_EQ(Settings().WriteString("G", "K", "v"), 0);
    EXPECT_EQ(Value("G", "K"), "v");
    EXPECT_EQ(openFiles(), before);
    EXPECT_EQ(folder_.Read("elsewhere/real.ini"), "[G]\nK=v\n");
    EXPECT_TRUE(std::filesystem::is_symlink(folder_.File(Name)));
    EXPECT_EQ(std::filesystem::status(folder_.File(Name)).permissions(), std::filesystem::perms{0640});
}

} // namespace
