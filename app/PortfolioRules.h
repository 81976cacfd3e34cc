#pragma once

#include <algorithm>
#include <cstring>
#include <span>
#include <string>
#include <vector>

#include "app/RecordLayouts.h"
#include "db/Database.h"
#include "util/CharacterBuffer.h"

// What the commands do to the data files, without a window. A portfolio is named by its name alone, in any
// letter case. A record that could not be written is what it was.

// Whether an open database has the layout of portfol.db, invest.db or misc.db, as far as the program relies
// on it: the column that its queries name, and records that fit the program's structs. One that has not must
// not be used.
[[nodiscard]] bool HoldsPortfolios(DATABASE& database);
[[nodiscard]] bool HoldsInvestments(DATABASE& database);
[[nodiscard]] bool HoldsCategories(DATABASE& database);

// Makes the portfolio records of that name, or the portfolio's investments, the result set of the database.
// Returns how many there are; 0 or less when there are none, the query fails, or the name can be in no query
// (it is empty or has a tab or line end in it): then the result set is not to be walked.
[[nodiscard]] long SelectPortfolios(DATABASE& portfolios, const char* name);
[[nodiscard]] long SelectInvestments(DATABASE& investments, const char* portfolio);
// The same for the entries of a pick list.
[[nodiscard]] long SelectCategory(DATABASE& categories, const char* category);

// Calls visit(const INVESTMENT_DATA&, long recordNumber) for each of the portfolio's investments in record
// order. visit must not change the database. The result set is left on the portfolio.
template <class Visit>
void ForEachInvestment(DATABASE& investments, const char* portfolio, Visit visit) {
    if (SelectInvestments(investments, portfolio) <= 0)
        return;
    DATABASE_HEADER header;
    investments.GetHeaderInfo(&header);
    INVESTMENT_DATA record{};
    const auto length = std::min(static_cast<std::size_t>(header.recordLength - 1), sizeof record);
    long number = 0;
    for (const void* data = investments.QueryGetFirst(&number); data;
         data = investments.QueryGetNext(&number)) {
        std::memcpy(&record, data, length);
        visit(record, number);
    }
}

// Reads a record into a zeroed struct; false when it cannot be read.
[[nodiscard]] bool ReadInvestment(DATABASE& investments, long recordNumber, INVESTMENT_DATA* record);

// The sum of the Value of the portfolio's investments, added up in single precision in record order; 0 for
// none. The result set is left on the portfolio, where the report finds it.
[[nodiscard]] float TotalValue(DATABASE& investments, const char* portfolio);

// Calls visit(const char* entry) for each entry of a pick list ("Type" or "Agent"), in file order.
template <class Visit>
void ForEachCategoryEntry(DATABASE& categories, const char* category, Visit visit) {
    if (SelectCategory(categories, category) <= 0)
        return;
    for (const void* data = categories.QueryGetFirst(nullptr); data;
         data = categories.QueryGetNext(nullptr)) {
        CATEGORY_DATA record;
        std::memcpy(&record, data, sizeof record);
        visit(std::string(FieldText(record.Entry)).c_str());
    }
}

// Whether a record and a query can hold the name: 1 to 31 bytes without a tab or line end.
[[nodiscard]] bool CanBePortfolioName(const char* name);

// Adds a portfolio without investments. The name must be one that CheckPortfolioName accepts. False when it
// could not be written.
[[nodiscard]] bool AddPortfolio(DATABASE& portfolios, const char* name);

// Lists again every portfolio that has investments but no record of its own, since those could not be seen:
// so after a renaming that was cut short, or when the file of the portfolios is lost or of another day.
// Returns the names added; one that could not be written is not among them.
[[nodiscard]] std::vector<std::string> RestorePortfolios(DATABASE& portfolios, DATABASE& investments);

// Gives the portfolio and all its investments a new name. False, with nothing changed, when there is no
// portfolio of the old name, or the new one cannot be one (CanBePortfolioName). The portfolio's own record
// changes first, then each investment: should one not be written, or the program be killed, every record is
// wholly old or wholly new, and those not reached keep the old name (see RestorePortfolios).
[[nodiscard]] bool RenamePortfolio(DATABASE& portfolios, DATABASE& investments, const char* oldName,
                                   const char* newName);

// Deletes every portfolio record of that name and every investment of it. False when one of them could not be
// deleted.
[[nodiscard]] bool DeletePortfolio(DATABASE& portfolios, DATABASE& investments, const char* name);

// Appends copies of the records as investments of the portfolio; nothing but their Portfolio changes. False
// when they could not be written; then none of them is there.
[[nodiscard]] bool AppendCopies(DATABASE& investments, std::span<const INVESTMENT_DATA> records,
                                const char* portfolio);
