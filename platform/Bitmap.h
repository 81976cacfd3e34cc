#pragma once

#include <memory>

#include "platform/Rect.h"
#include "platform/Types.h"

struct BitmapPixels;

// The value that stays see-through in a B_CMAP8 bitmap drawn in the mode B_OP_OVER.
constexpr uint8 B_TRANSPARENT_MAGIC_CMAP8 = 255;

// The colour of an entry of the system's 8-bit colour map; entry 255 is fully transparent.
rgb_color color_map_entry(uint8 index);

// A picture in memory, drawn by BView::DrawBitmap. Not a view: nothing draws into it but SetBits. Interface
// thread.
class BBitmap {
  public:
    BBitmap(BRect bounds, color_space space);
    ~BBitmap();
    BBitmap(const BBitmap&) = delete;
    BBitmap& operator=(const BBitmap&) = delete;

    [[nodiscard]] BRect Bounds() const { return bounds_; }

    // Copies length bytes of pixels, rows top to bottom without padding, to the byte offset given, one byte a
    // pixel. Bytes beyond the bitmap are left out.
    void SetBits(const void* data, int32 length, int32 offset, color_space space);

  private:
    friend struct BitmapAccess;

    BRect bounds_;
    std::unique_ptr<BitmapPixels> pixels_;
};
