#include "ColumnListView/OutlineRows.h"

#include <algorithm>

#include "ColumnListView/CLVListItem.h"

namespace {

uint32 LevelAt(const OutlineSequence& rows, int32 index) {
    return rows[static_cast<std::size_t>(index)]->OutlineLevel();
}

int32 Count(const OutlineSequence& rows) {
    return static_cast<int32>(rows.size());
}

bool InSight(const OutlineSequence& rows, int32 index) {
    for (int32 above = SuperitemIndex(rows, index); above >= 0; above = SuperitemIndex(rows, above))
        if (!rows[static_cast<std::size_t>(above)]->IsExpanded())
            return false;
    return true;
}

} // namespace

int32 DescendantsEnd(const OutlineSequence& rows, int32 index) {
    return DescendantsEnd(rows, index, index + 1);
}

int32 DescendantsEnd(const OutlineSequence& rows, int32 begin, int32 end) {
    uint32 lowest = LevelAt(rows, begin);
    for (int32 i = begin + 1; i < end; i++)
        lowest = std::min(lowest, LevelAt(rows, i));
    while (end < Count(rows) && LevelAt(rows, end) > lowest)
        end++;
    return end;
}

int32 SuperitemIndex(const OutlineSequence& rows, int32 index) {
    const uint32 level = LevelAt(rows, index);
    int32 above = level == 0 ? -1 : index - 1;
    while (above >= 0 && LevelAt(rows, above) >= level)
        above--;
    return above;
}

std::vector<bool> RowsInSight(const OutlineSequence& rows, int32 begin, int32 end) {
    std::vector<const CLVListItem*> above; // the rows that the next one may stand under, lowest level first
    std::vector<bool> aboveSeen;
    std::vector<bool> inSight;
    for (int32 i = begin; i < end; i++) {
        const CLVListItem& row = *rows[static_cast<std::size_t>(i)];
        bool knowsSibling = false;
        bool siblingSeen = false;
        while (!above.empty() && above.back()->OutlineLevel() >= row.OutlineLevel()) {
            knowsSibling = above.back()->OutlineLevel() == row.OutlineLevel();
            siblingSeen = aboveSeen.back();
            above.pop_back();
            aboveSeen.pop_back();
        }
        bool seen = siblingSeen;
        if (!above.empty())
            seen = aboveSeen.back() && above.back()->IsExpanded();
        else if (!knowsSibling)
            seen = InSight(rows, i);
        inSight.push_back(seen);
        above.push_back(&row);
        aboveSeen.push_back(seen);
    }
    return inSight;
}

OutlineSequence SortedOutline(const OutlineSequence& rows,
                              const std::function<int(const CLVListItem*, const CLVListItem*)>& compare) {
    // below[0] are the rows at the top, below[i + 1] the rows directly under row i.
    std::vector<std::vector<int32>> below(rows.size() + 1);
    std::vector<int32> above;
    for (int32 i = 0; i < Count(rows); i++) {
        while (!above.empty() && LevelAt(rows, above.back()) >= LevelAt(rows, i))
            above.pop_back();
        below[above.empty() ? 0 : static_cast<std::size_t>(above.back()) + 1].push_back(i);
        above.push_back(i);
    }
    const auto rowAt = [&](int32 index) { return rows[static_cast<std::size_t>(index)]; };
    for (std::vector<int32>& siblings : below)
        std::stable_sort(siblings.begin(), siblings.end(),
                         [&](int32 a, int32 b) { return compare(rowAt(a), rowAt(b)) < 0; });

    OutlineSequence sorted;
    sorted.reserve(rows.size());
    std::vector<int32> waiting(below[0].rbegin(), below[0].rend());
    while (!waiting.empty()) {
        const int32 index = waiting.back();
        waiting.pop_back();
        sorted.push_back(rowAt(index));
        const std::vector<int32>& under = below[static_cast<std::size_t>(index) + 1];
        waiting.insert(waiting.end(), under.rbegin(), under.rend());
    }
    return sorted;
}
