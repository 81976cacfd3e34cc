// Prints how long the charts' data sets take for portfolios of growing size, every investment with a ticker,
// type and name of its own, beside a bare walk of the same records; and how long the first drawing takes.
//
//   chart_bench [--records N] [--rounds N] [--folder PATH]

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "BenchOptions.h"
#include "app/model/PortfolioRules.h"
#include "app/model/RecordLayouts.h"
#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "db/Database.h"
#include "platform/Application.h"
#include "platform/ViewPicture.h"
#include "util/CharacterBuffer.h"

namespace {

bool Fill(DATABASE& file, const std::string& path, long records) {
    if (file.Create(path.c_str(), "", static_cast<int>(InvestmentColumns.size()), InvestmentColumns.data()) !=
        0)
        return false;
    std::vector<INVESTMENT_DATA> all(static_cast<std::size_t>(records));
    for (std::size_t i = 0; i < all.size(); ++i) {
        INVESTMENT_DATA& record = all[i];
        CopyText(record.Portfolio, "All");
        FormatInto(record.Name, sizeof record.Name, "Investment %zu", i);
        FormatInto(record.Ticker, sizeof record.Ticker, "%zX", i);
        FormatInto(record.Type, sizeof record.Type, "Type %zu", i);
        CopyText(record.Risk, "Med");
        record.Shares = record.Price = record.Value = 1;
    }
    return file.AppendAll(all.data(), sizeof(INVESTMENT_DATA), static_cast<std::int32_t>(records)) >= 0;
}

bool Measure(const OPTIONS& options, long records) {
    const std::string path = options.folder + "/quorvan-chart-bench.db";
    std::filesystem::remove(path);
    DATABASE file(nullptr);
    if (!Fill(file, path, records))
        return false;
    float total = 0;
    const double walk = Shortest(options.rounds, [&] { total = TotalValue(file, "All").value_or(-1); });
    ChartDataSets sets;
    const double data = Shortest(options.rounds, [&] {
        if (ReadChartData(file, "All", sets, total) != ChartData::Read)
            std::abort();
    });
    PieChartView view(ChartArea());
    ShowDataSet(view, sets, FirstChart);
    const double drawing =
        Shortest(options.rounds, [&] { static_cast<void>(DrawPicture(&view, PictureFormat::Png)); });
    std::printf(
        "%8ld investments: data sets %8.2f ms, %5.0f ns each; bare walk %7.2f ms; a picture %.1f ms\n",
        records, data * 1e3, data * 1e9 / static_cast<double>(records), walk * 1e3, drawing * 1e3);
    std::filesystem::remove(path);
    return true;
}

} // namespace

int main(int argc, char** argv) {
    setenv("QT_QPA_PLATFORM", "offscreen", 1);
    OPTIONS options(100'000);
    if (!ReadOptions(argc, argv, &options)) {
        std::fprintf(stderr, "usage: chart_bench [--records N] [--rounds N] [--folder PATH]\n");
        return 2;
    }
    const BApplication application("benchmark");
    for (const long part : {100, 10, 1}) {
        if (!Measure(options, std::max(options.records / part, 1L))) {
            std::fprintf(stderr, "chart_bench: the data file could not be made\n");
            return 1;
        }
    }
    return 0;
}
