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
    // Inserts before index (0 to CountItems()); false when the index lies outside.
    bool AddItem(void* item, int32 index);
    // Takes out the first occurrence; false when it is not there.
    bool RemoveItem(void* item);
    // Takes out and returns the item at index; null when the index lies outside.
    void* RemoveItem(int32 index);
    void MakeEmpty() { items_.clear(); }

    [[nodiscard]] void* ItemAt(int32 index) const {
        return index >= 0 && index < CountItems() ? items_[static_cast<std::size_t>(index)] : nullptr;
    }
    // -1 when the item is not in the list.
    [[nodiscard]] int32 IndexOf(const void* item) const;
    [[nodiscard]] int32 CountItems() const { return static_cast<int32>(items_.size()); }
    [[nodiscard]] bool IsEmpty() const { return items_.empty(); }

  private:
    std::vector<void*> items_;
};
