#include "charts/ChartDrawing.h"

#include <algorithm>
#include <cmath>

#include "platform/View.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float TitleScale = 1.5F;
constexpr float MessageScale = 2;
constexpr float RightGap = 2; // that DrawText leaves behind a text
constexpr float NoteGap = 4;  // around its text, and to its place

void DrawLarge(BView* view, const BRect& rect, const char* text, float scale) {
    BFont font;
    font.SetSize(font.Size() * scale);
    view->SetFont(&font);
    view->SetHighColor(colors::black);
    DrawWholeText(view, rect, text, DrawTextCenter | DrawTextMiddle);
    view->SetFont(be_plain_font);
}

} // namespace

void DrawChartTitle(BView* view, const BRect& rect, const std::string& title) {
    DrawLarge(view, rect, title.c_str(), TitleScale);
}

void DrawNothingToChart(BView* view) {
    DrawLarge(view, view->Bounds(), "Nothing to Chart!", MessageScale);
}

void DrawWholeText(BView* view, const BRect& rect, const std::string& text, uint8 flags) {
    BFont usual;
    view->GetFont(&usual);
    const BFont font = FittingFont(usual, text, rect.Width() - RightGap);
    view->SetFont(&font);
    DrawText(view, &rect, text.c_str(), flags);
    view->SetFont(&usual);
}

void DrawNote(BView* view, BPoint place, const std::string& text) {
    const BRect bounds = view->Bounds();
    const float height = std::ceil(GetFontHeight(be_plain_font)) + NoteGap;
    const float width =
        std::min(std::ceil(view->StringWidth(text.c_str())) + 2 * NoteGap + RightGap, bounds.Width());
    BRect frame(0, 0, width, height);
    frame.OffsetTo(std::clamp(place.x - width / 2, bounds.left, bounds.right - width),
                   std::max(place.y - NoteGap - height, bounds.top));
    view->SetHighColor(colors::light_gray);
    view->FillRect(frame);
    view->SetHighColor(colors::black);
    view->StrokeRect(frame);
    DrawWholeText(view, {frame.left + NoteGap, frame.top, frame.right - NoteGap, frame.bottom}, text,
                  DrawTextLeft | DrawTextMiddle);
}

void DrawFocus(BView* view) {
    view->SetHighColor(colors::dark_gray);
    if (view->IsFocus())
        view->StrokeRect(view->Bounds());
}
