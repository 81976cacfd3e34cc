#include "charts/PieChartView.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "charts/ChartDrawing.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr std::size_t MaxTitle = 127;
constexpr float ShadowDepth = 5;
constexpr float LegendGap = 5;      // between colour box and text
constexpr float LineGap = 2;        // between two lines of the legend
constexpr float SeamOverlap = 0.5F; // degrees
constexpr float LeastSeamed = 1;    // a narrower slice would be all seam
constexpr float Lift = 0.1F;        // of the pie's height, for the slice that is pointed to
constexpr float NotePlace = 0.6F;   // of the way from the pie's centre to its rim
constexpr const char* NegativeNote = "Negative values are not drawn.";
constexpr rgb_color Veil{216, 216, 216, 120}; // keeps texts readable over dark slices; unseen elsewhere

rgb_color ColorOf(int index) {
    return PieChartColors[static_cast<std::size_t>(index) % PieChartColors.size()];
}

} // namespace

PieChartView::PieChartView(BRect frame)
    : BView(frame, "pie chart view", B_FOLLOW_ALL_SIDES,
            B_WILL_DRAW | B_FRAME_EVENTS | B_NAVIGABLE | B_MOUSE_MOVES),
      rects_(LayOutPie(Bounds())) {
    SetViewColor(colors::gray);
}

void PieChartView::SetTitle(const char* title) {
    title_ = CutToBytes(title, MaxTitle);
}

int PieChartView::SetData(const float* values, int count) {
    data_ = values;
    count_ = count;
    pointed_ = -1;
    total_ = 0;
    for (int i = 0; i < count; ++i)
        total_ += values[i];
    hasNegative_ = std::any_of(values, values + std::max(count, 0), [](float value) { return value < 0; });
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
        DrawPointedTo();
    } else {
        DrawEmptyMessage();
    }
    DrawFocus(this);
}

void PieChartView::FrameResized(float /*width*/, float /*height*/) {
    Invalidate();
}

void PieChartView::MouseMoved(BPoint where, uint32 transit) {
    PointTo(transit == B_EXITED_VIEW || !HasChart() ? -1 : IndexAt(where));
}

bool PieChartView::KeyDown(char key) {
    if (!HasChart() || (key != B_LEFT_ARROW && key != B_RIGHT_ARROW))
        return false;
    const int step = key == B_LEFT_ARROW ? -1 : 1;
    int next = pointed_ < 0 && step < 0 ? count_ - 1 : pointed_ + step;
    while (next >= 0 && next < count_ && !HasLine(next))
        next += step;
    if (HasLine(next))
        PointTo(next);
    return true;
}

int PieChartView::IndexAt(BPoint where) const {
    for (int i = 0; i < LinesShown(); ++i) {
        BRect line = LegendLineRect(i);
        line.right = std::min(line.left + StringWidth(LegendText(i).c_str()), line.right);
        line.left = rects_.legend.left;
        if (line.Contains(where) && HasLine(i))
            return i;
    }
    const int found = ValueAt(SlicesOf(data_, count_), EllipseIn(rects_.chart), where);
    return HasLine(found) ? found : -1;
}

void PieChartView::PointTo(int index) {
    if (index == pointed_)
        return;
    pointed_ = index;
    Invalidate();
}

void PieChartView::DrawTitle() {
    DrawChartTitle(this, rects_.title, title_);
}

void PieChartView::DrawChart() {
    SetHighColor(colors::gray);
    FillRect(rects_.chart);
    const std::vector<PieSlice> slices = SlicesOf(data_, count_);
    if (slices.empty())
        return;
    const PieEllipse pie = EllipseIn(rects_.chart);
    const auto [center, xRadius, yRadius] = pie;
    const BPoint below(center.x, center.y + ShadowDepth);
    SetHighColor(colors::dark_gray);
    FillEllipse(below, xRadius, yRadius);
    SetHighColor(colors::black);
    StrokeEllipse(below, xRadius, yRadius);
    // Where two smooth edges meet, what lies below shines through: that is no shadow here, but the first
    // slice's colour beside the last one, and each other slice's beside the one after it.
    SetHighColor(ColorOf(slices.front().value));
    FillEllipse(center, xRadius, yRadius);
    for (const PieSlice& slice : slices)
        DrawSlice(pie, slice, SeamOverlap);
    DrawSeams(pie, slices);
    for (const PieSlice& slice : slices)
        if (slice.value == pointed_)
            DrawLifted(pie, slice);
}

void PieChartView::DrawSlice(const PieEllipse& pie, const PieSlice& slice, float overlap) {
    const auto& [center, xRadius, yRadius] = pie;
    SetHighColor(ColorOf(slice.value));
    FillArc(center, xRadius, yRadius, slice.start, std::min(slice.sweep + overlap, 360 - slice.start));
    SetHighColor(colors::black);
    StrokeArc(center, xRadius, yRadius, slice.start, slice.sweep);
}

// A line between two neighbours of one colour.
void PieChartView::DrawSeams(const PieEllipse& pie, const std::vector<PieSlice>& slices) {
    const PieSlice* before = &slices.back();
    for (const PieSlice& slice : slices) {
        if (&slice != before && ColorOf(slice.value) == ColorOf(before->value) &&
            std::min(slice.sweep, before->sweep) > LeastSeamed)
            StrokeLine(pie.center, PointInPie(pie, slice.start, 1));
        before = &slice;
    }
}

void PieChartView::DrawLifted(const PieEllipse& pie, const PieSlice& slice) {
    SetHighColor(colors::dark_gray);
    FillArc(pie.center, pie.xRadius, pie.yRadius, slice.start, slice.sweep);
    PieEllipse lifted = pie;
    lifted.center.y -= pie.yRadius * Lift;
    DrawSlice(lifted, slice, 0);
    if (slice.sweep == 360)
        return;
    for (const float angle : {slice.start, slice.start + slice.sweep})
        StrokeLine(lifted.center, PointInPie(lifted, angle, 1));
}

bool PieChartView::HasLine(int index) const {
    const auto slot = static_cast<std::size_t>(index);
    return index >= 0 && slot < labels_.size() && labels_[slot][0] != '\0';
}

std::string PieChartView::LegendText(int index) const {
    if (!HasLine(index))
        return {};
    return LegendLine(labels_[static_cast<std::size_t>(index)].data(), data_[index], total_, decimalPlaces_);
}

BRect PieChartView::LegendLineRect(int index) const {
    const float height = std::ceil(::GetFontHeight(be_plain_font));
    const float top = rects_.legend.top + static_cast<float>(index) * (height + LineGap);
    return {rects_.legend.left + height + LegendGap, top, rects_.legend.right, top + height};
}

int PieChartView::LinesShown() const {
    const float step = std::ceil(::GetFontHeight(be_plain_font)) + LineGap;
    const int room = static_cast<int>((rects_.legend.Height() + LineGap) / step) - (hasNegative_ ? 1 : 0);
    return count_ <= room ? count_ : std::max(room - 1, 0);
}

// The lines that have no room are told in place of the last one that has.
void PieChartView::DrawLegend() {
    SetFont(be_plain_font);
    const auto measure = [this](const std::string& line) { return StringWidth(line.c_str()); };
    const int shown = LinesShown();
    for (int i = 0; i < shown; ++i) {
        if (!HasLine(i))
            continue;
        const BRect text = LegendLineRect(i);
        DrawLegendBox({rects_.legend.left, text.top, text.left - LegendGap, text.bottom}, i);
        DrawLegendText(text, FittedLegendLine(labels_[static_cast<std::size_t>(i)].data(), data_[i], total_,
                                              decimalPlaces_, text.Width() - LineGap, measure));
    }
    int line = shown;
    if (shown < count_)
        DrawLegendText(LegendLineRect(line++), "and " + std::to_string(count_ - shown) + " more");
    if (hasNegative_)
        DrawLegendText(LegendLineRect(line), NegativeNote);
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
    // Some scripts rise above and fall below the font's own height.
    DrawWholeText(this, {text.left, text.top - LineGap, text.right, text.bottom + LineGap}, line,
                  DrawTextLeft | DrawTextMiddle);
}

// Beside the slice, or the line of one that cannot be seen.
void PieChartView::DrawPointedTo() {
    const std::string line = LegendText(pointed_);
    if (line.empty())
        return;
    BPoint place = pointed_ < LinesShown() ? LegendLineRect(pointed_).LeftTop() : rects_.chart.LeftTop();
    for (const PieSlice& slice : SlicesOf(data_, count_))
        if (slice.value == pointed_)
            place = PointInPie(EllipseIn(rects_.chart), slice.start + slice.sweep / 2, NotePlace);
    DrawNote(this, place, line);
}

void PieChartView::DrawEmptyMessage() {
    SetHighColor(colors::gray);
    FillRect(rects_.chart);
    DrawNothingToChart(this);
}

std::string PieChartView::AccessibleDescription() const {
    if (!HasChart())
        return title_ + ": Nothing to Chart!";
    if (HasLine(pointed_))
        return title_ + ": " + LegendText(pointed_);
    constexpr int mostLines = 1000;
    std::string description = title_;
    for (int i = 0; i < std::min(count_, mostLines); ++i)
        if (const std::string line = LegendText(i); !line.empty())
            description += "\n" + line;
    return hasNegative_ ? description + "\n" + NegativeNote : description;
}
