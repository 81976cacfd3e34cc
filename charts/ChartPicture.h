#pragma once

#include <optional>
#include <string>

#include "charts/ChartDataSets.h"
#include "platform/ViewPicture.h"

// Charts as picture files. An application object must exist.

inline constexpr float PictureScale = 2; // what a picture is drawn in unless the person says otherwise

enum class GrowthRates { All, Lower };

// The chart with this code as it stands in the window, without its controls; `total` is the value that grows.
// It names the portfolio to who does not see it. As DrawPicture.
[[nodiscard]] std::string ChartPicture(const char* portfolio, const ChartDataSets& dataSets, float total,
                                       std::uint32_t code, GrowthRates rates, PictureFormat format,
                                       float scale = PictureScale);

// By the name's end, in any letter case: .png, .svg or .pdf.
[[nodiscard]] std::optional<PictureFormat> PictureFormatOf(const std::string& path);
