#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "db/RecordTypes.h"

/// The keys by which the records of a result set are sorted, and the sort itself. The order is the one in
/// which exchanging neighbours while the first is greater than the second ends: keys that are equal, or of a
/// type that has no order, stay as they were; a float that is no number stays in its place, as nothing is
/// greater or smaller than it, and the records before and behind it are sorted apart.
///
/// It knows nothing of files, and its only idea of a record is the slot of the set that holds it. Entries are
/// added in the order of the slots, then given their keys in any order.
class SortKeys {
  public:
    struct ENTRY {
        std::uint64_t word; ///< ordered as the key, or as eight bytes of it where it is text
        std::int32_t slot;
        std::int32_t key; ///< where the text is
    };

    /// Makes room for `count` entries. False when there is no memory.
    [[nodiscard]] bool Prepare(const COLUMN_ENTRY& column, std::int32_t count);

    /// Adds an entry, with any number as its word until it gets its key.
    void Add(std::int32_t slot, std::int32_t word) {
        entries_[count_++] = {static_cast<std::uint64_t>(word), slot, 0};
    }
    [[nodiscard]] ENTRY* begin() const { return entries_.get(); }
    [[nodiscard]] ENTRY* end() const { return entries_.get() + count_; }

    /// Orders the entries by their words, those with equal words by their slots.
    void OrderByWord();
    void OrderBySlot();

    /// Gives the next entry, in the order in which they now stand, the key in its record's data. Null for a
    /// record that is gone: its entry moves behind those that have a key.
    void TakeKey(const std::uint8_t* data);
    /// Where the entries that have a key end.
    [[nodiscard]] ENTRY* EndOfKeys() const { return begin() + keys_; }

    /// Sorts the entries that have a key; each entry must have been given one or none.
    void Sort();

  private:
    void SortNumbers();
    void SortTexts(ENTRY* first, ENTRY* last, std::size_t depth);
    void StoreText(const std::uint8_t* field, std::int32_t key);

    COLUMN_ENTRY column_{};
    std::unique_ptr<ENTRY[]> entries_;
    std::int32_t count_ = 0;
    std::int32_t keys_ = 0; // entries with a key, which come first
    std::int32_t gone_ = 0; // entries without
    std::size_t words_ = 0; // of a text; 0 for other columns
    std::unique_ptr<std::uint64_t[]> texts_;
};
