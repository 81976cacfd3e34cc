#include "tools/InvestmentCells.h"

#include <algorithm>
#include <string_view>

#include "app/model/InvestmentTexts.h"
#include "db/DatesTimes.h"
#include "tools/RecordFields.h"
#include "util/CharacterBuffer.h"

namespace {

constexpr std::size_t DayDigits = 2;

const char* MoveText(PriceMove move) {
    switch (move) {
    case PriceMove::NotFound:
        return "not found";
    case PriceMove::Up:
        return "up";
    case PriceMove::Down:
        return "down";
    case PriceMove::Same:
        return "same";
    case PriceMove::Unknown:
        break;
    }
    return "unknown";
}

// As the window writes it; false for a column that has no writing of its own there.
bool FormatAsWindow(const COLUMN_ENTRY& column, const INVESTMENT_DATA& record, FigureText& text) {
    if (IsColumn(column, offsetof(INVESTMENT_DATA, Shares)))
        FormatShares(record.Shares, text);
    else if (IsColumn(column, offsetof(INVESTMENT_DATA, Price)))
        FormatPrice(record.Price, std::string(FieldText(record.Type)).c_str(), text);
    else if (IsColumn(column, offsetof(INVESTMENT_DATA, Value)))
        FormatValue(record.Value, text);
    else if (IsColumn(column, offsetof(INVESTMENT_DATA, Date)))
        FormatDay(record.Date, text);
    else
        return false;
    return true;
}

} // namespace

const std::array<COLUMN_ENTRY, InvestmentColumns.size()>& TextColumns() {
    static const auto columns = [] {
        constexpr std::string_view order[] = {"Portfolio", "Name",      "Ticker",    "Type",   "Shares",
                                              "Price",     "Value",     "Date",      "Retire", "Risk",
                                              "Agent",     "PrevPrice", "QuoteError"};
        std::array<COLUMN_ENTRY, InvestmentColumns.size()> ordered;
        std::transform(std::begin(order), std::end(order), ordered.begin(), [](std::string_view name) {
            return *std::find_if(InvestmentColumns.begin(), InvestmentColumns.end(),
                                 [name](const COLUMN_ENTRY& column) { return column.name == name; });
        });
        return ordered;
    }();
    return columns;
}

void FillForPrograms(const COLUMN_ENTRY& column, const INVESTMENT_DATA& record, Cell* cell) {
    FillCell(column, reinterpret_cast<const std::uint8_t*>(&record), cell);
    if (IsColumn(column, offsetof(INVESTMENT_DATA, Retire)) && (cell->number == 0 || cell->number == 1)) {
        cell->kind = Cell::Kind::Truth;
    } else if (column.type == ColumnType::Date) {
        if (PackDate(record.Date) == 0)
            cell->kind = Cell::Kind::Nothing;
        cell->text.insert(cell->text.size() - DayDigits, 1, '-');
        cell->text.insert(cell->text.size() - DayDigits - 1 - DayDigits, 1, '-');
    }
}

std::vector<std::string> ListedNames() {
    std::vector<std::string> names = {"Status"};
    for (std::size_t i = FirstListed; i < BehindListed; ++i)
        names.emplace_back(TextColumns()[i].name);
    return names;
}

void FillListed(const INVESTMENT_DATA& record, OutputFormat format, std::vector<Cell>* row) {
    row->resize(1 + BehindListed - FirstListed);
    row->front().SetText(MoveText(MoveOf(record)));
    for (std::size_t i = FirstListed; i < BehindListed; ++i) {
        const COLUMN_ENTRY& column = TextColumns()[i];
        Cell& cell = (*row)[1 + i - FirstListed];
        FigureText text;
        FillForPrograms(column, record, &cell);
        if (format == OutputFormat::Table && FormatAsWindow(column, record, text)) {
            cell.SetText(text);
            cell.kind = Cell::Kind::Figure;
        }
    }
}
