#include <gtest/gtest.h>

#include <csignal>
#include <filesystem>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

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
    std::string After(const std::string& content, const char* section, const char* key,
                      const char* value) const {
        folder_.Write(Name, content);
        EXPECT_EQ(Settings().WriteString(section, key, value), 0);
        EXPECT_FALSE(folder_.Has("ini_file.tmp"));
        return folder_.Read(Name);
    }
    INI_FILEx Settings() const { return INI_FILEx(folder_.File(Name).c_str()); }

    TemporaryFolder folder_;
};

TEST_F(IniFileTest, ReadsTheFirstEntryOfTheSection) {
    folder_.Write(Name, "Key=before any section\n"
                        ";[GENERAL]\n"
                        " [GENERAL]\nKey=blank\n"
                        "[general]\nKey=small\n"
                        "[GENERALX]\nKey=longer\n"
                        "[GENERAL] ; main\n"
                        ";Key=comment\n"
                        "\n"
                        "no entry\n"
                        "Key = blanks\n"
                        "Key=  a=b \t  \n"
                        "Key=second\n"
                        "[DISPLAY]\nKey=other\r\nWide=120\n"
                        "[GENERAL]old\n"
                        "Late=yes  ");
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
}

TEST_F(IniFileTest, CutsAtTheBufferAndLongLinesIntoSeveral) {
    folder_.Write(Name, "[G]\nPassword=12345678901234\xC3\xA4z\n");
    char small[16];
    Settings().ReadString("G", "Password", "", small);
    EXPECT_STREQ(small, "12345678901234");
    Settings().ReadString("G", "none", "a default that is too long", small);
    EXPECT_STREQ(small, "a default that ");
    const std::string longest = "[G]\nKey=" + std::string(123, 'v') + "Other=tail\n";
    folder_.Write(Name, longest);
    EXPECT_EQ(Value("G", "Key"), std::string(123, 'v'));
    EXPECT_EQ(Value("G", "Other"), "tail");
    EXPECT_EQ(After(longest, "G", "Key", "x"), "[G]\nKey=x\nOther=tail\n");
}

TEST_F(IniFileTest, WritesInPlace) {
    const struct {
        const char *before, *section, *key, *value, *after;
    } cases[] = {// the first occurrence of the key in its section, everything else untouched
                 {"; top\n[G]\n;K=c\n\nK = 1\nK=1  \nK=2\n[D]\nK=3\n", "G", "K", "new",
                  "; top\n[G]\n;K=c\n\nK = 1\nK=new\nK=2\n[D]\nK=3\n"},
                 // a new key goes before the next header, behind the blanks and comments that end its section
                 {"[G]\nA=1\n\n; end\n[D]\n", "G", "K", "v", "[G]\nA=1\n\n; end\nK=v\n[D]\n"},
                 // or to the end of the file, which may lack its line feed
                 {"[G]\nA=1\n", "G", "K", "v", "[G]\nA=1\nK=v\n"},
                 {"[G]\nA=1", "G", "K", "v", "[G]\nA=1\nK=v\n"},
                 {"[G]\nK=1", "G", "K", "v", "[G]\nK=v\n"},
                 // a new section goes to the end
                 {"[D]\nA=1", "G", "K", "v", "[D]\nA=1\n[G]\nK=v\n"},
                 {"", "G", "K", "", "[G]\nK=\n"},
                 // a section that comes twice: its first occurrence takes the key
                 {"[G]\n[D]\n[G]\nK=1\n", "G", "K", "v", "[G]\nK=v\n[D]\n[G]\nK=1\n"},
                 {"[G]\n[G]x\nK=1\n", "G", "K", "v", "[G]\n[G]x\nK=v\n"}};
    for (const auto& c : cases)
        EXPECT_EQ(After(c.before, c.section, c.key, c.value), c.after);
    EXPECT_EQ(After(std::string("[G]\nA=\0x\r\n", 10), "G", "K", "v"),
              std::string("[G]\nA=\0x\r\nK=v\n", 14));
    EXPECT_EQ(Settings().WriteInt("G", "K", -12), 0);
    EXPECT_EQ(Settings().ReadInt("G", "K", 0), -12);
}

TEST_F(IniFileTest, RefusesWhatCouldNotBeReadBack) {
    const std::string content = "[G]\nK=1\n";
    folder_.Write(Name, content);
    const std::string longest(124, 'v');
    const std::string cases[][3] = {{"G", "K", longest + "v"}, {"G", "K", "a\nb"},
                                    {"G", "K", "a\r"},         {"G", "K", "\x1B[2J"},
                                    {"G", "K=", "v"},          {"G", ";K", "v"},
                                    {"G", "[K", "v"},          {"G", "", "v"},
                                    {"G\n", "K", "v"},         {std::string(62, 's'), "K", "v"}};
    for (const auto& [section, key, value] : cases) {
        EXPECT_EQ(Settings().WriteString(section.c_str(), key.c_str(), value.c_str()), 1) << key << value;
        EXPECT_EQ(folder_.Read(Name), content);
    }
    EXPECT_EQ(Settings().WriteString("G", "K", longest.c_str()), 0);
    EXPECT_EQ(Value("G", "K"), longest);
}

TEST_F(IniFileTest, AMissingFileGivesDefaultsAndIsNotCreated) {
    EXPECT_EQ(Value("G", "K"), "default");
    EXPECT_EQ(Settings().WriteString("G", "K", "v"), 1);
    const INI_FILEx tooLong((folder_.Path() + std::string(128, '/') + Name).c_str());
    folder_.Write(Name, "[G]\nK=1\n");
    EXPECT_EQ(tooLong.ReadInt("G", "K", 7), 7);
    EXPECT_EQ(tooLong.WriteString("G", "K", "v"), 1);
    EXPECT_EQ(folder_.Read(Name), "[G]\nK=1\n");
    std::filesystem::remove(folder_.File(Name));
    ASSERT_EQ(mkfifo(folder_.File(Name).c_str(), 0600), 0);
    EXPECT_EQ(Value("G", "K"), "default"); // and does not wait for a writer
}

TEST_F(IniFileTest, AFailedWriteKeepsTheOldSettings) {
    const std::string content = "[G]\nK=1\n" + std::string(5000, ';');
    folder_.Write(Name, content);
    std::signal(SIGXFSZ, SIG_IGN);
    rlimit usual{};
    getrlimit(RLIMIT_FSIZE, &usual);
    const rlimit small{4096, usual.rlim_max};
    ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &small), 0);
    EXPECT_EQ(Settings().WriteString("G", "K", "v"), 1);
    ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &usual), 0);
    EXPECT_EQ(folder_.Read(Name), content);
    EXPECT_FALSE(folder_.Has("ini_file.tmp"));
    // The temporary cannot be created.
    std::filesystem::create_directory(folder_.File("ini_file.tmp"));
    EXPECT_EQ(Settings().WriteString("G", "K", "v"), 1);
    EXPECT_EQ(folder_.Read(Name), content);
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
    ASSERT_EQ(chmod(folder_.File(Name).c_str(), 0640), 0);
    const int before = dup(0);
    close(before);
    ASSERT_EQ(Settings().WriteString("G", "K", "v"), 0);
    EXPECT_EQ(Value("G", "K"), "v");
    const int after = dup(0);
    close(after);
    EXPECT_EQ(after, before);
    EXPECT_EQ(folder_.Read("elsewhere/real.ini"), "[G]\nK=v\n");
    EXPECT_TRUE(std::filesystem::is_symlink(folder_.File(Name)));
    EXPECT_EQ(std::filesystem::status(folder_.File(Name)).permissions(), std::filesystem::perms{0640});
}

} // namespace
