#pragma once

#include <array>
#include <cstddef>
#include <string>
#include <vector>

#include "app/model/RecordLayouts.h"
#include "tools/TableWriter.h"

// Investments as rows of text: what `quorvan-cli list`, `export` and `import` have in common.

// The columns of the window's list in its order, between Portfolio before them and what only a record has.
// They are those of InvestmentColumns.
[[nodiscard]] const std::array<COLUMN_ENTRY, InvestmentColumns.size()>& TextColumns();
inline constexpr std::size_t FirstListed = 1;
inline constexpr std::size_t BehindListed = 11;

[[nodiscard]] inline bool IsColumn(const COLUMN_ENTRY& column, std::size_t offset) {
    return static_cast<std::size_t>(column.offset) == offset;
}

// Makes `cell` the column's value for other programs: every digit of a number, a date as YYYY-MM-DD, nothing
// for none.
void FillForPrograms(const COLUMN_ENTRY& column, const INVESTMENT_DATA& record, Cell* cell);

// The window's columns: first how the price moved, then the listed ones.
[[nodiscard]] std::vector<std::string> ListedNames();
// A row of them, for a person as the window writes it, in the other formats for programs.
void FillListed(const INVESTMENT_DATA& record, OutputFormat format, std::vector<Cell>* row);
