#include <cstring>

#include "db/Database.h"
#include "db/FieldValue.h"

int DATABASE::WriteDbHeader() {
    return immediateHeaderWrite_ ? WriteHeaderBytes() : 0;
}

int DATABASE::SetImmediateHeaderWrite(int on) {
    immediateHeaderWrite_ = on != 0;
    return WriteDbHeader();
}

int DATABASE::WriteHeaderBytes() {
    return IsOpen() && file_.WriteAt(0, &header_, HeaderSize) == 0 ? 0 : Fail(DatabaseError::HeaderFailed);
}

int DATABASE::Sync() {
    return !file_.IsWritten() || file_.Sync() == 0 ? 0 : Fail(DatabaseError::SyncFailed);
}

int DATABASE::WriteLayout(File& file, const DATABASE_HEADER& header, const COLUMN_ENTRY* columns) {
    const int error = file.WriteAt(0, &header, HeaderSize);
    const auto count = static_cast<std::size_t>(header.columnCount);
    return error != 0 ? error : file.WriteAt(HeaderSize, columns, count * ColumnEntrySize);
}

int DATABASE::AdjustColumnSize(COLUMN_ENTRY* column) const {
    if (column->size < 0)
        VisitField(column->type, [column]<class Field>(Field) { column->size = Field::Width; });
    return 0;
}

int DATABASE::CalculateIOBufferSize() const {
    int size = header_.columnCount;
    for (int i = 0; i < header_.columnCount; ++i) {
        const COLUMN_ENTRY& column = columns_[i];
        size += column.type == ColumnType::String ? column.size + 2 : 0;
        VisitField(column.type, [&size]<class Field>(Field) { size += Field::LineBytes; });
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
