#include "charts/ValueChartView.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>
#include <vector>

#include "charts/ChartDrawing.h"
#include "platform/Button.h"
#include "util/Dates.h"
#include "util/Numbers.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr rgb_color GraphColor{205, 168, 157, 255};
constexpr rgb_color LineColors[] = {colors::red, colors::green, colors::blue, colors::yellow,
                                    colors::magenta};
constexpr const char* CheckBoxLabel = "Graph 20 and 25%";
constexpr const char* Title = "Value over Time";
constexpr std::size_t LowerRates = 3;
constexpr int AxisSteps = 5; // between the first label of an axis and its last
constexpr float LegendIndent = 30;
constexpr float LegendGap = 5;
constexpr float LegendTextWidth = 50;
constexpr float YearHalfWidth = 10;
constexpr float ValueHalfHeight = 10;
constexpr float RateGap = 8; // between a curve's end and its rate
constexpr float RateScale = 0.8F;
constexpr float PointRadius = 4;      // of the mark of what is pointed to
constexpr float LeastReadable = 0.6F; // of the font's size

std::string Percent(float rate) {
    return std::to_string(std::lround(rate * 100)) + "%";
}

std::string Whole(float value) {
    if (!std::isfinite(value))
        return "too large for a number";
    char text[FormatNumberSize];
    FormatNumber(value, text, 0);
    return text;
}

// With an exponent.
std::string Short(float value) {
    char text[FormatNumberSize];
    const auto [end, error] =
        std::to_chars(text, text + sizeof text, value, std::chars_format::scientific, 2);
    return {text, end};
}

} // namespace

ValueChartView::ValueChartView(BRect frame, float currentValue, Controls controls)
    : BView(frame, "value chart view", B_FOLLOW_ALL_SIDES,
            B_WILL_DRAW | B_FRAME_EVENTS | B_NAVIGABLE | B_MOUSE_MOVES),
      currentValue_(currentValue),
      rects_(LayOutGrowth(Bounds(), ::GetFontHeight(be_plain_font))) {
    SetViewColor(colors::gray);
    if (controls == Controls::CheckBox)
        AddCheckBox();
    CalculateDataPoints();
    maximum_ = GetMaxValue();
    GetDate(&year_, nullptr, nullptr);
}

// With a large font the place below the legend would lie outside the view.
void ValueChartView::AddCheckBox() {
    const float height = ::GetFontHeight(be_plain_font);
    const float left = rects_.legend.left + LegendIndent;
    const float top = std::min(rects_.legend.top + 3 * height, Bounds().bottom - height);
    auto* box = new BCheckBox({left, top, left + 2 * StringWidth(CheckBoxLabel), top + height},
                              "last percentage check", CheckBoxLabel, new BMessage(MessageToggleRates));
    box->SetValue(B_CONTROL_ON);
    AddChild(box);
}

void ValueChartView::Toggle20And25Percent() {
    allRates_ = !allRates_;
    CalculateDataPoints();
    maximum_ = GetMaxValue();
    pointed_.reset();
    Invalidate();
}

bool ValueChartView::HasChart() const {
    return currentValue_ > 0 && std::isfinite(currentValue_);
}

std::size_t ValueChartView::RowsInUse() const {
    return allRates_ ? points_.size() : LowerRates;
}

void ValueChartView::CalculateDataPoints() {
    for (std::size_t row = 0; row < RowsInUse(); ++row)
        points_[row] = Grow(currentValue_, Percentages[row]);
}

float ValueChartView::GetMaxValue() const {
    float maximum = currentValue_;
    for (std::size_t row = 0; row < RowsInUse(); ++row)
        for (const float point : points_[row])
            maximum = std::isfinite(point) ? std::max(maximum, point) : maximum;
    return maximum;
}

float ValueChartView::CalcXCoord(float years) const {
    return PlaceOnAxis(years, 0, GrowthYears, rects_.graph.left, rects_.graph.right);
}

float ValueChartView::CalcYCoord(float value) const {
    return PlaceOnAxis(value, currentValue_, maximum_, rects_.graph.bottom, rects_.graph.top);
}

void ValueChartView::Draw(BRect /*updateRect*/) {
    DrawTitle();
    if (HasChart()) {
        DrawChart();
        DrawLegend();
        DrawPointedTo();
    } else {
        DrawNothingToChart(this);
    }
    DrawFocus(this);
}

void ValueChartView::FrameResized(float /*width*/, float /*height*/) {
    Invalidate();
}

void ValueChartView::MouseMoved(BPoint where, uint32 transit) {
    std::optional<Point> nearest;
    if (transit != B_EXITED_VIEW && HasChart() && rects_.graph.Contains(where))
        nearest = NearestTo(where);
    PointTo(nearest && IsDrawn(*nearest) ? nearest : std::nullopt);
}

bool ValueChartView::KeyDown(char key) {
    const bool moves =
        key == B_LEFT_ARROW || key == B_RIGHT_ARROW || key == B_UP_ARROW || key == B_DOWN_ARROW;
    if (!moves || !HasChart())
        return false;
    Point point = pointed_.value_or(Point());
    if (pointed_ && key == B_RIGHT_ARROW)
        point.year = std::min<std::size_t>(point.year + 1, GrowthYears);
    else if (key == B_LEFT_ARROW)
        point.year -= point.year > 0 ? 1 : 0;
    else if (key == B_UP_ARROW)
        point.row = std::min(point.row + 1, RowsInUse() - 1);
    else if (key == B_DOWN_ARROW)
        point.row -= point.row > 0 ? 1 : 0;
    PointTo(point);
    return true;
}

ValueChartView::Point ValueChartView::NearestTo(BPoint where) const {
    const BRect& graph = rects_.graph;
    Point nearest;
    nearest.year =
        static_cast<std::size_t>(std::lround((where.x - graph.left) / graph.Width() * GrowthYears));
    const auto distance = [&](std::size_t row) {
        const Point point{nearest.year, row};
        return IsDrawn(point) ? std::abs(PlaceOf(point).y - where.y) : std::numeric_limits<float>::infinity();
    };
    for (std::size_t row = 1; row < RowsInUse(); ++row)
        if (distance(row) < distance(nearest.row))
            nearest.row = row;
    return nearest;
}

BPoint ValueChartView::PlaceOf(Point point) const {
    return {CalcXCoord(static_cast<float>(point.year)), CalcYCoord(points_[point.row][point.year])};
}

std::string ValueChartView::PointText() const {
    return std::to_string(static_cast<std::size_t>(year_) + pointed_->year) + " at " +
           Percent(Percentages[pointed_->row]) + ": " + Whole(points_[pointed_->row][pointed_->year]);
}

void ValueChartView::PointTo(std::optional<Point> point) {
    if (pointed_ == point || (point && !IsDrawn(*point)))
        return;
    pointed_ = point;
    Invalidate();
}

void ValueChartView::DrawTitle() {
    DrawChartTitle(this, rects_.title, Title);
}

void ValueChartView::DrawChart() {
    SetHighColor(GraphColor);
    FillRect(rects_.graph);
    SetHighColor(colors::black);
    StrokeRect(rects_.graph);
    BFont before;
    GetFont(&before);
    SetFont(be_fixed_font);
    DrawYears();
    DrawValues();
    SetFont(&before);
    DrawGrowth();
    DrawRates();
}

void ValueChartView::DrawYears() {
    const BRect& graph = rects_.graph;
    // A year is never cut, however large the font.
    const float half = std::max(YearHalfWidth, std::ceil(StringWidth("0000") / 2) + 1);
    // Below the lowest value's text, which ends at the graph's left edge, half of it under the bottom.
    const float top = graph.bottom + std::ceil(::GetFontHeight(be_fixed_font) / 2);
    BRect label(graph.left - half, top, graph.left + half, top + 30);
    for (int i = 0; i <= AxisSteps; ++i) {
        const int year = year_ + i * GrowthYears / AxisSteps;
        DrawText(this, &label, std::to_string(year).c_str(), DrawTextCenter | DrawTextTop);
        const float middle = label.left + half;
        if (i > 0 && i < AxisSteps)
            StrokeLine({middle, graph.top}, {middle, graph.bottom});
        label.OffsetBy(graph.Width() / AxisSteps, 0);
    }
}

std::vector<float> ValueChartView::AxisValues() const {
    std::vector<float> values = {currentValue_};
    while (values.size() <= AxisSteps)
        values.push_back(values.back() + (maximum_ - currentValue_) / AxisSteps);
    return values;
}

// All in letters of one size, and in the short form where these would be too small to read.
void ValueChartView::DrawValues() {
    const BRect& graph = rects_.graph;
    const float half = std::max(ValueHalfHeight, std::ceil(::GetFontHeight(be_fixed_font) / 2));
    BRect label(rects_.frame.left, graph.bottom - half, graph.left - 2, graph.bottom + half);
    const std::vector<float> values = AxisValues();
    const auto scale = [&](std::string (*text)(float)) {
        const float room = label.Width() - 3;
        float width = room;
        for (const float value : values)
            width = std::max(width, StringWidth(text(value).c_str()));
        return room / width;
    };
    const bool readable = scale(Whole) >= LeastReadable && Whole(maximum_).find('e') == std::string::npos;
    const auto text = readable ? Whole : Short;
    SetFontSize(be_fixed_font->Size() * scale(text));
    for (const float value : values) {
        DrawText(this, &label, text(value).c_str(), DrawTextRight | DrawTextMiddle);
        const float middle = (label.top + label.bottom) / 2;
        if (middle < graph.bottom && middle > graph.top + 1)
            StrokeLine({graph.left + 1, middle}, {graph.right - 1, middle});
        label.OffsetBy(0, -graph.Height() / AxisSteps);
    }
}

void ValueChartView::DrawGrowth() {
    SetPenSize(2);
    for (std::size_t row = 0; row < RowsInUse(); ++row) {
        SetHighColor(LineColors[row]);
        const BPoint start = PlaceOf({0, row});
        MovePenTo(start.x, start.y);
        for (std::size_t year = 0; year <= GrowthYears && std::isfinite(points_[row][year]); ++year)
            StrokeLine(PlaceOf({year, row}));
    }
    SetPenSize(1);
}

// Each beside its curve's end, or as near above as the one below leaves room, with a line from there.
void ValueChartView::DrawRates() {
    SetFontSize(be_plain_font->Size() * RateScale);
    BFont font;
    GetFont(&font);
    const float height = std::ceil(::GetFontHeight(&font));
    const float left = rects_.graph.right + RateGap;
    float middle = rects_.graph.bottom + height;
    for (std::size_t row = 0; row < RowsInUse(); ++row) {
        std::size_t last = GrowthYears;
        while (last > 0 && !IsDrawn({last, row}))
            --last;
        const BPoint end = PlaceOf({last, row});
        middle = std::min(middle - height, end.y);
        SetHighColor(LineColors[row]);
        StrokeLine(end, {left - 2, middle});
        SetHighColor(colors::black);
        DrawWholeText(this, {left, middle - height / 2, Bounds().right, middle + height / 2},
                      Percent(Percentages[row]), DrawTextLeft | DrawTextMiddle);
    }
    SetFont(be_plain_font);
}

void ValueChartView::DrawLegend() {
    const float size = std::ceil(::GetFontHeight(be_plain_font));
    const float left = rects_.legend.left + LegendIndent;
    const float entry = size + LegendGap + StringWidth("10%") + LegendGap;
    // All five have room in the view, whatever the font.
    const float step =
        std::min(3 * StringWidth("10%"), (rects_.legend.right - left - entry) / (Percentages.size() - 1));
    BRect box(left, rects_.legend.top, left + size, rects_.legend.top + size);
    const float width = std::max(LegendTextWidth, StringWidth("10%") + LegendGap);
    BRect text(box.right + LegendGap, box.top, box.right + LegendGap + width, box.bottom);
    for (std::size_t row = 0; row < RowsInUse(); ++row) {
        SetHighColor(LineColors[row]);
        FillRect(box);
        SetHighColor(colors::black);
        StrokeRect(box);
        DrawText(this, &text, Percent(Percentages[row]).c_str(), DrawTextLeft | DrawTextMiddle);
        box.OffsetBy(step, 0);
        text.OffsetBy(step, 0);
    }
}

void ValueChartView::DrawPointedTo() {
    if (!pointed_)
        return;
    const BPoint place = PlaceOf(*pointed_);
    SetHighColor(LineColors[pointed_->row]);
    FillEllipse(place, PointRadius, PointRadius);
    DrawNote(this, {place.x, place.y - PointRadius}, PointText());
}

std::string ValueChartView::AccessibleDescription() const {
    std::string description(Title);
    if (!HasChart())
        return description + ": Nothing to Chart!";
    if (pointed_)
        return description + ": " + PointText();
    description.append(": ").append(Whole(currentValue_)).append(" in ").append(std::to_string(year_));
    description.append(", and in ").append(std::to_string(year_ + GrowthYears));
    for (std::size_t row = 0; row < RowsInUse(); ++row)
        description.append("\n")
            .append(Percent(Percentages[row]))
            .append(": ")
            .append(Whole(points_[row].back()));
    return description;
}
