#include "app/PortfolioRules.h"

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <unordered_set>

#include "db/LoweredText.h"
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

// What a statement may hold at most, its NUL included.
constexpr std::size_t StatementSize = 128;

// "column = name"; false for a name that no statement can hold. The language ends a value at a tab or a line
// end, and would go on with another portfolio.
bool MakeStatement(char (&statement)[StatementSize], const char* column, const char* name) {
    return *name != '\0' && !std::strpbrk(name, "\t\r\n") &&
           FormatInto(statement, sizeof statement, "%s = %s", column, name);
}

long Select(DATABASE& database, const char* column, const char* name) {
    char statement[StatementSize];
    return MakeStatement(statement, column, name) ? database.Query(statement, QueryMode::New) : 0;
}

// Deletes the records of the result set. The walk comes first: reading between two deletions would read the
// file anew each time.
bool DeleteSelected(DATABASE& database) {
    std::vector<long> numbers;
    long number = 0;
    for (const void* data = database.QueryGetFirst(&number); data; data = database.QueryGetNext(&number))
        numbers.push_back(number);
    bool all = true;
    for (const long each : numbers)
        all = database.Delete(each) == 0 && all;
    return all;
}

// Calls visit(record) for each record that can be read, in the order of the file.
template <class Record, class Visit>
void ForEachRecord(DATABASE& database, Visit visit) {
    DATABASE_HEADER header;
    database.GetHeaderInfo(&header);
    for (std::int32_t i = 0; i < header.recordCount; ++i) {
        Record record{};
        if (database.Read(i, &record) == 1)
            visit(record);
    }
}

// A name as queries compare it.
std::string Lowered(std::string_view name) {
    std::string lowered(name);
    for (char& c : lowered)
        c = static_cast<char>(LoweredByte(static_cast<std::uint8_t>(c)));
    return lowered;
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

long SelectCategory(DATABASE& categories, const char* category) {
    return Select(categories, "Category", category);
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

bool AddPortfolio(DATABASE& portfolios, const char* name) {
    PORTFOLIO_DATA record;
    CopyTextZeroed(record.Name, name);
    return portfolios.Append(&record) >= 0;
}

std::vector<std::string> RestorePortfolios(DATABASE& portfolios, DATABASE& investments) {
    std::unordered_set<std::string> listed;
    ForEachRecord<PORTFOLIO_DATA>(
        portfolios, [&](const PORTFOLIO_DATA& record) { listed.insert(Lowered(FieldText(record.Name))); });
    std::vector<std::string> restored;
    std::string last; // most often the next investment is of the same portfolio
    ForEachRecord<INVESTMENT_DATA>(investments, [&](const INVESTMENT_DATA& record) {
        if (FieldText(record.Portfolio) == last)
            return;
        last = FieldText(record.Portfolio);
        if (CanBePortfolioName(last.c_str()) && listed.insert(Lowered(last)).second &&
            AddPortfolio(portfolios, last.c_str()))
            restored.push_back(last);
    });
    return restored;
}

bool CanBePortfolioName(const char* name) {
    const std::size_t length = std::strlen(name);
    return length > 0 && length < NameSize && !std::strpbrk(name, "\t\r\n");
}

bool RenamePortfolio(DATABASE& portfolios, DATABASE& investments, const char* oldName, const char* newName) {
    // Before anything changes: a name that the investments could not take must not leave them behind.
    char statement[StatementSize];
    if (!CanBePortfolioName(newName) || !MakeStatement(statement, "Portfolio", newName) ||
        SelectPortfolios(portfolios, oldName) <= 0 || !portfolios.QueryGetFirst(nullptr))
        return false;
    PORTFOLIO_DATA record;
    CopyTextZeroed(record.Name, newName);
    return portfolios.Update(&record) == 0 &&
           (SelectInvestments(investments, oldName) <= 0 || investments.QueryUpdate(statement) >= 0);
}

bool DeletePortfolio(DATABASE& portfolios, DATABASE& investments, const char* name) {
    bool all = SelectPortfolios(portfolios, name) <= 0 || DeleteSelected(portfolios);
    if (SelectInvestments(investments, name) > 0)
        all = DeleteSelected(investments) && all;
    return all;
}

bool AppendCopies(DATABASE& investments, std::span<const INVESTMENT_DATA> records, const char* portfolio) {
    std::vector<INVESTMENT_DATA> copies(records.begin(), records.end());
    for (INVESTMENT_DATA& copy : copies)
        CopyTextZeroed(copy.Portfolio, portfolio);
    return investments.AppendAll(copies.data(), sizeof(INVESTMENT_DATA),
                                 static_cast<std::int32_t>(copies.size())) >= 0;
}
