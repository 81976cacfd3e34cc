#pragma once

#include <string>

#include "platform/Rect.h"
#include "platform/Types.h"

class BFont;
class BView;
class ColumnListView;

// What a column may do and how it sorts.
constexpr uint32 CLVF_SORTABLE = 0x001;       // can be a sort key; header clicks sort by it
constexpr uint32 CLVF_FIXED_POSITION = 0x002; // its drag group cannot be dragged
constexpr uint32 CLVF_FIXED_WIDTH = 0x004;    // the person cannot resize it
constexpr uint32 CLVF_KEEP_FIRST = 0x008;     // stays before every column without this flag
constexpr uint32 CLVF_KEEP_LAST = 0x010;      // stays after every column without this flag
constexpr uint32 CLVF_HIDDEN = 0x020;         // not shown; takes no space
constexpr uint32 CLVF_JOIN_HEADER = 0x040;    // no header divider between it and the next shown column
constexpr uint32 CLVF_MOVE_WITH_NEXT = 0x080; // one drag group with the next column in display order
constexpr uint32 CLVF_EXPANDER = 0x100;       // holds the outline's arrows; at most one in a list
constexpr uint32 CLVF_PASS_INDENT = 0x200; // when pushed, passes the indentation on to the next shown column
constexpr uint32 CLVF_TRUNCATE_HEADER = 0x400; // a label that does not fit is shortened, not clipped
constexpr uint32 CLVF_WIDTH_NOTICE = 0x800;    // every row is told when this column's width changes

enum class CLVSortMode : int32 { Ascending = 0, Descending = 1, None = 2 };

// One column of a ColumnListView: its label, width, flags and sort mode, and where the list has placed it. It
// draws its label in the header; it neither draws rows nor handles the pointer.
//
// Whoever makes a column owns it until a list takes it; the list deletes it, or gives it back when it is
// removed. Like the list it lives on the interface thread, and once it is in a list that is in a window, the
// operations that change it want the window's lock.
class CLVColumn {
  public:
    // The least width of any column, and the greatest: beyond it places would no longer be exact numbers.
    static constexpr float LeastWidth = 4;
    static constexpr float GreatestWidth = 100000;

    // label is copied and may be null. A minimum width below LeastWidth becomes LeastWidth, a width below
    // the minimum becomes the minimum. A column with CLVF_EXPANDER has no label and is 20 wide; of the flags
    // given it keeps those that keep it first, hidden, at its position or with the next column.
    CLVColumn(const char* label, float width, uint32 flags = 0, float minWidth = LeastWidth);
    virtual ~CLVColumn();
    CLVColumn(const CLVColumn&) = delete;
    CLVColumn& operator=(const CLVColumn&) = delete;

    // Takes the width, limited as at construction; the columns to the right move at once. A list that shows
    // the column hears of the change by ColumnWidthChanged.
    virtual void SetWidth(float width);

    // Draws the label into the header cell at rect: 8 points from its left, in blue while the header is
    // pressed, underlined when sortKey. view draws in the header's font; fontAscent is that font's.
    virtual void DrawColumnHeader(BView* view, BRect rect, bool sortKey, bool pressed, float fontAscent);

    [[nodiscard]] float Width() const { return width_; }
    [[nodiscard]] float MinWidth() const { return minWidth_; }
    // Left and right edge in the list; without meaning while hidden or in no list.
    [[nodiscard]] float Begin() const { return begin_; }
    [[nodiscard]] float End() const { return end_; }
    // Whether the outline's indentation moves this column.
    [[nodiscard]] bool IsPushed() const { return pushed_; }

    // Hiding closes the gap; showing puts the column back in its place of the display order.
    void SetShown(bool shown);
    [[nodiscard]] bool IsShown() const { return (flags_ & CLVF_HIDDEN) == 0; }
    // The CLVF_ family, CLVF_HIDDEN as it stands now.
    [[nodiscard]] uint32 Flags() const { return flags_; }
    // Null when the column has no label. Valid as long as the column.
    [[nodiscard]] const char* GetLabel() const { return hasLabel_ ? label_.c_str() : nullptr; }
    [[nodiscard]] CLVSortMode SortMode() const { return sortMode_; }
    // The list that the column is in, or null.
    [[nodiscard]] ColumnListView* Parent() const { return list_; }
    // Where the header was last drawn, in the header view's coordinates; invalid until then.
    [[nodiscard]] BRect HeaderRect() const { return headerRect_; }

  private:
    friend class ColumnListView;
    friend class CLVColumnLabelView;

    // Shortens the label anew when the column truncates its header.
    void Truncate(const BFont& font);

    std::string label_;
    std::string truncatedLabel_;
    bool hasLabel_;
    BRect headerRect_;
    float width_;
    float minWidth_;
    float begin_ = 0;
    float end_ = 0;
    uint32 flags_;
    bool pushed_ = false;
    CLVSortMode sortMode_ = CLVSortMode::None;
    ColumnListView* list_ = nullptr;
    int32 index_ = -1; // in the list's order of adding
};
