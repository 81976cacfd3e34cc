#include "charts/ChartPicture.h"

#include <cerrno>
#include <filesystem>
#include <sys/stat.h>
#include <unistd.h>

#include "app/model/DataFolders.h"
#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "util/File.h"
#include "util/Strings.h"

namespace {

// The errno number that tells why there is something that a picture must not replace, or 0.
int WhyNotReplaced(const std::string& path) {
    struct stat status {};
    if (stat(path.c_str(), &status) != 0)
        return 0;
    if (!S_ISREG(status.st_mode))
        return S_ISDIR(status.st_mode) ? EISDIR : EOPNOTSUPP;
    return access(path.c_str(), W_OK) == 0 ? 0 : errno;
}

} // namespace

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

int WritePicture(const std::string& path, const std::string& bytes) {
    const mode_t mask = umask(0);
    umask(mask);
    const std::string target = RealPath(path);
    if (const int error = WhyNotReplaced(target); error != 0)
        return error;
    return WriteWholeFile(target, target + ".part" + std::to_string(getpid()), bytes, 0666 & ~mask,
                          ExistingFile::Replace);
}
