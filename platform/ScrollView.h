#pragma once

#include "platform/View.h"

class BListView;

// A frame that gives a list view its scroll bars. It contains the list, its child, and fills itself with it;
// the bars come and go at the right and bottom edges as the list's content asks for. Which bars it may show
// is fixed at construction.
class BScrollView : public BView {
  public:
    // Takes ownership of target, and takes its frame, enlarged by the bars that it may show.
    BScrollView(const char* name, BListView* target, uint32 resizingMode, uint32 flags, bool horizontal,
                bool vertical, border_style border);

  protected:
    // Leaves this much free above the list, for a header row.
    void SetTopMargin(float height);

  private:
    BListView* target_;
};

// What the scroll bar of a form takes of its width.
constexpr float B_FORM_BAR_WIDTH = 16;

// Holds the controls of a form. Where it is less high than they are together they scroll, and the one that
// gets the keyboard comes into sight. It lays out nothing and paints nothing.
class BFormView : public BView {
  public:
    BFormView(BRect frame, const char* name, uint32 resizingMode);
};
