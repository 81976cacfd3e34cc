// The folder's program among the desktop's programs.
#include <gtest/gtest.h>

#include <set>

#include "Session.h"
#include "Shell.h"

namespace {

namespace fs = std::filesystem;

constexpr const char* Entry = "data/applications/org.quorvan.quorvan.desktop";
constexpr const char* Icon = "data/icons/hicolor/scalable/apps/org.quorvan.quorvan.svg";
constexpr const char* Metainfo = "data/metainfo/org.quorvan.quorvan.metainfo.xml";
const std::set<std::string> AllThree{Entry, Icon, Metainfo};

class DesktopTest : public testing::Test {
  protected:
    DesktopTest() {
        folder_.Write("built", "#!/bin/sh\necho \"$#\" >\"$(dirname \"$0\")/started\"\n");
        setenv("XDG_DATA_HOME", folder_.File("data").c_str(), 1);
    }

    // The folder's name must hold no single quote.
    int Setup(const std::string& folder, const std::string& option) {
        return folder_.Run("'" QUORVAN_CLI "' setup '" + folder + "' --program built " + option);
    }
    std::set<std::string> Files(const std::string& below = "data") const {
        std::set<std::string> files;
        std::error_code none;
        for (const auto& entry : fs::recursive_directory_iterator(folder_.File(below), none))
            if (!entry.is_directory())
                files.insert(fs::relative(entry.path(), folder_.Path()).string());
        return files;
    }
    Shell folder_;
};

TEST_F(DesktopTest, StartsTheProgramOfAnyFolder) {
    for (const char* name : {"home", "My Folder", "a\"b`c`d$HOME$$e", "\\back\\\\slash\\", "100% %f %%",
                             "a=b %", "F\xC3\xBCr sp\xC3\xA4ter; (x) & ~ # * ? < > | [y]"}) {
        ASSERT_EQ(Setup(name, "--desktop"), 0) << folder_.Errors();
        EXPECT_EQ(Files(), AllThree);
        EXPECT_EQ(folder_.Run("desktop-file-validate " + std::string(Entry)), 0) << folder_.Output();
        ASSERT_EQ(folder_.Run("gio launch " + std::string(Entry)), 0) << name << folder_.Errors();
        const std::string started = std::string(name) + "/started";
        EXPECT_TRUE(WaitUntil([&] { return !folder_.Read(started).empty(); })) << folder_.Read(Entry);
        EXPECT_EQ(folder_.Read(started), "0\n") << name; // no argument
    }
    EXPECT_EQ(folder_.Run("appstreamcli validate --no-net " + std::string(Metainfo)), 0) << folder_.Output();
}

TEST_F(DesktopTest, TheLastFolderIsStartedAndTakenOut) {
    ASSERT_EQ(Setup("one", "--desktop"), 0) << folder_.Errors();
    ASSERT_EQ(Setup("one", "--desktop"), 0) << folder_.Errors();
    EXPECT_TRUE(folder_.Says("kept  " + folder_.File(Entry)));
    ASSERT_EQ(Setup("two", "--desktop"), 0) << folder_.Errors();
    EXPECT_TRUE(folder_.Says("in place of one for " + folder_.File("one/quorvan")));
    EXPECT_NE(folder_.Read(Entry).find("TryExec=" + folder_.File("two/quorvan") + "\n"), std::string::npos);
    EXPECT_EQ(Setup("one", "--remove-desktop"), 0) << folder_.Errors();
    EXPECT_TRUE(folder_.Says("it starts " + folder_.File("two/quorvan")));
    EXPECT_EQ(Files(), AllThree);
    // Even when the folder has gone already; and it is not made again.
    fs::remove_all(folder_.File("two"));
    EXPECT_EQ(Setup("two", "--remove-desktop"), 0) << folder_.Errors();
    EXPECT_EQ(Files(), std::set<std::string>{});
    EXPECT_FALSE(folder_.Has("two"));
    EXPECT_EQ(Setup("two", "--remove-desktop"), 0) << folder_.Errors();
}

TEST_F(DesktopTest, NeverHarmsForeignFiles) {
    ASSERT_EQ(Setup("home", "--desktop"), 0) << folder_.Errors();
    for (const std::string& name : AllThree) {
        folder_.Write(name, "somebody's own");
        EXPECT_EQ(Setup("home", "--desktop"), 1);
        EXPECT_TRUE(folder_.Complains(name + " is there already and is not Quorvan's"));
        EXPECT_EQ(Setup("home", "--remove-desktop"), 0);
        EXPECT_EQ(Files(), std::set<std::string>{name});
        EXPECT_EQ(folder_.Read(name), "somebody's own");
        // A link to something that is not there is somebody's too.
        fs::remove(folder_.File(name));
        fs::create_symlink("nowhere", folder_.File(name));
        EXPECT_EQ(Setup("home", "--desktop"), 1);
        EXPECT_TRUE(fs::is_symlink(folder_.File(name)));
        fs::remove(folder_.File(name));
    }
}

TEST_F(DesktopTest, SaysWhatCannotBeDone) {
    const struct {
        const char* folder;
        const char* before; // shell text
        const char* sentence;
    } cases[] = {{"two\nlines", "", "its path has a sign that no entry can hold"},
                 {"\xFF", "", "its path has a sign that no entry can hold"},
                 {"home", "XDG_DATA_HOME=relative HOME= ", "There is no home folder"},
                 {"home", "XDG_DATA_HOME=$PWD/built ", "cannot be made: Not a directory"}};
    for (const auto& c : cases) {
        EXPECT_EQ(folder_.Run(c.before + ("'" QUORVAN_CLI "' setup '" + std::string(c.folder)) +
                              "' --program built --desktop"),
                  1);
        EXPECT_TRUE(folder_.Complains(c.sentence));
        EXPECT_EQ(Files(), std::set<std::string>{});
    }
    EXPECT_EQ(Setup("home", "--desktop --remove-desktop"), 2);
    // A folder without a program is not offered.
    EXPECT_EQ(folder_.Run("'" QUORVAN_CLI "' setup other --program nothing --desktop"), 1);
    EXPECT_EQ(Files(), std::set<std::string>{});
    // Without a data folder of its own the person's is the usual one.
    EXPECT_EQ(
        folder_.Run("XDG_DATA_HOME= HOME=$PWD/me '" QUORVAN_CLI "' setup home --program built --desktop"), 0);
    EXPECT_TRUE(folder_.Has("me/.local/share/applications/org.quorvan.quorvan.desktop"));
}

} // namespace
