#include <cstring>

#include "db/Database.h"

namespace {

// What a type occupies in a record and in a text line. A string's width is its creator's choice.
struct TypeWidths {
    std::int16_t record;
    int text;
};

TypeWidths WidthsOf(std::int8_t type) {
    switch (type) {
    case ColumnType::Byte:
        return {1, 1};
    case ColumnType::Short:
        return {2, 16};
    case ColumnType::Long:
        return {4, 16};
    case ColumnType::Float:
        return {8, 16};
    case ColumnType::Date:
        return {4, 8};
    case ColumnType::Time:
        return {3, 6};
    default:
        return {0, 0};
    }
}

} // namespace

int DATABASE::WriteDbHeader() {
    return immediateHeaderWrite_ ? WriteHeaderBytes() : 0;
}

int DATABASE::SetImmediateHeaderWrite(int on) {
    immediateHeaderWrite_ = on != 0;
    return WriteDbHeader();
}

int DATABASE::WriteHeaderBytes() {
    std::uint8_t bytes[HeaderSize];
    EncodeHeader(header_, bytes);
    if (!IsOpen() || file_.WriteAt(0, bytes, HeaderSize) != 0)
        return Fail(DatabaseError::HeaderFailed);
    return 0;
}

int DATABASE::Sync() {
    return !file_.IsWritten() || file_.Sync() == 0 ? 0 : Fail(DatabaseError::SyncFailed);
}

int DATABASE::WriteLayout(File& file, const DATABASE_HEADER& header, const COLUMN_ENTRY* columns) {
    std::uint8_t bytes[HeaderSize];
    EncodeHeader(header, bytes);
    int error = file.WriteAt(0, bytes, HeaderSize);
    for (int i = 0; i < header.columnCount && error == 0; ++i) {
        std::uint8_t entry[ColumnEntrySize];
        EncodeColumn(columns[i], entry);
        error = file.WriteAt(DataStart(i), entry, ColumnEntrySize);
    }
    return error;
}

int DATABASE::AdjustColumnSize(COLUMN_ENTRY* column) const {
    const std::int16_t own = WidthsOf(column->type).record;
    if (column->size < 0 && own > 0)
        column->size = own;
    return 0;
}

int DATABASE::CalculateIOBufferSize() const {
    int size = header_.columnCount;
    for (int i = 0; i < header_.columnCount; ++i) {
        const COLUMN_ENTRY& column = columns_[i];
        size += column.type == ColumnType::String ? column.size + 2 : WidthsOf(column.type).text;
    }
    return size;
}

int DATABASE::GetColumnInfo(int index, COLUMN_ENTRY* out) {
    if (index < 0 || index >= header_.columnCount)
        return Fail(DatabaseError::InvalidColumnIndex);
    *out = columns_[index];
    return 0;
}

int DATABASE::GetHeaderInfo(DATABASE_HEADER* out) const {
    *out = header_;
    return 0;
}

const COLUMN_ENTRY* DATABASE::FindColumn(const char* name) const {
    for (int i = 0; i < header_.columnCount; ++i)
        if (std::strcmp(columns_[i].name, name) == 0)
            return &columns_[i];
    return nullptr;
}
