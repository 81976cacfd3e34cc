#pragma once

#include <algorithm>
#include <cstring>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "app/model/RecordLayouts.h"
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
// Returns how many there are; 0 when there are none, no file is open, or the name can be in no query (it is
// empty or has a tab or line end in it); -1 when the file cannot be read. Only a result set of 1 or more is
// to be walked.
[[nodiscard]] long SelectPortfolios(DATABASE& portfolios, const char* name);
[[nodiscard]] long SelectInvestments(DATABASE& investments, const char* portfolio);
// The same for the entries of a pick list.
[[nodiscard]] long SelectCategory(DATABASE& categories, const char* category);

// Calls visit(const void* data, long recordNumber) for each record of a new result set of `selected` records,
// in record order. visit must not change the database. False when they could not all be read, and when the
// selection itself failed (-1).
template <class Visit>
[[nodiscard]] bool ForEachSelected(DATABASE& database, long selected, Visit visit) {
    long visited = 0;
    if (selected > 0) {
        long number = 0;
        for (const void* data = database.QueryGetFirst(&number); data;
             data = database.QueryGetNext(&number)) {
            visit(data, number);
            ++visited;
        }
    }
    return visited == selected;
}

// Calls visit(const INVESTMENT_DATA&, long recordNumber) for each record of a result set of `selected`
// investments, as ForEachSelected does.
template <class Visit>
[[nodiscard]] bool ForEachInvestment(DATABASE& investments, long selected, Visit visit) {
    DATABASE_HEADER header;
    investments.GetHeaderInfo(&header);
    INVESTMENT_DATA record{};
    const auto length = std::min(static_cast<std::size_t>(header.recordLength - 1), sizeof record);
    return ForEachSelected(investments, selected, [&](const void* data, long number) {
        std::memcpy(&record, data, length);
        visit(record, number);
    });
}

// The same for each of the portfolio's investments in record order. The result set is left on the portfolio.
template <class Visit>
[[nodiscard]] bool ForEachInvestment(DATABASE& investments, const char* portfolio, Visit visit) {
    return ForEachInvestment(investments, SelectInvestments(investments, portfolio), visit);
}

// Reads a record into a zeroed struct; false when it cannot be read.
[[nodiscard]] bool ReadInvestment(DATABASE& investments, long recordNumber, INVESTMENT_DATA* record);

// The sum of the Value of the portfolio's investments, added up in single precision in record order; 0 for
// none, nothing when they could not all be read. The result set is left on the portfolio, where the report
// finds it.
[[nodiscard]] std::optional<float> TotalValue(DATABASE& investments, const char* portfolio);

// Calls visit(const char* entry) for each entry of a pick list ("Type" or "Agent"), in file order. False when
// they could not all be read.
template <class Visit>
[[nodiscard]] bool ForEachCategoryEntry(DATABASE& categories, const char* category, Visit visit) {
    return ForEachSelected(
        categories, SelectCategory(categories, category),
        [&](const void* data, long) {
            CATEGORY_DATA record;
            std::memcpy(&record, data, sizeof record);
            visit(std::string(FieldText(record.Entry)).c_str());
        });
}

// Appends the portfolios' names as they stand in the records of portfol.db or invest.db, in the order of the
// file; repeated ones that follow each other once. False when not all could be read.
[[nodiscard]] bool CollectPortfolios(DATABASE& file, std::vector<std::string>* names);

// Whether a record and a query can hold the name: 1 to 31 bytes without a tab or line end.
[[nodiscard]] bool CanBePortfolioName(const char* name);

// Adds a portfolio without investments. False, with nothing changed, when the name cannot be one
// (CanBePortfolioName), it is not known to be free, or the portfolio could not be written.
[[nodiscard]] bool AddPortfolio(DATABASE& portfolios, const char* name);

// Lists again every portfolio that has investments but no record of its own, since those could not be seen:
// so after a renaming that was cut short, or when the file of the portfolios is lost or of another day.
// Returns the names added; one that could not be written is not among them. Nothing is added when one of the
// files could not be read to its end.
[[nodiscard]] std::vector<std::string> RestorePortfolios(DATABASE& portfolios, DATABASE& investments);

// Gives the portfolio and all its investments a new name. False, with nothing changed, when there is no
// portfolio of the old name, the new one cannot be one (CanBePortfolioName) or is not known to be free, or
// one of the files cannot be read. The portfolio's own record changes first, then each investment: should one
// not be written, or the program be killed, every record is wholly old or wholly new, and those not reached
// keep the old name (see RestorePortfolios).
[[nodiscard]] bool RenamePortfolio(DATABASE& portfolios, DATABASE& investments, const char* oldName,
                                   const char* newName);

// Deletes every portfolio record of that name and every investment of it. False when one of them could not be
// deleted; with nothing changed when one of the files cannot be read.
[[nodiscard]] bool DeletePortfolio(DATABASE& portfolios, DATABASE& investments, const char* name);

// Appends copies of the records as investments of the portfolio; nothing but their Portfolio changes. False
// when they could not be written; then none of them is there.
[[nodiscard]] bool AppendCopies(DATABASE& investments, std::span<const INVESTMENT_DATA> records,
                                const char* portfolio);
