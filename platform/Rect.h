#pragma once

// Points and rectangles, in logical pixels.

struct BPoint {
    float x = 0;
    float y = 0;

    BPoint() = default;
    BPoint(float x_, float y_) : x(x_), y(y_) {}

    bool operator==(const BPoint&) const = default;
    BPoint operator+(const BPoint& other) const { return {x + other.x, y + other.y}; }
    BPoint operator-(const BPoint& other) const { return {x - other.x, y - other.y}; }
};

// A rectangle that includes its right and bottom edges: (0, 0, 15, 15) covers 16 x 16 pixels, though its
// Width() is 15. The default rectangle (0, 0, -1, -1) is invalid: it covers nothing.
struct BRect {
    float left = 0;
    float top = 0;
    float right = -1;
    float bottom = -1;

    BRect() = default;
    BRect(float left_, float top_, float right_, float bottom_)
        : left(left_), top(top_), right(right_), bottom(bottom_) {}

    bool operator==(const BRect&) const = default;

    [[nodiscard]] bool IsValid() const { return left <= right && top <= bottom; }
    [[nodiscard]] float Width() const { return right - left; }
    [[nodiscard]] float Height() const { return bottom - top; }
    [[nodiscard]] BPoint LeftTop() const { return {left, top}; }
    [[nodiscard]] bool Contains(BPoint point) const {
        return point.x >= left && point.x <= right && point.y >= top && point.y <= bottom;
    }
    [[nodiscard]] bool Intersects(const BRect& other) const {
        return IsValid() && other.IsValid() && other.left <= right && left <= other.right &&
               other.top <= bottom && top <= other.bottom;
    }

    void OffsetBy(float dx, float dy) {
        left += dx;
        right += dx;
        top += dy;
        bottom += dy;
    }
    void OffsetTo(float x, float y) { OffsetBy(x - left, y - top); }
    // Moves every edge inwards.
    void InsetBy(float dx, float dy) {
        left += dx;
        right -= dx;
        top += dy;
        bottom -= dy;
    }

    // The common part; invalid when there is none.
    BRect operator&(const BRect& other) const {
        return {left > other.left ? left : other.left, top > other.top ? top : other.top,
                right < other.right ? right : other.right, bottom < other.bottom ? bottom : other.bottom};
    }
};

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
