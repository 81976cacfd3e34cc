#include <gtest/gtest.h>

#include "resources/StatusImages.h"

namespace {

// The drawings are seen in their source; here is that none of their pixels changes unseen.
TEST(StatusImages, KeepTheirPixels) {
    const struct {
        const char* name;
        const StatusImageData& image;
        std::uint32_t sum;
    } cases[] = {{"up", UpArrowImageData, 2003132485},
                 {"down", DownArrowImageData, 2963478869},
                 {"equals", EqualsSignImageData, 1756346309},
                 {"question", QuestionMarkImageData, 2079535089},
                 {"error", ErrorSymbolImageData, 1196177981}};
    for (const auto& each : cases) {
        std::uint32_t sum = 2166136261; // FNV-1a
        for (const std::uint8_t pixel : each.image)
            sum = (sum ^ pixel) * 16777619;
        EXPECT_EQ(sum, each.sum) << each.name;
    }
}

} // namespace
