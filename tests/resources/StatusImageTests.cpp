#include <gtest/gtest.h>

#include <vector>

#include "resources/StatusImages.h"

namespace {

struct Run {
    std::size_t firstRow, lastRow, firstColumn, lastColumn;
};

StatusImageData Filled(int colour, const std::vector<Run>& runs) {
    StatusImageData image;
    image.fill(TransparentPixel);
    for (const Run& run : runs) {
        for (std::size_t row = run.firstRow; row <= run.lastRow; ++row) {
            for (std::size_t column = run.firstColumn; column <= run.lastColumn; ++column)
                image.at(row * 16 + column) = static_cast<std::uint8_t>(colour);
        }
    }
    return image;
}

TEST(StatusImages, HaveTheirPixels) {
    EXPECT_EQ(UpArrowImageData, Filled(143, {{2, 2, 7, 7},
                                             {3, 4, 6, 8},
                                             {5, 6, 5, 9},
                                             {7, 7, 4, 10},
                                             {8, 11, 6, 8},
                                             {12, 12, 6, 10},
                                             {13, 13, 7, 9}}));
    EXPECT_EQ(DownArrowImageData, Filled(228, {{2, 2, 7, 9},
                                               {3, 3, 6, 10},
                                               {4, 7, 6, 8},
                                               {8, 8, 4, 10},
                                               {9, 10, 5, 9},
                                               {11, 12, 6, 8},
                                               {13, 13, 7, 7}}));
    EXPECT_EQ(EqualsSignImageData, Filled(191, {{6, 7, 5, 10}, {9, 10, 5, 10}}));
    EXPECT_EQ(QuestionMarkImageData, Filled(163, {{2, 2, 6, 10},
                                                  {3, 3, 5, 11},
                                                  {4, 4, 5, 6},
                                                  {4, 4, 10, 11},
                                                  {5, 5, 5, 5},
                                                  {5, 5, 10, 11},
                                                  {6, 6, 10, 11},
                                                  {7, 7, 8, 10},
                                                  {8, 8, 7, 9},
                                                  {9, 11, 7, 8},
                                                  {13, 14, 7, 8}}));
    StatusImageData stripes = Filled(252, {{3, 12, 3, 12}});
    for (std::size_t pixel = 0; pixel < stripes.size(); ++pixel) {
        if (stripes.at(pixel) == 252 && (pixel / 16 + pixel % 16) % 4 >= 2)
            stripes.at(pixel) = 0;
    }
    EXPECT_EQ(ErrorSymbolImageData, stripes);
}

} // namespace
