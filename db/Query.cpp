#include <algorithm>
#include <cstring>
#include <numeric>

#include "db/Bytes.h"
#include "db/Database.h"
#include "db/Statement.h"

namespace {

constexpr std::int32_t BlockSize = 256; // records that a condition is asked about at once

// Records are scanned through the object's cache; without one, through a buffer of this size.
constexpr int ScanKilobytes = 64;

} // namespace

long DATABASE::Query(const char* statement, int mode) {
    if (mode != QueryMode::New && mode != QueryMode::And && mode != QueryMode::Or)
        return Fail(DatabaseError::QueryInvalidStatement);
    if (mode != QueryMode::New && sorted_)
        return Fail(DatabaseError::QueryAfterSort);
    if (mode != QueryMode::New && !slots_)
        return Fail(DatabaseError::QueryNoSet);
    if (statement == nullptr || *statement == '\0')
        return QueryReset();
    Condition condition;
    if (int code = PrepareCondition(statement, &condition); code != DatabaseError::None)
        return Fail(code);
    ReadCache own;
    ReadCache* reader = ScanCache(&own);
    if (reader == nullptr)
        return Fail(DatabaseError::QueryNoMemoryForRecord);
    if (mode == QueryMode::New) {
        if (!NewSlots())
            return Fail(DatabaseError::QueryNoMemoryForSlots);
        std::fill_n(slots_.get(), slotCount_, NotInSet);
        resultCount_ = 0;
        sorted_ = false;
    }
    if (int code = RunQuery(condition, mode, *reader); code != DatabaseError::None) {
        DropResultSet();
        return Fail(code);
    }
    walkPosition_ = 0;
    if (statement != lastStatement_)
        std::strcpy(lastStatement_, statement);
    return resultCount_;
}

int DATABASE::PrepareCondition(const char* statement, Condition* condition) const {
    Statement parts{};
    if (!SplitStatement(statement, &parts))
        return DatabaseError::QueryInvalidStatement;
    const COLUMN_ENTRY* column = FindColumn(parts.column);
    if (column == nullptr)
        return DatabaseError::QueryInvalidColumn;
    const int op = CompareOperatorOf(parts.op);
    if (op < 0)
        return DatabaseError::QueryInvalidOperator;
    if (op == CompareOperator::Contains && column->type != ColumnType::String)
        return DatabaseError::QueryContainsNeedsString;
    condition->Prepare(*column, op, parts.value, caseSensitive_);
    return DatabaseError::None;
}

bool DATABASE::NewSlots() {
    slots_.reset(); // first, so that two sets are never held at once
    slotCount_ = 0;
    slots_ = TryAllocate<std::int32_t>(static_cast<std::size_t>(header_.recordCount));
    if (slots_)
        slotCount_ = header_.recordCount;
    return slots_ != nullptr;
}

void DATABASE::DropResultSet() {
    slots_.reset();
    slotCount_ = 0;
    resultCount_ = 0;
    walkPosition_ = 0;
    sorted_ = false;
}

// Goes through the records in order, a cache at a time. In the other modes than a new query, those that
// cannot change are not read unless they lie between others.
int DATABASE::RunQuery(const Condition& condition, int mode, ReadCache& reader) {
    const auto canChange = [mode](std::int32_t slot) {
        return (slot == NotInSet) == (mode != QueryMode::And);
    };
    std::int32_t i = 0;
    for (;;) {
        if (mode != QueryMode::New) {
            i = static_cast<std::int32_t>(std::find_if(&slots_[i], &slots_[slotCount_], canChange) -
                                          &slots_[0]);
        }
        if (i >= slotCount_)
            return DatabaseError::None;
        if (!reader.Holds(i) && reader.FillFrom(file_, Area(), i) != 0)
            return DatabaseError::QueryFailed;
        const std::int32_t count = std::min({reader.Last() + 1 - i, slotCount_ - i, BlockSize});
        MergeMatches(condition, mode, i, count, reader.Record(i));
        i += count;
    }
}

// Asks the condition about `count` records (at most BlockSize) and brings their slots up to date.
void DATABASE::MergeMatches(const Condition& condition, int mode, std::int32_t first, std::int32_t count,
                            const std::uint8_t* records) {
    const auto length = static_cast<std::size_t>(header_.recordLength);
    std::uint8_t matches[BlockSize];
    condition.Match(records + 1, length, static_cast<std::size_t>(count), matches);
    const bool narrow = mode == QueryMode::And;
    std::int32_t* slots = &slots_[first];
    for (std::int32_t i = 0; i < count; ++i) {
        // Only a record that leaves (AND) or enters (NEW, OR) the set is looked at closer.
        if ((matches[i] != 0) == narrow || (slots[i] == NotInSet) == narrow ||
            records[static_cast<std::size_t>(i) * length] == RecordStatus::Deleted)
            continue;
        slots[i] = narrow ? NotInSet : first + i;
        resultCount_ += narrow ? -1 : 1;
    }
}

int DATABASE::ParseQueryStatement(const char* statement, char* column, char* op, char* value) const {
    Statement parts{};
    if (!SplitStatement(statement, &parts))
        return 1;
    std::memcpy(column, parts.column, TokenSize);
    std::memcpy(op, parts.op, TokenSize);
    std::memcpy(value, parts.value, TokenSize);
    return 0;
}

long DATABASE::QueryReset() {
    if (!NewSlots()) {
        DropResultSet();
        return Fail(DatabaseError::ResetNoMemoryForSlots);
    }
    std::iota(slots_.get(), slots_.get() + slotCount_, 0);
    resultCount_ = slotCount_;
    if (int code = header_.deletedCount > 0 ? TakeOutDeleted() : 0; code != DatabaseError::None) {
        DropResultSet();
        return Fail(code);
    }
    walkPosition_ = 0;
    lastStatement_[0] = '\0';
    return resultCount_;
}

int DATABASE::TakeOutDeleted() {
    ReadCache own;
    ReadCache* reader = ScanCache(&own);
    if (reader == nullptr)
        return DatabaseError::ResetNoMemoryForRecord;
    for (std::int32_t i = 0; i < slotCount_; ++i) {
        const std::uint8_t* record = reader->Scan(file_, Area(), i);
        if (record == nullptr)
            return DatabaseError::QueryFailed;
        if (*record == RecordStatus::Deleted) {
            slots_[i] = NotInSet;
            --resultCount_;
        }
    }
    return DatabaseError::None;
}

// The cache to read all records through: the object's, or `own` when that has none; null without memory.
ReadCache* DATABASE::ScanCache(ReadCache* own) {
    if (cache_.HasBuffer())
        return &cache_;
    return own->Resize(ScanKilobytes) ? own : nullptr;
}

void DATABASE::QueryRefresh() {
    Query(lastStatement_, QueryMode::New);
}

int DATABASE::IsQueryActive() const {
    return slots_ && resultCount_ < GetNumberOfActiveRecords() ? 1 : 0;
}

int DATABASE::CompareStringVals(int op, const char* field, const char* value) const {
    return CompareText(op, field, value, caseSensitive_);
}
