#pragma once

#include <array>
#include <functional>
#include <string>
#include <vector>

#include "platform/Rect.h"

// Where the charts put what, and what they write, without a view to draw in. All functions are pure; lengths
// are logical pixels, angles degrees, counter-clockwise from three o'clock.

// --- pie charts ---

struct PieRects {
    BRect title;
    BRect legend; // overlaps the chart: long texts run over the pie's left part
    BRect chart;
};
[[nodiscard]] PieRects LayOutPie(BRect bounds);

struct PieEllipse {
    BPoint center;
    float xRadius;
    float yRadius;
};
// As wide as the chart's shorter side, and six tenths as high as it is wide.
[[nodiscard]] PieEllipse EllipseIn(BRect chart);

struct PieSlice {
    float start;
    float sweep;
    int value; // whose colour it has
};
// A slice for every value, in order, from 0 degrees on: its sweep is its share of total times 360. Slices too
// narrow to be told apart are one with the next that is not, so that a thousand of them take no longer to
// draw than can be seen. None when total is 0 or no number.
[[nodiscard]] std::vector<PieSlice> SlicesOf(const float* values, int count, float total);

// Whether a pie can be made of values with this sum.
[[nodiscard]] bool IsPie(float total);

// A legend's line. With 2 decimal places label, amount of money and share of the total, with 3 the same for a
// plain number, with any other number of places the label alone.
[[nodiscard]] std::string LegendLine(const char* label, float value, float total, int decimalPlaces);

// The same with the label's end replaced by three dots where the line would be wider than `width`: a number
// whose end is cut off would be another number. `measure` gives a text's width.
[[nodiscard]] std::string FittedLegendLine(const char* label, float value, float total, int decimalPlaces,
                                           float width,
                                           const std::function<float(const std::string&)>& measure);

// --- growth chart ---

inline constexpr int GrowthYears = 25;
inline constexpr std::array<float, 5> Percentages = {0.05F, 0.10F, 0.15F, 0.20F, 0.25F};
using GrowthRow = std::array<float, GrowthYears + 1>;

struct GrowthRects {
    BRect title;
    BRect legend; // and the check box
    BRect frame;
    BRect graph;
};
[[nodiscard]] GrowthRects LayOutGrowth(BRect bounds, float fontHeight);

// The value after each year, worked out year by year in single precision.
[[nodiscard]] GrowthRow Grow(float currentValue, float rate);

// A place on an axis: `from` lies on its begin, `to` on its end. An axis without a length, or of values that
// are no numbers, has all on its begin.
[[nodiscard]] float PlaceOnAxis(float value, float from, float to, float begin, float end);
