#include <CLI/CLI.hpp>
#include <cmath>
#include <cstring>
#include <filesystem>
#include <memory>
#include <optional>
#include <sys/stat.h>
#include <unistd.h>

#include "app/model/DataFolders.h"
#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "db/Database.h"
#include "platform/ViewPicture.h"
#include "tools/Commands.h"
#include "util/File.h"
#include "util/Strings.h"

namespace {

constexpr int WrongUse = 2;

struct ChartOptions : PortfolioOptions {
    std::string chart;
    float scale = 2;
};

// By code or by title in any letter case; null for neither.
const ChartInfo* FindChart(const std::string& wanted) {
    for (const ChartInfo& chart : Charts)
        if (wanted == std::to_string(chart.code) || strcmpi(wanted.c_str(), chart.title) == 0)
            return &chart;
    return nullptr;
}

std::optional<PictureFormat> FormatOf(const std::string& path) {
    const std::string extension = std::filesystem::path(path).extension().string();
    if (strcmpi(extension.c_str(), ".png") == 0)
        return PictureFormat::Png;
    if (strcmpi(extension.c_str(), ".svg") == 0)
        return PictureFormat::Svg;
    if (strcmpi(extension.c_str(), ".pdf") == 0)
        return PictureFormat::Pdf;
    return std::nullopt;
}

// The errno number that tells why there is something that a picture must not replace, or 0.
int WhyNotReplaced(const std::string& path) {
    struct stat status {};
    if (stat(path.c_str(), &status) != 0)
        return 0;
    if (!S_ISREG(status.st_mode))
        return S_ISDIR(status.st_mode) ? EISDIR : EOPNOTSUPP;
    return access(path.c_str(), W_OK) == 0 ? 0 : errno;
}

// A file that exists keeps its permissions, and a link to it stays a link.
int Write(const std::string& path, const std::string& bytes) {
    const mode_t mask = umask(0);
    umask(mask);
    const std::string target = RealPath(path);
    int error = WhyNotReplaced(target);
    if (error == 0)
        error = WriteWholeFile(target, target + ".part" + std::to_string(getpid()), bytes, 0666 & ~mask,
                               ExistingFile::Replace);
    return error == 0 ? 0 : Fail(path + " cannot be written: " + Reason(error));
}

int DrawChart(const ChartOptions& options, const ChartInfo& chart, PictureFormat format,
              DATABASE& investments) {
    const OffscreenApplication application;
    ChartDataSets dataSets;
    float total = 0;
    const ChartData data = ReadChartData(investments, options.portfolio.c_str(), dataSets, total);
    if (data == ChartData::NotRead)
        return Fail("the investments in " + options.home + " could not all be read");
    if (data == ChartData::NoMemory)
        return Fail("there is not enough memory for the portfolio's charts");
    const BRect area = ChartArea();
    std::string bytes;
    if (chart.code == GrowthChart) {
        ValueChartView view(area, total, ValueChartView::Controls::None);
        bytes = DrawPicture(&view, format, options.scale);
    } else {
        PieChartView view(area);
        ShowDataSet(view, dataSets, chart.code);
        bytes = DrawPicture(&view, format, options.scale);
    }
    return bytes.empty() ? Fail("the chart could not be drawn") : Write(options.output, bytes);
}

int RunChart(ChartOptions& options) {
    const ChartInfo* chart = FindChart(options.chart);
    if (!chart)
        return Fail("there is no chart '" + options.chart + "'; there are 2000 to 2007, or their titles",
                    WrongUse);
    const std::optional<PictureFormat> format = FormatOf(options.output);
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
