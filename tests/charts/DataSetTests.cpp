// What the charts are made of: slices and lines, without a window.
#include <cmath>
#include <limits>

#include <gtest/gtest.h>

#include "DataFolder.h"
#include "charts/ChartDataSets.h"
#include "charts/ChartGeometry.h"

namespace {

using Slices = std::vector<std::pair<std::string, float>>;

Slices SlicesIn(const CHART_DATA_SET& set) {
    Slices slices;
    for (std::size_t i = 0; i < static_cast<std::size_t>(set.count); ++i)
        slices.emplace_back(set.labels[i].data(), set.values[i]);
    return slices;
}

struct Held {
    const char* name;
    const char* ticker;
    const char* type;
    const char* risk;
    bool retire;
    float shares, value;
};
constexpr Held Portfolio[] = {
    {"Acme", "ABC", "Stock Fund", "MED", true, 1, 10},
    {"Birch", "abc", "STOCK", "Med", false, 2, 20},
    {"Acme", "ABC", "Bond Fund", "low", false, 4, 40},
    {"Cedar", " ", "Cash", "Medium", false, 8, 80},
    {"Dogwood", "", "", "", true, 16, 160},
};

ChartDataSets SetsOf(std::span<const Held> all) {
    ChartDataSets sets;
    EXPECT_EQ(sets.GenerateDataSets(static_cast<long>(all.size())), 0);
    int index = 0;
    for (const Held& held : all) {
        INVESTMENT_DATA record = MakeInvestment("P", held.name, held.shares, 1, held.type);
        CopyTextZeroed(record.Ticker, held.ticker);
        CopyTextZeroed(record.Risk, held.risk);
        record.Retire = held.retire ? 1 : 0;
        record.Value = held.value;
        sets.AccumulateDataSet(index++, record);
    }
    return sets;
}

} // namespace

TEST(ChartDataSets, GroupByTheirKeysInTheOrderMet) {
    const ChartDataSets sets = SetsOf(Portfolio);
    const Slices expected[] = {
        {{"Acme", 10}, {"Birch", 20}, {"Acme", 40}, {"Cedar", 80}, {"Dogwood", 160}},
        {{"ABC", 50}, {"abc", 20}},
        {{"Stock Fund", 10}, {"STOCK", 20}, {"Bond Fund", 40}, {"Cash", 80}},
        {{"Fund", 50}, {"Stock", 20}, {"Other", 240}},
        {{"Low", 40}, {"Med", 30}, {"High", 0}},
        {{"Retirement", 170}, {"Non-Retirement", 140}},
        {{"Acme", 5}, {"Birch", 2}, {"Cedar", 8}, {"Dogwood", 16}},
    };
    for (std::uint32_t i = 0; i < std::size(expected); ++i)
        EXPECT_EQ(SlicesIn(sets.ForChart(FirstChart + i)), expected[i]) << Charts[i].title;
    EXPECT_EQ(&sets.ForChart(1), &sets.ForChart(FirstChart));
}

TEST(ChartDataSets, HaveTheirFixedSlicesAndKeepWithinTheirCapacity) {
    ChartDataSets sets = SetsOf({Portfolio, 1});
    for (int i = 1; i < 10; ++i)
        sets.AccumulateDataSet(i, MakeInvestment("P", std::to_string(i), 1, 1, std::to_string(i)));
    for (const std::uint32_t chart : {2000, 2002, 2006})
        EXPECT_EQ(sets.ForChart(chart).count, 3) << chart;
    EXPECT_EQ(SlicesIn(sets.ForChart(2005)), (Slices{{"Retirement", 10}, {"Non-Retirement", 9}}));
    EXPECT_EQ(sets.GenerateDataSets(-1), 0); // a query that failed
    EXPECT_EQ(SlicesIn(sets.ForChart(2002)), Slices{});
    EXPECT_EQ(SlicesIn(sets.ForChart(2005)), (Slices{{"Retirement", 0}, {"Non-Retirement", 0}}));
    EXPECT_EQ(sets.GenerateDataSets(std::numeric_limits<long>::max()), 1);
}

TEST(ChartGeometry, SlicesTakeTheirShareOfTheTurn) {
    const float values[] = {1, 0, 2, 1};
    std::string slices;
    for (const PieSlice& slice : SlicesOf(values, 4, 4))
        slices += std::to_string(slice.value) + ": " + std::to_string(std::lround(slice.start)) + " + " +
                  std::to_string(std::lround(slice.sweep)) + '\n';
    EXPECT_EQ(slices, "0: 0 + 90\n2: 90 + 180\n3: 270 + 90\n");
    const std::vector<float> many(100'000, 0.5F);
    EXPECT_LT(SlicesOf(many.data(), 100'000, 50'000).size(), 4000U);
    for (const float total : {0.0F, std::nanf(""), std::numeric_limits<float>::infinity()})
        EXPECT_TRUE(SlicesOf(values, 4, total).empty()) << total;
    const float mixed[] = {1e9F, -1e9F, 1};
    for (const PieSlice& slice : SlicesOf(mixed, 3, 1))
        EXPECT_LE(std::abs(slice.sweep), 360);
}

TEST(ChartGeometry, LegendLinesFollowTheDecimalPlacesAndTheWidth) {
    const auto letters = [](const std::string& text) { return static_cast<float>(text.size()); };
    EXPECT_EQ(LegendLine("Acme", 1200.5F, 3201.333F, 2), "Acme: $1200.50 37.50%");
    EXPECT_EQ(LegendLine("Acme", 150, 400, 3), "Acme: 150.00 37.50%");
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 2, 26, letters), "Maple Timber: $5.00 50.00%");
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 2, 25, letters), "Maple Ti...: $5.00 50.00%");
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 0, 8, letters), "Maple...");
    EXPECT_EQ(LegendLine("Huge", -3e38F, 3e38F, 2).substr(0, 14), "Huge: $-300000");
}

TEST(ChartGeometry, GrowthIsWorkedOutYearByYear) {
    EXPECT_NEAR(Grow(1000, Percentages[4])[25], 264'698, 1);
    EXPECT_NEAR(Grow(1000, Percentages[2])[25], 32'919, 1);
    EXPECT_EQ(Grow(-5, 0.05F)[0], -5);
    EXPECT_FLOAT_EQ(PlaceOnAxis(1500, 1000, 2000, 300, 100), 200);
    EXPECT_FLOAT_EQ(PlaceOnAxis(0, 0, 0, 300, 100), 300); // nothing grows
    EXPECT_FLOAT_EQ(PlaceOnAxis(1, 0, std::numeric_limits<float>::infinity(), 300, 100), 300);
}
