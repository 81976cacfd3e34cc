#include "charts/ChartGeometry.h"

#include <algorithm>
#include <cmath>

#include "util/Numbers.h"
#include "util/Utf8.h"

namespace {

constexpr float FullTurn = 360;
constexpr float LeastSweep = 0.1F; // a fifth of a pixel on the rim of a window's pie

std::string Fixed(double value) {
    char text[64]; // a float's 39 digits and two more
    FormatFixed(value, text, sizeof text, 2);
    return text;
}

} // namespace

PieRects LayOutPie(BRect bounds) {
    const float titleBottom = bounds.bottom / 10;
    return {{bounds.left, bounds.top, bounds.right, titleBottom},
            {bounds.left + 5, titleBottom + 1, bounds.right, bounds.bottom},
            {bounds.right / 3, titleBottom + 1, bounds.right - 5, bounds.bottom}};
}

PieEllipse EllipseIn(BRect chart) {
    const float width = chart.Width();
    const float height = chart.Height();
    const float radius = std::min(width, height) * 0.5F;
    return {{chart.left + width * 0.5F, chart.top + height * 0.5F}, radius, radius * 6 / 10};
}

bool IsPie(float total) {
    return std::isfinite(total) && total != 0;
}

std::vector<PieSlice> SlicesOf(const float* values, int count, float total) {
    std::vector<PieSlice> slices;
    if (!IsPie(total))
        return slices;
    float angle = 0;
    float drawn = 0;
    for (int i = 0; i < count; ++i) {
        // Values below 0 among others can make shares of more than the whole.
        const float sweep = std::clamp(values[i] / total * FullTurn, -FullTurn, FullTurn);
        angle += sweep;
        if (std::abs(angle - drawn) < LeastSweep && i + 1 < count)
            continue;
        if (angle != drawn)
            slices.push_back({drawn, std::clamp(angle - drawn, -FullTurn, FullTurn), i});
        drawn = angle;
    }
    return slices;
}

std::string LegendLine(const char* label, float value, float total, int decimalPlaces) {
    if (decimalPlaces != 2 && decimalPlaces != 3)
        return label;
    const char* unit = decimalPlaces == 2 ? ": $" : ": ";
    return std::string(label) + unit + Fixed(value) + " " + Fixed(value / total * 100) + "%";
}

std::string FittedLegendLine(const char* label, float value, float total, int decimalPlaces, float width,
                             const std::function<float(const std::string&)>& measure) {
    const auto line = [&](const std::string& text) {
        return LegendLine(text.c_str(), value, total, decimalPlaces);
    };
    return line(TruncatedLabel(label, width, [&](const std::string& text) { return measure(line(text)); }));
}

GrowthRects LayOutGrowth(BRect bounds, float fontHeight) {
    GrowthRects rects;
    rects.title = {bounds.left, bounds.top, bounds.right, bounds.bottom / 10};
    rects.frame = {bounds.left + 5, bounds.bottom / 10 + 5, bounds.right - 5, bounds.bottom - 5};
    const BRect& frame = rects.frame;
    rects.graph = {frame.left + frame.Width() * 0.25F, frame.top + frame.Height() / 6,
                   frame.right - frame.Width() / 10, frame.bottom - frame.Height() / 3};
    rects.legend = {frame.left, rects.graph.bottom + 2 * fontHeight, frame.right, frame.bottom};
    return rects;
}

GrowthRow Grow(float currentValue, float rate) {
    GrowthRow row{};
    row[0] = currentValue;
    for (std::size_t year = 1; year < row.size(); ++year)
        row[year] = row[year - 1] * (1 + rate);
    return row;
}

float PlaceOnAxis(float value, float from, float to, float begin, float end) {
    const float place = begin + (value - from) * (end - begin) / (to - from);
    return std::isfinite(place) ? place : begin;
}
