#include "charts/ValueChartView.h"

#include <algorithm>
#include <cmath>

#include "platform/CheckBox.h"
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
constexpr float TitleScale = 1.5F;

std::string Percent(float rate) {
    return std::to_string(std::lround(rate * 100)) + "%";
}

std::string Whole(float value) {
    char text[FormatNumberSize];
    FormatNumber(value, text, 0);
    return text;
}

} // namespace

ValueChartView::ValueChartView(BRect frame, float currentValue, Controls controls)
    : BView(frame, "value chart view", B_FOLLOW_ALL_SIDES, B_WILL_DRAW | B_FRAME_EVENTS),
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
    Invalidate();
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
        maximum = std::max(maximum, *std::max_element(points_[row].begin(), points_[row].end()));
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
    DrawChart();
    DrawLegend();
}

void ValueChartView::FrameResized(float /*width*/, float /*height*/) {
    Invalidate();
}

void ValueChartView::DrawTitle() {
    BFont font;
    font.SetSize(font.Size() * TitleScale);
    SetFont(&font);
    SetHighColor(colors::black);
    DrawText(this, &rects_.title, Title, DrawTextCenter | DrawTextMiddle);
    SetFont(be_plain_font);
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

void ValueChartView::DrawValues() {
    const BRect& graph = rects_.graph;
    BRect label(rects_.frame.left, graph.bottom - 10, graph.left - 2, graph.bottom + 10);
    // A number whose end is cut off would be another number: long ones are written smaller.
    const float room = label.Width() - 3;
    const float width = StringWidth(Whole(maximum_).c_str());
    BFont font;
    GetFont(&font);
    if (width > room)
        SetFontSize(font.Size() * room / width);
    float value = currentValue_;
    for (int i = 0; i <= AxisSteps; ++i) {
        DrawText(this, &label, Whole(value).c_str(), DrawTextRight | DrawTextMiddle);
        value += (maximum_ - currentValue_) / AxisSteps;
        const float middle = (label.top + label.bottom) / 2;
        if (i > 0 && i < AxisSteps)
            StrokeLine({graph.left + 1, middle}, {graph.right - 1, middle});
        label.OffsetBy(0, -graph.Height() / AxisSteps);
    }
}

void ValueChartView::DrawGrowth() {
    SetPenSize(2);
    for (std::size_t row = 0; row < RowsInUse(); ++row) {
        SetHighColor(LineColors[row]);
        MovePenTo(CalcXCoord(0), CalcYCoord(currentValue_));
        for (std::size_t year = 0; year < points_[row].size(); ++year)
            StrokeLine({CalcXCoord(static_cast<float>(year)), CalcYCoord(points_[row][year])});
    }
    SetPenSize(1);
}

void ValueChartView::DrawLegend() {
    const float size = std::ceil(::GetFontHeight(be_plain_font));
    const float left = rects_.legend.left + LegendIndent;
    const float entry = size + LegendGap + StringWidth("10%") + LegendGap;
    // All five have room in the view, whatever the font.
    const float step =
        std::min(3 * StringWidth("10%"), (rects_.legend.right - left - entry) / (Percentages.size() - 1));
    BRect box(left, rects_.legend.top, left + size, rects_.legend.top + size);
    BRect text(box.right + LegendGap, box.top, box.right + LegendGap + LegendTextWidth, box.bottom);
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

std::string ValueChartView::AccessibleDescription() const {
    std::string description(Title);
    description.append(": ").append(Whole(currentValue_)).append(" in ").append(std::to_string(year_));
    description.append(", and in ").append(std::to_string(year_ + GrowthYears));
    for (std::size_t row = 0; row < RowsInUse(); ++row)
        description.append("\n")
            .append(Percent(Percentages[row]))
            .append(": ")
            .append(Whole(points_[row].back()));
    return description;
}
