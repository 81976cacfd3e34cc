#include <gtest/gtest.h>

#include <array>
#include <csignal>
#include <fcntl.h>
#include <functional>
#include <sstream>
#include <sys/stat.h>
#include <unistd.h>

#include "InChild.h"
#include "Shell.h"
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

// The built program at work on data files.
class DbCommandTest : public testing::Test {
  protected:
    struct STEP {
        const char* arguments;
        int status;
        const char* output;
        std::vector<const char*> errors = {}; // what is told; a failure tells of something in any case
    };

    int Run(const std::string& arguments) { return shell_.Run("'" QUORVAN_CLI "' " + arguments); }
    void Go(const std::vector<STEP>& steps) {
        for (const STEP& step : steps) {
            SCOPED_TRACE(step.arguments);
            EXPECT_EQ(Run(step.arguments), step.status) << shell_.Errors();
            EXPECT_EQ(shell_.Output(), step.output);
            EXPECT_EQ(shell_.Errors().empty(), step.status == 0 && step.errors.empty()) << shell_.Errors();
            for (const char* error : step.errors)
                EXPECT_TRUE(shell_.Complains(error));
        }
    }
    // A file with a record of every kind.
    void MakeSample() {
        Go({{"db a.db create --column Name:string:16 --column Price:float::3 --column Day:date --column "
             "At:time "
             "--column Tag:byte --description sample",
             0, "created with 5 columns\n"},
            {"db a.db append 'Name=Acorn Fund' Price=12.5 Day=20240229 At=091530 Tag=-7", 0,
             "record 0 appended\n"},
            {"db a.db append 'Name=\xC3\xA4pfel\tb' Price=0.1", 0, "record 1 appended\n"},
            {"db a.db append 'Name=bad\xFF' Price=-1000000", 0, "record 2 appended\n"}});
    }

    Shell shell_;
    std::string path_ = shell_.File("a.db");
};

TEST_F(DbCommandTest, EveryCommandTakesItsOptions) {
    Go({
        {"db a.db create --column Name:string:8 --column N:long --description text", 0,
         "created with 2 columns\n"},
        {"db a.db append Name=one N=1 --format json", 0, "{\"record\":0}\n"},
        {"db --format tsv a.db append N=2 Name=TWO", 0, "record\n1\n"},
        {"db a.db append", 0, "record 2 appended\n"},
        {"db a.db query 'N = 1' --or 'Name contains two' --and 'N > 1' --format tsv", 0,
         "record\tName\tN\n1\tTWO\t2\n"},
        {"db a.db query 'N > 0' --and 'N > 1' --or 'Name = one' --sort N --format tsv", 0,
         "record\tName\tN\n0\tone\t1\n1\tTWO\t2\n"},
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
        {"db a.db load a.txt --separators , --heading",
         1,
         "",
         {"a.txt, line 1: ' ' stands where the column Name "}},
        {"db a.db compact", 0, "compacted: 1 record removed, 4 records left\n"},
        {"db a.db columns --format tsv", 0,
         "name\ttype\twidth\toffset\tdecimals\nName\tstring\t8\t0\t\nN\tlong\t4\t8\t\n"},
        {"db a.db check", 0, "nothing is wrong\n"},
        {"db a.db check --repair", 0, "nothing is wrong\n"},
        {"db a.db query Name=", 1, ""},
        {"db a.db query 'Nome = x'", 1, "", {"1602 Query error - invalid column name"}},
        {"db a.db query --sort Nome", 1, "", {"1701 "}},
        {"db b.db info", 1, ""},
        {"db a.db create --column N:byte", 1, ""},
        {"db a.db query >/dev/full", 1, "", {"the output cannot be written: No space left on device\n"}},
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
        {"db c.db create --column record:byte", 0, "created with 1 column\n"},
        {"db c.db append record=1", 0, "record 0 appended\n"},
        {"db c.db query --format json", 0, "{\"record\":0,\"record_2\":1}\n"},
    });
}

TEST_F(DbCommandTest, ShowsRecordsInThreeFormats) {
    MakeSample();
    Go({{"db a.db query", 0,
         "record  Name               Price  Day       At      Tag\n"
         "     0  Acorn Fund        12.500  20240229  091530   -7\n"
         "     1  \xC3\xA4pfel\\tb           0.100  00000000  000000    0\n"
         "     2  bad\\xFF     -1000000.000  00000000  000000    0\n"},
        {"db a.db query --format tsv", 0,
         "record\tName\tPrice\tDay\tAt\tTag\n"
         "0\tAcorn Fund\t12.5\t20240229\t091530\t-7\n"
         "1\t\xC3\xA4pfel\\tb\t0.1\t00000000\t000000\t0\n"
         "2\tbad\\xFF\t-1000000\t00000000\t000000\t0\n"},
        {"db a.db query --format json", 0,
         R"({"record":0,"Name":"Acorn Fund","Price":12.5,"Day":"20240229","At":"091530","Tag":-7})"
         "\n{\"record\":1,\"Name\":\"\xC3\xA4pfel\\tb\",\"Price\":0.1,\"Day\":\"00000000\",\"At\":"
         "\"000000\",\"Tag\":0}\n{\"record\":2,\"Name\":\"bad\xEF\xBF\xBD\",\"Price\":-1e+06,\"Day\":"
         "\"00000000\",\"At\":\"000000\",\"Tag\":0}\n"}});
}

TEST_F(DbCommandTest, ChangesRecords) {
    MakeSample();
    Go({{"db a.db set 'Price * 2' --where 'Price > 0'", 0, "2 records changed\n"},
        {"db a.db set 'Day = 19990105' --all", 0, "3 records changed\n"},
        {"db a.db set 'At = 235959' --where 'Tag = -7'", 0, "1 record changed\n"},
        {"db a.db set 'Day = 00000000' --where 'Tag = -7'", 0, "1 record changed\n"}, // none
        {"db a.db set 'Name + x' --all", 1, "", {"2203 "}},
        {"db a.db set 'Price / 0' --where 'Tag = -7'", 0, "1 record changed\n"},
        {"db a.db set 'Price - inf' --where 'Tag = -7'", 0, "1 record changed\n"}, // no number, with a sign
        {"db a.db delete 2 2 9", 1, "1 record deleted\n", {"record 2: 1403 ", "record 9: 1402 "}},
        {"db a.db query --format tsv", 0,
         "record\tName\tPrice\tDay\tAt\tTag\n0\tAcorn Fund\tnan\t00000000\t235959\t-7\n"
         "1\t\xC3\xA4pfel\\tb\t0.2\t19990105\t000000\t0\n"},
        {"db a.db lock --where 'Tag = -7' --format tsv", 0, "locked\n1\n"},
        {"db a.db unlock 0 1", 1, "1 record unlocked\n", {"record 1: 2403 "}},
        {"db a.db compact --format json", 0, "{\"removed\":1}\n"},
        {"db a.db append Tag=1 Tag=2", 1, "", {"Tag is given twice"}},
        {"db a.db append Tog=1", 1, "", {"'Tog=1' begins with no column's name"}},
        {"db a.db append =1", 1, "", {"'=1' begins with no column's name"}}});
    EXPECT_EQ(Run("db a.db info --format json"), 0);
    EXPECT_TRUE(shell_.Says(R"("records":2,"deleted":0,"active":2,"columns":5,)"));
}

TEST_F(DbCommandTest, SetRefusesWhatAppendRefuses) {
    MakeSample();
    const std::string before = shell_.Read("a.db");
    const std::array<std::string, 3> cases[] = {
        {"Day", "20240230", "is no date"},     {"Day", "today", "is no date"},
        {"Day", "131006726", "is no date"},    {"At", "12:30:00", "is no time"},
        {"Price", "1.250,50", "is no number"}, {"Price", "$12", "is no number"},
        {"Tag", "300", "is no whole number"},  {"Name", "sixteen letters!", "is too long"},
    };
    for (const auto& [column, value, why] : cases) {
        const std::string told = column + ": '" + value + "' " + why;
        Go({{("db a.db append '" + column + "=" + value + "'").c_str(), 1, "", {told.c_str()}},
            {("db a.db set '" + column + " = " + value + "' --all").c_str(), 1, "", {told.c_str()}}});
    }
    EXPECT_EQ(shell_.Read("a.db"), before);
}

TEST_F(DbCommandTest, TextGoesOutAndComesBack) {
    MakeSample();
    Go({{"db a.db set 'Tag = 65' --all", 0, "3 records changed\n"},
        {"db a.db set 'Name = plain' --all", 0, "3 records changed\n"},
        {"db a.db export a.txt --separator ';' --characters --heading --where 'Price < 100' --sort Price", 0,
         "3 records exported to a.txt\n"}});
    EXPECT_EQ(shell_.Read("a.txt"), "Name;Price;Day;At;Tag;\nplain;-1000000.000;00000000;000000;A;\n"
                                    "plain;0.100;00000000;000000;A;\nplain;12.500;20240229;091530;A;\n");
    Go({{"db a.db load a.txt --separators ';' --characters --heading", 0, "3 records loaded from a.txt\n"},
        {"db a.db query 'Price = 12.5' --format tsv", 0,
         "record\tName\tPrice\tDay\tAt\tTag\n0\tplain\t12.5\t20240229\t091530\t65\n"
         "5\tplain\t12.5\t20240229\t091530\t65\n"},
        {"db a.db export a.txt --format tsv", 0, "exported\n6\n"},
        {"db a.db load a.txt --separators ';'", 1, "", {"a.txt, line 1: 1 field, the data file has 5"}},
        {"db a.db load a.db", 1, "", {"a.db: 1801 "}},
        {"db a.db load no/where", 1, "", {"no/where: 1801 ", "(No such file or directory)"}},
        {"db a.db export no/where", 1, "", {"1901 ", "(No such file or directory)"}}});
    EXPECT_EQ(shell_.Read("a.txt").substr(0, 42), "plain\t12.500\t20240229\t091530\t65\t\nplain\t0.1");
}

// Bytes of every kind in all ways that they can be written, and what is near the limits of its column.
TEST_F(DbCommandTest, WhatIsExportedLoadsBackTheSame) {
    Go({{"db a.db create --column A:byte --column Name:string:6 --column F:float::15 --column S:short "
         "--column L:long --column D:date --column T:time --column One:string:1",
         0, "created with 8 columns\n"},
        {"db a.db append A=-128 'Name=a,b;c' F=-3.4028235e38 S=-32768 L=-2147483648 D=99991231 T=235959", 0,
         "record 0 appended\n"},
        {"db a.db append A=48 'Name= ' F=0.1 S=32767 L=2147483647", 0, "record 1 appended\n"},
        {"db a.db append Name=\xC3\xBF\\\\ A=0", 0, "record 2 appended\n"}});
    ASSERT_EQ(Run("db a.db query --format tsv"), 0);
    const std::string content = shell_.Output();
    const std::string whole = shell_.Read("a.db");
    for (const std::string options : {"", " --characters", " --heading", " --characters --heading"}) {
        Go({{("db a.db export a.txt" + options).c_str(), 0, "3 records exported to a.txt\n"},
            {"db a.db delete 0 1 2", 0, "3 records deleted\n"},
            {("db a.db load a.txt" + options).c_str(), 0, "3 records loaded from a.txt\n"},
            {"db a.db compact", 0, "compacted: 3 records removed, 3 records left\n"},
            {"db a.db query --format tsv", 0, content.c_str()}});
        shell_.Write("a.db", whole);
    }
}

TEST_F(DbCommandTest, TextWithAWrongLineIsNotLoaded) {
    MakeSample();
    const std::string before = shell_.Read("a.db");
    const std::string good = "Birch\t+1e1\t20240229\t091530\t-7\t\r\n";
    const std::string names = "Name\tPrice\tDay\tAt\tTag\n";
    const struct {
        std::string text;
        const char* options;
        const char* wrong; // null when it is loaded
    } cases[] = {
        {good + "a\t5,5\t00000000\t000000\t0\n" + "a\n", "", ", line 2: Price: '5,5' is no number"},
        {good + "\n\n \t5\t2026\t000000\t0", "", ", line 4: Day: '2026' is no date of the form YYYYMMDD"},
        {"a\t5\t20240229\t246000\t0\n", "", ", line 1: At: '246000' is no time"},
        {"a\t5\t20240229\t091530\tx\n", "", ", line 1: Tag: 'x' is no whole number from -128 to 127"},
        {"a\t5\t20240229\t091530\t65\n", "--characters", ", line 1: Tag: '65' is more than one character"},
        {"sixteen letters!\t5\t20240229\t091530\t0\n", "",
         "' is too long: 16 bytes, and the column holds 15"},
        {"bad\xFF\t5\t20240229\t091530\t0\n", "", ", line 1: Name: 'bad\\xFF' is no UTF-8"},
        {std::string(500, 'x') + "\na\n", "", ", line 2: 1 field, the data file has 5"},
        {std::string("a\0b", 3) + "\t5\t20240229\t091530\t0\n", "", ", line 1: Name: 'a\\x00b' has a byte 0"},
        {good + "a\t\t20240229\t091530\t0\n", "",
         ", line 2: 4 fields, the data file has 5 columns (an empty field needs a"},
        {good + "a\t1\t20240229\t091530\t0\tmore\n", "", ", line 2: 6 fields, the data file has 5 columns"},
        {good + std::string(500, 'x') + "\n", "", ", line 2: the line is longer than "},
        {names + good, "", ", line 1: Price: 'Price' is no number"},
        {good, "--heading", ", line 1: 'Birch' stands where the column Name is to be named"},
        {"", "--heading", ", line 1: 0 fields, the data file has 5 columns"},
        {names + "a\n", "--heading", ", line 2: 1 field, the data file has 5 columns"},
        {names + "\n" + good, "--heading", nullptr},
        {good, "", nullptr},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.text);
        shell_.Write("a.txt", c.text);
        EXPECT_EQ(Run(std::string("db a.db load a.txt ") + c.options), c.wrong == nullptr ? 0 : 1);
        EXPECT_EQ(shell_.Read("a.db") == before, c.wrong != nullptr);
        EXPECT_TRUE(c.wrong == nullptr || shell_.Complains(std::string("a.txt") + c.wrong) ||
                    (c.wrong[0] == '\'' && shell_.Complains(c.wrong)))
            << shell_.Errors();
        shell_.Write("a.db", before);
    }
    ASSERT_EQ(shell_.Run("yes a | head -n 22 >a.txt"), 0);
    Go({{"db a.db load a.txt", 1, "", {", line 20: 1 field", "and 2 more lines are wrong\n"}}});
    EXPECT_EQ(std::count(shell_.Errors().begin(), shell_.Errors().end(), '\n'), 21);
    shell_.Write("a.txt", "\xEF\xBB\xBF\r\n" + good + "\r\n");
    Go({{"db a.db load a.txt", 0, "1 record loaded from a.txt\n"},
        {"db a.db query 'Name = Birch' --format tsv", 0,
         "record\tName\tPrice\tDay\tAt\tTag\n3\tBirch\t10\t20240229\t091530\t-7\n"}});
}

TEST_F(DbCommandTest, DamageIsToldAndMended) {
    MakeSample();
    const std::string whole = shell_.Read("a.db");
    std::string bytes = whole;
    shell_.Write("a.db", bytes.replace(36, 1, "\x09"));
    const char* refused = "nothing is changed before `check --repair`";
    Go({{"db a.db query 'Tag = -7' --format tsv",
         0,
         "record\tName\tPrice\tDay\tAt\tTag\n0\tAcorn Fund\t12.5\t20240229\t091530\t-7\n",
         {"the file is damaged"}},
        {"db a.db append", 1, "", {refused}},
        {"db a.db set 'Tag = 1' --all", 1, "", {refused}},
        {"db a.db delete 0", 1, "", {refused}},
        {"db a.db compact", 1, "", {refused}}});
    EXPECT_EQ(Run("db a.db check"), 1);
    EXPECT_EQ(shell_.Output(),
              "kind     offset  record  finding\n"
              "problem      36          the header counts 9 records, the file has room for 3\n");
    EXPECT_EQ(shell_.Read("a.db"), bytes);
    EXPECT_EQ(Run("db a.db check --repair"), 0);
    EXPECT_TRUE(shell_.Complains("the file as it was is " + path_ + ".before-repair"));
    EXPECT_EQ(shell_.Read("a.db"), whole);
    shell_.Write("a.db", bytes.replace(52 + 32, 1, "\x63"));
    EXPECT_EQ(Run("db a.db check --repair --format json"), 1) << "a count is mended, and something is left";
    EXPECT_TRUE(shell_.Complains("the counts are mended") && shell_.Complains("is left as it is"));
    EXPECT_TRUE(shell_.Says(R"({"kind":"problem","offset":84,"record":null,)"));
    // Beside what an interrupted compaction left no file is made; the advice brings the data back.
    for (const std::string left : {"a.new", "a.bak"}) {
        shell_.Write("a.new", std::string(whole).replace(36, 4, 4, '\0')); // before its records are counted
        std::filesystem::rename(path_, shell_.File(left == "a.new" ? "elsewhere" : left));
        const std::string told = left + ", as an interrupted compaction leaves it; `check --repair`";
        Go({{"db a.db info", 1, "", {"1103 ", told.c_str()}},
            {"db a.db create --column N:byte", 1, "", {told.c_str(), "nothing is made"}}});
        EXPECT_EQ(Run("db a.db check --repair"), 0) << shell_.Errors();
        EXPECT_EQ(shell_.Read("a.db"), whole);
    }
    shell_.Write("a.db", whole.substr(0, 70));
    Go({{"db a.db info",
         1,
         "",
         {"1103 Open error - file could not be opened: header and 5 columns need 272"}}});
}

TEST_F(DbCommandTest, ChangesOnlyWhatItHasToItselfAndHasKept) {
    MakeSample();
    const std::string before = shell_.Read("a.db");
    const std::string held = "in use by quorvan (process " + std::to_string(getpid());
    FolderLock lock;
    ASSERT_EQ(lock.Take(shell_.Path(), "quorvan"), FolderLock::Outcome::Taken);
    ASSERT_EQ(shell_.Run("mkdir else; ln -s ../a.db else/link.db"), 0);
    Go({{"db a.db append", 1, "", {held.c_str()}},
        {"db else/link.db compact", 1, "", {held.c_str()}},
        {"db a.db check --repair", 1, "", {held.c_str()}},
        {"db a.db check", 0, "nothing is wrong\n"},
        {"db a.db query 'Tag = 9' --format tsv", 0, "record\tName\tPrice\tDay\tAt\tTag\n"}});
    lock.Release();
    std::filesystem::remove_all(shell_.File("backups"));
    shell_.Write("backups", "in the way");
    Go({{"db a.db append", 1, "", {"the day's backup cannot be made"}}});
    EXPECT_EQ(shell_.Read("a.db"), before);
    std::filesystem::remove(shell_.File("backups"));
    Go({{"db else/link.db delete 0", 0, "1 record deleted\n"},
        {"db a.db compact", 0, "compacted: 1 record removed, 2 records left\n"}});
    ASSERT_EQ(shell_.Run("cat backups/a.db.*"), 0);
    EXPECT_EQ(shell_.Output(), before) << "there is one backup, of what was there at first";
    EXPECT_FALSE(shell_.Has("Quorvan.lock"));
}

// What the tool tells when its output goes to a descriptor.
std::string Told(const std::string& path, int file, const std::function<int(DataFileTool&)>& work,
                 int expected, FileOperations& operations = SystemFiles()) {
    TextOutput output(file);
    std::ostringstream errors;
    DataFileTool tool(path, OutputFormat::Table, output, errors, operations);
    EXPECT_EQ(tool.Finish(work(tool)), expected);
    return errors.str();
}
int QueryAll(DataFileTool& tool) {
    return tool.Query({});
}

TEST_F(DbCommandTest, FileThatMayOnlyBeReadIsShown) {
    MakeSample();
    ASSERT_EQ(chmod(path_.c_str(), 0444) + chmod(shell_.Path().c_str(), 0777), 0);
    EXPECT_EQ(ResultAsOrdinaryUser([this] {
                  const int out = open("/dev/null", O_WRONLY);
                  const std::string reason = "the file may only be read, not changed";
                  EXPECT_EQ(Told(path_, out, QueryAll, 0), "");
                  for (const auto& change : {+[](DataFileTool& tool) { return tool.Append({}); },
                                             +[](DataFileTool& tool) { return tool.Compact(); }})
                      EXPECT_NE(Told(path_, out, change, 1).find(reason), std::string::npos);
                  return HasFailure() ? 1 : 0;
              }),
              0);
}

TEST_F(DbCommandTest, ADiskThatFailsIsTold) {
    struct : FileOperations {
        int Sync(int) override {
            errno = EIO;
            return -1;
        }
    } failing;
    MakeSample();
    const int out = open("/dev/null", O_WRONLY);
    const std::string message = ": 3001 Sync error - unable to reach the disk (Input/output error)\n";
    EXPECT_EQ(Told(
                  path_, out, [](DataFileTool& tool) { return tool.Append({}); }, 1, failing),
              "quorvan-cli: " + path_ + message);
    const std::string made = shell_.File("made.db");
    EXPECT_EQ(Told(
                  made, out, [](DataFileTool& tool) { return tool.Create("", {"A:long"}); }, 1, failing),
              "quorvan-cli: " + made + message);
    close(out);
}

TEST_F(DbCommandTest, OutputThatNobodyTakesIsNoFailure) {
    MakeSample();
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    close(ends[0]);
    signal(SIGPIPE, SIG_IGN);
    EXPECT_EQ(Told(path_, ends[1], QueryAll, 0), "");
    close(ends[1]);
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
        std::istringstream lines(shell_.Output());
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
