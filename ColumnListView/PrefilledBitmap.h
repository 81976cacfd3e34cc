#pragma once

#include "platform/Bitmap.h"

// A bitmap that is filled from a table of pixels as it is made, for pictures that are part of the program.
class PrefilledBitmap : public BBitmap {
  public:
    // data: length bytes of pixels, rows top to bottom without padding, in the given colour space. Pixels
    // that the table does not reach keep the colour space's first content.
    PrefilledBitmap(BRect bounds, color_space space, const void* data, int32 length);
};
