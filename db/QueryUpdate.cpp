#include <algorithm>
#include <cstring>

#include "db/Allocate.h"
#include "db/Database.h"

namespace {
constexpr std::int32_t NotInSet = -1;
constexpr std::size_t RunBytes = 64 * 1024; // neighbouring records that are written in one go
} // namespace

long DATABASE::QueryUpdate(const char* statement) {
    FieldChange change;
    if (int code = PrepareChange(statement, &change); code != DatabaseError::None) {
        return Fail(code);
    }
    if ((lastStatement_[0] == '\0' || !slots_) && QueryReset() < 0) {
        return -1;
    }
    long changed = 0;
    const int code = ChangeRecords(change, &changed);
    return code == DatabaseError::None ? changed : Fail(code);
}

int DATABASE::PrepareChange(const char* statement, FieldChange* change) const {
    STATEMENT parts{};
    if (statement == nullptr || *statement == '\0') {
        return DatabaseError::SetInvalidOperator;
    }
    if (!SplitStatement(statement, &parts)) {
        return DatabaseError::SetInvalidStatement;
    }
    const int op = SetOperatorOf(parts.op);
    if (op < 0) {
        return DatabaseError::SetInvalidOperator;
    }
    const COLUMN_ENTRY* column = FindColumn(parts.column);
    if (column == nullptr) {
        return DatabaseError::SetInvalidColumn;
    }
    if (column->type == ColumnType::String && op != SetOperator::Assign) {
        return DatabaseError::SetStringsOnly;
    }
    return change->Prepare(*column, op, parts.value) ? DatabaseError::None : DatabaseError::SetNoMemory;
}

// Changes the records of the set in the order of the file, which a sort has changed in the slots. Returns an
// error code.
int DATABASE::ChangeRecords(const FieldChange& change, long* changed) {
    ReadCache own;
    ReadCache* reader = ScanCache(&own);
    const std::size_t most = std::max<std::size_t>(RunBytes / (DataSize() + 1), 1);
    const auto before = TryAllocate<std::uint8_t>(most * (DataSize() + 1));
    const auto numbers = TryAllocate<std::int32_t>(sorted_ ? static_cast<std::size_t>(slotCount_) : 0);
    if (reader == nullptr || !before || !numbers) {
        return DatabaseError::SetNoMemory;
    }
    const std::int32_t* next = slots_.get();
    const std::int32_t* end = next + slotCount_;
    if (sorted_) {
        end = std::copy(next, end, numbers.get());
        std::sort(numbers.get(), numbers.get() + slotCount_);
        next = numbers.get();
    }
    while (next != end) {
        if (*next == NotInSet) {
            ++next;
            continue;
        }
        if (!reader->Holds(*next) && reader->Fill(file_, Area(), *next) != 0) {
            return DatabaseError::SetReadFailed;
        }
        const std::size_t run =
            RunLength(*reader, next, std::min(most, static_cast<std::size_t>(end - next)));
        if (run > 0 && !ChangeRun(change, *reader, *next, run, before.get())) {
            return DatabaseError::WriteFailed;
        }
        *changed += static_cast<long>(run);
        next += std::max<std::size_t>(run, 1);
    }
    return DatabaseError::None;
}

// How many of the records listed from `numbers` on follow one another, are held by the reader and are not
// deleted.
std::size_t DATABASE::RunLength(const ReadCache& reader, const std::int32_t* numbers, std::size_t most) {
    std::size_t run = 0;
    while (run < most && numbers[run] == *numbers + static_cast<std::int32_t>(run) &&
           reader.Holds(numbers[run]) && *reader.Record(numbers[run]) != RecordStatus::Deleted) {
        ++run;
    }
    return run;
}

// Changes neighbouring records in the reader and in the file. After a failed write the file has the records
// as they were, kept in `before`, or as they should be, none of them in parts, as far as it can still be
// written.
bool DATABASE::ChangeRun(const FieldChange& change, ReadCache& reader, std::int32_t first, std::size_t count,
                         std::uint8_t* before) {
    const std::size_t length = DataSize() + 1;
    std::uint8_t* records = reader.Record(first);
    std::memcpy(before, records, count * length);
    for (std::size_t i = 0; i < count; ++i) {
        records[i * length] = RecordStatus::Active;
        change.Apply(records + i * length + 1);
    }
    if (file_.WriteAt(Area().OffsetOf(first), records, count * length) != 0) {
        reader.Clear();
        static_cast<void>(file_.WriteAt(Area().OffsetOf(first), before, count * length));
        return false;
    }
    currentRecord_ = first + static_cast<std::int32_t>(count) - 1;
    return true;
}

void DATABASE::QueryUpdateDateFunction(int op, dbDATE* field, const long* value) const {
    ChangeDate(op, field, static_cast<std::int32_t>(*value));
}

void DATABASE::QueryUpdateTimeFunction(int op, dbTIME* field, const long* value) const {
    ChangeTime(op, field, static_cast<std::int32_t>(*value));
}
