#include "db/DataFile.h"

#include <algorithm>

void CleanColumn(COLUMN_ENTRY* column) {
    column->name[NameSize - 1] = '\0';
    auto* bytes = reinterpret_cast<std::uint8_t*>(column);
    for (const std::size_t between : {33, 38, 39})
        bytes[between] = 0;
}

bool HeaderMakesSense(const DATABASE_HEADER& header, std::int64_t fileLength) {
    return header.recordCount >= 0 && header.columnCount >= 0 && header.recordLength >= 1 &&
           DataStart(header.columnCount) <= fileLength;
}

bool ColumnFits(const COLUMN_ENTRY& column, int recordLength) {
    return column.size >= 0 && column.offset >= 0 && column.offset + column.size <= recordLength - 1;
}

FileCounts CheckRecordCount(DATABASE_HEADER* header, std::int64_t fileLength) {
    std::int64_t bytes = fileLength - DataStart(header->columnCount);
    std::int64_t counted = static_cast<std::int64_t>(header->recordCount) * header->recordLength;
    if (counted > bytes) {
        header->recordCount = static_cast<std::int32_t>(bytes / header->recordLength);
        return FileCounts::TooFew;
    }
    const std::int64_t announced = std::max(header->reserved, 1);
    return bytes - counted > announced * header->recordLength ? FileCounts::TooMany : FileCounts::Agree;
}
