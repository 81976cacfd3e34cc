#include "app/model/RecordLayouts.h"

#include <bit>
#include <string>

#include "util/Strings.h"

namespace {

constexpr COLUMN_ENTRY Column(std::string_view name, std::int8_t type, std::size_t size) {
    COLUMN_ENTRY column{};
    name.copy(column.name, sizeof column.name - 1);
    column.type = type;
    column.size = static_cast<std::int16_t>(size);
    return column;
}

constexpr COLUMN_ENTRY Float(std::string_view name, int decimals) {
    // The engine's own width for floats would be 8.
    COLUMN_ENTRY column = Column(name, ColumnType::Float, sizeof(float));
    column.format = decimals;
    return column;
}

// Each where the engine will place it: columns follow each other without gaps.
template <std::size_t Count>
constexpr std::array<COLUMN_ENTRY, Count> Placed(std::array<COLUMN_ENTRY, Count> columns) {
    int offset = 0;
    for (COLUMN_ENTRY& column : columns) {
        column.offset = static_cast<std::int16_t>(offset);
        offset += column.size;
    }
    return columns;
}

} // namespace

constexpr std::array<COLUMN_ENTRY, 1> PortfolioColumns = {Column("Name", ColumnType::String, NameSize)};

constexpr std::array<COLUMN_ENTRY, 13> InvestmentColumns = Placed<13>({
    Column("Portfolio", ColumnType::String, NameSize),
    Column("Name", ColumnType::String, NameSize),
    Column("Ticker", ColumnType::String, TickerSize),
    Column("Type", ColumnType::String, NameSize),
    Column("Retire", ColumnType::Byte, 1),
    Float("Shares", 3),
    Column("Date", ColumnType::Date, sizeof(dbDATE)),
    // Enough decimals for a thirty-second.
    Float("Price", 5),
    Float("PrevPrice", 5),
    Float("Value", 2),
    Column("Agent", ColumnType::String, NameSize),
    Column("Risk", ColumnType::String, RiskSize),
    Column("QuoteError", ColumnType::Byte, 1),
});

constexpr std::array<COLUMN_ENTRY, 2> CategoryColumns = Placed<2>({
    Column("Category", ColumnType::String, NameSize),
    Column("Entry", ColumnType::String, NameSize),
});

namespace {

// Without such a column, where they all end.
template <std::size_t Count>
constexpr std::size_t OffsetOf(const std::array<COLUMN_ENTRY, Count>& columns, std::string_view name) {
    for (const COLUMN_ENTRY& column : columns)
        if (std::string_view(column.name) == name)
            return static_cast<std::size_t>(column.offset);
    return static_cast<std::size_t>(columns.back().offset + columns.back().size);
}

static_assert(std::endian::native == std::endian::little, "records are written as they lie in memory");

static_assert(sizeof(PORTFOLIO_DATA) == 32 && OffsetOf(PortfolioColumns, "") == sizeof(PORTFOLIO_DATA));
static_assert(sizeof(CATEGORY_DATA) == 64 && OffsetOf(CategoryColumns, "") == sizeof(CATEGORY_DATA));
static_assert(sizeof(INVESTMENT_DATA) == 438 &&
              OffsetOf(InvestmentColumns, "") == offsetof(INVESTMENT_DATA, Unused));

struct Place {
    const char* name;
    std::size_t inRecord;
    std::size_t expected;
};

constexpr Place Places[] = {
    {"Portfolio", offsetof(INVESTMENT_DATA, Portfolio), 0},
    {"Name", offsetof(INVESTMENT_DATA, Name), 32},
    {"Ticker", offsetof(INVESTMENT_DATA, Ticker), 64},
    {"Type", offsetof(INVESTMENT_DATA, Type), 72},
    {"Retire", offsetof(INVESTMENT_DATA, Retire), 104},
    {"Shares", offsetof(INVESTMENT_DATA, Shares), 105},
    {"Date", offsetof(INVESTMENT_DATA, Date), 109},
    {"Price", offsetof(INVESTMENT_DATA, Price), 113},
    {"PrevPrice", offsetof(INVESTMENT_DATA, PrevPrice), 117},
    {"Value", offsetof(INVESTMENT_DATA, Value), 121},
    {"Agent", offsetof(INVESTMENT_DATA, Agent), 125},
    {"Risk", offsetof(INVESTMENT_DATA, Risk), 157},
    {"QuoteError", offsetof(INVESTMENT_DATA, QuoteError), 229},
};

constexpr bool AllInPlace() {
    for (const Place& place : Places)
        if (place.inRecord != place.expected || OffsetOf(InvestmentColumns, place.name) != place.expected)
            return false;
    return true;
}
static_assert(AllInPlace());

} // namespace

std::optional<std::size_t> RiskIndex(std::string_view text) {
    const std::string wanted = Lowered(text);
    for (std::size_t i = 0; i < RiskNames.size(); ++i)
        if (Lowered(RiskNames[i]) == wanted)
            return i;
    return std::nullopt;
}

bool AreSame(const INVESTMENT_DATA& one, const INVESTMENT_DATA& other) {
    const auto bytes = [](const INVESTMENT_DATA& data) {
        return std::string_view(reinterpret_cast<const char*>(&data), sizeof data);
    };
    return bytes(one) == bytes(other);
}
