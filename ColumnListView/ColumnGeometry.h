#pragma once

// Where columns lie, and which move together and where to when a header is dragged: arithmetic without a
// window. All measures are logical pixels; a column from begin to end covers both edges, so that its width is
// end minus begin and the next column begins at end plus 1.

#include <vector>

#include "ColumnListView/CLVColumn.h"
#include "platform/Rect.h"

// How far one outline level moves the expander column and the pushed columns to the right.
constexpr float IndentPerLevel = 20;
// Side length of the expander arrow, and its distance from the expander column's end.
constexpr float ArrowSize = 10;
constexpr float ArrowInset = 3;
// How near to a border a press still takes hold of the border.
constexpr float BorderReach = 2;

// What of a column decides where it lies.
struct ColumnShape {
    float width = 0;
    uint32 flags = 0; // the CLVF_ family

    [[nodiscard]] bool IsShown() const { return (flags & CLVF_HIDDEN) == 0; }
};

// Where a column lies; without meaning for a hidden one.
struct ColumnPlace {
    float begin = 0;
    float end = 0;
    bool pushed = false; // moved right by the outline indentation, because the expander column is before it
};

struct ColumnLayout {
    std::vector<ColumnPlace> places; // as the shapes, in display order
    float end = -1;                  // of the last shown column; -1 when none is shown
    float pushEnd = -1;              // of the last pushed column, else of the expander column; -1 without one
};

// Places the columns given in display order: the first shown one begins at 0.
[[nodiscard]] ColumnLayout LayOutColumns(const std::vector<ColumnShape>& shapes);

// The part of a row's rectangle that belongs to a column. indentation is 0 save for the expander column and
// the pushed ones, which move right by it but reach no further than pushEnd. Invalid when nothing is left.
[[nodiscard]] BRect ColumnFrameInRow(const ColumnPlace& place, const BRect& row, float indentation,
                                     float pushEnd);

// Where the expander arrow lies in the (indented) frame of the expander column.
[[nodiscard]] BRect ArrowFrame(const BRect& expanderFrame);

// What a press at a place of the header takes hold of.
struct HeaderHit {
    enum class What { Nothing, Border, Header };
    What what = What::Nothing;
    int32 position = -1; // in display order: the column to resize, or the column whose header is pressed

    bool operator==(const HeaderHit&) const = default;
};

// Within BorderReach right of a column's begin lies the border of the shown column before it, within
// BorderReach left of its end its own; a border of a column with CLVF_FIXED_WIDTH is part of the header
// around it.
[[nodiscard]] HeaderHit HitHeader(const std::vector<ColumnShape>& shapes, const ColumnLayout& layout,
                                  float x);

// A run of columns in display order that moves as one: a column with CLVF_MOVE_WITH_NEXT and the next.
// Positions are places in display order; begin, end and lastShown have meaning only when a member is shown.
struct DragGroup {
    int32 first = 0;
    int32 last = 0;
    int32 lastShown = -1;
    float begin = 0;
    float end = 0;
    bool isShown = false;
    bool allKeepFirst = true;
    bool allKeepLast = true;
    uint32 flags = 0; // the members' fixed-position, keep-first and keep-last flags together
};

[[nodiscard]] std::vector<DragGroup> BuildDragGroups(const std::vector<ColumnShape>& shapes,
                                                     const ColumnLayout& layout);

// The index of the group that the column at this display position belongs to; -1 when there is none.
[[nodiscard]] int32 GroupAt(const std::vector<DragGroup>& groups, int32 position);

// The next shown group that the dragged one changes places with when the pointer is at x; -1 when it stays.
// Groups without a shown member are passed over.
[[nodiscard]] int32 GroupToSwapWith(const std::vector<DragGroup>& groups, int32 dragged, float x);

// Moves the dragged group to the other side of target; order is the display order.
void MoveGroup(const std::vector<DragGroup>& groups, int32 dragged, int32 target, std::vector<int32>& order);
