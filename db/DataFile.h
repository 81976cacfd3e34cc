#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <span>

#include "db/RecordTypes.h"

// The regions of a data file as bytes: 52 bytes of header, 44 for each column, then the records.
// doc/data-file.md has the byte tables. Nothing here touches a file, so that all of it can be fed bytes of
// any origin.

inline constexpr std::size_t HeaderSize = 52;
inline constexpr std::size_t ColumnEntrySize = 44;
// The most bytes that a record can have: the header counts them in 16 bits.
inline constexpr std::size_t LongestRecord = std::numeric_limits<std::int16_t>::max();

// Values of a record's first byte. Any other value (no version of the engine writes one) counts as active.
namespace RecordStatus {
inline constexpr std::uint8_t Active = 0;
inline constexpr std::uint8_t Deleted = 1;
inline constexpr std::uint8_t Locked = 2;
} // namespace RecordStatus

// Where the records of a file lie.
struct RecordArea {
    std::int64_t dataStart = 0;    // offset of record 0
    std::int32_t recordLength = 0; // bytes of a record, the status byte included
    std::int32_t recordCount = 0;

    [[nodiscard]] std::int64_t OffsetOf(std::int64_t record) const {
        return dataStart + record * recordLength;
    }
};

// What a file's length says about the counts in its header.
enum class FileCounts {
    Agree,   // no more behind the counted records than an interrupted append leaves: one record, or those
             // that AppendAll announced
    TooFew,  // records are missing at the end; the count was lowered to the whole records that are there
    TooMany, // the file goes on behind the last counted record
};

// Ends a column's name that was read from a file, and clears the bytes between the fields.
void CleanColumn(COLUMN_ENTRY* column);

// Offset of record 0 in a file with that many columns.
[[nodiscard]] constexpr std::int64_t DataStart(int columnCount) {
    return static_cast<std::int64_t>(HeaderSize + ColumnEntrySize * static_cast<std::size_t>(columnCount));
}

// Tells whether a file of that length can be the header's: no negative count, records of at least their
// status byte, and a column table that is there in full.
[[nodiscard]] bool HeaderMakesSense(const DATABASE_HEADER& header, std::int64_t fileLength);

// Tells whether the column lies inside the data of a record of `recordLength` bytes.
[[nodiscard]] bool ColumnFits(const COLUMN_ENTRY& column, int recordLength);

// Compares the record count of a header that makes sense with the file's length, lowering the count to what
// is there.
[[nodiscard]] FileCounts CheckRecordCount(DATABASE_HEADER* header, std::int64_t fileLength);
