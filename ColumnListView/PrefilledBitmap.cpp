#include "ColumnListView/PrefilledBitmap.h"

PrefilledBitmap::PrefilledBitmap(BRect bounds, color_space space, const void* data, int32 length)
    : BBitmap(bounds, space) {
    SetBits(data, length, 0, space);
}
