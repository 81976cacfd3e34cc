#include "resources/StatusImages.h"

#include <string_view>

namespace {

// Turns a drawing of 16 lines of 16 characters into an image: '.' is transparent, '#' the first colour, 'o'
// the second.
constexpr StatusImageData Painted(std::string_view drawing, std::uint8_t colour,
                                  std::uint8_t second = TransparentPixel) {
    StatusImageData image{};
    for (std::size_t i = 0; i < image.size(); ++i)
        image.at(i) = drawing.at(i) == '#' ? colour : drawing.at(i) == 'o' ? second : TransparentPixel;
    return image;
}

} // namespace

// clang-format off
constexpr StatusImageData UpArrowImageData = Painted(
    "................"
    "................"
    ".......#........"
    "......###......."
    "......###......."
    ".....#####......"
    ".....#####......"
    "....#######....."
    "......###......."
    "......###......."
    "......###......."
    "......###......."
    "......#####....."
    ".......###......"
    "................"
    "................",
    143);

constexpr StatusImageData DownArrowImageData = Painted(
    "................"
    "................"
    ".......###......"
    "......#####....."
    "......###......."
    "......###......."
    "......###......."
    "......###......."
    "....#######....."
    ".....#####......"
    ".....#####......"
    "......###......."
    "......###......."
    ".......#........"
    "................"
    "................",
    228);

constexpr StatusImageData EqualsSignImageData = Painted(
    "................"
    "................"
    "................"
    "................"
    "................"
    "................"
    ".....######....."
    ".....######....."
    "................"
    ".....######....."
    ".....######....."
    "................"
    "................"
    "................"
    "................"
    "................",
    191);

constexpr StatusImageData QuestionMarkImageData = Painted(
    "................"
    "................"
    "......#####....."
    ".....#######...."
    ".....##...##...."
    ".....#....##...."
    "..........##...."
    "........###....."
    ".......###......"
    ".......##......."
    ".......##......."
    ".......##......."
    "................"
    ".......##......."
    ".......##......."
    "................",
    163);

constexpr StatusImageData ErrorSymbolImageData = Painted(
    "................"
    "................"
    "................"
    "...##oo##oo##..."
    "...#oo##oo##o..."
    "...oo##oo##oo..."
    "...o##oo##oo#..."
    "...##oo##oo##..."
    "...#oo##oo##o..."
    "...oo##oo##oo..."
    "...o##oo##oo#..."
    "...##oo##oo##..."
    "...#oo##oo##o..."
    "................"
    "................"
    "................",
    0, 252);
// clang-format on
