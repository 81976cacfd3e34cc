// The rows of a list in their order. Only for the layer's own sources.
#pragma once

#include <algorithm>
#include <vector>

#include "platform/Types.h"

class BListItem;

// A sequence of borrowed rows with its free room in one gap that stands where rows were last put in or taken
// out, so that a run of changes from one end to the other costs as much as one pass. Plain data of one list;
// interface thread.
class RowStore {
  public:
    [[nodiscard]] int32 Count() const { return static_cast<int32>(cells_.size()) - (gapEnd_ - gapStart_); }
    // index must lie inside.
    [[nodiscard]] BListItem* At(int32 index) const { return cells_[Cell(index)]; }

    void Insert(int32 index, const std::vector<BListItem*>& rows) {
        const auto count = static_cast<int32>(rows.size());
        MakeRoom(count);
        MoveGap(index);
        std::copy(rows.begin(), rows.end(), cells_.begin() + gapStart_);
        gapStart_ += count;
    }
    void Remove(int32 index, int32 count) {
        MoveGap(index);
        gapEnd_ += count;
    }
    void Clear() {
        cells_.clear();
        gapStart_ = gapEnd_ = 0;
    }
    // All rows in order, and back: as many as there were, in another order.
    [[nodiscard]] std::vector<BListItem*> Rows() const {
        std::vector<BListItem*> rows(cells_.begin(), cells_.begin() + gapStart_);
        rows.insert(rows.end(), cells_.begin() + gapEnd_, cells_.end());
        return rows;
    }
    void Assign(std::vector<BListItem*> rows) {
        cells_ = std::move(rows);
        gapStart_ = gapEnd_ = static_cast<int32>(cells_.size());
    }

  private:
    [[nodiscard]] std::size_t Cell(int32 index) const {
        return static_cast<std::size_t>(index < gapStart_ ? index : index + (gapEnd_ - gapStart_));
    }
    void MakeRoom(int32 count) {
        const int32 missing = count - (gapEnd_ - gapStart_);
        if (missing <= 0)
            return;
        const int32 more = std::max(missing, Count() / 2);
        cells_.insert(cells_.begin() + gapEnd_, static_cast<std::size_t>(more), nullptr);
        gapEnd_ += more;
    }
    void MoveGap(int32 index) {
        const auto begin = cells_.begin();
        if (index < gapStart_)
            std::move_backward(begin + index, begin + gapStart_, begin + gapEnd_);
        else if (index > gapStart_)
            std::move(begin + gapEnd_, begin + gapEnd_ + (index - gapStart_), begin + gapStart_);
        gapEnd_ += index - gapStart_;
        gapStart_ = index;
    }

    std::vector<BListItem*> cells_;
    int32 gapStart_ = 0; // cells from gapStart_ to before gapEnd_ are free
    int32 gapEnd_ = 0;
};
