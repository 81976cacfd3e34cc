#pragma once

#include "platform/Rect.h"

// An area, used to say where a view may draw: one rectangle. A plain value.
class BRegion {
  public:
    BRegion() = default;
    explicit BRegion(BRect rect) : frame_(rect) {}

    void Set(BRect rect) { frame_ = rect; }
    // Invalid when the area is empty.
    [[nodiscard]] BRect Frame() const { return frame_; }

  private:
    BRect frame_;
};
