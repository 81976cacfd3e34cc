#include "charts/ChartDataSets.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <functional>
#include <new>
#include <span>
#include <stdexcept>

#include "util/CharacterBuffer.h"
#include "util/Strings.h"

namespace {

enum Set { ByInvestment, ByTicker, ByType, ByCategory, ByRisk, ByRetirement, SharesByInvestment };

constexpr const char* Categories[] = {"Fund", "Stock", "Other"};
constexpr const char* Retirement[] = {"Retirement", "Non-Retirement"};

constexpr long LeastCapacity = 3; // the fixed slices

void SetLabel(ChartLabel& label, std::string_view text) {
    label = {};
    std::memcpy(label.data(), text.data(), std::min(text.size(), label.size() - 1));
}

void Preset(CHART_DATA_SET& set, std::span<const char* const> labels) {
    for (std::size_t i = 0; i < labels.size(); ++i)
        SetLabel(set.labels[i], labels[i]);
    set.count = static_cast<std::int32_t>(labels.size());
}

std::size_t CategoryOf(std::string_view type) {
    const std::string lowered = Lowered(type);
    if (lowered.find("fund") != lowered.npos)
        return 0;
    return lowered.find("stock") != lowered.npos ? 1 : 2;
}

} // namespace

int ChartDataSets::GenerateDataSets(long capacity) {
    const auto slots = static_cast<std::size_t>(std::max(capacity, LeastCapacity));
    try {
        for (CHART_DATA_SET& set : sets_) {
            set = {};
            set.labels.resize(slots);
            set.values.resize(slots);
            set.capacity = static_cast<std::int32_t>(slots);
        }
        for (Places* places : {&tickers_, &types_, &names_})
            places->assign(std::bit_ceil(slots) * 2, -1); // at most half full
    } catch (const std::bad_alloc&) {
        return 1;
    } catch (const std::length_error&) {
        return 1;
    }
    Preset(sets_[ByCategory], Categories);
    Preset(sets_[ByRisk], RiskNames);
    Preset(sets_[ByRetirement], Retirement);
    return 0;
}

int ChartDataSets::AccumulateDataSet(int index, const INVESTMENT_DATA& record) {
    const std::string_view name = FieldText(record.Name);
    const std::string_view type = FieldText(record.Type);
    CHART_DATA_SET& investments = sets_[ByInvestment];
    if (investments.capacity == 0)
        return 0; // not generated
    if (index >= 0 && index < investments.capacity) {
        investments.values[static_cast<std::size_t>(index)] = record.Value;
        SetLabel(investments.labels[static_cast<std::size_t>(index)], name);
        ++investments.count;
    }
    AddKeyed(sets_[ByTicker], tickers_, FieldText(record.Ticker), record.Value);
    AddKeyed(sets_[ByType], types_, type, record.Value);
    sets_[ByCategory].values[CategoryOf(type)] += record.Value;
    if (const std::optional<std::size_t> risk = RiskIndex(FieldText(record.Risk)))
        sets_[ByRisk].values[*risk] += record.Value;
    sets_[ByRetirement].values[record.Retire ? 0 : 1] += record.Value;
    AddKeyed(sets_[SharesByInvestment], names_, name, record.Shares);
    return 0;
}

std::int32_t& ChartDataSets::PlaceOf(const CHART_DATA_SET& set, Places& places, std::string_view key) {
    const std::size_t mask = places.size() - 1;
    const std::hash<std::string_view> hash;
    std::size_t place = hash(key) & mask;
    while (places[place] >= 0 && key != set.labels[static_cast<std::size_t>(places[place])].data())
        place = (place + 1) & mask;
    return places[place];
}

void ChartDataSets::AddKeyed(CHART_DATA_SET& set, Places& places, std::string_view key, float value) {
    if (IsBlank(key))
        return;
    key = key.substr(0, NameSize - 1); // as the label will be
    std::int32_t& slot = PlaceOf(set, places, key);
    if (slot < 0) {
        if (set.count >= set.capacity)
            return;
        slot = set.count++;
        SetLabel(set.labels[static_cast<std::size_t>(slot)], key);
    }
    set.values[static_cast<std::size_t>(slot)] += value;
}

const CHART_DATA_SET& ChartDataSets::ForChart(std::uint32_t code) const {
    return code < FirstChart || code >= FirstChart + Count ? sets_[ByInvestment] : sets_[code - FirstChart];
}
