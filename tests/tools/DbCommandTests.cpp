#include <gtest/gtest.h>

#include <array>
#include <cstdlib>
#include <fcntl.h>
#include <sstream>
#include <string>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "TemporaryFolder.h"
#include "db/Database.h"
#include "tools/DataFileTool.h"
#include "tools/DisplayText.h"
#include "tools/RecordFields.h"
#include "util/FolderLock.h"

namespace {

TEST(DisplayText, StaysOnItsLineAndCanBeTurnedBack) {
    const struct {
        std::string bytes;
        const char* shown;
        std::size_t width;
    } cases[] = {
        {"plain", "plain", 5},
        {"a\tb\nc\rd\\e", "a\\tb\\nc\\rd\\\\e", 13},
        {"\x1B[31m\x7F", "\\x1B[31m\\x7F", 12},
        {"\xC3\xA4 \xE2\x82\xAC", "\xC3\xA4 \xE2\x82\xAC", 3},
        {"\xE6\x97\xA5", "\xE6\x97\xA5", 2},                  // wide
        {"e\xCC\x81", "e\xCC\x81", 1},                        // combining
        {"\xC2\x9B", "\\xC2\\x9B", 8},                        // a control character
        {"\xE2\x80\xAE", "\\xE2\\x80\\xAE", 12},              // turns the direction
        {"\xFF \xC3 \xC0\x80", "\\xFF \\xC3 \\xC0\\x80", 18}, // no UTF-8, and an overlong form
        {"\xED\xA0\x80\xF4\x90\x80\x80", "\\xED\\xA0\\x80\\xF4\\x90\\x80\\x80", 28}, // beyond Unicode
    };
    for (const auto& c : cases) {
        std::string shown;
        AppendEscaped(shown, c.bytes);
        EXPECT_EQ(shown, c.shown);
        EXPECT_EQ(DisplayWidth(shown), c.width) << c.shown;
    }
}

TEST(RecordFields, TakeWhatTheirColumnHolds) {
    const struct {
        const char* column;
        const char* value;
        const char* result; // the stored value as shown; null when it is refused
    } cases[] = {
        {"A:string:4", "abc", "abc"},
        {"A:string:4", "abcd", nullptr},
        {"A:byte", "-128", "-128"},
        {"A:byte", "128", nullptr},
        {"A:byte", "", nullptr},
        {"A:short", "+7", "7"},
        {"A:short", "+-7", nullptr},
        {"A:short", "32768", nullptr},
        {"A:long", "-2147483648", "-2147483648"},
        {"A:long", "12x", nullptr},
        {"A:long", " 12", nullptr},
        {"A:float", "0.1", "0.1"},
        {"A:float:4", "-1.5e3", "-1500"},
        {"A:float", "16777217", "16777216"},
        {"A:float", "inf", nullptr},
        {"A:float", "1e39", nullptr},
        {"A:date", "20240229", "20240229"},
        {"A:date", "", "00000000"},
        {"A:date", "00000000", "00000000"},
        {"A:date", "20230229", nullptr},
        {"A:date", "2024-2-9", nullptr},
        {"A:time", "235959", "235959"},
        {"A:time", "240000", nullptr},
        {"A:time", "1234", nullptr},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(std::string(c.column) + " = " + c.value);
        COLUMN_ENTRY column{};
        ASSERT_EQ(ParseColumn(c.column, &column), "");
        column.size = column.size < 0 ? std::int16_t{8} : column.size;
        column.offset = 1;
        std::array<std::uint8_t, 16> data{};
        EXPECT_EQ(StoreField(column, c.value, data.data()).empty(), c.result != nullptr);
        CELL cell;
        FillCell(column, data.data(), &cell);
        if (c.result == nullptr)
            continue;
        if (cell.kind == CELL::Kind::Float) {
            EXPECT_EQ(cell.value, std::strtof(c.result, nullptr));
        } else {
            EXPECT_EQ(cell.kind == CELL::Kind::Text ? cell.text : std::to_string(cell.number), c.result);
        }
        EXPECT_EQ(data[0], 0);
    }
    COLUMN_ENTRY narrow{"A", ColumnType::Long, 2, 0, 0};
    std::array<std::uint8_t, 16> data{};
    EXPECT_EQ(StoreField(narrow, "65535", data.data()), "");
    EXPECT_NE(StoreField(narrow, "65536", data.data()), "") << "it would come back as 0";
    EXPECT_EQ(data[2], 0);
}

TEST(RecordFields, ColumnsAreDescribedInOneWord) {
    COLUMN_ENTRY column{};
    ASSERT_EQ(ParseColumn("Price:float:4:3", &column), "");
    EXPECT_STREQ(column.name, "Price");
    EXPECT_EQ(column.type, ColumnType::Float);
    EXPECT_EQ(column.size, 4);
    EXPECT_EQ(column.format, 3);
    ASSERT_EQ(ParseColumn("Price:float::15", &column), "");
    EXPECT_EQ(column.size, -1);
    for (const char* wrong : {"Price", "Price:", ":long", "a b:long", "A:text:4", "A:string", "A:string:0",
                              "A:string:x", "A:long:3", "A:long:32768", "A:long::2", "A:float::0",
                              "A:float::16", "A:float:8:2:1", "a-name-of-thirty-two-characters-:long"})
        EXPECT_NE(ParseColumn(wrong, &column), "") << wrong;
}

// One data file with a record of every kind, and the tool at work on it.
class DataFileToolTest : public testing::Test {
  protected:
    void SetUp() override {
        ASSERT_EQ(Run(&DataFileTool::Create, "sample",
                      std::vector<std::string>{"Name:string:16", "Price:float::3", "Day:date", "At:time",
                                               "Tag:byte"}),
                  0);
        for (const std::vector<std::string>& values :
             {std::vector<std::string>{"Name=Acorn Fund", "Price=12.5", "Day=20240229", "At=091530",
                                       "Tag=-7"},
              {"Name=\xC3\xA4pfel\tb", "Price=0.1"},
              {"Name=bad\xFF", "Price=-1000000"}})
            ASSERT_EQ(Run(&DataFileTool::Append, values), 0) << errors_;
    }

    // Runs one operation; its output and messages are in output_ and errors_.
    template <class... Parameters, class... Arguments>
    int Run(int (DataFileTool::*operation)(Parameters...), Arguments... arguments) {
        const int file = open(folder_.File("out").c_str(), O_CREAT | O_TRUNC | O_WRONLY, 0600);
        TextOutput output(file);
        std::ostringstream errors;
        DataFileTool tool(path_, format_, output, errors);
        const int status = tool.Finish((tool.*operation)(arguments...));
        close(file);
        output_ = folder_.Read("out");
        errors_ = errors.str();
        return status;
    }
    int Query(const SELECTION& selection) { return Run(&DataFileTool::Query, selection); }
    std::string Tsv(const SELECTION& selection) {
        format_ = OutputFormat::Tsv;
        EXPECT_EQ(Query(selection), 0) << errors_;
        return output_.substr(output_.find('\n') + 1);
    }
    bool Refused(const std::string& reason) const { return errors_.find(reason) != std::string::npos; }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("a.db");
    OutputFormat format_ = OutputFormat::Table;
    std::string output_;
    std::string errors_;
};

TEST_F(DataFileToolTest, ShowsRecordsInThreeFormats) {
    ASSERT_EQ(Query({}), 0) << errors_;
    EXPECT_EQ(output_, "record  Name               Price  Day       At      Tag\n"
                       "     0  Acorn Fund        12.500  20240229  091530   -7\n"
                       "     1  \xC3\xA4pfel\\tb           0.100  00000000  000000    0\n"
                       "     2  bad\\xFF     -1000000.000  00000000  000000    0\n");
    format_ = OutputFormat::Tsv;
    ASSERT_EQ(Query({}), 0);
    EXPECT_EQ(output_, "record\tName\tPrice\tDay\tAt\tTag\n"
                       "0\tAcorn Fund\t12.5\t20240229\t091530\t-7\n"
                       "1\t\xC3\xA4pfel\\tb\t0.1\t00000000\t000000\t0\n"
                       "2\tbad\\xFF\t-1000000\t00000000\t000000\t0\n");
    format_ = OutputFormat::Json;
    ASSERT_EQ(Query({}), 0);
    EXPECT_EQ(output_,
              R"({"record":0,"Name":"Acorn Fund","Price":12.5,"Day":"20240229","At":"091530","Tag":-7})"
              "\n{\"record\":1,\"Name\":\"\xC3\xA4pfel\\tb\",\"Price\":0.1,\"Day\":\"00000000\",\"At\":"
              "\"000000\",\"Tag\":0}\n{\"record\":2,\"Name\":\"bad\xEF\xBF\xBD\",\"Price\":-1e+06,\"Day\":"
              "\"00000000\",\"At\":\"000000\",\"Tag\":0}\n");
    path_ = folder_.File("b.db");
    ASSERT_EQ(Run(&DataFileTool::Create, "", std::vector<std::string>{"record:byte"}), 0);
    ASSERT_EQ(Run(&DataFileTool::Append, std::vector<std::string>{"record=1"}), 0);
    ASSERT_EQ(Query({}), 0);
    EXPECT_EQ(output_, "{\"record\":0,\"record_2\":1}\n");
}

TEST_F(DataFileToolTest, SelectsStepByStepAndSorts) {
    const auto numbers = [this](const SELECTION& selection) {
        std::istringstream lines(Tsv(selection));
        std::string found;
        for (std::string line; std::getline(lines, line);)
            found += line.substr(0, line.find('\t')) + " ";
        return found;
    };
    EXPECT_EQ(numbers({"Price > 0", {}, "", false}), "0 1 ");
    EXPECT_EQ(numbers({"Price > 0", {}, "Price", false}), "1 0 ");
    EXPECT_EQ(
        numbers(
            {"Name contains FUND", {{QueryMode::Or, "Price < 1"}, {QueryMode::And, "Tag = 0"}}, "", false}),
        "1 2 ");
    EXPECT_EQ(
        numbers(
            {"Name contains FUND", {{QueryMode::And, "Tag = 0"}, {QueryMode::Or, "Price < 1"}}, "", false}),
        "1 2 ");
    EXPECT_EQ(numbers({"Tag = 0", {{QueryMode::Or, "Tag = -7"}, {QueryMode::And, "Tag = -7"}}, "", false}),
              "0 ");
    EXPECT_EQ(numbers({"Name contains FUND", {}, "", true}), "");
    EXPECT_EQ(Query({"Nome = x", {}, "", false}), 1);
    EXPECT_TRUE(Refused("1602 Query error - invalid column name")) << errors_;
    EXPECT_EQ(Query({"", {}, "Nome", false}), 1);
    EXPECT_TRUE(Refused("1701 ")) << errors_;
    EXPECT_EQ(output_, "");
}

TEST_F(DataFileToolTest, ChangesRecords) {
    ASSERT_EQ(Run(&DataFileTool::Set, "Price * 2", SELECTION{"Price > 0", {}, "", false}), 0) << errors_;
    EXPECT_EQ(output_, "2 records changed\n");
    ASSERT_EQ(Run(&DataFileTool::Set, "Day = 19990105", SELECTION{}), 0);
    ASSERT_EQ(Run(&DataFileTool::Set, "At = 235959", SELECTION{"Tag = -7", {}, "", false}), 0);
    // Beyond eight digits, a date is a packed number.
    ASSERT_EQ(Run(&DataFileTool::Set, "Day = 131006726", SELECTION{"Tag = -7", {}, "", false}), 0);
    EXPECT_EQ(Run(&DataFileTool::Set, "Name + x", SELECTION{}), 1);
    EXPECT_TRUE(Refused("2203 ")) << errors_;
    EXPECT_EQ(Run(&DataFileTool::Delete, std::vector<long>{2, 2, 9}, nullptr), 1);
    EXPECT_EQ(output_, "1 record deleted\n");
    EXPECT_TRUE(Refused("record 2: 1403 ") && Refused("record 9: 1402 ")) << errors_;
    EXPECT_EQ(Tsv({}), "0\tAcorn Fund\t25\t19990106\t235959\t-7\n"
                       "1\t\xC3\xA4pfel\\tb\t0.2\t19990105\t000000\t0\n");
    const SELECTION first{"Tag = -7", {}, "", false};
    EXPECT_EQ(Run(&DataFileTool::Lock, std::vector<long>{}, &first), 0);
    EXPECT_EQ(output_, "locked\n1\n");
    EXPECT_EQ(Run(&DataFileTool::UnLock, std::vector<long>{0, 1}, nullptr), 1);
    EXPECT_TRUE(Refused("record 1: 2403 ")) << errors_;
    EXPECT_EQ(Run(&DataFileTool::UnDelete, std::vector<long>{2}), 0);
    EXPECT_EQ(Run(&DataFileTool::Delete, std::vector<long>{0}, nullptr), 0);
    format_ = OutputFormat::Json;
    EXPECT_EQ(Run(&DataFileTool::Compact), 0);
    EXPECT_EQ(output_, "{\"removed\":1}\n");
    EXPECT_EQ(Run(&DataFileTool::Info), 0);
    EXPECT_NE(output_.find(R"("records":2,"deleted":0,"active":2,"columns":5,)"), output_.npos) << output_;
}

TEST_F(DataFileToolTest, RefusesRecordsThatDoNotFit) {
    const std::string before = folder_.Read("a.db");
    const std::pair<std::vector<std::string>, const char*> cases[] = {
        {{"Name=sixteen letters!"}, "Name: 'sixteen letters!' is too long: 16 bytes"},
        {{"Price=12,5"}, "Price: '12,5' is no number"},
        {{"Tag=1", "Tag=2"}, "Tag is given twice"},
        {{"Tog=1"}, "'Tog=1' begins with no column's name"},
        {{"=1"}, "'=1' begins with no column's name"},
    };
    for (const auto& [values, reason] : cases) {
        EXPECT_EQ(Run(&DataFileTool::Append, values), 1);
        EXPECT_TRUE(Refused(reason)) << errors_;
    }
    EXPECT_EQ(folder_.Read("a.db"), before);
}

TEST_F(DataFileToolTest, TextGoesOutAndComesBack) {
    const std::string text = folder_.File("a.txt");
    const SELECTION cheap{"Price < 100", {}, "Price", false};
    ASSERT_EQ(Run(&DataFileTool::Set, "Tag = 65", SELECTION{}), 0);
    ASSERT_EQ(Run(&DataFileTool::Set, "Name = plain", SELECTION{}), 0);
    ASSERT_EQ(Run(&DataFileTool::Export, text, ";", true, &cheap), 0) << errors_;
    EXPECT_EQ(folder_.Read("a.txt"), "plain;-1000000.000;00000000;000000;A;\n"
                                     "plain;0.100;00000000;000000;A;\nplain;12.500;20240229;091530;A;\n");
    ASSERT_EQ(Run(&DataFileTool::Load, text, ";"), 0) << errors_;
    EXPECT_EQ(output_, "3 records loaded from " + text + "\n");
    EXPECT_EQ(Tsv({"Price = 12.5", {}, "", false}), "0\tplain\t12.5\t20240229\t091530\t65\n"
                                                    "5\tplain\t12.5\t20240229\t091530\t65\n");
    ASSERT_EQ(Run(&DataFileTool::Export, text, "\t", false, nullptr), 0);
    EXPECT_EQ(output_, "exported\n6\n");
    EXPECT_EQ(folder_.Read("a.txt").substr(0, 42), "plain\t12.500\t20240229\t091530\t65\t\nplain\t0.1");
    EXPECT_EQ(Run(&DataFileTool::Load, text, ";"), 1);
    EXPECT_TRUE(Refused("1802 ")) << errors_;
    EXPECT_EQ(Run(&DataFileTool::Export, folder_.File("no/where"), ";", false, nullptr), 1);
    EXPECT_TRUE(Refused("1901 ") && Refused("(No such file or directory)")) << errors_;
}

TEST_F(DataFileToolTest, DamageIsToldAndMended) {
    const std::string whole = folder_.Read("a.db");
    std::string bytes = whole;
    folder_.Write("a.db", bytes.replace(36, 1, "\x09"));
    EXPECT_EQ(Query({}), 0);
    EXPECT_TRUE(Refused("the file is damaged")) << errors_;
    EXPECT_NE(output_.find("Acorn"), output_.npos);
    EXPECT_EQ(Run(&DataFileTool::Append, std::vector<std::string>{}), 1);
    EXPECT_EQ(Run(&DataFileTool::Set, "Tag = 1", SELECTION{}), 1);
    EXPECT_EQ(Run(&DataFileTool::Delete, std::vector<long>{0}, nullptr), 1);
    EXPECT_EQ(Run(&DataFileTool::Compact), 1);
    EXPECT_TRUE(Refused("nothing is changed before `check --repair`")) << errors_;
    EXPECT_EQ(folder_.Read("a.db"), bytes);
    EXPECT_EQ(Run(&DataFileTool::Check, false), 1);
    EXPECT_EQ(output_, "kind     offset  record  finding\n"
                       "problem      36          the header counts 9 records, the file has room for 3\n");
    EXPECT_EQ(Run(&DataFileTool::Check, true), 0) << errors_;
    EXPECT_TRUE(Refused("the file as it was is " + path_ + ".before-repair")) << errors_;
    EXPECT_EQ(folder_.Read("a.db"), whole);
    EXPECT_EQ(Run(&DataFileTool::Check, false), 0);
    EXPECT_EQ(output_, "nothing is wrong\n");
    folder_.Write("a.db", bytes.replace(52 + 32, 1, "\x63"));
    format_ = OutputFormat::Json;
    EXPECT_EQ(Run(&DataFileTool::Check, true), 1) << "a count is mended, and something else is left";
    EXPECT_TRUE(Refused("the counts are mended") && Refused("is left as it is")) << errors_;
    EXPECT_NE(output_.find(R"({"kind":"problem","offset":84,"record":null,)"), output_.npos) << output_;
    std::filesystem::rename(path_, folder_.File("a.bak"));
    EXPECT_EQ(Run(&DataFileTool::Info), 1);
    EXPECT_TRUE(Refused("1103 ") && Refused("a.bak, as an interrupted compaction leaves it")) << errors_;
    EXPECT_EQ(Run(&DataFileTool::Check, true), 1);
    EXPECT_TRUE(folder_.Has("a.db")) << errors_;
    folder_.Write("a.db", whole.substr(0, 70));
    EXPECT_EQ(Run(&DataFileTool::Info), 1);
    EXPECT_TRUE(Refused("1103 Open error - file could not be opened: header and 5 columns need 272 bytes"))
        << errors_;
}

TEST_F(DataFileToolTest, ChangesOnlyWhatItHasToItselfAndHasKept) {
    const std::string before = folder_.Read("a.db");
    FolderLock lock;
    ASSERT_EQ(lock.Take(folder_.Path(), "quorvan"), FolderLock::Outcome::Taken);
    EXPECT_EQ(Run(&DataFileTool::Append, std::vector<std::string>{}), 1);
    EXPECT_TRUE(Refused("in use by quorvan (process " + std::to_string(getpid()))) << errors_;
    EXPECT_EQ(Run(&DataFileTool::Compact), 1);
    EXPECT_EQ(Run(&DataFileTool::Check, true), 1);
    EXPECT_EQ(Run(&DataFileTool::Check, false), 0);
    EXPECT_EQ(Query({}), 0);
    lock.Release();
    std::filesystem::remove_all(folder_.File("backups"));
    folder_.Write("backups", "in the way");
    EXPECT_EQ(Run(&DataFileTool::Append, std::vector<std::string>{}), 1);
    EXPECT_TRUE(Refused("the day's backup cannot be made")) << errors_;
    EXPECT_EQ(folder_.Read("a.db"), before);
    std::filesystem::remove(folder_.File("backups"));
    EXPECT_EQ(Run(&DataFileTool::Delete, std::vector<long>{0}, nullptr), 0) << errors_;
    EXPECT_EQ(Run(&DataFileTool::Compact), 0) << errors_;
    int kept = 0;
    for (const auto& entry : std::filesystem::directory_iterator(folder_.File("backups"))) {
        EXPECT_EQ(folder_.Read("backups/" + entry.path().filename().string()), before);
        ++kept;
    }
    EXPECT_EQ(kept, 1);
    EXPECT_FALSE(folder_.Has("Quorvan.lock"));
}

TEST_F(DataFileToolTest, FileThatMayOnlyBeReadIsShown) {
    const std::string before = folder_.Read("a.db");
    ASSERT_EQ(chmod(path_.c_str(), 0444) + chmod(folder_.File("out").c_str(), 0666), 0);
    ASSERT_EQ(chmod(folder_.Path().c_str(), 0777), 0);
    if (geteuid() == 0) { // who may write everything
        ASSERT_EQ(seteuid(65534), 0);
    }
    EXPECT_EQ(Query({"Price > 0", {}, "Name", false}), 0) << errors_;
    EXPECT_NE(output_.find("Acorn"), output_.npos);
    EXPECT_EQ(Run(&DataFileTool::Check, false), 0) << errors_;
    EXPECT_EQ(Run(&DataFileTool::Append, std::vector<std::string>{}), 1);
    EXPECT_TRUE(Refused("the file may only be read, not changed")) << errors_;
    EXPECT_EQ(Run(&DataFileTool::Compact), 1);
    EXPECT_TRUE(Refused("the file may only be read, not changed")) << errors_;
    EXPECT_EQ(seteuid(getuid()), 0);
    EXPECT_EQ(folder_.Read("a.db"), before);
}

TEST_F(DataFileToolTest, OutputThatNobodyTakes) {
    const auto query = [this](int file) {
        TextOutput output(file);
        std::ostringstream errors;
        DataFileTool tool(path_, format_, output, errors);
        const int status = tool.Finish(tool.Query({}));
        errors_ = errors.str();
        close(file);
        return status;
    };
    EXPECT_EQ(query(open("/dev/full", O_WRONLY)), 1);
    EXPECT_EQ(errors_, "quorvan-cli: the output cannot be written: No space left on device\n");
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    close(ends[0]);
    signal(SIGPIPE, SIG_IGN);
    EXPECT_EQ(query(ends[1]), 0);
    EXPECT_EQ(errors_, "");
}

// The built program with its command line.
class DbCommandTest : public testing::Test {
  protected:
    int Run(const std::string& arguments) {
        const std::string command =
            "cd '" + folder_.Path() + "' && { '" QUORVAN_CLI "' " + arguments + "; } >out 2>err";
        const int status = std::system(command.c_str());
        output_ = folder_.Read("out");
        errors_ = folder_.Read("err");
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

    TemporaryFolder folder_;
    std::string output_;
    std::string errors_;
};

TEST_F(DbCommandTest, EveryCommandTakesItsOptions) {
    const struct {
        const char* arguments;
        int status;
        const char* output;
    } cases[] = {
        {"db a.db create --column Name:string:8 --column N:long --description text", 0,
         "created with 2 columns\n"},
        {"db a.db append Name=one N=1 --format json", 0, "{\"record\":0}\n"},
        {"db --format tsv a.db append N=2 Name=TWO", 0, "record\n1\n"},
        {"db a.db append", 0, "record 2 appended\n"},
        {"db a.db query 'N = 1' --or 'Name contains two' --and 'N > 1' --format tsv", 0,
         "record\tName\tN\n1\tTWO\t2\n"},
        {"db a.db query 'N > 0' --sort Name --and 'Name contains O' --case --format tsv", 0,
         "record\tName\tN\n1\tTWO\t2\n"},
        {"db a.db query --sort N --format json", 0,
         "{\"record\":2,\"Name\":\"\",\"N\":0}\n{\"record\":0,\"Name\":\"one\",\"N\":1}\n{\"record\":1,"
         "\"Name\":\"TWO\",\"N\":2}\n"},
        {"db a.db set 'N - 1' --where 'N > 0' --and 'Name = one'", 0, "1 record changed\n"},
        {"db a.db set 'N = 5' --all", 0, "3 records changed\n"},
        {"db a.db lock 0 1", 0, "2 records locked\n"},
        {"db a.db unlock --where 'Name = one'", 0, "1 record unlocked\n"},
        {"db a.db delete 2", 0, "1 record deleted\n"},
        {"db a.db undelete 2", 0, "1 record undeleted\n"},
        {"db a.db delete --where 'Name = two'", 0, "1 record deleted\n"},
        {"db a.db export a.txt --separator , --where 'N > 0' --sort Name", 0,
         "2 records exported to a.txt\n"},
        {"db a.db load a.txt --separators ,", 0, "2 records loaded from a.txt\n"},
        {"db a.db compact", 0, "compacted: 1 record removed, 4 records left\n"},
        {"db a.db columns --format tsv", 0,
         "name\ttype\twidth\toffset\tdecimals\nName\tstring\t8\t0\t\nN\tlong\t4\t8\t\n"},
        {"db a.db check", 0, "nothing is wrong\n"},
        {"db a.db check --repair", 0, "nothing is wrong\n"},
        {"db a.db query Name=", 1, ""},
        {"db b.db info", 1, ""},
        {"db a.db create --column N:byte", 1, ""},
        {"db a.db query >/dev/full", 1, ""},
        {"db a.db query | true", 0, ""},
        {"--version", 0, "quorvan-cli 1.0\n"},
        {"db", 2, ""},
        {"db a.db", 2, ""},
        {"db a.db query --format xml", 2, ""},
        {"db a.db query a b", 2, ""},
        {"db a.db set 'N = 1'", 2, ""},
        {"db a.db set 'N = 1' --where ''", 2, ""},
        {"db a.db set 'N = 1' --all --where 'N = 2'", 2, ""},
        {"db a.db delete", 2, ""},
        {"db a.db delete x", 2, ""},
        {"db a.db delete 1 --where 'N = 1'", 2, ""},
        {"db a.db undelete --where 'N = 1'", 2, ""},
        {"db a.db append N", 2, ""},
        {"db c.db create", 2, ""},
        {"db c.db create --column N:text", 2, ""},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(Run(c.arguments), c.status) << c.arguments << "\n" << errors_;
        EXPECT_EQ(output_, c.output) << c.arguments;
        EXPECT_EQ(errors_.empty(), c.status == 0) << c.arguments << "\n" << errors_;
    }
}

// What --help offers stands in the manual page as well.
TEST_F(DbCommandTest, ManualNamesEveryCommandAndOption) {
    std::ifstream file(QUORVAN_MANUAL);
    std::string manual{std::istreambuf_iterator<char>(file), {}};
    manual.erase(std::remove(manual.begin(), manual.end(), '\\'), manual.end());
    int found = 0;
    for (const char* arguments : {"--help", "setup --help", "quote --help", "chart --help", "report --help",
                                  "db --help", "db x info --help", "db x query --help", "db x set --help",
                                  "db x append --help", "db x delete --help", "db x check --help",
                                  "db x create --help", "db x export --help", "db x load --help"}) {
        ASSERT_EQ(Run(arguments), 0);
        std::istringstream lines(output_);
        bool commands = false;
        for (std::string line; std::getline(lines, line);) {
            commands = commands || line == "Subcommands:";
            std::istringstream words(line);
            std::string word;
            words >> word;
            word.erase(0, word.rfind(',') + 1);
            if (line.compare(0, 2, "  ") != 0 || line[2] == ' ' ||
                (word.compare(0, 2, "--") != 0 && !commands))
                continue;
            EXPECT_NE(manual.find(word), manual.npos) << arguments << ": " << word;
            ++found;
        }
    }
    EXPECT_GT(found, 40);
}

} // namespace
