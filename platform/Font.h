#pragma once

#include <memory>

#include "platform/Types.h"

// Heights in logical pixels; leading is the extra space between two lines.
struct font_height {
    float ascent = 0;
    float descent = 0;
    float leading = 0;
};

struct FontFace;

// A font: a face and a size in logical pixels. A value; copies are cheap. It measures text, it does not draw.
// The three system fonts exist from the construction of the application object to its end and follow the
// person's interface font.
class BFont {
  public:
    // The plain system font. An application object must exist.
    BFont();

    [[nodiscard]] float Size() const;
    void SetSize(float size);

    void GetHeight(font_height* height) const;
    // Width of the UTF-8 text in logical pixels, not rounded.
    [[nodiscard]] float StringWidth(const char* text) const;

  private:
    friend struct FontAccess;
    explicit BFont(std::shared_ptr<const FontFace> face) : face_(std::move(face)) {}

    std::shared_ptr<const FontFace> face_;
};

extern const BFont* be_plain_font;
extern const BFont* be_bold_font;
extern const BFont* be_fixed_font;
