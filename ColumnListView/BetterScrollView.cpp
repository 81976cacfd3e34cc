#include "ColumnListView/BetterScrollView.h"

#include "ColumnListView/CLVColumnLabelView.h"
#include "ColumnListView/ColumnListView.h"

BetterScrollView::BetterScrollView(const char* name, ColumnListView* list, CLVColumnLabelView* header,
                                   uint32 resizingMode, uint32 flags, bool horizontal, bool vertical,
                                   border_style border)
    : BScrollView(name, list, resizingMode, flags, horizontal, vertical, border) {
    const float height = header->Frame().Height();
    SetTopMargin(height + 1);
    const BRect rows = list->Frame();
    header->MoveTo(rows.left, rows.top - height - 1);
    header->ResizeTo(Bounds().Width() - 2 * rows.left, height);
    AddChild(header);
}
