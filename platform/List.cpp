#include "platform/List.h"

#include <algorithm>

bool BList::AddItem(void* item, int32 index) {
    if (index < 0 || index > CountItems())
        return false;
    items_.insert(items_.begin() + index, item);
    return true;
}

bool BList::RemoveItem(void* item) {
    const int32 index = IndexOf(item);
    if (index < 0)
        return false;
    items_.erase(items_.begin() + index);
    return true;
}

void* BList::RemoveItem(int32 index) {
    if (index < 0 || index >= CountItems())
        return nullptr;
    void* item = ItemAt(index);
    items_.erase(items_.begin() + index);
    return item;
}

int32 BList::IndexOf(const void* item) const {
    const auto found = std::find(items_.begin(), items_.end(), item);
    return found == items_.end() ? -1 : static_cast<int32>(found - items_.begin());
}
