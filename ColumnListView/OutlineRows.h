#pragma once

// The order of an outline: rows in one sequence, each followed by the rows below it, which have higher
// levels. Rules without a window; the rows are borrowed.

#include <functional>
#include <vector>

#include "platform/Types.h"

class CLVListItem;

using OutlineSequence = std::vector<CLVListItem*>;

// The index behind the rows from begin to end (begin < end) and all descendants of any of them.
[[nodiscard]] int32 DescendantsEnd(const OutlineSequence& rows, int32 begin, int32 end);

// The index of the row that the row at index stands under; -1 at the top.
[[nodiscard]] int32 SuperitemIndex(const OutlineSequence& rows, int32 index);

// The rows from begin to end for which every row above them in the outline is expanded.
[[nodiscard]] OutlineSequence RowsInSight(const OutlineSequence& rows, int32 begin, int32 end);

// The rows with every level sorted by itself under its superitem; rows that compare equal keep their order.
[[nodiscard]] OutlineSequence
SortedOutline(const OutlineSequence& rows,
              const std::function<int(const CLVListItem*, const CLVListItem*)>& compare);
