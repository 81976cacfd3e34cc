#include "tools/ChartCommand.h"

#include <CLI/CLI.hpp>
#include <cmath>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <memory>
#include <optional>
#include <sys/stat.h>
#include <unistd.h>

#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "db/Database.h"
#include "platform/ViewPicture.h"
#include "tools/HomeFolder.h"
#include "tools/OffscreenApplication.h"
#include "util/Strings.h"
#include "util/WholeFile.h"

namespace {

constexpr int Failed = 1;
constexpr int WrongUse = 2;

struct ChartOptions {
    std::string home;
    std::string portfolio;
    std::string chart;
    std::string output;
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

int Fail(const std::string& sentence, int status = Failed) {
    std::cerr << "quorvan-cli: " << sentence << '\n';
    return status;
}

struct OutputTarget {
    std::string path;
    mode_t mode;
};

// A file that exists keeps its permissions, and a link to it stays a link. Nothing, with errno telling why,
// when there is something that a picture must not replace.
std::optional<OutputTarget> TargetOf(const std::string& path) {
    std::error_code missing;
    const std::string existing = std::filesystem::canonical(path, missing).string();
    if (missing) {
        const mode_t mask = umask(0);
        umask(mask);
        return OutputTarget{path, 0666 & ~mask};
    }
    struct stat status {};
    if (stat(existing.c_str(), &status) != 0 || access(existing.c_str(), W_OK) != 0)
        return std::nullopt;
    if (!S_ISREG(status.st_mode)) {
        errno = S_ISDIR(status.st_mode) ? EISDIR : EOPNOTSUPP;
        return std::nullopt;
    }
    return OutputTarget{existing, status.st_mode & 0777U};
}

int Write(const std::string& path, const std::string& bytes) {
    const std::optional<OutputTarget> target = TargetOf(path);
    if (target && WriteWholeFile(target->path, target->path + ".part" + std::to_string(getpid()), bytes,
                                 target->mode, ExistingFile::Replace))
        return 0;
    return Fail(path + " cannot be written: " + std::strerror(errno));
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
    if (options.home.empty())
        options.home = DefaultHomeFolder();
    const auto investments = OpenInvestments(options.home, options.portfolio, std::cerr);
    return investments ? DrawChart(options, *chart, *format, *investments) : Failed;
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
    command->add_option("PORTFOLIO", options->portfolio, "The portfolio's name")->required();
    command->add_option("CHART", options->chart, "The chart's code or title, in any letter case")->required();
    command->add_option("-o,--output", options->output, "A .png, .svg or .pdf file; replaced where it exists")
        ->required()
        ->type_name("FILE");
    command->add_option("--scale", options->scale, "Pixels of a .png for each pixel of the window")
        ->check(CLI::Range(0.25F, 16.0F))
        ->capture_default_str();
    command
        ->add_option("--home", options->home,
                     "Quorvan's folder (default: that of quorvan-cli when it holds an "
                     "invest.db, else ~/Quorvan)")
        ->type_name("FOLDER");
    command->footer(ChartList());
    command->callback([options, &status] { status = RunChart(*options); });
}
