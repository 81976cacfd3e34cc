#include <algorithm>
#include <cstring>
#include <span>

#include "db/Bytes.h"
#include "db/Database.h"

long DATABASE::QueryUpdate(const char* statement) {
    FieldChange change;
    if (int code = PrepareChange(statement, &change); code != DatabaseError::None)
        return Fail(code);
    if ((lastStatement_[0] == '\0' || !slots_) && QueryReset() < 0)
        return -1;
    long changed = 0;
    const int code = ChangeRecords(change, &changed);
    return code == DatabaseError::None ? changed : Fail(code);
}

int DATABASE::PrepareChange(const char* statement, FieldChange* change) const {
    Statement parts{};
    if (statement == nullptr || *statement == '\0')
        return DatabaseError::SetInvalidOperator;
    if (!SplitStatement(statement, &parts))
        return DatabaseError::SetInvalidStatement;
    const int op = SetOperatorOf(parts.op);
    if (op < 0)
        return DatabaseError::SetInvalidOperator;
    const COLUMN_ENTRY* column = FindColumn(parts.column);
    if (column == nullptr)
        return DatabaseError::SetInvalidColumn;
    if (column->type == ColumnType::String && op != SetOperator::Assign)
        return DatabaseError::SetStringsOnly;
    return change->Prepare(*column, op, parts.value) ? DatabaseError::None : DatabaseError::SetNoMemory;
}

// Changes the records of the set in the order of the file, which a sort has changed in the slots. Returns an
// error code.
int DATABASE::ChangeRecords(const FieldChange& change, long* changed) {
    ReadCache own;
    ReadCache* reader = ScanCache(&own);
    const auto count = static_cast<std::size_t>(slotCount_);
    const auto sorted = TryAllocate<std::int32_t>(sorted_ ? count : 0);
    if (reader == nullptr || !sorted)
        return DatabaseError::SetNoMemory;
    reader->Reset(); // what is written back must be what the file holds now
    if (sorted_)
        std::partial_sort_copy(&slots_[0], &slots_[count], &sorted[0], &sorted[count]);
    for (const std::int32_t number : std::span(sorted_ ? sorted.get() : slots_.get(), count)) {
        if (number == NotInSet)
            continue;
        if (!reader->Holds(number) && reader->Fill(file_, Area(), number) != 0)
            return DatabaseError::SetReadFailed;
        if (*reader->Record(number) == RecordStatus::Deleted)
            continue;
        if (ChangeRecord(change, *reader, number) != 0)
            return DatabaseError::WriteFailed;
        currentRecord_ = number;
        ++*changed;
    }
    return DatabaseError::None;
}

// Changes a record in the reader and in the file; after a failure it is what it was in both.
int DATABASE::ChangeRecord(const FieldChange& change, ReadCache& reader, std::int32_t number) {
    std::uint8_t before[LongestRecord];
    std::uint8_t* record = reader.Record(number);
    const std::size_t length = DataSize() + 1;
    std::memcpy(before, record, length);
    *record = RecordStatus::Active;
    change.Apply(record + 1);
    const std::int64_t offset = Area().OffsetOf(number);
    const int error = file_.WriteAt(offset, record, length);
    if (error != 0) {
        std::memcpy(record, before, length);
        static_cast<void>(
            file_.WriteAt(offset, before, length)); // part of the new record may have been written
        reader.Reset();
    }
    return error;
}

void DATABASE::QueryUpdateDateFunction(int op, dbDATE* field, const long* value) const {
    ChangeDate(op, field, static_cast<std::int32_t>(*value));
}

void DATABASE::QueryUpdateTimeFunction(int op, dbTIME* field, const long* value) const {
    ChangeTime(op, field, static_cast<std::int32_t>(*value));
}
