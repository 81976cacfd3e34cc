#pragma once

#include <vector>

#include "platform/Types.h"

// An ordered list of borrowed pointers. It owns none of what it points at. Not for sharing between threads.
class BList {
  public:
    bool AddItem(void* item) {
        items_.push_back(item);
        return true;
    }
    void MakeEmpty() { items_.clear(); }

    [[nodiscard]] void* ItemAt(int32 index) const {
        return index >= 0 && index < CountItems() ? items_[static_cast<std::size_t>(index)] : nullptr;
    }
    [[nodiscard]] int32 CountItems() const { return static_cast<int32>(items_.size()); }

  private:
    std::vector<void*> items_;
};
