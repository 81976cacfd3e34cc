#pragma once

#include "platform/ScrollView.h"

class CLVColumnLabelView;
class ColumnListView;

// The container of a ColumnListView: the header above the rows, the scroll bars beside them. The bars follow
// the list's rows and columns by themselves; the list moves the header along sideways. It has no knowledge of
// columns. Owns the list and the header; belongs to the view it is added to. Interface thread.
class BetterScrollView : public BScrollView {
  public:
    // Takes ownership of list and header. Made by the list's constructor only.
    BetterScrollView(const char* name, ColumnListView* list, CLVColumnLabelView* header, uint32 resizingMode,
                     uint32 flags, bool horizontal, bool vertical, border_style border);
};
