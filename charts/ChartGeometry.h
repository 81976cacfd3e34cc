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
// A slice for every value above 0, in order, from 0 degrees on: its sweep is its share of what these come to,
// times 360. Slices too narrow to be told apart are one with the next that is not, or at the end with the
// last, so that a thousand of them take no longer to draw than can be seen. None when the values above 0 come
// to nothing or to no number.
[[nodiscard]] std::vector<PieSlice> SlicesOf(const float* values, int count);

// The value whose slice lies there; -1 beside the pie.
[[nodiscard]] int ValueAt(const std::vector<PieSlice>& slices, const PieEllipse& pie, BPoint where);

// The point in this direction, at a part of the way from the centre to the rim.
[[nodiscard]] BPoint PointInPie(const PieEllipse& pie, float angle, float part);

// Whether values with this sum have shares of it.
[[nodiscard]] bool IsPie(double total);

// A legend's line. With 2 decimal places label, amount of money and share of the total, with 3 the same for a
// plain number, with any other number of places the label alone. The label stands first even when it is
// written from right to left.
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
