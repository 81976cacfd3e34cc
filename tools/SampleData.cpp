#include "tools/SampleData.h"

#include <string_view>

#include "app/model/RecordLayouts.h"
#include "db/Database.h"
#include "util/CharacterBuffer.h"

namespace {

struct PickListEntry {
    std::string_view category;
    std::string_view entry;
};

constexpr PickListEntry PickLists[] = {
    {"Type", "Stock"},      {"Type", "Stock Fund"},     {"Type", "Bond Fund"},
    {"Type", "Index Fund"}, {"Type", "Mixed Fund"},     {"Type", "Money Market Fund"},
    {"Type", "Bond"},       {"Type", "Real Estate"},    {"Type", "Savings Account"},
    {"Type", "Other"},      {"Agent", "Self"},          {"Agent", "Bank"},
    {"Agent", "Broker"},    {"Agent", "Online Broker"}, {"Agent", "Employer Plan"},
    {"Agent", "Insurance"},
};

constexpr std::string_view Retirement = "My Retirement Fund";
// "Für später", German for "for later".
constexpr std::string_view Later = "F\xC3\xBCr sp\xC3\xA4ter";

struct SampleInvestment {
    std::string_view name;
    std::string_view ticker;
    std::string_view type;
    float shares;
    float price;
    float previousPrice;
    std::string_view risk;
    std::string_view agent;
    bool retirement;
    bool quoteError;
    dbDATE date;
};

// Looked up, and no price found.
constexpr bool NotFound = true;

constexpr SampleInvestment RetirementInvestments[] = {
    {"Alder Paper Mills", "ALDP", "Stock", 120, 12.375F, 12.125F, "Med", "Broker", true, false, {3, 3, 2025}},
    {"Birch & Sons", "BRCH", "Stock", 45.5F, 88.5F, 90.25F, "Med", "Broker", true, false, {3, 3, 2025}},
    {"Cedar Rail",
     "CDRR",
     "Stock",
     300,
     7.03125F,
     7.03125F,
     "High",
     "Online Broker",
     true,
     false,
     {3, 3, 2025}},
    {"Dogwood Biolabs",
     "DGWD",
     "Stock",
     80,
     31.96875F,
     24.5F,
     "High",
     "Online Broker",
     true,
     false,
     {28, 2, 2025}},
    {"Elm Street Water Works", "ELMW", "Stock", 210, 41, 40.75F, "Low", "Broker", true, false, {3, 3, 2025}},
    {"Fir Hill Index 500",
     "FHIDX",
     "Index Fund",
     154.321F,
     143.87F,
     142.1F,
     "Med",
     "Employer Plan",
     true,
     false,
     {3, 3, 2025}},
    {"Fir Hill Small Companies",
     "FHSML",
     "Stock Fund",
     96.044F,
     52.5F,
     53.75F,
     "High",
     "Employer Plan",
     true,
     false,
     {3, 3, 2025}},
    {"Grove Long Bonds",
     "GRVLB",
     "Bond Fund",
     1200,
     9.84F,
     9.84F,
     "Low",
     "Employer Plan",
     true,
     false,
     {3, 3, 2025}},
    {"Grove Short Bonds",
     "GRVSB",
     "Bond Fund",
     800.75F,
     10.02F,
     10.01F,
     "Low",
     "Employer Plan",
     true,
     false,
     {3, 3, 2025}},
    {"Hazel Cash Reserve",
     "HZLC",
     "Money Market Fund",
     15250.4F,
     1,
     1,
     "Low",
     "Bank",
     true,
     false,
     {3, 3, 2025}},
    {"Ironwood Tools",
     "IRNW",
     "Stock",
     64,
     19.6875F,
     NoPreviousPrice,
     "Med",
     "Broker",
     true,
     false,
     {17, 1, 2025}},
    {"Juniper Old Holdings",
     "JNPO",
     "Stock",
     500,
     0.46875F,
     0.5F,
     "High",
     "Broker",
     true,
     NotFound,
     {9, 8, 2024}},
    {"Pension Insurance",
     "",
     "Other",
     1,
     48200,
     NoPreviousPrice,
     "Low",
     "Insurance",
     true,
     false,
     {31, 12, 2024}},
    {"Kauri World Balanced",
     "KWBAL",
     "Mixed Fund",
     410.2F,
     27.31F,
     26.98F,
     "Med",
     "Employer Plan",
     true,
     false,
     {3, 3, 2025}},
    {"Larch Real Estate",
     "LRCHR",
     "Real Estate",
     75,
     61.2F,
     63.05F,
     "Med",
     "Insurance",
     true,
     false,
     {3, 3, 2025}},
    {"Municipal Bond 2031",
     "",
     "Bond",
     20,
     1012.5F,
     NoPreviousPrice,
     "Low",
     "Bank",
     true,
     false,
     {2, 9, 2024}},
};

constexpr SampleInvestment LaterInvestments[] = {
    {"Nordlicht Energie",
     "NRDL",
     "Stock",
     150,
     22.25F,
     21.875F,
     "High",
     "Online Broker",
     false,
     false,
     {3, 3, 2025}},
    {"\xC3\x96lm\xC3\xBChle Weber",
     "OELW",
     "Stock",
     40,
     110.75F,
     112,
     "Med",
     "Broker",
     false,
     false,
     {3, 3, 2025}},
    {"Caf\xC3\xA9 Parisien",
     "CAFP",
     "Stock",
     260,
     8.15625F,
     8.15625F,
     "High",
     "Self",
     false,
     false,
     {3, 3, 2025}},
    {"Quince Software",
     "QNCE",
     "Stock",
     33,
     204.34375F,
     187.5F,
     "High",
     "Online Broker",
     false,
     false,
     {3, 3, 2025}},
    {"Rowan Shipping",
     "ROWN",
     "Stock",
     500,
     5.5F,
     6.25F,
     "High",
     "Online Broker",
     false,
     false,
     {3, 3, 2025}},
    {"Spruce Foods",
     "SPRF",
     "Stock",
     90,
     47.8125F,
     NoPreviousPrice,
     "Low",
     "Broker",
     false,
     false,
     {24, 2, 2025}},
    {"Tamarack Telephone", "TMRK", "Stock", 75, 36.625F, 36.5F, "Low", "Broker", true, false, {3, 3, 2025}},
    {"Upland Index World",
     "UPIDX",
     "Index Fund",
     212.5F,
     98.41F,
     97.2F,
     "Med",
     "Online Broker",
     false,
     false,
     {3, 3, 2025}},
    {"Upland Growth",
     "UPGRO",
     "Stock Fund",
     64.125F,
     71.9F,
     74.33F,
     "High",
     "Online Broker",
     true,
     false,
     {3, 3, 2025}},
    {"Vine Income", "VINEI", "Mixed Fund", 318, 14.07F, 14.07F, "Med", "Bank", false, false, {3, 3, 2025}},
    {"Willow Bonds",
     "WLLWB",
     "Bond Fund",
     1042.6F,
     11.18F,
     11.21F,
     "Low",
     "Bank",
     false,
     false,
     {3, 3, 2025}},
    {"Yew Closed Fund",
     "YEWC",
     "Mixed Fund",
     25,
     33.4F,
     33.9F,
     "Med",
     "Broker",
     false,
     NotFound,
     {14, 11, 2024}},
    {"Zelkova Mines",
     "ZLKV",
     "Stock",
     1000,
     1.21875F,
     1.1875F,
     "High",
     "Self",
     false,
     NotFound,
     {3, 2, 2025}},
    {"Everyday savings",
     "",
     "Savings Account",
     1,
     6431.17F,
     NoPreviousPrice,
     "Low",
     "Bank",
     false,
     false,
     {1, 3, 2025}},
    {"Gold coins", "", "Other", 12.5F, 268, 261, "Med", "Self", true, false, {28, 2, 2025}},
    {"Garden allotment share", "", "", 1, 350, NoPreviousPrice, "Med", "", false, false, {12, 6, 2024}},
};

INVESTMENT_DATA RecordOf(std::string_view portfolio, const SampleInvestment& sample) {
    INVESTMENT_DATA record{};
    CopyText(record.Portfolio, portfolio);
    CopyText(record.Name, sample.name);
    CopyText(record.Ticker, sample.ticker);
    CopyText(record.Type, sample.type);
    record.Retire = sample.retirement ? 1 : 0;
    record.Shares = sample.shares;
    record.Date = sample.date;
    record.Price = sample.price;
    record.PrevPrice = sample.previousPrice;
    record.Value = sample.shares * sample.price;
    CopyText(record.Agent, sample.agent);
    CopyText(record.Risk, sample.risk);
    record.QuoteError = sample.quoteError ? 1 : 0;
    return record;
}

template <std::size_t Count>
bool AppendInvestments(DATABASE& investments, std::string_view portfolio,
                       const SampleInvestment (&samples)[Count]) {
    for (const SampleInvestment& sample : samples) {
        INVESTMENT_DATA record = RecordOf(portfolio, sample);
        if (investments.Append(&record) < 0)
            return false;
    }
    return true;
}

} // namespace

bool AppendPickLists(DATABASE& categories) {
    for (const PickListEntry& entry : PickLists) {
        CATEGORY_DATA record{};
        CopyText(record.Category, entry.category);
        CopyText(record.Entry, entry.entry);
        if (categories.Append(&record) < 0)
            return false;
    }
    return true;
}

bool AppendSamplePortfolios(DATABASE& portfolios) {
    for (const std::string_view name : {Later, Retirement}) {
        PORTFOLIO_DATA record{};
        CopyText(record.Name, name);
        if (portfolios.Append(&record) < 0)
            return false;
    }
    return true;
}

bool AppendSampleInvestments(DATABASE& investments) {
    return AppendInvestments(investments, Later, LaterInvestments) &&
           AppendInvestments(investments, Retirement, RetirementInvestments);
}
