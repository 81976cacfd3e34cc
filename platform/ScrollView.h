#pragma once

#include "platform/View.h"

class BListView;

constexpr float B_V_SCROLL_BAR_WIDTH = 14;
constexpr float B_H_SCROLL_BAR_HEIGHT = 14;

// One scroll bar of a scroll view, which owns it. A handle on the toolkit's own scroll bar.
class BScrollBar {
  public:
    ~BScrollBar() = default;
    BScrollBar(const BScrollBar&) = delete;
    BScrollBar& operator=(const BScrollBar&) = delete;

    [[nodiscard]] float Value() const;
    // Scrolls the target; clamped to the range.
    void SetValue(float value);
    void GetRange(float* minimum, float* maximum) const;

  private:
    friend class BScrollView;
    BScrollBar(BListView* target, orientation direction);

    BListView* target_;
    orientation orientation_;
};

// A frame that gives a list view its scroll bars. It contains the list, its child, and fills itself with it;
// the bars come and go at the right and bottom edges as the list's content asks for. Which bars it may show
// is fixed at construction.
class BScrollView : public BView {
  public:
    // Takes ownership of target, and takes its frame, enlarged by the bars that it may show.
    BScrollView(const char* name, BListView* target, uint32 resizingMode, uint32 flags, bool horizontal,
                bool vertical, border_style border);
    ~BScrollView() override;

    // Null for a bar that the view does not have.
    [[nodiscard]] BScrollBar* ScrollBar(orientation direction) const;

  protected:
    // Leaves this much free above the list, for a header row.
    void SetTopMargin(float height);

  private:
    BListView* target_;
    std::unique_ptr<BScrollBar> horizontal_;
    std::unique_ptr<BScrollBar> vertical_;
};
