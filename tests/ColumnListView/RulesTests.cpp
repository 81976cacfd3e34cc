#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <memory>
#include <string>

#include "ColumnListView/CLVColumn.h"
#include "ColumnListView/CLVListItem.h"
#include "ColumnListView/ColumnGeometry.h"
#include "ColumnListView/DragGroups.h"
#include "ColumnListView/LabelText.h"
#include "ColumnListView/OutlineRows.h"
#include "ColumnListView/ToUpperStr.h"

namespace {

using What = HeaderHit::What;

TEST(Columns, LimitWidthsAndFlags) {
    const float nothing = std::numeric_limits<float>::quiet_NaN();
    const float endless = std::numeric_limits<float>::infinity();
    const struct {
        float width, minWidth;
        float expectedWidth, expectedMinimum;
    } cases[] = {{50, 2, 50, 4},
                 {10, 20, 20, 20},
                 {-5, -5, 4, 4},
                 {nothing, nothing, 4, 4},
                 {endless, 20, 100000, 20}};
    for (const auto& c : cases) {
        const CLVColumn column("x", c.width, 0, c.minWidth);
        EXPECT_EQ(column.Width(), c.expectedWidth) << c.width;
        EXPECT_EQ(column.MinWidth(), c.expectedMinimum) << c.minWidth;
    }
    CLVColumn column("Name", 50, CLVF_SORTABLE, 20);
    column.SetWidth(7);
    EXPECT_EQ(column.Width(), 20);
    EXPECT_STREQ(column.GetLabel(), "Name");
    EXPECT_EQ(column.SortMode(), CLVSortMode::None);
    EXPECT_FALSE(column.HeaderRect().IsValid());
    EXPECT_EQ(CLVColumn(nullptr, 20).GetLabel(), nullptr);

    const CLVColumn expander("gone", 90, 0xFFF, 70);
    EXPECT_EQ(expander.GetLabel(), nullptr);
    EXPECT_EQ(expander.Width(), 20);
    EXPECT_EQ(expander.MinWidth(), 20);
    EXPECT_EQ(expander.Flags(), 0x1EEU);
}

TEST(Geometry, PlacesShownColumnsAndPushesBehindTheExpander) {
    const ColumnLayout layout = LayOutColumns(
        {{20, CLVF_EXPANDER}, {30, CLVF_PASS_INDENT}, {99, CLVF_HIDDEN}, {40, 0}, {50, CLVF_PASS_INDENT}});
    const struct {
        std::size_t index;
        float begin, end;
        bool pushed;
    } cases[] = {{0, 0, 20, false}, {1, 21, 51, true}, {3, 52, 92, true}, {4, 93, 143, false}};
    for (const auto& c : cases) {
        EXPECT_EQ(layout.places[c.index].begin, c.begin);
        EXPECT_EQ(layout.places[c.index].end, c.end);
        EXPECT_EQ(layout.places[c.index].pushed, c.pushed) << c.index;
    }
    EXPECT_EQ(layout.end, 143);
    EXPECT_EQ(layout.pushEnd, 92);
    EXPECT_EQ(LayOutColumns({{20, CLVF_EXPANDER | CLVF_HIDDEN}, {30, 0}}).pushEnd, -1);
    EXPECT_EQ(LayOutColumns({}).end, -1);
}

TEST(Geometry, IndentsFramesUpToTheLastPushedEnd) {
    const BRect row(0, 100, 500, 119);
    EXPECT_EQ(ColumnFrameInRow({21, 51, true}, row, 0, 92), BRect(21, 100, 51, 119));
    EXPECT_EQ(ColumnFrameInRow({21, 51, true}, row, 40, 92), BRect(61, 100, 91, 119));
    EXPECT_EQ(ColumnFrameInRow({52, 92, true}, row, 20, 92), BRect(72, 100, 92, 119));
    EXPECT_FALSE(ColumnFrameInRow({52, 92, true}, row, 60, 92).IsValid());
    EXPECT_EQ(ArrowFrame({20, 100, 40, 119}), BRect(28, 105, 37, 114));
}

TEST(Geometry, FindsWhatAPressTakesHoldOf) {
    // 0..20 fixed width, 21..61, 62..66 (the least width), hidden, 67..97
    const std::vector<ColumnShape> shapes{
        {20, CLVF_FIXED_WIDTH}, {40, 0}, {4, 0}, {80, CLVF_HIDDEN}, {30, 0}};
    const ColumnLayout layout = LayOutColumns(shapes);
    const struct {
        float x;
        What what;
        int32 position;
    } cases[] = {{-1, What::Nothing, -1},  {0, What::Header, 0},   {20, What::Header, 0},
                 {21, What::Header, 1},    {58, What::Header, 1},  {59, What::Border, 1},
                 {61.5F, What::Border, 1}, {62, What::Border, 1},  {64, What::Border, 1},
                 {65, What::Border, 2},    {68, What::Border, 2},  {69, What::Border, 2},
                 {70, What::Header, 4},    {94, What::Header, 4},  {95, What::Border, 4},
                 {97, What::Border, 4},    {98, What::Nothing, -1}};
    for (const auto& c : cases)
        EXPECT_EQ(HitHeader(shapes, layout, c.x), (HeaderHit{c.what, c.position})) << c.x;
}

struct Groups {
    explicit Groups(const std::vector<ColumnShape>& s) : shapes(s), layout(LayOutColumns(s)) {
        groups = BuildDragGroups(shapes, layout);
    }
    std::vector<ColumnShape> shapes;
    ColumnLayout layout;
    std::vector<DragGroup> groups;
};

TEST(Dragging, JoinsColumnsThatMoveTogether) {
    const Groups made({{20, CLVF_KEEP_FIRST | CLVF_MOVE_WITH_NEXT},
                       {30, CLVF_KEEP_FIRST | CLVF_FIXED_POSITION},
                       {10, CLVF_HIDDEN | CLVF_MOVE_WITH_NEXT},
                       {40, CLVF_KEEP_LAST | CLVF_SORTABLE},
                       {50, CLVF_HIDDEN}});
    ASSERT_EQ(made.groups.size(), 3U);
    EXPECT_TRUE(made.groups[0].allKeepFirst && made.groups[0].isShown);
    EXPECT_EQ(made.groups[0].flags, CLVF_KEEP_FIRST | CLVF_FIXED_POSITION);
    EXPECT_EQ(made.groups[0].end, 51);
    EXPECT_EQ(made.groups[1].begin, 52);
    EXPECT_EQ(made.groups[1].lastShown, 3);
    EXPECT_FALSE(made.groups[1].allKeepLast);
    EXPECT_EQ(made.groups[1].flags, CLVF_KEEP_LAST);
    EXPECT_FALSE(made.groups[2].isShown);
    EXPECT_EQ(GroupAt(made.groups, 3), 1);
    EXPECT_EQ(GroupAt(made.groups, 5), -1);
    EXPECT_EQ(MoveGroup(made.groups, 0, 1), (std::vector<int32>{2, 3, 0, 1, 4}));
    EXPECT_EQ(MoveGroup(made.groups, 2, 0), (std::vector<int32>{4, 0, 1, 2, 3}));
}

TEST(Dragging, SwapsWhereThePointerHasPassedAndTheFlagsAllow) {
    constexpr uint32 first = CLVF_KEEP_FIRST;
    constexpr uint32 last = CLVF_KEEP_LAST;
    // Three columns 0..100, 101..121 and 122..172; the middle one is dragged.
    const struct {
        float x;
        uint32 flags[3];
        int32 target;
    } cases[] = {{111, {0, 0, 0}, -1},
                 {20, {0, 0, 0}, -1},
                 {19, {0, 0, 0}, 0},
                 {-50, {0, 0, 0}, 0},
                 {152, {0, 0, 0}, -1},
                 {153, {0, 0, 0}, 2},
                 {900, {0, 0, 0}, 2},
                 {5, {first, 0, 0}, -1},
                 {5, {first, first, 0}, 0},
                 {5, {0, last, last}, -1},
                 {5, {last, last, last}, 0},
                 {160, {0, 0, last}, -1},
                 {160, {0, last, last}, 2},
                 {160, {first, first, 0}, -1},
                 {160, {first, first, first}, 2},
                 {130, {0, 0, CLVF_HIDDEN}, -1},
                 {5, {CLVF_HIDDEN, 0, 0}, -1}};
    for (const auto& c : cases) {
        const Groups made({{100, c.flags[0]}, {20, c.flags[1]}, {50, c.flags[2]}});
        EXPECT_EQ(GroupToSwapWith(made.groups, 1, c.x), c.target) << c.x << " " << c.flags[0] << c.flags[1];
    }
    // A wide group passes a narrow neighbour only when the pointer is over it, and does not swing back.
    const Groups wide({{10, 0}, {5, CLVF_HIDDEN}, {100, 0}});
    EXPECT_EQ(GroupToSwapWith(wide.groups, 2, 11), -1);
    EXPECT_EQ(GroupToSwapWith(wide.groups, 2, 10), 0);
    const Groups after({{100, 0}, {10, 0}});
    EXPECT_EQ(GroupToSwapWith(after.groups, 0, 10), -1);
}

TEST(Dragging, KeepsSidesAndHoldsTheOutline) {
    EXPECT_EQ(KeepingOrder({{9, CLVF_KEEP_LAST}, {9, 0}, {9, CLVF_KEEP_FIRST}, {9, 0}, {9, CLVF_KEEP_LAST}}),
              (std::vector<int32>{2, 1, 3, 0, 4}));
    EXPECT_EQ(HeldOutlineLeft(-5, 30, 0, 200), 0);
    EXPECT_EQ(HeldOutlineLeft(190, 30, 0, 200), 170);
    EXPECT_EQ(HeldOutlineLeft(60, 300, 40, 200), 40);
    EXPECT_EQ(HeldOutlineLeft(60, 30, 40, 200), 60);
}

TEST(Labels, AreCutBetweenCharactersToFit) {
    const auto measure = [](const std::string& text) { return static_cast<float>(text.size()); };
    const struct {
        const char* text;
        float width;
        const char* expected;
    } cases[] = {{"Retire", 6, "Retire"},
                 {"Retire", 5, "Re..."},
                 {"Retire", 3, "..."},
                 {"Retire", -1, "..."},
                 {"", -1, ""},
                 {"a\xC3\xA4z12", 5, "a..."},
                 {"a\xC3\xA4z123", 6, "a\xC3\xA4..."}};
    for (const auto& c : cases)
        EXPECT_EQ(TruncatedLabel(c.text, c.width, measure), c.expected) << c.text << c.width;
}

TEST(Labels, UpperCaseKnowsAsciiOnly) {
    for (const auto& [text, upper] :
         {std::pair{"az`{1.250,00", "AZ`{1.250,00"}, {"", ""}, {"n\xC3\xA4", "N\xC3\xA4"}}) {
        const std::unique_ptr<char[]> copy(ToUpperStr(text));
        EXPECT_STREQ(copy.get(), upper);
    }
}

class OutlineRow : public CLVListItem {
  public:
    OutlineRow(uint32 level, bool expanded, int k) : CLVListItem(level, false, expanded, 10), key(k) {}
    void DrawItemColumn(BView*, BRect, int32, bool) override {}
    int key;
};

// Rows from lines such as "1-7": level, expanded (+) or not (-), sort key.
struct Outline {
    explicit Outline(std::initializer_list<const char*> lines) {
        for (const char* line : lines) {
            owned.push_back(std::make_unique<OutlineRow>(line[0] - '0', line[1] == '+', line[2] - '0'));
            rows.push_back(owned.back().get());
        }
    }
    std::vector<std::unique_ptr<OutlineRow>> owned;
    OutlineSequence rows;
};

TEST(OutlineOrder, KnowsWhoStandsUnderWhomAndWhoIsInSight) {
    const Outline outline({"0+1", "1-2", "2+3", "3+4", "1+5", "0-6", "2+7", "1+8"});
    const int32 above[] = {-1, 0, 1, 2, 0, -1, 5, 5};
    const int32 ends[] = {5, 4, 4, 4, 5, 8, 7, 8};
    for (int32 i = 0; i < 8; i++) {
        EXPECT_EQ(SuperitemIndex(outline.rows, i), above[i]) << i;
        EXPECT_EQ(DescendantsEnd(outline.rows, i), ends[i]) << i;
    }
    EXPECT_EQ(DescendantsEnd(outline.rows, 3, 5), 5);
    const std::vector<bool> all{true, true, false, false, true, true, false, false};
    EXPECT_EQ(RowsInSight(outline.rows, 0, 8), all);
    for (int32 i = 0; i < 8; i++)
        EXPECT_EQ(RowsInSight(outline.rows, i, 8), std::vector<bool>(all.begin() + i, all.end())) << i;
}

TEST(OutlineOrder, SortsEveryLevelUnderItsSuperitem) {
    const Outline outline({"0+5", "1+3", "2+9", "2+8", "1+1", "0+2", "1+7", "0+2", "1+4"});
    const OutlineSequence sorted =
        SortedOutline(outline.rows, [](const CLVListItem* a, const CLVListItem* b) {
            return static_cast<const OutlineRow*>(a)->key - static_cast<const OutlineRow*>(b)->key;
        });
    std::string keys;
    for (const CLVListItem* row : sorted)
        keys += std::to_string(static_cast<const OutlineRow*>(row)->key);
    EXPECT_EQ(keys, "272451389");
}

} // namespace
