#include "charts/PieChartView.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr std::size_t MaxTitle = 127;
constexpr float ShadowDepth = 5;
constexpr float LegendGap = 5; // between colour box and text
constexpr float LineGap = 2;   // between two lines of the legend
constexpr float TitleScale = 1.5F;
constexpr float MessageScale = 2;
constexpr rgb_color Veil{216, 216, 216, 120}; // keeps texts readable over dark slices; unseen elsewhere

rgb_color ColorOf(int index) {
    return PieChartColors[static_cast<std::size_t>(index) % PieChartColors.size()];
}

} // namespace

PieChartView::PieChartView(BRect frame)
    : BView(frame, "pie chart view", B_FOLLOW_ALL_SIDES, B_WILL_DRAW | B_FRAME_EVENTS),
      rects_(LayOutPie(Bounds())) {
    SetViewColor(colors::gray);
}

void PieChartView::SetTitle(const char* title) {
    title_ = CutToBytes(title, MaxTitle);
}

int PieChartView::SetData(const float* values, int count) {
    data_ = values;
    count_ = count;
    total_ = 0;
    for (int i = 0; i < count; ++i)
        total_ += values[i];
    try {
        labels_.assign(static_cast<std::size_t>(std::max(count, 0)), ChartLabel{});
    } catch (const std::bad_alloc&) {
        labels_.clear();
        return 1;
    }
    return 0;
}

void PieChartView::SetDecimalPlaces(int places) {
    decimalPlaces_ = places;
}

int PieChartView::SetLegendLabel(int index, const char* label) {
    if (index < 0 || static_cast<std::size_t>(index) >= labels_.size())
        return 1;
    ChartLabel& slot = labels_[static_cast<std::size_t>(index)];
    CopyText(slot.data(), slot.size(), label);
    return 0;
}

bool PieChartView::HasChart() const {
    return data_ && count_ > 0 && IsPie(total_);
}

void PieChartView::Draw(BRect /*updateRect*/) {
    DrawTitle();
    if (HasChart()) {
        DrawChart();
        DrawLegend();
    } else {
        DrawEmptyMessage();
    }
}

void PieChartView::FrameResized(float /*width*/, float /*height*/) {
    Invalidate();
}

void PieChartView::DrawTitle() {
    BFont font;
    font.SetSize(font.Size() * TitleScale);
    SetFont(&font);
    SetHighColor(colors::black);
    DrawText(this, &rects_.title, title_.c_str(), DrawTextCenter | DrawTextMiddle);
    SetFont(be_plain_font);
}

void PieChartView::DrawChart() {
    SetHighColor(colors::gray);
    FillRect(rects_.chart);
    const auto [center, xRadius, yRadius] = EllipseIn(rects_.chart);
    const BPoint below(center.x, center.y + ShadowDepth);
    SetHighColor(colors::dark_gray);
    FillEllipse(below, xRadius, yRadius);
    SetHighColor(colors::black);
    StrokeEllipse(below, xRadius, yRadius);
    for (const PieSlice& slice : SlicesOf(data_, count_, total_)) {
        SetHighColor(ColorOf(slice.value));
        FillArc(center, xRadius, yRadius, slice.start, slice.sweep);
        SetHighColor(colors::black);
        StrokeArc(center, xRadius, yRadius, slice.start, slice.sweep);
    }
}

std::string PieChartView::LegendText(int index) const {
    const auto slot = static_cast<std::size_t>(index);
    if (slot >= labels_.size() || labels_[slot][0] == '\0')
        return {};
    return LegendLine(labels_[slot].data(), data_[index], total_, decimalPlaces_);
}

std::string PieChartView::LegendText(int index, BRect text) const {
    const auto slot = static_cast<std::size_t>(index);
    if (slot >= labels_.size() || labels_[slot][0] == '\0')
        return {};
    return FittedLegendLine(labels_[slot].data(), data_[index], total_, decimalPlaces_, text.Width(),
                            [this](const std::string& line) { return StringWidth(line.c_str()); });
}

// The lines that have no room are told in place of the last one that has.
void PieChartView::DrawLegend() {
    SetFont(be_plain_font);
    const float height = std::ceil(::GetFontHeight(be_plain_font));
    const float step = height + LineGap;
    BRect box(rects_.legend.left, rects_.legend.top, rects_.legend.left + height, rects_.legend.top + height);
    BRect text(box.right + LegendGap, box.top, rects_.legend.right, box.bottom);
    const int room = static_cast<int>((rects_.legend.Height() + LineGap) / step);
    const int shown = count_ <= room ? count_ : std::max(room - 1, 0);
    for (int i = 0; i < shown; ++i) {
        if (const std::string line = LegendText(i, text); !line.empty()) {
            DrawLegendBox(box, i);
            DrawLegendText(text, line);
        }
        box.OffsetBy(0, step);
        text.OffsetBy(0, step);
    }
    if (shown < count_)
        DrawLegendText(text, "and " + std::to_string(count_ - shown) + " more");
}

void PieChartView::DrawLegendBox(BRect box, int color) {
    SetHighColor(ColorOf(color));
    FillRect(box);
    SetHighColor(colors::black);
    StrokeRect(box);
}

void PieChartView::DrawLegendText(BRect text, const std::string& line) {
    const float end = std::min(text.left + std::ceil(StringWidth(line.c_str())), text.right);
    SetHighColor(Veil);
    // Down to the next line's veil, so that no stripe shows between them.
    FillRect({text.left, text.top, end, text.bottom + LineGap - 1});
    SetHighColor(colors::black);
    DrawText(this, &text, line.c_str(), DrawTextLeft | DrawTextMiddle);
}

void PieChartView::DrawEmptyMessage() {
    SetHighColor(colors::gray);
    FillRect(rects_.chart);
    SetHighColor(colors::black);
    BFont font;
    font.SetSize(font.Size() * MessageScale);
    SetFont(&font);
    const BRect bounds = Bounds();
    DrawText(this, &bounds, "Nothing to Chart!", DrawTextCenter | DrawTextMiddle);
    SetFont(be_plain_font);
}

std::string PieChartView::AccessibleDescription() const {
    if (!HasChart())
        return title_ + ": Nothing to Chart!";
    constexpr int mostLines = 1000;
    std::string description = title_;
    for (int i = 0; i < std::min(count_, mostLines); ++i)
        if (const std::string line = LegendText(i); !line.empty())
            description += "\n" + line;
    return description;
}
