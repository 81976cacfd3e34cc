// Prints how long the commands that change many investments take beside the same work in SQLite (synchronous
// off, its own journal): a portfolio with a tenth of all investments renamed, and ten thousand investments
// (at most as many as there are) pasted.
//
//   portfolio_bench [--records N] [--rounds N] [--folder PATH]

#include <unistd.h>

#include "BenchData.h"
#include "app/model/PortfolioRules.h"

namespace {

constexpr long PastedAtMost = 10'000;

// The portfolio that every tenth investment belongs to; Risk, which the made-up data has "Med" in for these,
// names it.
bool GatherPortfolio(DATABASE& investments, Peer& peer) {
    investments.Query("Risk = med", QueryMode::New);
    return investments.QueryUpdate("Portfolio = Growth") ==
           peer.Change("UPDATE t SET Portfolio = 'Growth' WHERE Risk = 'med'");
}

bool MakePortfolios(DATABASE& portfolios, const std::string& path) {
    return portfolios.Create(path.c_str(), "benchmark", 1, PortfolioColumns.data()) == 0 &&
           AddPortfolio(portfolios, "Growth");
}

void Print(const char* work, double ours, double theirs) {
    std::printf("%-36s %10.2f ms   SQLite %10.2f ms   ratio %5.2f (at most 1)\n", work, ours * 1e3,
                theirs * 1e3, ours / theirs);
}

bool MeasureRename(const OPTIONS& options, DATABASE& portfolios, DATABASE& investments, Peer& peer) {
    bool good = true;
    int turn = 0;
    const char* const names[] = {"Growth", "Retirement"};
    const double ours = Shortest(options.rounds, [&] {
        good &= RenamePortfolio(portfolios, investments, names[turn % 2], names[(turn + 1) % 2]);
        ++turn;
    });
    const char* const updates[] = {"UPDATE t SET Portfolio = 'Retirement' WHERE Portfolio = 'Growth'",
                                   "UPDATE t SET Portfolio = 'Growth' WHERE Portfolio = 'Retirement'"};
    long changed = 0;
    turn = 0;
    const double theirs = Shortest(options.rounds, [&] { changed = peer.Change(updates[turn++ % 2]); });
    Print("rename a portfolio of a tenth", ours, theirs);
    return good && changed == SelectInvestments(investments, names[turn % 2]);
}

bool MeasurePaste(const OPTIONS& options, DATABASE& investments, Peer& peer) {
    const long count = std::min(PastedAtMost, options.records);
    std::vector<INVESTMENT_DATA> clipboard(static_cast<std::size_t>(count));
    for (long i = 0; i < count; ++i)
        FillInvestment(i, reinterpret_cast<char*>(&clipboard[static_cast<std::size_t>(i)]));
    bool good = true;
    const double ours = Shortest(
        options.rounds, [&] { good &= AppendCopies(investments, clipboard, "Another portfolio"); });
    const double theirs = Shortest(options.rounds, [&] { peer.Insert(0, count); });
    Print("paste investments", ours, theirs);
    return good;
}

bool Measure(const OPTIONS& options, const std::string& folder) {
    DATABASE portfolios(nullptr);
    if (!MakeFile(folder + "/invest.db", options.records) ||
        !MakePortfolios(portfolios, folder + "/portfol.db"))
        return false;
    DATABASE investments((folder + "/invest.db").c_str());
    Peer peer(folder + "/peer.sqlite", options.peerCache, Peer::Journal::Default);
    peer.Make(options.records);
    std::printf("%ld investments\n", options.records);
    return GatherPortfolio(investments, peer) && MeasureRename(options, portfolios, investments, peer) &&
           MeasurePaste(options, investments, peer) && peer.IsGood();
}

} // namespace

int main(int argc, char** argv) {
    OPTIONS options(1'000'000);
    if (!ReadOptions(argc, argv, &options)) {
        std::fprintf(stderr, "usage: portfolio_bench [--records N] [--rounds N] [--folder PATH]\n");
        return 2;
    }
    std::string folder = options.folder + "/portfolio_bench.XXXXXX";
    if (mkdtemp(folder.data()) == nullptr) {
        std::perror(folder.c_str());
        return 1;
    }
    const bool good = Measure(options, folder);
    std::filesystem::remove_all(folder);
    return good ? 0 : 1;
}
