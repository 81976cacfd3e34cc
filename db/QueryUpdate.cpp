#include <algorithm>
#include <cstring>

#include "db/Allocate.h"
#include "db/Database.h"

namespace {
constexpr std::size_t SpanBytes = 256 * 1024; // the most that is written in one go
constexpr int MostGapBytes = 4096;            // between two changed records of it
} // namespace

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
    STATEMENT parts{};
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
    const auto before = TryAllocate<std::uint8_t>(SpanBytes + DataSize() + 1);
    const auto sorted = TryAllocate<std::int32_t>(sorted_ ? static_cast<std::size_t>(slotCount_) : 0);
    if (reader == nullptr || !before || !sorted)
        return DatabaseError::SetNoMemory;
    const std::int32_t* next = slots_.get();
    const std::int32_t* end = next + slotCount_;
    if (sorted_) {
        std::partial_sort_copy(next, end, sorted.get(), sorted.get() + slotCount_);
        next = sorted.get();
        end = next + slotCount_;
    }
    for (;;) {
        const std::span<const std::int32_t> numbers = TakeSpan(*reader, &next, end);
        if (numbers.empty())
            return DatabaseError::None;
        // Always read anew: what lies between the records is written back as well.
        const std::int32_t first = numbers.front();
        if (reader->FillSpan(file_, Area(), first, numbers.back() - first + 1) != 0)
            return DatabaseError::SetReadFailed;
        const int count = ChangeSpan(change, *reader, numbers, before.get());
        if (count < 0)
            return DatabaseError::WriteFailed;
        *changed += count;
    }
}

// Takes the records that are read and written together off the list: they fit the reader, and lie no further
// than a page from each other, so that what lies between costs less than one more call. None at the end.
std::span<const std::int32_t> DATABASE::TakeSpan(const ReadCache& reader, const std::int32_t** next,
                                                 const std::int32_t* end) const {
    const std::int32_t mostGap = MostGapBytes / header_.recordLength + 1;
    const std::int32_t most = std::min(static_cast<std::int32_t>(SpanBytes) / header_.recordLength,
                                       reader.Capacity(header_.recordLength));
    const auto inSet = [](std::int32_t number) { return number != NotInSet; };
    const std::int32_t* first = std::find_if(*next, end, inSet);
    const std::int32_t* last = first;
    *next = first;
    while (*next != end && **next - *first < most && **next - *last <= mostGap) {
        last = *next;
        *next = std::find_if(last + 1, end, inSet);
    }
    return {first, *next == first ? first : last + 1};
}

// Changes the listed records in the reader and in the file; returns how many, -1 when they could not be
// written. Then each is as it was or as it should be, none of them in parts, as far as the file can still be
// written.
int DATABASE::ChangeSpan(const FieldChange& change, ReadCache& reader, std::span<const std::int32_t> numbers,
                         std::uint8_t* before) {
    const std::size_t length = DataSize() + 1;
    std::int32_t first = NotInSet;
    std::int32_t last = NotInSet;
    int count = 0;
    for (const std::int32_t number : numbers) {
        if (number == NotInSet || *reader.Record(number) == RecordStatus::Deleted)
            continue;
        std::uint8_t* record = reader.Record(number);
        std::memcpy(before + static_cast<std::size_t>(count) * length, record, length);
        *record = RecordStatus::Active;
        change.Apply(record + 1);
        first = count == 0 ? number : first;
        last = number;
        ++count;
    }
    const std::size_t bytes = static_cast<std::size_t>(last - first + 1) * length;
    if (count == 0 || file_.WriteAt(Area().OffsetOf(first), reader.Record(first), bytes) == 0) {
        currentRecord_ = count == 0 ? currentRecord_ : last;
        return count;
    }
    for (const std::int32_t number : numbers) {
        if (number != NotInSet && *reader.Record(number) != RecordStatus::Deleted) {
            std::memcpy(reader.Record(number), before, length);
            before += length;
        }
    }
    if (file_.WriteAt(Area().OffsetOf(first), reader.Record(first), bytes) != 0)
        reader.Reset(); // nobody knows what the file holds there
    return -1;
}

void DATABASE::QueryUpdateDateFunction(int op, dbDATE* field, const long* value) const {
    ChangeDate(op, field, static_cast<std::int32_t>(*value));
}

void DATABASE::QueryUpdateTimeFunction(int op, dbTIME* field, const long* value) const {
    ChangeTime(op, field, static_cast<std::int32_t>(*value));
}
