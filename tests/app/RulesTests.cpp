// The rules of the commands and the texts of a row, on real data files and without a window.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>

#include <sys/wait.h>
#include <unistd.h>

#include "DataFolder.h"
#include "app/InvestmentTexts.h"
#include "app/PortfolioRules.h"
#include "db/FaultyFiles.h"

namespace {

using Texts = std::vector<std::string>;

std::string Price(float price, const char* type) {
    FigureText text;
    FormatPrice(price, type, text);
    return text;
}

TEST(InvestmentTexts, APriceIsInFractionsForStocks) {
    constexpr float huge = std::numeric_limits<float>::max();
    constexpr float infinite = std::numeric_limits<float>::infinity();
    const struct {
        float price;
        const char* type;
        const char* text;
    } cases[] = {
        {12.375F, "Stock", "12 3/8"},
        {12.5F, "STOCK", "12 1/2"},
        {12.99F, "Stock Fund", "12 31/32"},
        {12.02F, "my stocks", "12"},
        {10, "Stock", "10"},
        {0.5F, "stock", "0 1/2"},
        {8388607.5F, "stock", "8388607 1/2"},
        {12.9999F, "stock", "12 31/32"},
        {-12.5F, "stock", "-12"},
        {10, "Fund", "10.00"},
        {12.375F, "", "12.38"},
        {0.125F, "Bond", "0.12"},
        {12.5F, "sto ck", "12.50"},
        {12.5F,
         "\xC3\x9C"
         "berstock",
         "12 1/2"}, // as stored behind a letter that has no ASCII case
        {12.5F,
         "\xC3\x9C"
         "berSTOCK",
         "12.50"},
        {huge, "stock", "340282346638528"},
        {huge, "Fund", "340282346638528"},
        {infinite, "stock", "inf"},
        {-infinite, "Fund", "-inf"},
        {std::nanf(""), "stock", "nan"},
    };
    for (const auto& each : cases)
        EXPECT_EQ(Price(each.price, each.type), each.text) << each.type;
}

TEST(InvestmentTexts, FiguresAreCutToTheirSize) {
    FigureText text;
    const auto shares = [&](float value) { return FormatShares(value, text), std::string(text); };
    const auto value = [&](float number) { return FormatValue(number, text), std::string(text); };
    const auto day = [&](dbDATE date) { return FormatDay(date, text), std::string(text); };
    EXPECT_EQ(shares(1.0005F), "1.000"); // just below in binary
    EXPECT_EQ(shares(-2.5F), "-2.500");
    EXPECT_EQ(shares(1e20F), "100000002004087");
    EXPECT_EQ(value(1234.5F), "1234.50");
    EXPECT_EQ(value(12345.5F), "12,345.50");
    EXPECT_EQ(value(123456784.F), "123,456,784.00");
    EXPECT_EQ(value(1234567936.F), "1,234,567,936.0");
    EXPECT_EQ(day({3, 3, 2001}), "03-03-2001");
    EXPECT_EQ(day({25, 12, 1999}), "12-25-1999");
    EXPECT_EQ(day({0, 0, 0}), "00-00-0000");
    EXPECT_EQ(day({-128, -128, -32768}), "-128--128--3276");
}

TEST(InvestmentTexts, TheMoveDependsOnTheRecordAlone) {
    const struct {
        float price;
        float previous;
        std::int8_t error;
        PriceMove move;
    } cases[] = {
        {10, 9, 0, PriceMove::Up},       {10, 11, 0, PriceMove::Down},
        {10, 10, 0, PriceMove::Same},    {10, NoPreviousPrice, 0, PriceMove::Unknown},
        {10, 0, 0, PriceMove::Unknown},  {10, std::nanf(""), 0, PriceMove::Unknown},
        {10, 9, 1, PriceMove::NotFound}, {10, NoPreviousPrice, -1, PriceMove::NotFound},
    };
    for (const auto& each : cases) {
        INVESTMENT_DATA record = MakeInvestment("P", "N", 1, each.price);
        record.PrevPrice = each.previous;
        record.QuoteError = each.error;
        EXPECT_EQ(MoveOf(record), each.move) << each.price << " after " << each.previous;
    }
}

TEST(PortfolioRules, OnlyFilesOfTheProgramsLayoutAreTaken) {
    const DataFolder folder;
    DATABASE portfolios(folder.File("portfol.db").c_str());
    DATABASE investments(folder.File("invest.db").c_str());
    DATABASE categories(folder.File("misc.db").c_str());
    EXPECT_TRUE(HoldsPortfolios(portfolios) && HoldsInvestments(investments) && HoldsCategories(categories));
    EXPECT_FALSE(HoldsPortfolios(investments) || HoldsInvestments(portfolios) || HoldsCategories(portfolios));
    DATABASE closed(nullptr);
    EXPECT_FALSE(HoldsPortfolios(closed) || HoldsInvestments(closed) || HoldsCategories(closed));

    const struct {
        const char* name;
        int rest; // bytes of data behind the first column
        bool taken;
    } cases[] = {
        {"Portfolio", 198, true},  {"Portfolio", 406, true},  {"Portfolio", 197, false},
        {"Portfolio", 407, false}, {"portfolio", 198, false},
    };
    for (const auto& each : cases) {
        const TemporaryFolder other;
        COLUMN_ENTRY columns[2]{};
        CopyText(columns[0].name, each.name);
        columns[0].size = NameSize;
        CopyText(columns[1].name, "Rest");
        columns[1].size = static_cast<std::int16_t>(each.rest);
        DATABASE file(nullptr);
        ASSERT_EQ(file.Create(other.File("x.db").c_str(), "", 2, columns), 0);
        EXPECT_EQ(HoldsInvestments(file), each.taken) << each.name << each.rest;
    }
}

TEST(PortfolioRules, AWalkVisitsThePortfoliosInvestmentsInRecordOrder) {
    const DataFolder folder;
    folder.AddInvestment(MakeInvestment("My Fund", "a", 1, 0.1F));
    folder.AddInvestment(MakeInvestment("Other", "b"));
    folder.AddInvestment(MakeInvestment("my fund", "c", 1, 16777216));
    folder.AddInvestment(MakeInvestment("My Fund", "d", 1, 1));
    folder.AddInvestment(MakeInvestment("My Fund ", "e"));
    DATABASE file(folder.File("invest.db").c_str());
    file.Delete(1);

    Texts seen;
    ForEachInvestment(file, "My Fund", [&](const INVESTMENT_DATA& record, long number) {
        seen.push_back(std::to_string(number) + record.Name);
    });
    EXPECT_EQ(seen, (Texts{"0a", "2c", "3d"}));
    // In single precision and that order: the tenth and the one are lost beside the large value.
    EXPECT_EQ(TotalValue(file, "My Fund"), 16777216.F);
    // The report goes on from there.
    EXPECT_STREQ(static_cast<const INVESTMENT_DATA*>(file.QueryGetFirst(nullptr))->Name, "a");
    EXPECT_EQ(TotalValue(file, "None"), 0);

    INVESTMENT_DATA record;
    EXPECT_TRUE(ReadInvestment(file, 3, &record));
    EXPECT_STREQ(record.Name, "d");
    EXPECT_FALSE(ReadInvestment(file, 1, &record));
    EXPECT_FALSE(ReadInvestment(file, 5, &record));
}

TEST(PortfolioRules, DeletingTakesAllOfThatNameAndNothingElse) {
    const DataFolder folder;
    for (const char* name : {"A", "b c", "a", "A\tx"})
        folder.AddPortfolio(name);
    for (const char* portfolio : {"A", "b c", "a", "A", "AA"})
        folder.AddInvestment(MakeInvestment(portfolio, "n"));
    DATABASE portfolios(folder.File("portfol.db").c_str());
    DATABASE investments(folder.File("invest.db").c_str());

    // A name that no query can hold must not be taken for the part of it that one can.
    for (const char* name : {"A\tx", "A\n", "", "none"})
        EXPECT_TRUE(DeletePortfolio(portfolios, investments, name));
    EXPECT_EQ(portfolios.GetNumberOfActiveRecords(), 4);
    EXPECT_EQ(investments.GetNumberOfActiveRecords(), 5);

    EXPECT_TRUE(DeletePortfolio(portfolios, investments, "A"));
    EXPECT_EQ(folder.Portfolios(), (Texts{"b c", "A\tx"}));
    EXPECT_EQ(folder.Investments(), (Texts{"b c/n", "AA/n"}));
}

TEST(PortfolioRules, ARenameTakesEveryInvestmentAlong) {
    const DataFolder folder;
    for (const char* name : {"Old", "Other"})
        folder.AddPortfolio(name);
    for (const char* portfolio : {"old", "Other", "Old", "Old one"})
        folder.AddInvestment(MakeInvestment(portfolio, "n"));
    DATABASE portfolios(folder.File("portfol.db").c_str());
    DATABASE investments(folder.File("invest.db").c_str());
    EXPECT_TRUE(RenamePortfolio(portfolios, investments, "Old", "  New name"));
    EXPECT_EQ(folder.Portfolios(), (Texts{"  New name", "Other"}));
    EXPECT_EQ(folder.Investments(), (Texts{"  New name/n", "Other/n", "  New name/n", "Old one/n"}));
    EXPECT_TRUE(RenamePortfolio(portfolios, investments, "Other", "Alone"));
    EXPECT_FALSE(RenamePortfolio(portfolios, investments, "Old", "x"));
    EXPECT_FALSE(RenamePortfolio(portfolios, investments, "A\tx", "x"));
    // A name that the investments could not take must not be given to the portfolio alone.
    for (const char* name : {"", "a\tb", "a name of more than 31 characters"})
        EXPECT_FALSE(RenamePortfolio(portfolios, investments, "Alone", name)) << name;
    EXPECT_EQ(folder.Portfolios(), (Texts{"  New name", "Alone"}));
}

// Runs the command in a child that is killed before its at-th change of a file; false when it came to its
// end.
template <class Command>
bool KilledAt(const DataFolder& folder, int at, Command command) {
    const pid_t child = fork();
    if (child == 0) {
        FaultyFiles files;
        DATABASE portfolios(folder.File("portfol.db").c_str(), files);
        DATABASE investments(folder.File("invest.db").c_str(), files);
        files.Arm(Fault::KilledBefore, at);
        _exit(command(portfolios, investments) ? 0 : 1);
    }
    int status = 0;
    waitpid(child, &status, 0);
    return WIFSIGNALED(status);
}

TEST(PortfolioRules, KilledAnywhereARenameLosesNoInvestmentAndADeleteNoOther) {
    const auto fill = [](const DataFolder& folder) {
        for (const char* name : {"Other", "Old"})
            folder.AddPortfolio(name);
        // Far enough apart that they are written one by one.
        for (int i = 0; i < 120; ++i)
            folder.AddInvestment(MakeInvestment(i % 40 == 0 ? "Old" : "Other", "n"));
    };
    bool killed = true;
    for (int at = 0; killed; ++at) {
        const DataFolder folder;
        fill(folder);
        killed = KilledAt(folder, at, [](DATABASE& portfolios, DATABASE& investments) {
            return RenamePortfolio(portfolios, investments, "Old", "New");
        });
        const Texts all = folder.Investments();
        const auto count = [&](const char* text) { return std::count(all.begin(), all.end(), text); };
        EXPECT_EQ(count("Other/n"), 117) << at;
        EXPECT_EQ(count("Old/n") + count("New/n"), 3) << at;
        EXPECT_TRUE(killed || (at > 3 && count("New/n") == 3));
        EXPECT_EQ(folder.Portfolios().front(), "Other");
        EXPECT_EQ(folder.Portfolios().back(), at == 0 ? "Old" : "New");
    }
    killed = true;
    for (int at = 0; killed; ++at) {
        const DataFolder folder;
        fill(folder);
        killed = KilledAt(folder, at, [](DATABASE& portfolios, DATABASE& investments) {
            return DeletePortfolio(portfolios, investments, "old");
        });
        const Texts all = folder.Investments();
        EXPECT_EQ(std::count(all.begin(), all.end(), "Other/n"), 117) << at;
        EXPECT_TRUE(killed || (at > 3 && all.size() == 117));
    }
}

TEST(PortfolioRules, CopiesDifferInTheirPortfolioAlone) {
    const DataFolder folder;
    INVESTMENT_DATA copied = MakeInvestment("A much longer name than below", "Fund");
    copied.PrevPrice = 3;
    copied.QuoteError = 1;
    const INVESTMENT_DATA both[] = {copied, MakeInvestment("Other", "Second")};
    DATABASE file(folder.File("invest.db").c_str());
    EXPECT_TRUE(AppendCopies(file, both, "New one"));

    INVESTMENT_DATA record;
    ASSERT_TRUE(ReadInvestment(file, 0, &record));
    INVESTMENT_DATA expected = copied;
    CopyTextZeroed(expected.Portfolio, "New one");
    EXPECT_EQ(std::memcmp(&record, &expected, offsetof(INVESTMENT_DATA, Unused)), 0);
    EXPECT_EQ(folder.Investments(), (Texts{"New one/Fund", "New one/Second"}));
}

} // namespace
