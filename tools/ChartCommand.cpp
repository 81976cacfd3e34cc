#include <CLI/CLI.hpp>
#include <cmath>
#include <cstring>
#include <memory>
#include <optional>

#include "charts/ChartPicture.h"
#include "charts/ChartWindow.h"
#include "db/Database.h"
#include "tools/Commands.h"
#include "tools/Sentences.h"
#include "util/Strings.h"

namespace {

constexpr int WrongUse = 2;

struct ChartOptions : PortfolioOptions {
    std::string chart;
    float scale = PictureScale;
};

// By code or by title in any letter case; null for neither.
const ChartInfo* FindChart(const std::string& wanted) {
    for (const ChartInfo& chart : Charts)
        if (wanted == std::to_string(chart.code) || strcmpi(wanted.c_str(), chart.title) == 0)
            return &chart;
    return nullptr;
}

int DrawChart(const ChartOptions& options, const ChartInfo& chart, PictureFormat format,
              DATABASE& investments) {
    const OffscreenApplication application;
    ChartDataSets dataSets;
    float total = 0;
    const ChartData data = ReadChartData(investments, options.portfolio.c_str(), dataSets, total);
    if (data == ChartData::NotRead)
        return Fail(NotAllRead("investments", options.home));
    if (data == ChartData::NoMemory)
        return Fail("there is not enough memory for the portfolio's charts");
    if (!std::isfinite(total))
        return Fail("a value in the portfolio is not a number, or too large for one");
    const std::string picture = ChartPicture(options.portfolio.c_str(), dataSets, total, chart.code,
                                             GrowthRates::All, format, options.scale);
    return picture.empty() ? Fail("the chart could not be drawn") : WriteOutputFile(options.output, picture);
}

int RunChart(ChartOptions& options) {
    const ChartInfo* chart = FindChart(options.chart);
    if (!chart)
        return Fail("there is no chart '" + options.chart + "'; there are 2000 to 2007, or their titles",
                    WrongUse);
    const std::optional<PictureFormat> format = PictureFormatOf(options.output);
    if (!format)
        return Fail("the name of the picture must end with .png, .svg or .pdf", WrongUse);
    if (std::isnan(options.scale)) // which no range keeps out
        return Fail("the scale must be a number", WrongUse);
    const auto investments = OpenInvestments(options);
    return investments ? DrawChart(options, *chart, *format, *investments) : 1;
}

std::string ChartList() {
    std::string list = "The charts:";
    for (const ChartInfo& chart : Charts)
        list += "\n  " + std::to_string(chart.code) + "  " + chart.title;
    return list;
}

} // namespace

void AddChartCommand(CLI::App& application, int& status) {
    CLI::App* command =
        application.add_subcommand("chart", "Write one of a portfolio's charts into a picture file.");
    const auto options = std::make_shared<ChartOptions>();
    AddPortfolioOptions(*command, *options, "A .png, .svg or .pdf file; replaced where it exists");
    command->add_option("CHART", options->chart, "The chart's code or title, in any letter case")->required();
    command->add_option("--scale", options->scale, "Pixels of a .png for each pixel of the window")
        ->check(CLI::Range(0.25F, 16.0F))
        ->capture_default_str();
    AddHomeOption(*command, options->home);
    command->footer(ChartList());
    command->callback([options, &status] { status = RunChart(*options); });
}
