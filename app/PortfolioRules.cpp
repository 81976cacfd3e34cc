#include "app/PortfolioRules.h"

#include <cstddef>
#include <string_view>
#include <vector>

#include "util/CharacterBuffer.h"

namespace {

// Whether every record begins with the named text column of 32 bytes and holds that many bytes of data.
bool HasLayout(DATABASE& database, std::string_view firstColumn, std::size_t leastData,
               std::size_t mostData) {
    COLUMN_ENTRY column;
    if (!database.IsOpen() || database.GetColumnInfo(0, &column) != 0)
        return false;
    DATABASE_HEADER header;
    database.GetHeaderInfo(&header);
    const auto data = static_cast<std::size_t>(header.recordLength - 1);
    return FieldText(column.name) == firstColumn && column.type == ColumnType::String && column.offset == 0 &&
           column.size == NameSize && data >= leastData && data <= mostData;
}

long Select(DATABASE& database, const char* column, const char* name) {
    // The query language ends a value at such a character, and would select another portfolio.
    if (*name == '\0' || std::strpbrk(name, "\t\r\n"))
        return 0;
    char statement[128];
    if (!FormatInto(statement, sizeof statement, "%s = %s", column, name))
        return 0;
    return database.Query(statement, QueryMode::New);
}

// Deletes the records of the result set. The walk comes first: reading between two deletions would read the
// file anew each time.
void DeleteSelected(DATABASE& database) {
    std::vector<long> numbers;
    long number = 0;
    for (const void* data = database.QueryGetFirst(&number); data; data = database.QueryGetNext(&number))
        numbers.push_back(number);
    for (const long each : numbers)
        database.Delete(each);
}

} // namespace

bool HoldsPortfolios(DATABASE& database) {
    return HasLayout(database, "Name", sizeof(PORTFOLIO_DATA), sizeof(PORTFOLIO_DATA));
}

bool HoldsInvestments(DATABASE& database) {
    return HasLayout(database, "Portfolio", offsetof(INVESTMENT_DATA, Unused), sizeof(INVESTMENT_DATA));
}

bool HoldsCategories(DATABASE& database) {
    return HasLayout(database, "Category", sizeof(CATEGORY_DATA), sizeof(CATEGORY_DATA));
}

long SelectPortfolios(DATABASE& portfolios, const char* name) {
    return Select(portfolios, "Name", name);
}

long SelectInvestments(DATABASE& investments, const char* portfolio) {
    return Select(investments, "Portfolio", portfolio);
}

bool ReadInvestment(DATABASE& investments, long recordNumber, INVESTMENT_DATA* record) {
    *record = {};
    return investments.Read(recordNumber, record) == 1;
}

float TotalValue(DATABASE& investments, const char* portfolio) {
    float total = 0;
    ForEachInvestment(investments, portfolio,
                      [&](const INVESTMENT_DATA& record, long) { total += record.Value; });
    return total;
}

void DeletePortfolio(DATABASE& portfolios, DATABASE& investments, const char* name) {
    if (SelectPortfolios(portfolios, name) > 0)
        DeleteSelected(portfolios);
    if (SelectInvestments(investments, name) > 0)
        DeleteSelected(investments);
}

void AppendCopies(DATABASE& investments, std::span<const INVESTMENT_DATA> records, const char* portfolio) {
    for (INVESTMENT_DATA record : records) {
        CopyTextZeroed(record.Portfolio, portfolio);
        investments.Append(&record);
    }
}
