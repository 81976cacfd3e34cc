// quorvan-cli list, export, import and check.
#include <sstream>

#include "CommandTest.h"
#include "tools/CsvImport.h"
#include "tools/CsvReader.h"

namespace {

TEST(CsvReader, DividesTextIntoFields) {
    const std::string marks =
        "its quotation marks do not fit: one within a field is doubled, and the field is "
        "between two; what follows it was not read";
    const std::tuple<std::string, char, std::string, std::string> cases[] = {
        // a text, the delimiter, its rows with their lines, what is wrong with the rest
        {"\uFEFF", ',', "", ""},
        {"\uFEFFa,b\r\nc,d", ',', "1<a><b>2<c><d>", ""},
        {"a;b,c;\n;;\n", ';', "1<a><b,c><>2<><><>", ""},
        {"a\tb\n\t\n \n\n  c \t\" d \"\n", '\t', "1<a><b>2<><>5<c>< d >", ""},
        {"\"a,\"\"b\"\"\",\"c\r\nd\n\",e\r\nf\n", ',', "1<a,\"b\"><c\r\nd\n><e>4<f>", ""},
        {"a\rb\r\r\nc", ',', "1<a>2<b>4<c>", ""},
        {"a\n\"b\n\nc\n", ',', "1<a>", "line 2: " + marks},
        {"a\nb\n\"c\" d,e\nf", ',', "1<a>2<b>", "line 3: " + marks},
        {"a,6\" pipe\nf", ',', "", "line 1: " + marks},
        {std::string("a\0b\xFF", 4), ',', std::string("1<a\0b\xFF>", 7), ""},
    };
    for (const auto& [text, delimiter, rows, wrong] : cases) {
        std::string found;
        const auto take = [&found](long line, const std::vector<std::string>& fields) {
            found += std::to_string(line);
            for (const std::string& field : fields)
                found += "<" + field + ">";
        };
        const std::string why = ReadCsv(text, delimiter, take);
        EXPECT_EQ(found, rows);
        EXPECT_TRUE(why.starts_with(wrong) && why.empty() == wrong.empty()) << text << ": " << why;
    }
}

TEST(CsvReader, NumbersAreUnderstoodOrRefused) {
    // The decimal mark or ? for none said, the text, and what it means; nothing for no number.
    std::istringstream cases(
        "?12.5=12.5|?1.234=1.234|?1,234,567=1234567|?-1,234.5=-1234.5|?+.5e-3=+.5e-3|.1,234=1234|,1.234=1234|"
        ",1.234.567,25=1234567.25|,0,25=0.25|?1 234 567=1234567|?1'234.5=1234.5|,1\u00A0234,5=1234.5|"
        "?1\u202F234=1234|?1\u2019234=1234|?44,50=|?0,234=|?1,23,456=|?1,234 567=|?1234,567=|,12.5=|?,5=|"
        "?$5=|?12 3/8=|?1,2345=|?5-=|?1.2.3=");
    for (std::string each; std::getline(cases, each, '|');) {
        const std::size_t end = each.find('=');
        const PlainNumber number = ReadPlainNumber(each.substr(1, end - 1), each[0] == '?' ? '\0' : each[0]);
        EXPECT_EQ(number.text, each.substr(end + 1)) << each;
        EXPECT_EQ(number.wrong, end + 1 == each.size() ? "is no number" : "") << each;
    }
    EXPECT_TRUE(ReadPlainNumber("1,234", 0).wrong.starts_with("may be a whole number or a broken one"));
}

class FolderTest : public HomeTest {
  protected:
    FolderTest() {
        for (const char* portfolio : {"Growth", "Tab\x1b"})
            home_.AddPortfolio(portfolio);
        Add("Growth", "Zinc", 1000, 1.5F, {1, 2, 2024}, "Med", "AAA");
        Add("Growth", "acorn", 9, 100, {2, 1, 2024});
        Add("growth", "Birch", 80, 12.375F, {3, 12, 1999});
    }
    void Add(const char* portfolio, const char* name, float shares, float price, dbDATE date,
             const char* risk = "Med", const char* ticker = "BBB") {
        INVESTMENT_DATA record = MakeInvestment(portfolio, name, shares, price, "Stock", ticker, risk);
        record.Date = date;
        record.PrevPrice = 8;
        record.QuoteError = record.Retire = 1;
        record.Value += static_cast<float>(record.Name[0] == '!'); // a wrong one
        home_.AddInvestment(record);
    }
    std::string In(const std::string& command) const {
        return "quorvan-cli " + command + " --home '" + home_.Path() + "'";
    }
    // What it says, with one blank for many, and its status.
    std::string Of(const std::string& command, const std::string& pipe = "cat") {
        return Printed("{ " + In(command) + "; echo $?; } | tr -s ' ' | " + pipe);
    }
};

TEST_F(FolderTest, WhatIsExportedComesBackTheSame) {
    home_.AddPortfolio("A, \"b\"");
    Add("Growth", "no risk", 1, 1, {1, 1, 2020}, "");
    float amount = 1e-30F;
    for (const char* name : {"\"", "a,b;c", " blank ", "line\r\nend", "\xC3\xA4\xE2\x82\xAC", "=1+1"}) {
        home_.AddInvestment(MakeInvestment("A, \"b\"", name, amount, -1 / amount, ""));
        amount *= 4.7e8F;
    }
    ASSERT_TRUE(
        Works(Setup() + "; " + In("export --all -o a.csv") + "; " + In("export --all") +
                  " | cmp - a.csv; quorvan-cli import --home home --all a.csv --create",
              "10 investments added, new portfolio Growth, new portfolio Tab\\x1B, new portfolio A, "));
    for (const std::string file : {"invest.db", "portfol.db"}) // from behind the description on
        EXPECT_TRUE(folder_.Read("home/" + file).substr(36) == home_.Read(file).substr(36));
    // One portfolio, its name and the table's written otherwise, into a file that lies elsewhere.
    ASSERT_TRUE(Works("mv home/invest.db to.db; chmod 640 to.db; ln -s ../to.db home/invest.db; " +
                      In("export Growth") +
                      R"( | sed '1s/Shares/Quantity/' | tr , '\t' | quorvan-cli import)"
                      " --home home Other - --create --delimiter tab --column Shares=quantity"));
    EXPECT_EQ(Printed("stat -c %A to.db home/invest.db"), "-rw-r-----\nlrwxrwxrwx\n");
    EXPECT_EQ(Printed("quorvan-cli export Other --home home"), Printed(In("export Growth")));
    EXPECT_TRUE(Works(In("export Growth --json"), R"("Retire":true,"Risk":"Med","Agent":"Bank",)"));
}

TEST_F(FolderTest, SetsWhatTheWindowWouldSet) {
    folder_.Write("t.csv",
                  "Ticker;Anteile;Kurs;Name;Note;Date\nccc;1.234,5;2;New;x;\n aaa;;3;;y;2020-01-02\n;;;;;\n");
    const std::string read = " t.csv --delimiter ';' --decimal , --column Shares=Anteile --column Price=Kurs "
                             "--update-by ticker";
    const std::string before = State(home_.Path());
    const std::string day = "date +%F | tr -d '\\n'", began = Printed(day);
    EXPECT_TRUE(Works(In("import Growth --dry-run --json" + read), R"({"Line":2,"Action":"add",)"));
    EXPECT_TRUE(folder_.Says(R"({"Line":3,"Action":"change","Portfolio":"Growth","Name":"Zinc")"));
    EXPECT_EQ(State(home_.Path()), before);
    ASSERT_TRUE(Works(In("import Growth" + read), "1 investment added, 1 changed\n"));
    EXPECT_TRUE(folder_.Complains("t.csv: nothing is taken of 'Note'\n"));
    const std::string written = Printed(In("export Growth"));
    const std::string today = written.find(began) != written.npos ? began : Printed(day);
    EXPECT_EQ(written,
              "Name,Ticker,Type,Shares,Price,Value,Date,Retire,Risk,Agent,PrevPrice,QuoteError\r\n"
              "Zinc,aaa,Stock,1000,3,3000,2020-01-02,yes,Med,Bank,8,1\r\n"
              "acorn,BBB,Stock,9,100,900,2024-01-02,yes,Med,Bank,8,1\r\n"
              "Birch,BBB,Stock,80,12.375,990,1999-12-03,yes,Med,Bank,8,1\r\nNew,ccc,,1234.5,2,2469," +
                  today + ",no,Med,,-1,0\r\n");
    EXPECT_TRUE(home_.Has("backups"));
    folder_.Write("v.csv", "Name,Type,Value,Risk,Date\nA,Fund,7, low ,2999-01-01\n");
    EXPECT_EQ(Printed(In("import Growth v.csv --column Agent=Type")),
              "1 investment added\nquorvan-cli: v.csv: nothing is taken of 'Value'\n"
              "quorvan-cli: v.csv, line 2: Date lies ahead\n");
    EXPECT_TRUE(Works(In("export Growth"), "A,,,0,0,0,2999-01-01,no,Low,Fund,-1,0"));
}

TEST_F(FolderTest, NamesEveryWrongLineAndChangesNothing) {
    const std::string whole = "is no whole number from -128 to 127";
    const std::string name = "1: the heading has no column 'Name'; is there another ";
    const std::string x(32, 'x');
    const std::tuple<std::string, std::string, std::vector<std::string>> cases[] = {
        // the arguments, the table, each thing that is wrong
        {"Growth t.csv --column Shares=Sum",
         "Name,Risk,Date,Sum,Price,Retire\nA,mid,,x,\"1,234\",200\nA,,0000-00-00,,,\nB,hIgH\n" + x +
             ",,,,,\n,LOW,,,,\n\xFF,,,,,maybe\n",
         {"2: Risk: 'mid' is none of Low, Med and High", "2: Shares ('Sum'): 'x' is no number",
          "2: Price: '1,234' may be a whole number or a broken one: ", "2: Retire: '200' " + whole,
          "3: Date: '0000-00-00' is no date of the form YYYY-MM-DD", "4: 2 fields, the heading has 6",
          "5: Name: '" + x + "' is too long: 32 bytes, and the column holds 31", "6: Name: there is none",
          "7: Name: '\\xFF' is no UTF-8", "7: Retire: 'maybe' " + whole}},
        {"Growth t.csv", "Name,Shares,Price\nA,3e38,9\n", {"2: Value: shares times price is too large"}},
        {"Growth t.csv", "Name;Price\nA;1\n", {name + "--delimiter?"}},
        {"Growth t.csv --column Type=Kind",
         "Ticker,Price,price\n",
         {"1: the heading names Price twice", name + "name for --column Name=NAME?",
          "1: the heading has no column 'Kind'"}},
        {"Growth t.csv", "", {"1: there is no heading that names the columns"}},
        {"Growth t.csv",
         "Name,Portfolio\nA,Growth\nB,Income\n",
         {"3: Portfolio: 'Income' is another one; --all imports each line into its own"}},
        {"--all t.csv",
         "Name,Portfolio\nA,Income\nB,\nC,Income\n",
         {"2: Portfolio: there is no portfolio 'Income'; --create", "3: Portfolio: the line names none",
          "4: Portfolio: there is no portfolio 'Income'"}},
        {"Growth t.csv --update-by ticker",
         "Ticker,Price\nAAA,1\nBBB,1\nNEW,1\n,1\naaa,2\n",
         {"3: Ticker: 'BBB' is that of 2 investments", "4: Name: there is none",
          "5: Ticker: '' is empty, and tells the investment", "6: Ticker: 'aaa' stands in line 2 already"}},
    };
    const std::string before = State(home_.Path());
    for (const auto& [arguments, table, wrong] : cases) {
        folder_.Write("t.csv", table);
        EXPECT_EQ(folder_.Run(In("import " + arguments)), 1) << arguments;
        EXPECT_EQ(std::count(folder_.Errors().begin(), folder_.Errors().end(), '\n'), std::ssize(wrong));
        for (const std::string& each : wrong)
            EXPECT_TRUE(folder_.Complains("quorvan-cli: t.csv, line " + each));
    }
    EXPECT_EQ(State(home_.Path()), before);
}

// A row changed, one added, and a portfolio made.
TEST_F(FolderTest, ImportIsOneStepWhateverFails) {
    const auto found = [this] { return std::pair(home_.Portfolios(), home_.Investments()); };
    const auto import = [this](FileOperations& files) {
        DATABASE portfolios(home_.File("portfol.db").c_str());
        DATABASE investments(home_.File("invest.db").c_str());
        ImportOptions options;
        options.create = options.updateByTicker = true;
        CsvImport table(options, portfolios, investments);
        EXPECT_EQ(table.Read("Portfolio,Ticker,Name\nGrowth,aaa,Renamed\nNew,nn,n\nVoid,,\n", [](long) {}),
                  "");
        return table.Write(ToolFolder(home_.Path()), files).empty() ? 0 : 1;
    };
    const auto old = found(),
               changed = std::pair(
                   std::vector<std::string>{"Growth", "Tab\x1b", "New", "Void"},
                   std::vector<std::string>{"Growth/Renamed", "Growth/acorn", "growth/Birch", "New/n"});
    const auto names = home_.Names();
    AtEveryCall({Fault::KilledBefore, Fault::KilledAfter, Fault::Error, Fault::HalfThenError}, import,
                [&](int result) {
                    const bool made = found() == changed;
                    const bool kept = found() == old || found() == std::pair(changed.first, old.second);
                    EXPECT_TRUE(made || (kept && std::abs(result) == 1));
                    EXPECT_TRUE(result == -1 || home_.Names() == names) << "no part is left";
                    FileOperations files;
                    EXPECT_TRUE(made || (import(files) == 0 && found() == changed)) << "once more";
                });
}

TEST_F(FolderTest, ListsAsTheWindowDoes) {
    EXPECT_EQ(Of("list"),
              "Portfolio Investments Value\nGrowth 3 3390.00\nTab\\x1B 0 0.00\nTotal 3 3390.00\n0\n");
    EXPECT_EQ(Of("list --json", "sed -n 2,3p"), R"({"Portfolio":"Tab\u001b","Investments":0,"Value":0.0}
{"Portfolio":null,"Investments":3,"Value":3390.0}
)");
    EXPECT_EQ(Of("list Growth --sort date --reverse"),
              "Status Name Ticker Type Shares Price Value Date Retire Risk Agent\n"
              "not found Zinc AAA Stock 1000.000 1 1/2 1500.00 02-01-2024 yes Med Bank\n"
              "not found acorn BBB Stock 9.000 100 900.00 01-02-2024 yes Med Bank\n"
              "not found Birch BBB Stock 80.000 12 3/8 990.00 12-03-1999 yes Med Bank\n"
              "Total Value: $3390.00\n0\n");
    EXPECT_EQ(Of("list Growth --json --sort value", "cut -sd'\"' -f8 | tr '\\n' ' '"), "acorn Birch Zinc ");
}

TEST_F(FolderTest, ChecksTheFolderAsAWhole) {
    Add("Lost", "!worth", 2, 10, {1, 1, 2020});
    Add("lost", "risky", 2, 10, {}, "mid");
    Add("Growth", "Future", 1, 1, {1, 1, 9999});
    Add("Growth", "Never", 1, 1, {30, 2, 2024});
    home_.Write("portfol.db", home_.Read("portfol.db").replace(40, 1, "\x01")); // one counts as deleted
    const std::string heading = "kind file offset record finding\n";
    const std::string left =
        "problem invest.db 4 Risk is 'mid', which no chart counts, and none of Low, Med and High\n"
        "problem invest.db 4 there is no Date\n"
        "problem invest.db 5 Date is 9999-1-1, which lies ahead\n"
        "problem invest.db 6 Date is 2024-2-30, which is none\n";
    const auto expected = [&](const std::string& kind) {
        return heading + kind + " portfol.db 40 the header counts 1 deleted, the status bytes 0\n" + kind +
               " invest.db 3 Value is 21, and Shares times Price 20\n" + left + kind +
               " invest.db 3 2 investments from here on of 'Lost', which is no portfolio of the list\n1\n";
    };
    const std::string before = State(home_.Path());
    EXPECT_EQ(Of("check"), expected("problem"));
    EXPECT_EQ(State(home_.Path()), before);
    home_.Write("backups", ""); // where no backup can be made, nothing is mended
    EXPECT_EQ(Of("check --repair 2>/dev/null", "sed -n 2p; rm '" + home_.File("backups") + "'"),
              "problem portfol.db 40 the header counts 1 deleted, the status bytes 0\n");
    EXPECT_EQ(Of("check --repair"), expected("mended"));
    EXPECT_TRUE(home_.Has("backups") && home_.Portfolios().back() == "Lost");
    EXPECT_TRUE(Works("ls '" + home_.File("backups") + "'", "misc.db."));
    EXPECT_EQ(Of("check --repair"), heading + left + "1\n") << "but for what is left";
    Printed("cd '" + home_.Path() + "'; mv invest.db invest.bak; rm misc.db");
    EXPECT_EQ(Of("check --repair", "sed 's|/[^ ]*/||'"),
              heading +
                  "mended invest.db the backup of an interrupted compaction got back its name\n"
                  "problem misc.db misc.db cannot be opened: No such file or directory\n" +
                  left + "1\n");
}

} // namespace
