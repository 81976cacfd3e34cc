#include "ColumnListView/CLVListItem.h"

#include <algorithm>
#include <cstring>

#include "ColumnListView/CLVColumn.h"
#include "ColumnListView/ColumnListView.h"
#include "util/Strings.h"

CLVListItem::CLVListItem(uint32 outlineLevel, bool superitem, bool expanded, float minHeight)
    : BListItem(outlineLevel, expanded), superitem_(superitem), minHeight_(minHeight) {}

CLVListItem::~CLVListItem() {
    if (list_)
        list_->RemoveItem(this);
}

void CLVListItem::DrawItem(BView* owner, BRect rowRect, bool complete) {
    if (!list_)
        return;
    BRegion clipping;
    owner->GetClippingRegion(&clipping);
    const BRect area = clipping.Frame();
    const auto draw = [&](const BRect& frame, int32 column) {
        if (frame.Intersects(area))
            DrawItemColumn(owner, frame, column, complete);
    };
    for (const CLVColumn* column : list_->ColumnsInDisplayOrder()) {
        if (!column->IsShown())
            continue;
        const BRect frame = list_->ColumnFrame(*this, *column, rowRect);
        draw(frame, list_->IndexOfColumn(column));
        if ((column->Flags() & CLVF_EXPANDER) != 0)
            DrawExpander(owner, frame);
    }
    draw({list_->ColumnsEnd() + 1, rowRect.top, std::max(rowRect.right, owner->Bounds().right),
          rowRect.bottom},
         -1);
}

void CLVListItem::DrawExpander(BView* owner, BRect frame) {
    expanderRect_ = frame;
    if (!superitem_)
        return;
    // Indented out of its column there is no arrow to be seen, nor to be pressed.
    arrowRect_ = frame.IsValid() ? ArrowFrame(frame) : BRect(-1, -1, -1, -1);
    if (!frame.IsValid())
        return;
    owner->SetDrawingMode(B_OP_OVER);
    owner->DrawBitmap(list_->Arrow(IsExpanded()), arrowRect_.LeftTop());
    owner->SetDrawingMode(B_OP_COPY);
}

void CLVListItem::Update(BView* owner, const BFont* font) {
    BListItem::Update(owner, font);
    SetHeight(std::max(Height(), minHeight_));
}

char* ToUpperStr(const char* text) {
    const std::size_t size = std::strlen(text) + 1;
    char* copy = new char[size];
    std::transform(text, text + size, copy, [](char c) { return Raised(c); });
    return copy;
}
