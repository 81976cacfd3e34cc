#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>

#include "db/RecordTypes.h"

// The keys by which the records of a result set are sorted, and the sort itself. The order is the one in
// which exchanging neighbours while the first is greater than the second ends: keys that are equal, or of a
// type that has no order, stay as they were; a float that is no number stays in its place, as nothing is
// greater or smaller than it, and the records before and behind it are sorted apart.
//
// It knows nothing of files. A sort makes one, adds the records in the order of their slots in the set,
// gives each its key (in that order or by record number, as it likes), sorts, and reads off the result.
class SortKeys {
  public:
    struct Entry {
        std::uint64_t word; // ordered as the key, or as eight bytes of it where it is text
        std::int32_t slot;  // of the set; its complement while a record is known to be gone
        std::int32_t index; // how many were added before
    };

    // Makes room for `count` entries. False when there is no memory.
    [[nodiscard]] bool Prepare(const COLUMN_ENTRY& column, std::int32_t count);

    void Add(std::int32_t slot, std::int32_t record);
    // Puts the entries, none of which has its key yet, into the order of their records.
    void OrderByRecord();
    [[nodiscard]] std::span<Entry> Entries() const {
        return {entries_.get(), static_cast<std::size_t>(count_)};
    }
    // Gives an entry the key in its record's data.
    void SetKey(Entry* entry, const std::uint8_t* data);
    // Takes an entry out of the sort.
    static void SetGone(Entry* entry) { entry->slot = ~entry->slot; }

    // Sorts the entries that have a key; all others must be gone.
    void Sort();
    // After Sort: the entries that have a key, in their order; and the others.
    [[nodiscard]] std::span<Entry> Sorted() const { return Entries().first(static_cast<std::size_t>(keys_)); }
    [[nodiscard]] std::span<Entry> Gone() const { return Entries().subspan(static_cast<std::size_t>(keys_)); }

  private:
    void StoreText(const std::uint8_t* field, std::int32_t index);
    void RestoreOrder();
    void SortNumbers();
    void SortTexts(std::span<Entry> entries, std::size_t depth);
    void SortByWord(std::span<Entry> entries);

    COLUMN_ENTRY column_{};
    std::unique_ptr<Entry[]> entries_;
    std::unique_ptr<Entry[]> scratch_; // as many
    std::int32_t count_ = 0;
    std::int32_t keys_ = 0;                  // entries with a key, which come first; known after Sort
    std::size_t words_ = 0;                  // of a text; 0 for other columns
    std::unique_ptr<std::uint64_t[]> texts_; // of each entry that has a key, by its index
};
