// The rules of the commands and the texts of a row, on real data files and without a window.
#include <cmath>
#include <limits>

#include "DataFolder.h"
#include "InChild.h"
#include "app/model/CutFile.h"
#include "app/model/InvestmentTexts.h"
#include "app/model/PortfolioRules.h"
#include "db/FaultyFiles.h"

namespace {

using Texts = std::vector<std::string>;

template <class Formatter, class... Values>
std::string TextOf(Formatter format, Values... values) {
    FigureText text;
    format(values..., text);
    return text;
}

TEST(InvestmentTexts, FiguresAreWholeAndPricesOfStocksInFractions) {
    std::string prices, types;
    for (const float price :
         {12.375F, 12.5F, 12.04F, 0.5F, 8388607.5F, 12.9999F, -12.5F, HUGE_VALF, std::nanf("")})
        prices += TextOf(FormatPrice, price, "my STOCKS") + "|";
    EXPECT_EQ(prices, "12 3/8|12 1/2|12 1/32|0 1/2|8388607 1/2|12 31/32|-12|inf|nan|");
    // The letter before the last two has no ASCII case.
    for (const char* type : {"Stock", "", "sto ck", "\xC3\x9Cstock", "\xC3\x9CSTOCK"})
        types += TextOf(FormatPrice, 12.375F, type) + "|";
    EXPECT_EQ(types, "12 3/8|12.38|12.38|12 3/8|12.38|");
    EXPECT_EQ(TextOf(FormatPrice, std::numeric_limits<float>::max(), "Fund"),
              "340282346638528859811704183484516925440.00");
    EXPECT_EQ(TextOf(FormatShares, 1.0005F), "1.000"); // just below in binary
    EXPECT_EQ(TextOf(FormatValue, 1e17F), "99999998,430,674,944.00");
}

TEST(PortfolioRules, OnlyFilesOfTheProgramsLayoutAreTaken) {
    const DataFolder folder;
    std::string holds;
    for (const char* name : {"portfol.db", "invest.db", "misc.db", "none"}) {
        DATABASE file(folder.File(name).c_str());
        holds += std::string(HoldsPortfolios(file) ? "P" : "") + (HoldsInvestments(file) ? "I" : "") +
                 (HoldsCategories(file) ? "C" : "") + "|";
    }
    EXPECT_EQ(holds, "P|I|C||");
    for (const std::string name : {"Portfolio", "portfolio"}) {
        for (const int rest : {197, 198, 406, 407}) { // bytes of data behind the first column
            COLUMN_ENTRY columns[] = {{"", ColumnType::String, NameSize, 0, 0},
                                      {"Rest", ColumnType::String, static_cast<std::int16_t>(rest), 0, 0}};
            CopyText(columns[0].name, name);
            std::filesystem::remove(folder.File("none"));
            DATABASE file(nullptr);
            ASSERT_EQ(file.Create(folder.File("none").c_str(), "", 2, columns), 0);
            EXPECT_EQ(HoldsInvestments(file), name == "Portfolio" && rest > 197 && rest < 407) << rest;
        }
    }
}

// A folder with these portfolios and an investment "n" of each of these.
struct FilledFolder : DataFolder {
    FilledFolder(const Texts& names, const Texts& holders) {
        for (const std::string& name : names)
            AddPortfolio(name);
        for (const std::string& holder : holders)
            AddInvestment(MakeInvestment(holder, "n"));
    }
};
struct OpenFolder : FilledFolder {
    using FilledFolder::FilledFolder;
    FaultyFiles portfolioFiles, investmentFiles;
    DATABASE portfolios{File("portfol.db").c_str(), portfolioFiles};
    DATABASE investments{File("invest.db").c_str(), investmentFiles};
};

TEST(PortfolioRules, AWalkVisitsThePortfoliosInvestmentsInRecordOrder) {
    const DataFolder folder;
    for (const auto& [portfolio, value] : {std::pair{"My Fund", 0.1F},
                                           {"Other", 1.F},
                                           {"my fund", 16777216.F},
                                           {"My Fund", 1.F},
                                           {"My Fund ", 1.F}})
        folder.AddInvestment(MakeInvestment(portfolio, portfolio, 1, value));
    DATABASE file(folder.File("invest.db").c_str());
    file.Delete(1);
    std::vector<long> seen;
    EXPECT_TRUE(ForEachInvestment(file, "My Fund",
                                  [&](const INVESTMENT_DATA&, long number) { seen.push_back(number); }));
    EXPECT_EQ(seen, (std::vector<long>{0, 2, 3}));
    // In single precision and that order: the tenth and the one are lost beside the large value.
    EXPECT_EQ(TotalValue(file, "My Fund"), 16777216.F);
    // The report goes on from there.
    EXPECT_EQ(static_cast<const INVESTMENT_DATA*>(file.QueryGetFirst(nullptr))->Value, 0.1F);
}

TEST(PortfolioRules, DeletingTakesAllOfThatNameAndNothingElse) {
    OpenFolder folder({"A", "b c", "a", "A\tx"}, {"A", "b c", "a", "A", "AA"});
    // A name that no query can hold must not be taken for the part of it that one can.
    for (const char* name : {"A\tx", "A\n", "", "none"})
        EXPECT_TRUE(DeletePortfolio(folder.portfolios, folder.investments, name));
    EXPECT_EQ(folder.portfolios.GetNumberOfActiveRecords(), 4);
    EXPECT_EQ(folder.investments.GetNumberOfActiveRecords(), 5);

    EXPECT_TRUE(DeletePortfolio(folder.portfolios, folder.investments, "A"));
    EXPECT_EQ(folder.Portfolios(), (Texts{"b c", "A\tx"}));
    EXPECT_EQ(folder.Investments(), (Texts{"b c/n", "AA/n"}));
}

TEST(PortfolioRules, ARenameTakesEveryInvestmentAlong) {
    OpenFolder folder({"Old", "Other"}, {"old", "Other", "Old", "Old one"});
    for (const auto& [from, to, done] :
         {std::tuple{"Old", "  New name", true},
          {"Other", "Alone", true},
          {"Old", "x", false},
          {"A\tx", "x", false},
          // What the investments could not take must not be given to the portfolio alone.
          {"Alone", "", false},
          {"Alone", "a\tb", false},
          {"Alone", "a name of exactly 32 characters.", false}})
        EXPECT_EQ(RenamePortfolio(folder.portfolios, folder.investments, from, to), done) << from << to;
    EXPECT_EQ(folder.Portfolios(), (Texts{"  New name", "Alone"}));
    EXPECT_EQ(folder.Investments(), (Texts{"  New name/n", "Alone/n", "  New name/n", "Old one/n"}));
}

TEST(PortfolioRules, AReadErrorIsNoEmptyPortfolio) {
    OpenFolder folder({"Old"}, {"Other", "Old"});
    DATABASE &portfolios = folder.portfolios, &investments = folder.investments;
    FaultyFiles *inPortfolios = &folder.portfolioFiles, *inInvestments = &folder.investmentFiles;
    constexpr int walk = 14;     // a read behind those of the query
    investments.SetReadCache(0); // so that a walk reads, too
    const std::tuple<std::function<bool()>, FaultyFiles*, int> cases[] = {
        {[&] { return AddPortfolio(portfolios, "Old"); }, inPortfolios, 0},
        {[&] { return !RestorePortfolios(portfolios, investments).empty(); }, inPortfolios, 0},
        {[&] { return RenamePortfolio(portfolios, investments, "Old", "New"); }, inInvestments, 0},
        {[&] { return DeletePortfolio(portfolios, investments, "Old"); }, inInvestments, walk},
        {[&] { return TotalValue(investments, "Old").has_value(); }, inInvestments, walk}};
    for (const auto& [done, files, at] : cases) {
        files->Arm(Fault::NoReads, at);
        EXPECT_FALSE(done());
        EXPECT_TRUE(files->Disarm());
    }
    EXPECT_EQ(folder.Portfolios(), Texts{"Old"});
    EXPECT_EQ(folder.Investments(), (Texts{"Other/n", "Old/n"}));
}

TEST(PortfolioRules, LostPortfoliosAreListedAgainByTheNamesOfTheirInvestments) {
    const std::string umlaut = "\xC3\x84";
    OpenFolder folder({"Kept", umlaut + "ra"},
                      {"KEPT", "Lost", "kept", "lost", umlaut + "RA", "", "a\tb", "Gone", "Lost"});
    folder.investments.Delete(7);
    EXPECT_EQ(RestorePortfolios(folder.portfolios, folder.investments), (Texts{"Lost", umlaut + "RA"}));
    EXPECT_EQ(folder.Portfolios(), (Texts{"Kept", umlaut + "ra", "Lost", umlaut + "RA"}));
    EXPECT_EQ(RestorePortfolios(folder.portfolios, folder.investments), Texts{});
}

TEST(PortfolioRules, KilledAnywhereARenameLosesNoInvestment) {
    // Far enough apart that they are written one by one.
    Texts holders(120, "Other");
    holders[0] = holders[40] = holders[80] = "Old";
    bool killed = true;
    for (int at = 0; killed; ++at) {
        ASSERT_LT(at, 100);
        const FilledFolder folder({"Other", "Old"}, holders);
        const auto work = [&] {
            FaultyFiles files;
            DATABASE portfolios(folder.File("portfol.db").c_str(), files);
            DATABASE investments(folder.File("invest.db").c_str(), files);
            files.Arm(Fault::KilledBefore, at);
            return RenamePortfolio(portfolios, investments, "Old", "New");
        };
        killed = ResultInChild(work) == -1;
        const Texts all = folder.Investments();
        const auto count = [&](const char* text) { return std::count(all.begin(), all.end(), text); };
        EXPECT_TRUE(count("Other/n") == 117 && count("Old/n") + count("New/n") == 3) << at;
        EXPECT_EQ(folder.Portfolios(), (Texts{"Other", at == 0 ? "Old" : "New"}));
        EXPECT_TRUE(killed || (at > 3 && count("Old/n") == 0)) << at;
    }
}

TEST(CutFile, PutsBackWhatIsNotThere) {
    const DataFolder folder;
    std::vector<INVESTMENT_DATA> cut;
    for (const char* name : {"deleted", "not reached", "changed since"}) {
        cut.push_back(MakeInvestment("P", name));
        folder.AddInvestment(cut.back());
    }
    cut[0].Unused[0] = 'x'; // a file with longer records
    FaultyFiles files;
    DATABASE investments(folder.File("invest.db").c_str(), files);
    const CutFile file(folder.Path(), files);
    EXPECT_EQ(file.Restore(investments), CutFile::Outcome::NothingKept);
    folder.Write("cut.db.tmp", "left by a kill");
    ASSERT_TRUE(file.Keep(cut, std::vector<long>{0, 1, 2}));
    EXPECT_EQ(std::filesystem::status(folder.File("cut.db")).permissions(), std::filesystem::perms{0600});
    EXPECT_FALSE(file.Keep(cut, std::vector<long>{0, 1, 2})) << "what is kept is not replaced";
    files.Arm(Fault::NoRead, 0);
    EXPECT_EQ(file.Restore(investments), CutFile::Outcome::Failed) << "it may all be there";
    files.Disarm();
    investments.Delete(0);
    const INVESTMENT_DATA other = MakeInvestment("P", "other");
    investments.Write(2, &other);
    EXPECT_EQ(file.Restore(investments), CutFile::Outcome::Restored);
    EXPECT_EQ(folder.Investments(), (Texts{"P/not reached", "P/other", "P/deleted", "P/changed since"}));
    EXPECT_EQ(files.Order().substr(files.Order().size() - 3), "sxs") << "on the disk before its copy goes";
    EXPECT_FALSE(folder.Has("cut.db") || folder.Has("cut.db.tmp"));
    folder.Write("cut.db", "damaged");
    EXPECT_EQ(file.Restore(investments), CutFile::Outcome::Failed);
    EXPECT_TRUE(folder.Has("cut.db"));
}

TEST(CutFile, IsThereWholeOrNotAtAll) {
    const DataFolder folder;
    const std::vector<INVESTMENT_DATA> cut = {MakeInvestment("P", "a"), MakeInvestment("P", "b")};
    FaultyFiles files;
    const CutFile file(folder.Path(), files);
    bool met = true;
    for (int call = 0; met; ++call) {
        ASSERT_LT(call, 100);
        files.Arm(Fault::Error, call);
        const bool kept = file.Keep(cut, std::vector<long>{0, 1});
        met = files.Disarm();
        EXPECT_EQ(kept, !met) << call;
        EXPECT_TRUE(folder.Has("cut.db") == kept && !folder.Has("cut.db.tmp")) << call;
    }
    // A killed machine has no file under its name whose bytes are not there.
    EXPECT_EQ(files.Order().substr(files.Order().size() - 3), "srs");
}

} // namespace
