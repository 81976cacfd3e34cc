#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <map>
#include <set>
#include <sstream>
#include <unistd.h>

#include "Shell.h"
#include "app/RecordLayouts.h"
#include "db/Database.h"
#include "util/CharacterBuffer.h"
#include "util/FolderLock.h"
#include "util/IniFile.h"

namespace {

namespace fs = std::filesystem;

class SetupTest : public testing::Test {
  protected:
    SetupTest() { folder_.Write("built", "a program"); }

    // Runs quorvan-cli with the words of `arguments`; `before` is shell text in front of it.
    int Run(const std::string& arguments, const std::string& before = "") {
        return folder_.Run(before + "'" QUORVAN_CLI "' " + arguments);
    }
    int Setup(const std::string& more = "") { return Run("setup home --program built " + more); }

    // Every file of the new folder with its content and the time of its last change.
    std::map<std::string, std::pair<std::string, fs::file_time_type>> Files() const {
        std::map<std::string, std::pair<std::string, fs::file_time_type>> files;
        for (const auto& entry : fs::recursive_directory_iterator(folder_.File("home"))) {
            const std::string name = fs::relative(entry.path(), folder_.Path()).string();
            if (entry.is_regular_file())
                files[name] = {folder_.Read(name), entry.last_write_time()};
        }
        return files;
    }

    static std::set<std::string> PicturesOf(const std::string& help) {
        const std::string before = "<img src=\"pictures/";
        std::set<std::string> names;
        for (std::size_t at = 0; (at = help.find(before, at)) != std::string::npos;) {
            at += before.size();
            names.insert(help.substr(at, help.find('"', at) - at));
        }
        return names;
    }
    std::set<std::string> FileNames(const std::string& folder) const {
        std::set<std::string> names;
        for (const auto& entry : fs::directory_iterator(folder_.File(folder)))
            names.insert(entry.path().filename().string());
        return names;
    }

    template <class Record>
    std::vector<Record> Records(const char* name, int length) const {
        DATABASE database(folder_.File(std::string("home/") + name).c_str());
        EXPECT_TRUE(database.IsOpen() && !database.IsDamaged()) << name;
        DATABASE_HEADER header{};
        database.GetHeaderInfo(&header);
        EXPECT_EQ(header.recordLength, length);
        std::vector<Record> records(static_cast<std::size_t>(header.recordCount));
        for (std::size_t i = 0; i < records.size(); ++i)
            EXPECT_EQ(database.Read(static_cast<long>(i), &records[i]), 1);
        return records;
    }

    Shell folder_;
};

TEST_F(SetupTest, MakesAFolderThatRuns) {
    ASSERT_EQ(Run("setup home --program built", "umask 0; "), 0) << folder_.Errors();
    std::set<std::string> names;
    for (const auto& [name, file] : Files()) {
        names.insert(name.substr(5).starts_with("help/pictures/") ? "help/pictures" : name.substr(5));
        EXPECT_TRUE(folder_.Says("made  " + name.substr(5)));
    }
    EXPECT_EQ(names,
              (std::set<std::string>{"portfol.db", "invest.db", "misc.db", "Quorvan.ini", "Quorvan.cfg",
                                     "quorvan", "quorvan-cli", "help/Quorvan.html", "help/pictures"}));
    EXPECT_EQ(Records<PORTFOLIO_DATA>("portfol.db", 33).size(), 0U);
    EXPECT_EQ(Records<INVESTMENT_DATA>("invest.db", 231).size(), 0U);
    std::map<std::string, int> categories;
    for (const CATEGORY_DATA& entry : Records<CATEGORY_DATA>("misc.db", 65))
        ++categories[entry.Category];
    EXPECT_GE(categories["Type"], 5);
    EXPECT_GE(categories["Agent"], 3);
    EXPECT_EQ(categories.size(), 2U);
    EXPECT_EQ(folder_.Read("home/quorvan"), "a program");
    EXPECT_EQ(PicturesOf(folder_.Read("home/help/Quorvan.html")), FileNames("home/help/pictures"));
    EXPECT_EQ(fs::status(folder_.File("home/quorvan")).permissions() & fs::perms::owner_all,
              fs::perms::owner_all);
    EXPECT_EQ(folder_.Run("find home -perm /077"), 0);
    EXPECT_EQ(folder_.Output(), "") << "for others to look into";
    for (const char* name : {"Quorvan.ini", "Quorvan.cfg", "help/Quorvan.html"}) {
        folder_.Run(std::string("cmp home/") + name + " '" QUORVAN_RESOURCES "/" + name + "'");
        EXPECT_EQ(folder_.Output() + folder_.Errors(), "");
    }
    const INI_FILEx settings(folder_.File("home/Quorvan.ini").c_str());
    char text[64];
    settings.ReadString("GENERAL", "Password", "missing", text);
    EXPECT_STREQ(text, "");
    settings.ReadString("GENERAL", "IsConnectedURL", "", text);
    EXPECT_STREQ(text, "127.0.0.1");
    for (int column = 0; column <= 10; ++column)
        EXPECT_GE(settings.ReadInt("DISPLAY", ("ColumnWidth" + std::to_string(column)).c_str(), 0), 20)
            << column;
    // A short line would end the list of sources, a long one would be taken for two.
    std::istringstream sources(folder_.Read("home/Quorvan.cfg"));
    for (std::string line; std::getline(sources, line);) {
        EXPECT_TRUE(line.starts_with(";")) << line;
        EXPECT_TRUE(line.size() >= 9 && line.size() <= 254) << line;
    }
}

TEST_F(SetupTest, NeverChangesAFileThatExists) {
    ASSERT_EQ(Setup(), 0);
    folder_.Write("home/Quorvan.ini", "mine");
    folder_.Write("home/quorvan", "my program");
    folder_.Write("home/help/Quorvan.html", "an older help");
    fs::remove(folder_.File("home/Quorvan.cfg"));
    fs::create_symlink("nowhere", folder_.File("home/Quorvan.cfg"));
    const auto before = Files();
    EXPECT_EQ(Setup("--sample"), 0) << folder_.Errors();
    EXPECT_EQ(Files(), before);
    EXPECT_FALSE(folder_.Has("home/nowhere"));
    EXPECT_EQ(folder_.Output().find("made"), std::string::npos) << folder_.Output();
    EXPECT_TRUE(folder_.Says("kept  Quorvan.ini\n"));
    EXPECT_TRUE(folder_.Says("kept  quorvan: it differs"));
    EXPECT_TRUE(folder_.Says("no sample"));
    // What is missing is made anew, without a sample while the other data file has its own.
    fs::remove(folder_.File("home/invest.db"));
    EXPECT_EQ(Setup("--sample"), 0);
    EXPECT_TRUE(folder_.Says("made  invest.db: empty\n"));
    fs::permissions(folder_.File("home/quorvan"), fs::perms{0755});
    EXPECT_EQ(Setup("--update-program"), 0);
    EXPECT_EQ(fs::status(folder_.File("home/quorvan")).permissions(), fs::perms{0755});
    EXPECT_EQ(folder_.Read("home/quorvan"), "a program");
    EXPECT_TRUE(folder_.Says("made  help/Quorvan.html: brought up to date\n"));
    EXPECT_TRUE(folder_.Says("kept  help/pictures/main-window.png\n"));
    EXPECT_EQ(folder_.Read("home/Quorvan.ini"), "mine");
}

TEST_F(SetupTest, LeavesWhatACompactionLeftItsPlace) {
    ASSERT_EQ(Setup("--sample"), 0);
    std::string last = "invest.db";
    for (const char* name : {"invest.bak", "invest.new"}) {
        fs::rename(folder_.File("home/" + last), folder_.File(std::string("home/") + name));
        last = name;
        ASSERT_EQ(Setup(), 0);
        EXPECT_TRUE(folder_.Says("kept  " + last + "\n")) << last;
        EXPECT_FALSE(folder_.Has("home/invest.db")) << last;
    }
}

std::string Movement(const INVESTMENT_DATA& record) {
    if (record.QuoteError != 0)
        return "error";
    if (record.PrevPrice <= 0)
        return "unknown";
    return record.Price > record.PrevPrice ? "risen" : record.Price < record.PrevPrice ? "fallen" : "equal";
}

TEST_F(SetupTest, TheSampleIsVaried) {
    ASSERT_EQ(Setup("--sample"), 0) << folder_.Errors();
    std::map<std::string, int> investments;
    std::set<std::string> portfolios, kinds;
    for (const INVESTMENT_DATA& record : Records<INVESTMENT_DATA>("invest.db", 231)) {
        ++investments[record.Portfolio];
        const bool stock = std::strcmp(record.Type, "Stock") == 0;
        const bool fund = std::strstr(record.Type, "Fund") != nullptr;
        const std::string kind = stock ? "stock" : fund ? "fund" : "other";
        kinds.insert({Movement(record), record.Risk, kind + (record.Retire != 0 ? " retirement" : "")});
        if (stock && std::fmod(record.Price, 1) != 0 && std::fmod(record.Price * 32, 1) == 0)
            kinds.insert("fraction");
        EXPECT_NE(record.Name[0], '\0');
        EXPECT_EQ(record.Value, record.Shares * record.Price) << record.Name;
        // No text fills its field, so none was cut.
        EXPECT_LT(FieldText(record.Name).size(), sizeof record.Name - 1);
        EXPECT_LT(FieldText(record.Ticker).size(), sizeof record.Ticker - 1);
    }
    for (const PORTFOLIO_DATA& record : Records<PORTFOLIO_DATA>("portfol.db", 33)) {
        portfolios.insert(record.Name);
        EXPECT_GE(investments[record.Name], 15) << record.Name;
    }
    EXPECT_EQ(portfolios, (std::set<std::string>{"My Retirement Fund", "F\xC3\xBCr sp\xC3\xA4ter"}));
    EXPECT_EQ(investments.size(), 2U);
    EXPECT_EQ(kinds, (std::set<std::string>{"error", "unknown", "risen", "fallen", "equal", "Low", "Med",
                                            "High", "stock", "fund", "other", "stock retirement",
                                            "fund retirement", "other retirement", "fraction"}));
}

TEST_F(SetupTest, FailsWithOneClearSentence) {
    const std::string program = " --program built";
    const struct {
        std::string arguments;
        int status;
        const char* sentence;
    } cases[] = {{"setup built/home" + program, 1, "cannot be made: Not a directory"},
                 {"setup built" + program, 1, "cannot be made: Not a directory"},
                 {"setup ''" + program, 1, "the name is empty"},
                 {"setup " + std::string(109, 'd') + program, 1, "path is too long"},
                 {"setup home --program nothing", 1, "nothing cannot be read: No such file"},
                 {"", 2, "subcommand"},
                 {"setup", 2, "FOLDER"},
                 {"setup home --simple", 2, "--simple"}};
    for (const auto& c : cases)
        EXPECT_TRUE(folder_.Fails("'" QUORVAN_CLI "' " + c.arguments, c.status, c.sentence));
    EXPECT_FALSE(folder_.Has(std::string(109, 'd')));
    EXPECT_EQ(Run("setup --help"), 0);
    EXPECT_TRUE(folder_.Says("--sample"));
}

TEST_F(SetupTest, LeavesAFolderInUseAlone) {
    fs::create_directory(folder_.File("home"));
    FolderLock lock;
    ASSERT_EQ(lock.Take(folder_.File("home"), "quorvan"), FolderLock::Outcome::Taken);
    EXPECT_EQ(Setup("--sample"), 1);
    EXPECT_TRUE(folder_.Complains("is in use by quorvan (process " + std::to_string(getpid()) + " on "));
    EXPECT_EQ(Files().size(), 1U); // the lock
    lock.Release();
    EXPECT_EQ(Setup(), 0) << folder_.Errors();
    EXPECT_FALSE(folder_.Has("home/Quorvan.lock"));
    folder_.Write("home/Quorvan.lock", "program: quorvan\nprocess: 17\nhost: elsewhere\n");
    EXPECT_EQ(Setup(), 1);
    EXPECT_TRUE(folder_.Complains("delete " + folder_.File("home/Quorvan.lock")));
}

TEST_F(SetupTest, AFullDiskLeavesNoPartOfAFile) {
    // Room for the settings, for neither the help nor the sample.
    EXPECT_EQ(Run("setup home --sample --program built", "ulimit -f 8; "), 1);
    EXPECT_TRUE(folder_.Complains("invest.db cannot be made"));
    EXPECT_TRUE(folder_.Complains("help/Quorvan.html cannot be made: File too large"));
    EXPECT_EQ(folder_.Run("cd home && ls && rmdir help/pictures help"), 0);
    EXPECT_EQ(folder_.Output(), "Quorvan.cfg\nQuorvan.ini\nhelp\nmisc.db\nquorvan\n");
    EXPECT_EQ(Setup("--sample"), 0) << folder_.Errors();
    EXPECT_TRUE(folder_.Says("made  invest.db: sample investments\n"));
    EXPECT_TRUE(folder_.Says("kept  Quorvan.ini\n"));
}

} // namespace
