#include "ColumnListView/OutlineRows.h"

#include <algorithm>
#include <utility>

#include "ColumnListView/CLVListItem.h"

namespace {

uint32 LevelAt(const OutlineSequence& rows, int32 index) {
    return rows[static_cast<std::size_t>(index)]->OutlineLevel();
}

int32 Count(const OutlineSequence& rows) {
    return static_cast<int32>(rows.size());
}

// Sorts the rows from begin to end, which stand under one row or at the top, with what is below them.
template <class Compare>
void SortLevel(OutlineSequence& rows, int32 begin, int32 end, const Compare& compare) {
    std::vector<OutlineSequence> blocks; // a row of the level and its descendants
    for (int32 next = begin; next < end;) {
        // What stands behind end may not be in its order yet.
        const int32 first = std::exchange(next, std::min(end, DescendantsEnd(rows, next, next + 1)));
        blocks.emplace_back(rows.begin() + first, rows.begin() + next);
    }
    std::stable_sort(blocks.begin(), blocks.end(),
                     [&](const auto& a, const auto& b) { return compare(a.front(), b.front()) < 0; });
    for (const OutlineSequence& block : blocks) {
        std::copy(block.begin(), block.end(), rows.begin() + begin);
        const int32 blockEnd = begin + Count(block);
        SortLevel(rows, begin + 1, blockEnd, compare);
        begin = blockEnd;
    }
}

} // namespace

int32 DescendantsEnd(const OutlineSequence& rows, int32 begin, int32 end) {
    uint32 lowest = LevelAt(rows, begin);
    for (int32 i = begin + 1; i < end; ++i)
        lowest = std::min(lowest, LevelAt(rows, i));
    while (end < Count(rows) && LevelAt(rows, end) > lowest)
        ++end;
    return end;
}

int32 SuperitemIndex(const OutlineSequence& rows, int32 index) {
    const uint32 level = LevelAt(rows, index);
    int32 above = level == 0 ? -1 : index - 1;
    while (above >= 0 && LevelAt(rows, above) >= level)
        --above;
    return above;
}

OutlineSequence RowsInSight(const OutlineSequence& rows, int32 begin, int32 end) {
    int32 top = begin;
    while (top > 0 && (top >= Count(rows) || LevelAt(rows, top) > 0))
        --top;
    OutlineSequence inSight;
    const CLVListItem* collapsed = nullptr; // what the rows with higher levels are hidden under
    for (int32 i = top; i < end; ++i) {
        CLVListItem* row = rows[static_cast<std::size_t>(i)];
        if (collapsed && row->OutlineLevel() > collapsed->OutlineLevel())
            continue;
        collapsed = row->IsExpanded() ? nullptr : row;
        if (i >= begin)
            inSight.push_back(row);
    }
    return inSight;
}

OutlineSequence SortedOutline(const OutlineSequence& rows,
                              const std::function<int(const CLVListItem*, const CLVListItem*)>& compare) {
    OutlineSequence sorted = rows;
    SortLevel(sorted, 0, Count(sorted), compare);
    return sorted;
}
