#include "db/DataFile.h"

#include <algorithm>
#include <bit>
#include <cstring>

#include "db/LittleEndian.h"

namespace {

std::int16_t LoadInt16(const std::uint8_t* bytes) {
    return static_cast<std::int16_t>(LoadLittleEndian<std::uint16_t>(bytes));
}

std::int32_t LoadInt32(const std::uint8_t* bytes) {
    return static_cast<std::int32_t>(LoadLittleEndian<std::uint32_t>(bytes));
}

void Store(std::uint8_t* bytes, std::int16_t value) {
    StoreLittleEndian(bytes, static_cast<std::uint16_t>(value));
}

void Store(std::uint8_t* bytes, std::int32_t value) {
    StoreLittleEndian(bytes, static_cast<std::uint32_t>(value));
}

void LoadName(char (&name)[NameSize], const std::uint8_t* bytes) {
    std::memcpy(name, bytes, NameSize);
    name[NameSize - 1] = '\0';
}

} // namespace

DATABASE_HEADER DecodeHeader(std::span<const std::uint8_t, HeaderSize> bytes) {
    const std::uint8_t* at = bytes.data();
    DATABASE_HEADER header{};
    header.version = std::bit_cast<float>(LoadLittleEndian<std::uint32_t>(at + HeaderOffset::Version));
    LoadName(header.description, at + HeaderOffset::Description);
    header.recordCount = LoadInt32(at + HeaderOffset::RecordCount);
    header.deletedCount = LoadInt32(at + HeaderOffset::DeletedCount);
    header.columnCount = LoadInt16(at + HeaderOffset::ColumnCount);
    header.recordLength = LoadInt16(at + HeaderOffset::RecordLength);
    header.reserved = LoadInt32(at + HeaderOffset::Reserved);
    return header;
}

void EncodeHeader(const DATABASE_HEADER& header, std::span<std::uint8_t, HeaderSize> bytes) {
    std::uint8_t* at = bytes.data();
    StoreLittleEndian(at + HeaderOffset::Version, std::bit_cast<std::uint32_t>(header.version));
    std::memcpy(at + HeaderOffset::Description, header.description, NameSize);
    Store(at + HeaderOffset::RecordCount, header.recordCount);
    Store(at + HeaderOffset::DeletedCount, header.deletedCount);
    Store(at + HeaderOffset::ColumnCount, header.columnCount);
    Store(at + HeaderOffset::RecordLength, header.recordLength);
    Store(at + HeaderOffset::Reserved, header.reserved);
}

COLUMN_ENTRY DecodeColumn(std::span<const std::uint8_t, ColumnEntrySize> bytes) {
    const std::uint8_t* at = bytes.data();
    COLUMN_ENTRY column{};
    LoadName(column.name, at + ColumnOffset::Name);
    column.type = static_cast<std::int8_t>(at[ColumnOffset::Type]);
    column.size = LoadInt16(at + ColumnOffset::Size);
    column.offset = LoadInt16(at + ColumnOffset::Offset);
    column.format = LoadInt32(at + ColumnOffset::Format);
    return column;
}

void EncodeColumn(const COLUMN_ENTRY& column, std::span<std::uint8_t, ColumnEntrySize> bytes) {
    std::uint8_t* at = bytes.data();
    std::memset(at, 0, ColumnEntrySize);
    std::memcpy(at + ColumnOffset::Name, column.name, NameSize);
    at[ColumnOffset::Type] = static_cast<std::uint8_t>(column.type);
    Store(at + ColumnOffset::Size, column.size);
    Store(at + ColumnOffset::Offset, column.offset);
    Store(at + ColumnOffset::Format, column.format);
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
