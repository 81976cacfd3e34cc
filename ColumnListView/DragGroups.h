// Which columns move together when a header is dragged, and where they may go: rules without a window.
#pragma once

#include <vector>

#include "ColumnListView/ColumnGeometry.h"

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
