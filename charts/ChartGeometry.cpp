#include "charts/ChartGeometry.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <numbers>

#include "util/Numbers.h"
#include "util/Utf8.h"

namespace {

constexpr float FullTurn = 360;
constexpr float LeastSweep = 0.1F; // a fifth of a pixel on the rim of a window's pie

std::string Fixed(double value) {
    char text[96]; // a share of the smallest float has more digits than the largest float
    FormatFixed(value, text, sizeof text, 2);
    return text;
}

bool IsRightToLeft(char32_t code) {
    constexpr struct {
        char32_t first, last;
    } ranges[] = {{0x590, 0x8FF},   {0x200F, 0x200F},   {0x202A, 0x202E},  {0xFB1D, 0xFDFF},
                  {0xFE70, 0xFEFF}, {0x10800, 0x10FFF}, {0x1E800, 0x1EFFF}};
    return std::any_of(std::begin(ranges), std::end(ranges),
                       [code](const auto& range) { return code >= range.first && code <= range.last; });
}

// Such a label would turn the order of the numbers behind it as well. Between these two invisible characters
// it keeps its direction to itself.
std::string Isolated(const std::string& label) {
    for (std::string_view rest = label; !rest.empty();) {
        const Utf8Character character = DecodeFirst(rest);
        if (IsRightToLeft(character.code))
            return "\u2068" + label + "\u2069";
        rest.remove_prefix(std::max<std::size_t>(character.length, 1));
    }
    return label;
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

BPoint PointInPie(const PieEllipse& pie, float angle, float part) {
    const float radians = angle / 180 * std::numbers::pi_v<float>;
    return {pie.center.x + pie.xRadius * part * std::cos(radians),
            pie.center.y - pie.yRadius * part * std::sin(radians)};
}

bool IsPie(double total) {
    return std::isfinite(total) && total != 0;
}

std::vector<PieSlice> SlicesOf(const float* values, int count) {
    std::vector<PieSlice> slices;
    const auto drawn = [values](int i) { return values[i] > 0 ? static_cast<double>(values[i]) : 0.0; };
    double whole = 0;
    for (int i = 0; i < count; ++i)
        whole += drawn(i);
    if (!IsPie(whole))
        return slices;
    double sum = 0;
    float start = 0;
    for (int i = 0; i < count; ++i) {
        sum += drawn(i);
        const auto end = static_cast<float>(sum / whole * FullTurn);
        if (end - start < LeastSweep)
            continue;
        slices.push_back({start, end - start, i});
        start = end;
    }
    slices.back().sweep = FullTurn - slices.back().start;
    return slices;
}

int ValueAt(const std::vector<PieSlice>& slices, const PieEllipse& pie, BPoint where) {
    const float x = (where.x - pie.center.x) / pie.xRadius;
    const float y = (pie.center.y - where.y) / pie.yRadius;
    if (x * x + y * y > 1)
        return -1;
    const float angle = std::atan2(y, x) / std::numbers::pi_v<float> * 180;
    const float turned = angle < 0 ? angle + FullTurn : angle;
    const auto found = std::find_if(slices.begin(), slices.end(), [turned](const PieSlice& slice) {
        return turned <= slice.start + slice.sweep;
    });
    return found == slices.end() ? -1 : found->value;
}

std::string LegendLine(const char* label, float value, float total, int decimalPlaces) {
    if (decimalPlaces != 2 && decimalPlaces != 3)
        return Isolated(label);
    const char* unit = decimalPlaces == 2 ? ": $" : ": ";
    const double share = static_cast<double>(value) / total * 100;
    return Isolated(label) + unit + Fixed(value) + " " + Fixed(share) + "%";
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
    const double part = (static_cast<double>(value) - from) / (static_cast<double>(to) - from);
    return std::isfinite(part) ? static_cast<float>(begin + part * (end - begin)) : begin;
}
