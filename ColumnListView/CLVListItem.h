#pragma once

#include "platform/ListView.h"

class ColumnListView;

// One row of a ColumnListView, the base of a program's own rows. It works out where each column lies and has
// the derived class draw one column at a time; it holds no texts of its own.
//
// Who makes a row owns it; a list borrows it from adding to removing. Interface thread.
class CLVListItem : public BListItem {
  public:
    // outlineLevel: 0 at the top. superitem: has rows below it in the outline, and an arrow. expanded: these
    // are to be seen. minHeight is in points.
    CLVListItem(uint32 outlineLevel, bool superitem, bool expanded, float minHeight);
    // Leaves the list, if it is in one.
    ~CLVListItem() override;

    // Has every shown column that overlaps owner's clipping region drawn, then the strip behind the last one.
    void DrawItem(BView* owner, BRect rowRect, bool complete = false) override;
    // As the base, and raises the height to the minimum.
    void Update(BView* owner, const BFont* font) override;

    // Draws the column with this index, in the order in which columns were added, into columnRect (owner's
    // coordinates, the row's height). Index -1 is the strip behind the last column. complete: the background
    // is not painted yet.
    virtual void DrawItemColumn(BView* owner, BRect columnRect, int32 column, bool complete) = 0;
    // For columns with CLVF_WIDTH_NOTICE: the new width, less what the indentation cuts off.
    virtual void ColumnWidthChanged(int32 /*column*/, float /*width*/, ColumnListView* /*list*/) {}
    // For columns with CLVF_WIDTH_NOTICE, on rows in sight: the column has moved; frame is its place.
    virtual void FrameChanged(int32 /*column*/, BRect /*frame*/, ColumnListView* /*list*/) {}

    [[nodiscard]] bool IsSuperItem() const { return superitem_; }
    void SetSuperItem(bool superitem) { superitem_ = superitem; }
    [[nodiscard]] float MinHeight() const { return minHeight_; }
    // Where the expander arrow and the expander column were last drawn, in the list's coordinates;
    // (-1, -1, -1, -1) until then.
    [[nodiscard]] BRect ExpanderArrowRect() const { return arrowRect_; }
    [[nodiscard]] BRect ExpanderColumnRect() const { return expanderRect_; }
    // The list that the row is in, or null.
    [[nodiscard]] ColumnListView* List() const { return list_; }

  private:
    friend class ColumnListView;

    void DrawExpander(BView* owner, BRect frame);

    bool superitem_;
    float minHeight_;
    BRect arrowRect_{-1, -1, -1, -1};
    BRect expanderRect_{-1, -1, -1, -1};
    ColumnListView* list_ = nullptr;
    bool inSight_ = false; // outline lists: among the visible rows
    int32 fullIndex_ = -1; // outline lists: place in the full list as of the last sort
};

// A copy of text with the ASCII letters a to z turned to upper case and every other byte unchanged. The copy
// takes the text's length plus 1 bytes, allocated with new[]; the caller deletes it.
[[nodiscard]] char* ToUpperStr(const char* text);
