#include <algorithm>

#include "db/Database.h"
#include "db/SortKeys.h"

int DATABASE::SortBy(const char* column, int /*ignored*/) {
    const COLUMN_ENTRY* by = column != nullptr ? FindColumn(column) : nullptr;
    if (by == nullptr)
        return Fail(DatabaseError::SortInvalidColumn);
    if (!slots_ && QueryReset() < 0)
        return -1;
    if (resultCount_ < 2)
        return 0;
    SortKeys keys;
    if (!keys.Prepare(*by, resultCount_))
        return Fail(DatabaseError::SortNoMemoryForKeys);
    if (const int code = ReadSortKeys(&keys); code != DatabaseError::None)
        return Fail(code);
    keys.Sort();
    TakeSortOrder(keys);
    return 0;
}

// Reads the keys of the set's records, in the order of the file so that it is gone through once.
int DATABASE::ReadSortKeys(SortKeys* keys) {
    ReadCache own;
    ReadCache* reader = ScanCache(&own);
    if (reader == nullptr)
        return DatabaseError::SortNoMemoryForFirstRecord;
    for (std::int32_t i = 0; i < slotCount_; ++i)
        if (slots_[i] != NotInSet)
            keys->Add(i, slots_[i]);
    if (sorted_)
        keys->OrderByRecord();
    for (SortKeys::Entry& entry : keys->Entries()) {
        const std::int32_t number = slots_[entry.slot];
        if (!reader->Holds(number) && reader->Fill(file_, Area(), number) != 0)
            return DatabaseError::SortReadFailed;
        const std::uint8_t* record = reader->Record(number);
        if (*record == RecordStatus::Deleted)
            SortKeys::SetGone(&entry);
        else
            keys->SetKey(&entry, record + 1);
    }
    return DatabaseError::None;
}

// Puts the records into the slots that the set uses, in the order of their keys; those that are gone leave
// it.
void DATABASE::TakeSortOrder(const SortKeys& keys) {
    for (const SortKeys::Entry& gone : keys.Gone()) {
        slots_[gone.slot] = NotInSet;
        --resultCount_;
    }
    const std::span<SortKeys::Entry> sorted = keys.Sorted();
    for (SortKeys::Entry& entry : sorted)
        entry.word = static_cast<std::uint32_t>(slots_[entry.slot]); // the record, before its slot is taken
    auto entry = sorted.begin();
    for (std::int32_t i = 0; i < slotCount_; ++i)
        if (slots_[i] != NotInSet)
            slots_[i] = static_cast<std::int32_t>((entry++)->word);
    sorted_ = true;
}

void DATABASE::GetNextSortSlots(long* first, long* second) const {
    const auto next = [this](long slot) {
        for (slot = std::max(slot, -1L); slot < header_.recordCount;) {
            ++slot;
            if (slot < slotCount_ && slots_[slot] != NotInSet)
                return slot;
        }
        return static_cast<long>(header_.recordCount);
    };
    *first = next(*first);
    *second = next(*first);
}
