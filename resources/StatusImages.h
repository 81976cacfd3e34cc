#pragma once

#include <array>
#include <cstdint>

// The five status images of the investment list: 16 rows of 16 pixels from the top left, one byte a pixel,
// each a colour of the 8-bit colour map or TransparentPixel. Shapes differ as well as colours, so that the
// states can be told apart without colour.
inline constexpr std::uint8_t TransparentPixel = 255;
using StatusImageData = std::array<std::uint8_t, 256>;

// The price has risen.
extern const StatusImageData UpArrowImageData;

// The price has fallen.
extern const StatusImageData DownArrowImageData;

// The price has stayed the same.
extern const StatusImageData EqualsSignImageData;

// There is no earlier price to compare with.
extern const StatusImageData QuestionMarkImageData;

// The last look-up found no price.
extern const StatusImageData ErrorSymbolImageData;
