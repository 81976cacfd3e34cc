#include "ColumnListView/ColumnGeometry.h"

#include <algorithm>
#include <cmath>

namespace {

void AddMember(DragGroup& group, const ColumnShape& shape, const ColumnPlace& place, int32 position) {
    group.last = position;
    group.flags |= shape.flags & (CLVF_FIXED_POSITION | CLVF_KEEP_FIRST | CLVF_KEEP_LAST);
    group.allKeepFirst = group.allKeepFirst && (shape.flags & CLVF_KEEP_FIRST) != 0;
    group.allKeepLast = group.allKeepLast && (shape.flags & CLVF_KEEP_LAST) != 0;
    if (!shape.IsShown())
        return;
    if (!group.isShown)
        group.begin = place.begin;
    group.isShown = true;
    group.end = place.end;
    group.lastShown = position;
}

// The nearest shown group in the direction of step (1 or -1); -1 when there is none.
int32 ShownNeighbour(const std::vector<DragGroup>& groups, int32 from, int32 step) {
    const auto count = static_cast<int32>(groups.size());
    for (int32 i = from + step; i >= 0 && i < count; i += step)
        if (groups[static_cast<std::size_t>(i)].isShown)
            return i;
    return -1;
}

bool MayMoveBefore(const DragGroup& dragged, const DragGroup& previous) {
    const bool passesKeepFirst = (previous.flags & CLVF_KEEP_FIRST) != 0 && !dragged.allKeepFirst;
    const bool leavesKeepLast = (dragged.flags & CLVF_KEEP_LAST) != 0 && !previous.allKeepLast;
    return !passesKeepFirst && !leavesKeepLast;
}

bool MayMoveAfter(const DragGroup& dragged, const DragGroup& next) {
    const bool passesKeepLast = (next.flags & CLVF_KEEP_LAST) != 0 && !dragged.allKeepLast;
    const bool leavesKeepFirst = (dragged.flags & CLVF_KEEP_FIRST) != 0 && !next.allKeepFirst;
    return !passesKeepLast && !leavesKeepFirst;
}

} // namespace

ColumnLayout LayOutColumns(const std::vector<ColumnShape>& shapes) {
    ColumnLayout layout;
    layout.places.reserve(shapes.size());
    bool pushNext = false;
    for (const ColumnShape& shape : shapes) {
        const float begin = layout.end + 1;
        if (!shape.IsShown()) {
            layout.places.push_back({begin, begin, false});
            continue;
        }
        const ColumnPlace place{begin, begin + shape.width, pushNext};
        layout.places.push_back(place);
        layout.end = place.end;
        const bool isExpander = (shape.flags & CLVF_EXPANDER) != 0;
        if (isExpander || pushNext)
            layout.pushEnd = place.end;
        pushNext = isExpander || (pushNext && (shape.flags & CLVF_PASS_INDENT) != 0);
    }
    return layout;
}

BRect ColumnFrameInRow(const ColumnPlace& place, const BRect& row, float indentation, float pushEnd) {
    const float end = indentation > 0 ? std::min(place.end + indentation, pushEnd) : place.end;
    return {place.begin + indentation, row.top, end, row.bottom};
}

BRect ArrowFrame(const BRect& expanderFrame) {
    const float right = expanderFrame.right - ArrowInset;
    const float top = expanderFrame.top + std::floor((expanderFrame.Height() + 1 - ArrowSize) / 2);
    return {right - ArrowSize + 1, top, right, top + ArrowSize - 1};
}

HeaderHit HitHeader(const std::vector<ColumnShape>& shapes, const ColumnLayout& layout, float x) {
    int32 previous = -1;
    for (std::size_t i = 0; i < shapes.size(); ++i) {
        if (!shapes[i].IsShown())
            continue;
        const auto position = static_cast<int32>(i);
        const auto [begin, end, pushed] = layout.places[i];
        if (x >= begin && x < end + 1) {
            const auto resizable = [&](int32 at) {
                return at >= 0 && (shapes[static_cast<std::size_t>(at)].flags & CLVF_FIXED_WIDTH) == 0;
            };
            if (x <= begin + BorderReach && resizable(previous))
                return {HeaderHit::What::Border, previous};
            if (x >= end - BorderReach && resizable(position))
                return {HeaderHit::What::Border, position};
            return {HeaderHit::What::Header, position};
        }
        previous = position;
    }
    return {};
}

std::vector<DragGroup> BuildDragGroups(const std::vector<ColumnShape>& shapes, const ColumnLayout& layout) {
    std::vector<DragGroup> groups;
    bool joins = false;
    for (std::size_t i = 0; i < shapes.size(); ++i) {
        const auto position = static_cast<int32>(i);
        if (!joins) {
            groups.emplace_back();
            groups.back().first = position;
        }
        AddMember(groups.back(), shapes[i], layout.places[i], position);
        joins = (shapes[i].flags & CLVF_MOVE_WITH_NEXT) != 0;
    }
    return groups;
}

int32 GroupAt(const std::vector<DragGroup>& groups, int32 position) {
    for (std::size_t i = 0; i < groups.size(); ++i)
        if (position >= groups[i].first && position <= groups[i].last)
            return static_cast<int32>(i);
    return -1;
}

int32 GroupToSwapWith(const std::vector<DragGroup>& groups, int32 dragged, float x) {
    const DragGroup& group = groups[static_cast<std::size_t>(dragged)];
    const float width = group.end - group.begin;
    if (const int32 index = ShownNeighbour(groups, dragged, -1); index >= 0) {
        const DragGroup& previous = groups[static_cast<std::size_t>(index)];
        if (x < previous.begin + width && x <= previous.end && MayMoveBefore(group, previous))
            return index;
    }
    if (const int32 index = ShownNeighbour(groups, dragged, 1); index >= 0) {
        const DragGroup& next = groups[static_cast<std::size_t>(index)];
        if (x > next.end - width && x >= next.begin && MayMoveAfter(group, next))
            return index;
    }
    return -1;
}

void MoveGroup(const std::vector<DragGroup>& groups, int32 dragged, int32 target, std::vector<int32>& order) {
    const DragGroup& moved = groups[static_cast<std::size_t>(dragged)];
    const DragGroup& passed = groups[static_cast<std::size_t>(target)];
    const auto at = order.begin();
    if (target < dragged)
        std::rotate(at + passed.first, at + moved.first, at + moved.last + 1);
    else
        std::rotate(at + moved.first, at + moved.last + 1, at + passed.last + 1);
}
