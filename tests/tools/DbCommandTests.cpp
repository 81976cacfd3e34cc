#include <array>
#include <functional>
#include <sstream>
#include <tuple>
#include <unistd.h>

#include "CommandTest.h"
#include "tools/DataFileTool.h"
#include "tools/RecordFields.h"

namespace {

TEST(RecordFields, KnowWhatAColumnHolds) {
    COLUMN_ENTRY column{};
    for (const char* wrong :
         {"Price", "Price:", ":long", "a b:long", "A:string", "A:string:0", "A:string:x", "A:byte:0",
          "A:short:1", "A:long:3", "A:float:3", "A:date:3", "A:time:2", "A:long:32768", "A:long::2",
          "A:float::0", "A:float::16", "A:float:8:2:1", "a-name-of-thirty-two-characters-:long"})
        EXPECT_NE(ParseColumn(wrong, &column), "") << wrong;
    const std::array<std::string, 3> cases[] = {
        {"A:string:6", "sixsix", "is too long: 6 bytes, and the column holds 5"},
        {"A:byte:1", "128 x", "is no whole number from -128 to 127"},
        {"A:short:2", "32768 +-7", "is no whole number from -32768 to 32767"},
        {"A:long:4", "2147483648 12x", "is no whole number from -2147483648 to 2147483647"},
        {"A:float:4", "inf 1e39 1.250,50 $12", "is no number, or too large or too small for a float"},
        {"A:date:4", "20230229 2024-2-9 today 131006726", "is no date of the form YYYYMMDD"},
        {"A:time:3", "240000 236000 235960 1234 12:30:00", "is no time of the form HHMMSS"}};
    std::uint8_t data[6];
    for (const auto& [type, values, why] : cases) {
        EXPECT_EQ(ParseColumn(type, &column), ""); // at its least width
        std::istringstream each(values);
        for (std::string value; each >> value;)
            EXPECT_EQ(StoreField(column, value, data), why) << value;
    }
    // Narrower than its type, as another program may have made it, it would read 0 for the second.
    const COLUMN_ENTRY narrow{"A", ColumnType::Long, 2, 0, 0};
    EXPECT_TRUE(StoreField(narrow, "65535", data).empty() && !StoreField(narrow, "65536", data).empty());
}

// Commands on the file a.db.
class DbCommandTest : public CommandTest {
  protected:
    // It has a record of every kind.
    DbCommandTest() {
        Db({{"create --column Name:string:16 --column Price:float:4:3 --column Day:date --column At:time "
             "--column Tag:byte --description sample",
             "created with 5 columns\n"},
            {"append 'Name=Acorn Fund' Price=12.5 Day=20240229 At=091530 Tag=-7", "record 0 appended\n"},
            {"--format tsv append Price=0.1 'Name=\xC3\xA4pfel\tb'", "record\n1\n"},
            {"append 'Name=bad\xFF' Price=-1000000 --format json", "{\"record\":2}\n"}});
    }
    void Db(const std::vector<Step>& steps) { Expect("quorvan-cli db a.db ", steps); }

    const std::string path_ = folder_.File("a.db");
    const std::string heading_ = "record\tName\tPrice\tDay\tAt\tTag\n";
    const std::string acorn_ = "0\tAcorn Fund\t12.5\t20240229\t091530\t-7\n";
    const std::string apple_ = "1\t\xC3\xA4pfel\\tb\t0.1\t00000000\t000000\t0\n";
    const std::string bad_ = "2\tbad\\xFF\t-1000000\t00000000\t000000\t0\n";
};

TEST_F(DbCommandTest, ShowsRecords) {
    Db({{"query", "record  Name               Price  Day       At      Tag\n"
                  "     0  Acorn Fund        12.500  20240229  091530   -7\n"
                  "     1  \xC3\xA4pfel\\tb           0.100  00000000  000000    0\n"
                  "     2  bad\\xFF     -1000000.000  00000000  000000    0\n"},
        {"query --format tsv", heading_ + acorn_ + apple_ + bad_},
        {"query --format json",
         R"({"record":0,"Name":"Acorn Fund","Price":12.5,"Day":"20240229","At":"091530","Tag":-7})"
         "\n{\"record\":1,\"Name\":\"\xC3\xA4pfel\\tb\",\"Price\":0.1,\"Day\":\"00000000\",\"At\":"
         "\"000000\",\"Tag\":0}\n{\"record\":2,\"Name\":\"bad\xEF\xBF\xBD\",\"Price\":-1e+06,\"Day\":"
         "\"00000000\",\"At\":\"000000\",\"Tag\":0}\n"},
        {"query 'Tag = -7' --or 'Name contains BAD' --or 'Price < 1' --and 'Price < 12' --and 'Price > 0' "
         "--format tsv",
         heading_ + apple_},
        {"query 'Tag = 0' --and 'Price > 0' --or 'Tag = -7' --sort Price --format tsv",
         heading_ + apple_ + acorn_},
        {"query --sort Price --and 'Name contains F' --case --format tsv", heading_ + acorn_},
        {"export a.txt --separator ';' --heading --where 'Price > 0' --sort Price --format tsv",
         "exported\n2\n"},
        {"columns", "name   type    width  offset  decimals\nName   string     16       0\n"
                    "Price  float       4      16         3\nDay    date        4      20\n"
                    "At     time        3      24\nTag    byte        1      27\n"},
        {"check --repair", "nothing is wrong\n"}});
    EXPECT_EQ(folder_.Read("a.txt"), "Name;Price;Day;At;Tag;\n\xC3\xA4pfel\tb;0.100;00000000;000000;0;\n"
                                     "Acorn Fund;12.500;20240229;091530;-7;\n");
    EXPECT_EQ(Printed("db() { quorvan-cli db b.db $*; }; db create --column record:byte; db append record=1; "
                      "db query --format json"),
              "created with 1 column\nrecord 0 appended\n{\"record\":0,\"record_2\":1}\n");
}

TEST_F(DbCommandTest, ChangesRecords) {
    const std::string before = folder_.Read("a.db");
    ASSERT_TRUE(
        Works("rm -r backups; mkdir else; ln -s ../a.db else/link.db; quorvan-cli db else/link.db lock 0"));
    Db({{"set 'Price * 2' --where 'Price > 0' --and 'Tag = 0' --or 'Tag = -7'", "2 records changed\n"},
        {"set 'Day = 19990105' --all", "3 records changed\n"},
        {"set 'At = 235959' --where 'Tag = -7' --and 'Name contains ACORN'", "1 record changed\n"},
        {"set 'Day = 00000000' --where 'Tag = -7'", "1 record changed\n"}, // none
        {"set 'Price / 0' --where 'Tag = -7'", "1 record changed\n"},
        {"set 'Price - inf' --where 'Tag = -7'", "1 record changed\n"}, // no number, with a sign
        {"delete 2 2 9", "1 record deleted\n", "record 2: 1403 "},
        {"query --format tsv", heading_ + "0\tAcorn Fund\tnan\t00000000\t235959\t-7\n"
                                          "1\t\xC3\xA4pfel\\tb\t0.2\t19990105\t000000\t0\n"},
        {"lock --where 'Tag = -7' --format tsv", "locked\n1\n"},
        {"unlock 0 1", "1 record unlocked\n", "record 1: 2403 "},
        {"undelete 2", "1 record undeleted\n"},
        {"delete --where 'Tag = 0'", "2 records deleted\n"},
        {"compact --format json", "{\"removed\":2}\n"}});
    EXPECT_TRUE(Works("quorvan-cli db a.db info --format json", R"("records":1,"deleted":0,"active":1,)"));
    EXPECT_EQ(Printed("cat backups/a.db.*"), before) << "there is one backup, of what was there at first";
    EXPECT_FALSE(folder_.Has("Quorvan.lock") || folder_.Has("else/backups"));
}

// Bytes of every kind in all ways that they can be written, and what is at the limits of its column.
TEST_F(DbCommandTest, WhatIsExportedLoadsBackTheSame) {
    const std::string content = "record\tA\tName\tF\tS\tL\tD\tT\tOne\n"
                                "0\t-128\ta,b;c\t-3.4028235e+38\t-32768\t-2147483648\t99991231\t235959\t\n"
                                "1\t48\t \t0.1\t32767\t2147483647\t00000000\t000000\t\n"
                                "2\t7\t\xC3\xBF\\\\\t16777216\t0\t0\t20240229\t000000\t\n";
    EXPECT_EQ(Printed(R"sh(rm a.db; db() { quorvan-cli db a.db "$@"; }; db create --column A:byte --column \
            Name:string:6 --column F:float::15 --column S:short --column L:long --column D:date \
            --column T:time --column One:string:1 >told
        db append A=-128 'Name=a,b;c' F=-3.4028235e38 S=-32768 L=-2147483648 D=99991231 T=235959 >told
        db append A=48 'Name= ' F=0.1 S=32767 L=2147483647 D= T=000000 >told
        db append 'Name=ÿ\' A=+7 F=1.6777217e7 D=20240229 >told; db query --format tsv)sh"),
              content);
    const std::string whole = folder_.Read("a.db");
    const std::string both = "--characters --heading --separator";
    for (const auto& [way, back] : {std::pair<std::string, std::string>("", ""),
                                    {"--characters", "--characters"},
                                    {"--heading", "--heading"},
                                    {both + " '|'", both + "s '#|'"}}) {
        Db({{"export a.txt " + way, "3 records exported to a.txt\n"},
            {"delete 0 1 2", "3 records deleted\n"},
            {"load a.txt " + back, "3 records loaded from a.txt\n"},
            {"compact", "compacted: 3 records removed, 3 records left\n"},
            {"query --format tsv", content}});
        folder_.Write("a.db", whole);
    }
}

TEST_F(DbCommandTest, TextWithAWrongLineIsNotLoaded) {
    const std::string before = folder_.Read("a.db");
    const std::string good = "Birch\t+1e1\t20240229\t091530\t-7\t\r\n";
    const std::string rest = "\t5\t20240229\t091530\t0\n";
    const std::array<std::string, 3> cases[] = {
        // a text, the options, the only thing wrong
        {good + "\n\n \t5\t2026\t000000\t0", "", "4: Day: '2026' is no date of the form YYYYMMDD"},
        {"a\t5\t20240229\t091530\t65\n", "--characters", "1: Tag: '65' is more than one character"},
        {"bad\xFF" + rest, "", "1: Name: 'bad\\xFF' is no UTF-8"},
        {std::string("a\0b", 3) + rest, "", "1: Name: 'a\\x00b' has a byte 0"},
        {good + "a\t\t20240229\t091530\t0\n", "",
         "2: 4 fields, the data file has 5 columns (an empty field needs a"},
        {good, "--heading", "1: 'Birch' stands where the column Name is to be named"},
    };
    for (const auto& [text, options, wrong] : cases) {
        folder_.Write("a.txt", text);
        EXPECT_TRUE(folder_.Fails("quorvan-cli db a.db load a.txt " + options, 1, "a.txt, line " + wrong));
    }
    folder_.Write("a.txt", std::string(500, 'x') + "\n\n6" + rest + "6\t6" + rest);
    Db({{"load a.txt", "", "line 4: 6 fields, the data file has 5"}});
    EXPECT_TRUE(folder_.Complains("line 1: the line is longer than ")); // each is told
    EXPECT_EQ(folder_.Read("a.db"), before);
    folder_.Write("a.txt", "\xEF\xBB\xBF" + heading_.substr(7) + "\r\n" + good + "\r\n");
    Db({{"load a.txt --heading", "1 record loaded from a.txt\n"},
        {"query 'Name = Birch' --format tsv", heading_ + "3\tBirch\t10\t20240229\t091530\t-7\n"}});
}

TEST_F(DbCommandTest, DamageIsToldAndMended) {
    const std::string whole = folder_.Read("a.db");
    std::string bytes = whole;
    const std::string finding =
        "kind     offset  record  finding\nproblem      36          the header counts 9 "
        "records, the file has room for 3\n";
    folder_.Write("a.db", bytes.replace(36, 1, "\x09"));
    Db({{"query 'Tag = -7' --format tsv", heading_ + acorn_, "the file is damaged", 0},
        {"check", finding, "", 1},
        {"check --repair", finding, "the file as it was is " + path_ + ".before-repair\n", 0}});
    EXPECT_TRUE(folder_.Read("a.db.before-repair") == bytes && folder_.Read("a.db") == whole);
    folder_.Write("a.db", bytes.replace(52 + 32, 1, "\x63"));
    EXPECT_TRUE(Works("quorvan-cli db a.db info", "read_only    no\ndamaged      yes\n"));
    EXPECT_TRUE(Works("! quorvan-cli db a.db check --repair --format json",
                      R"({"kind":"problem","offset":84,"record":null,)"));
    EXPECT_TRUE(folder_.Complains("the counts are mended") && folder_.Complains("is left as it is"));
    folder_.Write("a.new", std::string(whole).replace(36, 4, 4, '\0')); // as a compaction left it
    EXPECT_TRUE(Works("rm a.db; quorvan-cli db a.db check --repair") && folder_.Read("a.db") == whole);
}

TEST_F(DbCommandTest, ADiskThatFailsIsTold) {
    FaultyFiles disk;
    const auto told = [&](const std::string& name, const std::function<int(DataFileTool&)>& work) {
        TextOutput output(STDOUT_FILENO);
        std::ostringstream errors;
        DataFileTool tool(folder_.File(name), OutputFormat::Table, output, errors, disk);
        EXPECT_EQ(tool.Finish(work(tool)), 1);
        return errors.str().substr(errors.str().find(": 3001") + 1);
    };
    disk.Arm(Fault::NoReads, 3); // of the records
    EXPECT_NE(told("a.db", [](auto& tool) { return tool.Query({}); }), "");
    EXPECT_TRUE(disk.Disarm());
    const std::string reason = " 3001 Sync error - unable to reach the disk (No space left on device)\n";
    disk.may = [syncs = 1](char call) mutable { return call != 's' || syncs-- > 0; }; // the name's fails
    EXPECT_EQ(told(
                  "new", [](auto& tool) { return tool.Create("", {"A:long"}); }),
              reason);
    EXPECT_EQ(told("a.db", [](auto& tool) { return tool.Append({}); }), reason);
}

TEST_F(DbCommandTest, OutputThatNobodyTakesIsNoFailure) {
    ASSERT_TRUE(Works(
        "db() { quorvan-cli db b.db $*; }; yes plain | head -n 50000 >a.txt; db create --column A:string:8; "
        "db load a.txt; { db query; echo $? >status; } | head -n 1",
        "record  A\n"));
    EXPECT_EQ(folder_.Read("status") + folder_.Errors(), "0\n");
}

TEST_F(DbCommandTest, ManualNamesEveryCommandAndOptionAndIsInOrder) {
    EXPECT_TRUE(Works(
        R"sh(for command in '' setup quote chart report list export import check update backups db \
            'db x info' 'db x query' 'db x set' 'db x append' 'db x delete' 'db x check' 'db x create' \
            'db x export' 'db x load'; do
            quorvan-cli $command --help | sed -n 's/^  \(-., *\)*\(--[^ ,]*\).*/\2/p
                /^Subcommands:/,$ s/^  \([^ ]\+\).*/\1/p'
        done | sort -u >offered; [ $(wc -l <offered) -gt 30 ] && tr -d '\\' <')sh" QUORVAN_SOURCES
        R"sh(/doc/man/quorvan-cli.1' >man; while read -r word; do
            grep -qF -e "$word" man || { echo "$word" >&2; false; } || exit 1; done <offered)sh"));
    EXPECT_EQ(Printed("export LC_ALL=C.UTF-8 MANROFFSEQ= MANWIDTH=80; for page in '" QUORVAN_SOURCES
                      "'/doc/man/*; do "
                      "man --warnings -E UTF-8 -l -Tutf8 -Z $page >page && [ -s page ] || exit 1; done"),
              "");
}

} // namespace
