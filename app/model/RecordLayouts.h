#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include "db/RecordTypes.h"

// The records of the three data files, as the engine hands them over: packed, little-endian, without the
// status byte. Text is NUL-terminated; what follows the NUL in a field has no meaning. The files are
// described in doc/data-file.md.
//
// Being packed, a record's numbers cannot be bound to references or pointers: copy them.

inline constexpr std::size_t TickerSize = 8;
inline constexpr std::size_t RiskSize = 72;

// portfol.db: a portfolio is its name, at most 31 bytes, unique in any letter case.
struct PORTFOLIO_DATA {
    char Name[NameSize];
};

// invest.db: one investment. The columns of the file cover the bytes up to and including QuoteError; a file's
// records may be that short, or longer, up to the whole struct. A record must be zeroed before it is read or
// filled.
struct [[gnu::packed]] INVESTMENT_DATA {
    char Portfolio[NameSize]; // the owning portfolio's name
    char Name[NameSize];      // never empty
    char Ticker[TickerSize];  // the symbol that quotes are looked up by; may be empty
    char Type[NameSize];      // free text; one with "stock" in it has prices in fractions
    std::int8_t Retire;       // 1: held for retirement
    float Shares;
    dbDATE Date;     // of the last edit or the last price found
    float Price;     // of one share
    float PrevPrice; // the price before the last one found; NoPreviousPrice when none was found yet
    float Value;     // Shares * Price, in single precision
    char Agent[NameSize];
    char Risk[RiskSize];    // one of RiskNames
    std::int8_t QuoteError; // 1: the last look-up found no price
    char Unused[208];       // zero; no column covers it
};

// Whether they agree in every byte.
[[nodiscard]] bool AreSame(const INVESTMENT_DATA& one, const INVESTMENT_DATA& other);

inline constexpr float NoPreviousPrice = -1.0F;

// misc.db: one entry of a pick list. Category is "Type" or "Agent".
struct CATEGORY_DATA {
    char Category[NameSize];
    char Entry[NameSize];
};

// What Risk can be.
inline constexpr std::array<const char*, 3> RiskNames = {"Low", "Med", "High"};
// Which of them it is, in any letter case.
[[nodiscard]] std::optional<std::size_t> RiskIndex(std::string_view text);

// The columns that the files are created with, in the order of the fields and with their offsets.
extern const std::array<COLUMN_ENTRY, 1> PortfolioColumns;
extern const std::array<COLUMN_ENTRY, 13> InvestmentColumns;
extern const std::array<COLUMN_ENTRY, 2> CategoryColumns;
