#pragma once

#include <array>
#include <cstdint>
#include <string_view>
#include <vector>

#include "app/model/RecordLayouts.h"

// A slice's label: at most 31 bytes, then NULs.
using ChartLabel = std::array<char, NameSize>;

// One chart's slices. Both arrays have `capacity` slots, of which the first `count` are in use; the rest are
// zero.
struct CHART_DATA_SET {
    std::vector<float> values;
    std::vector<ChartLabel> labels;
    std::int32_t count = 0;
    std::int32_t capacity = 0;
};

// What a chart shows; the numbers are the codes of the messages that choose it.
inline constexpr std::uint32_t FirstChart = 2000;
inline constexpr std::uint32_t SharesChart = 2006;
inline constexpr std::uint32_t GrowthChart = 2007; // the one without a data set
struct ChartInfo {
    std::uint32_t code;
    int decimalPlaces;
    const char* title;
};
inline constexpr ChartInfo Charts[] = {
    {FirstChart, 2, "Value by Investment"},
    {2001, 2, "Value by Ticker"},
    {2002, 2, "Value by Type"},
    {2003, 2, "Value by Category"},
    {2004, 2, "Value by Risk"},
    {2005, 2, "Value by Retirement"},
    {SharesChart, 3, "Shares by Investment"},
    {GrowthChart, 2, "Value over Time"},
};

// The slices of the seven pie charts, added up from a portfolio's investments. It reads no file and draws
// nothing. A slice stands where its key was first met; nothing is sorted.
class ChartDataSets {
  public:
    static constexpr std::size_t Count = 7;

    // Begins anew with room for `capacity` slices in each set. The slices of "Value by Category", "by Risk"
    // and "by Retirement" are there from the start. Returns 0, or 1 without memory.
    int GenerateDataSets(long capacity);

    // Adds the investment, the `index`-th from 0, to all sets. One whose index or keys find no free slot is
    // left out of that set. Returns 0.
    int AccumulateDataSet(int index, const INVESTMENT_DATA& record);

    // By the chart's code; any code without a data set gives the first one. The set stays where it is, and
    // its arrays too, until GenerateDataSets.
    [[nodiscard]] const CHART_DATA_SET& ForChart(std::uint32_t code) const;

  private:
    // Where each label of a set is: a hash table of slot numbers, -1 for a free place. A scan of the slots
    // would find the same, and takes as long as there are slices.
    using Places = std::vector<std::int32_t>;

    // The place of the key, or the free one where it belongs. There is always one.
    static std::int32_t& PlaceOf(const CHART_DATA_SET& set, Places& places, std::string_view key);
    static void AddKeyed(CHART_DATA_SET& set, Places& places, std::string_view key, float value);

    std::array<CHART_DATA_SET, Count> sets_;
    Places tickers_;
    Places types_;
    Places names_;
};
