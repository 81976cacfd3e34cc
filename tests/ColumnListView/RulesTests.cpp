#include <array>
#include <cmath>
#include <limits>

#include "ColumnListView/ColumnGeometry.h"
#include "ColumnListView/ListFixture.h"
#include "util/Utf8.h"

namespace {

TEST(Columns, LimitWidthsAndFlags) {
    const float nothing = std::numeric_limits<float>::quiet_NaN();
    const float endless = std::numeric_limits<float>::infinity();
    const std::tuple<float, float, std::pair<float, float>> cases[] = {{50, 2, {50, 4}},
                                                                       {10, 20, {20, 20}},
                                                                       {-5, -5, {4, 4}},
                                                                       {nothing, nothing, {4, 4}},
                                                                       {endless, 20, {100000, 20}}};
    for (const auto& [width, minWidth, limited] : cases) {
        const CLVColumn column("x", width, 0, minWidth);
        EXPECT_EQ(std::pair(column.Width(), column.MinWidth()), limited) << width;
    }
    const CLVColumn expander("gone", 90, 0xFFF, 70);
    EXPECT_EQ(expander.GetLabel(), nullptr);
    EXPECT_EQ(std::pair(expander.Width(), expander.MinWidth()), std::pair(20.0F, 20.0F));
    EXPECT_EQ(expander.Flags(), 0x1EEU);
}

TEST(Geometry, PlacesShownColumnsAndPushesBehindTheExpander) {
    const ColumnLayout layout = LayOutColumns(
        {{20, CLVF_EXPANDER}, {30, CLVF_PASS_INDENT}, {99, CLVF_HIDDEN}, {40, 0}, {50, CLVF_PASS_INDENT}});
    std::string places;
    for (const auto& [begin, end, pushed] : layout.places)
        places += std::to_string(std::lround(begin)) + (pushed ? " pushed to " : " to ") +
                  std::to_string(std::lround(end)) + ", ";
    EXPECT_EQ(places, "0 to 20, 21 pushed to 51, 52 to 52, 52 pushed to 92, 93 to 143, ");
    EXPECT_EQ(layout.end, 143);
    EXPECT_EQ(layout.pushEnd, 92);
    EXPECT_EQ(LayOutColumns({{20, CLVF_EXPANDER | CLVF_HIDDEN}, {30, 0}}).pushEnd, -1);
    const BRect row(0, 100, 500, 119);
    EXPECT_EQ(ColumnFrameInRow({52, 92, true}, row, 20, 92), BRect(72, 100, 92, 119));
    EXPECT_FALSE(ColumnFrameInRow({52, 92, true}, row, 60, 92).IsValid());
}

TEST(Geometry, FindsWhatAPressTakesHoldOf) {
    const auto hits = [](const std::vector<ColumnShape>& shapes) {
        return Runs(-1, 100, 0.5F, [&](float x) {
            const auto [what, position] = HitHeader(shapes, LayOutColumns(shapes), x);
            return std::string{" |H"[static_cast<int>(what)]} + std::to_string(position);
        });
    };
    // 0..20 fixed width, 21..61, 62..66 (the least width), hidden, 67..97
    EXPECT_EQ(hits({{20, CLVF_FIXED_WIDTH}, {40, 0}, {4, 0}, {80, CLVF_HIDDEN}, {30, 0}}),
              "-1 -1 0H0 21H1 59|1 64.5|2 69.5H4 95|4 98 -1 ");
    EXPECT_EQ(hits({{20, 0}, {40, CLVF_FIXED_WIDTH}}), "-1 -1 0H0 18|0 23.5H1 62 -1 ");
}

std::vector<DragGroup> Groups(const std::vector<ColumnShape>& shapes) {
    return BuildDragGroups(shapes, LayOutColumns(shapes));
}

TEST(Dragging, JoinsColumnsThatMoveTogether) {
    const std::vector<DragGroup> groups = Groups({{20, CLVF_KEEP_FIRST | CLVF_MOVE_WITH_NEXT},
                                                  {30, CLVF_KEEP_FIRST | CLVF_FIXED_POSITION},
                                                  {10, CLVF_HIDDEN | CLVF_MOVE_WITH_NEXT},
                                                  {40, CLVF_KEEP_LAST | CLVF_SORTABLE},
                                                  {50, CLVF_HIDDEN}});
    std::ostringstream all;
    for (const DragGroup& group : groups)
        all << group.first << "-" << group.last << " (" << group.lastShown << ") " << group.begin << ".."
            << group.end << " " << group.allKeepFirst << group.allKeepLast << " " << group.flags << "; ";
    EXPECT_EQ(all.str(), "0-1 (1) 0..51 10 10; 2-3 (3) 52..92 00 16; 4-4 (-1) 0..0 00 0; ");
    EXPECT_EQ(GroupAt(groups, 0), 0);
    EXPECT_EQ(GroupAt(groups, 3), 1);
    EXPECT_EQ(GroupAt(groups, 5), -1);
    Order order{5, 6, 7, 8, 9};
    MoveGroup(groups, 0, 1, order);
    EXPECT_EQ(order, (Order{7, 8, 5, 6, 9}));
    MoveGroup(groups, 2, 0, order);
    EXPECT_EQ(order, (Order{9, 7, 8, 5, 6}));
}

TEST(Dragging, SwapsWhereThePointerHasPassedAndTheFlagsAllow) {
    constexpr uint32 first = CLVF_KEEP_FIRST;
    constexpr uint32 last = CLVF_KEEP_LAST;
    const auto targets = [](const std::vector<DragGroup>& groups, int32 dragged) {
        return Runs(-50, 900, 1,
                    [&](float x) { return ">" + std::to_string(GroupToSwapWith(groups, dragged, x)); });
    };
    // Three columns 0..100, 101..121 and 122..172; the middle one is dragged.
    const std::pair<std::array<uint32, 3>, const char*> cases[] = {
        {{0, 0, 0}, "-50>0 20>-1 153>2 "},
        {{first, 0, 0}, "-50>-1 153>2 "},
        {{first, first, 0}, "-50>0 20>-1 "},
        {{first, first, first}, "-50>0 20>-1 153>2 "},
        {{0, 0, last}, "-50>0 20>-1 "},
        {{0, last, last}, "-50>-1 153>2 "},
        {{last, last, last}, "-50>0 20>-1 153>2 "},
        {{0, 0, CLVF_HIDDEN}, "-50>0 20>-1 "},
        {{CLVF_HIDDEN, 0, 0}, "-50>-1 52>2 "}};
    for (const auto& [flags, expected] : cases)
        EXPECT_EQ(targets(Groups({{100, flags[0]}, {20, flags[1]}, {50, flags[2]}}), 1), expected)
            << flags[0] << flags[1] << flags[2];
    // A wide group passes a narrow neighbour only when the pointer is over it, and does not swing back.
    EXPECT_EQ(targets(Groups({{10, 0}, {5, CLVF_HIDDEN}, {100, 0}}), 2), "-50>0 11>-1 ");
    EXPECT_EQ(targets(Groups({{100, 0}, {10, 0}}), 0), "-50>-1 101>1 ");
}

TEST(Labels, AreCutBetweenCharactersAndRaised) {
    const auto measure = [](const std::string& text) { return static_cast<float>(text.size()); };
    for (const auto& [text, width, expected] : {std::tuple{"Retire", 6, "Retire"},
                                                {"Retire", 5, "Re..."},
                                                {"Retire", -1, "..."},
                                                {"", -1, ""},
                                                {"a\xC3\xA4z12", 5, "a..."},
                                                {"a\xC3\xA4z123", 6, "a\xC3\xA4..."}})
        EXPECT_EQ(TruncatedLabel(text, static_cast<float>(width), measure), expected) << text << width;
    EXPECT_STREQ(std::unique_ptr<char[]>(ToUpperStr("az`{1.250\xC3\xA4")).get(), "AZ`{1.250\xC3\xA4");
}

} // namespace
