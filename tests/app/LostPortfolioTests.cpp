// Investments whose portfolio is not in the list: the program lists it again at its start.
#include <gtest/gtest.h>

#include "Program.h"
#include "app/model/PortfolioRules.h"

namespace {

TEST(LostPortfolios, AreListedAgainByTheNamesOfTheirInvestments) {
    const DataFolder folder;
    const std::string umlaut = "\xC3\x84";
    for (const std::string& name : {std::string("Kept"), umlaut + "ra"})
        folder.AddPortfolio(name);
    for (const std::string& portfolio :
         Texts{"KEPT", "Lost", "kept", "lost", umlaut + "RA", "", "a\tb", "Gone", "Lost"})
        folder.AddInvestment(MakeInvestment(portfolio, "n"));
    DATABASE portfolioFile(folder.File("portfol.db").c_str());
    DATABASE investmentFile(folder.File("invest.db").c_str());
    investmentFile.Delete(7);
    EXPECT_EQ(RestorePortfolios(portfolioFile, investmentFile), (Texts{"Lost", umlaut + "RA"}));
    EXPECT_EQ(folder.Portfolios(), (Texts{"Kept", umlaut + "ra", "Lost", umlaut + "RA"}));
    EXPECT_EQ(RestorePortfolios(portfolioFile, investmentFile), Texts{});
    EXPECT_EQ(SelectInvestments(investmentFile, "Lost"), 3);
}

TEST(LostPortfolios, AreNamedAtTheStart) {
    Program program;
    program.AddPortfolio("New");
    program.AddInvestment(MakeInvestment("New", "renamed"));
    program.AddInvestment(MakeInvestment("Old", "not reached"));
    program.Answer("There are investments of portfolios that were not in the list. These portfolios are in "
                   "the list again: \"Old\".",
                   "Ok");
    program.Expect({"not reached"}).Select("New").Expect({"renamed"});
    EXPECT_EQ(program.RunAndClose(), 0);
    EXPECT_EQ(program.Portfolios(), (Texts{"New", "Old"}));
}

} // namespace
