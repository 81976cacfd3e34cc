#pragma once

#include <vector>

#include "platform/Rect.h"

// An area as a list of rectangles, used to say where a view may draw. A plain value. Its rectangles may
// overlap; it is no area arithmetic.
class BRegion {
  public:
    BRegion() = default;
    explicit BRegion(BRect rect) { Include(rect); }

    // Adds rect to the area; an invalid rectangle adds nothing.
    void Include(BRect rect) {
        if (rect.IsValid())
            rects_.push_back(rect);
    }
    void Set(BRect rect) {
        MakeEmpty();
        Include(rect);
    }
    void MakeEmpty() { rects_.clear(); }

    [[nodiscard]] int CountRects() const { return static_cast<int>(rects_.size()); }
    [[nodiscard]] BRect RectAt(int index) const { return rects_[static_cast<std::size_t>(index)]; }
    // The smallest rectangle that holds the area; invalid when it is empty.
    [[nodiscard]] BRect Frame() const {
        BRect frame;
        for (const BRect& rect : rects_)
            frame = frame.IsValid() ? (frame | rect) : rect;
        return frame;
    }

  private:
    std::vector<BRect> rects_;
};
