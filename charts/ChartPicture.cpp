#include "charts/ChartPicture.h"

#include <filesystem>

#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "util/Strings.h"

std::string ChartPicture(const char* portfolio, const ChartDataSets& dataSets, float total,
                         std::uint32_t code, GrowthRates rates, PictureFormat format, float scale) {
    if (code == GrowthChart) {
        ValueChartView view(ChartArea(), total, ValueChartView::Controls::None);
        NameChart(view, portfolio);
        if (rates == GrowthRates::Lower)
            view.Toggle20And25Percent();
        return DrawPicture(&view, format, scale);
    }
    PieChartView view(ChartArea());
    ShowDataSet(view, dataSets, code);
    NameChart(view, portfolio);
    return DrawPicture(&view, format, scale);
}

std::optional<PictureFormat> PictureFormatOf(const std::string& path) {
    const std::string extension = std::filesystem::path(path).extension().string();
    if (strcmpi(extension.c_str(), ".png") == 0)
        return PictureFormat::Png;
    if (strcmpi(extension.c_str(), ".svg") == 0)
        return PictureFormat::Svg;
    if (strcmpi(extension.c_str(), ".pdf") == 0)
        return PictureFormat::Pdf;
    return std::nullopt;
}
