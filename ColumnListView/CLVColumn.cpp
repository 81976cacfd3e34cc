#include "ColumnListView/CLVColumn.h"

#include <algorithm>

#include "ColumnListView/ColumnListView.h"
#include "platform/View.h"
#include "util/Utf8.h"

namespace {

constexpr float LabelInset = 8;
constexpr float ExpanderWidth = 20;
constexpr uint32 ExpanderKeeps = CLVF_FIXED_POSITION | CLVF_KEEP_FIRST | CLVF_HIDDEN | CLVF_MOVE_WITH_NEXT;
constexpr uint32 ExpanderFlags = CLVF_EXPANDER | CLVF_FIXED_WIDTH | CLVF_JOIN_HEADER;

// Written so that "not a number" gives the least width too.
float Limited(float width, float least) {
    return width > least ? std::min(width, CLVColumn::GreatestWidth) : least;
}

} // namespace

CLVColumn::CLVColumn(const char* label, float width, uint32 flags, float minWidth)
    : hasLabel_(label != nullptr), width_(0), minWidth_(Limited(minWidth, LeastWidth)), flags_(flags) {
    if ((flags & CLVF_EXPANDER) != 0) {
        flags_ = (flags & ExpanderKeeps) | ExpanderFlags;
        hasLabel_ = false;
        minWidth_ = ExpanderWidth;
        width = ExpanderWidth;
    }
    width_ = Limited(width, minWidth_);
    if (hasLabel_)
        label_ = truncatedLabel_ = label;
}

CLVColumn::~CLVColumn() = default;

void CLVColumn::SetWidth(float width) {
    if (list_)
        list_->AssertLocked();
    const float limited = Limited(width, minWidth_);
    if (limited == width_)
        return;
    width_ = limited;
    if (list_ && IsShown())
        list_->ColumnResized(*this);
}

void CLVColumn::SetShown(bool shown) {
    if (list_)
        list_->AssertLocked();
    if (shown == IsShown())
        return;
    flags_ ^= CLVF_HIDDEN;
    if (list_)
        list_->ColumnsChanged();
}

void CLVColumn::Truncate(const BFont& font) {
    if (hasLabel_ && (flags_ & CLVF_TRUNCATE_HEADER) != 0)
        truncatedLabel_ = TruncatedLabel(
            label_, width_ - 2 * LabelInset,
            [&](const std::string& text) { return font.StringWidth(text.c_str()); });
}

void CLVColumn::DrawColumnHeader(BView* view, BRect rect, bool sortKey, bool pressed, float fontAscent) {
    if (!hasLabel_)
        return;
    const BPoint start(rect.left + LabelInset, rect.top + 1 + fontAscent);
    const char* text = truncatedLabel_.c_str();
    view->SetHighColor(pressed ? rgb_color{0, 0, 229, 255} : rgb_color{0, 0, 0, 255});
    view->DrawString(text, start);
    if (sortKey)
        view->StrokeLine({start.x - 1, start.y + 2}, {start.x + view->StringWidth(text), start.y + 2});
}
