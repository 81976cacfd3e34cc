#include "app/model/PortfolioRules.h"

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <unordered_set>

#include "util/CharacterBuffer.h"
#include "util/Strings.h"

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
    return database.IsOpen() && MakeStatement(statement, column, name)
               ? database.Query(statement, QueryMode::New)
               : 0;
}

// The numbers of the result set's `selected` records; false when they could not all be read.
bool CollectNumbers(DATABASE& database, long selected, std::vector<long>* numbers) {
    return ForEachSelected(
        database, selected, [&](const void*, long number) { numbers->push_back(number); });
}

bool DeleteAll(DATABASE& database, const std::vector<long>& numbers) {
    bool all = true;
    for (const long each : numbers)
        all = database.Delete(each) == 0 && all;
    return all;
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

std::optional<float> TotalValue(DATABASE& investments, const char* portfolio) {
    float total = 0;
    const bool read = ForEachInvestment(investments, portfolio,
                                        [&](const INVESTMENT_DATA& record, long) { total += record.Value; });
    return read ? std::optional(total) : std::nullopt;
}

bool CollectPortfolios(DATABASE& file, std::vector<std::string>* names) {
    return ForEachSelected(
        file, file.Query(nullptr, QueryMode::New),
        [&](const void* data, long) {
            char name[NameSize];
            std::memcpy(name, data, sizeof name);
            // Most often the next investment is of the same portfolio.
            if (names->empty() || names->back() != FieldText(name))
                names->emplace_back(FieldText(name));
        });
}

bool AddPortfolio(DATABASE& portfolios, const char* name) {
    if (!CanBePortfolioName(name) || SelectPortfolios(portfolios, name) != 0)
        return false;
    PORTFOLIO_DATA record;
    CopyTextZeroed(record.Name, name);
    return portfolios.Append(&record) >= 0;
}

std::vector<std::string> RestorePortfolios(DATABASE& portfolios, DATABASE& investments) {
    std::vector<std::string> names;
    std::vector<std::string> holders;
    if (!CollectPortfolios(portfolios, &names) || !CollectPortfolios(investments, &holders))
        return {};
    std::unordered_set<std::string> listed;
    for (const std::string& name : names)
        listed.insert(Lowered(name));
    std::vector<std::string> restored;
    for (const std::string& holder : holders)
        if (listed.insert(Lowered(holder)).second && AddPortfolio(portfolios, holder.c_str()))
            restored.push_back(holder);
    return restored;
}

bool CanBePortfolioName(const char* name) {
    const std::size_t length = std::strlen(name);
    return length > 0 && length < NameSize && !std::strpbrk(name, "\t\r\n");
}

bool RenamePortfolio(DATABASE& portfolios, DATABASE& investments, const char* oldName, const char* newName) {
    // Before anything changes: investments that cannot be found, or could not take the name, must not be left
    // behind.
    char statement[StatementSize];
    if (!CanBePortfolioName(newName) || !MakeStatement(statement, "Portfolio", newName) ||
        SelectPortfolios(portfolios, newName) != 0 || !investments.IsOpen())
        return false;
    const long held = SelectInvestments(investments, oldName);
    if (held < 0 || SelectPortfolios(portfolios, oldName) <= 0 || !portfolios.QueryGetFirst(nullptr))
        return false;
    PORTFOLIO_DATA record;
    CopyTextZeroed(record.Name, newName);
    return portfolios.Update(&record) == 0 && (held == 0 || investments.QueryUpdate(statement) >= 0);
}

bool DeletePortfolio(DATABASE& portfolios, DATABASE& investments, const char* name) {
    // All reading comes first: what cannot be found must not be left behind, and reading between two
    // deletions would read the file anew each time.
    std::vector<long> records;
    std::vector<long> held;
    if (!investments.IsOpen() || !CollectNumbers(portfolios, SelectPortfolios(portfolios, name), &records) ||
        !CollectNumbers(investments, SelectInvestments(investments, name), &held))
        return false;
    const bool all = DeleteAll(portfolios, records);
    return DeleteAll(investments, held) && all;
}

bool AppendCopies(DATABASE& investments, std::span<const INVESTMENT_DATA> records, const char* portfolio) {
    std::vector<INVESTMENT_DATA> copies(records.begin(), records.end());
    for (INVESTMENT_DATA& copy : copies)
        CopyTextZeroed(copy.Portfolio, portfolio);
    return investments.AppendAll(copies.data(), sizeof(INVESTMENT_DATA),
                                 static_cast<std::int32_t>(copies.size())) >= 0;
}
