#include "db/SortKeys.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstring>
#include <numeric>
#include <utility>

#include "db/FieldValue.h"
#include "util/Strings.h"

namespace {

constexpr std::uint64_t NotANumber = std::uint64_t{1} << 32; // no key of a number is that large

// Numbers as unsigned ones of the same order.
std::uint64_t Ordered(std::int32_t value) {
    constexpr std::int64_t lowest = std::int64_t{1} << 31;
    return static_cast<std::uint64_t>(value + lowest);
}

std::uint64_t Ordered(float value) {
    if (std::isnan(value))
        return NotANumber;
    constexpr std::uint32_t sign = std::uint32_t{1} << 31;
    const auto bits = std::bit_cast<std::uint32_t>(value == 0 ? 0.0F : value); // -0 and 0 are equal
    return (bits & sign) != 0 ? ~bits : bits | sign;
}

// Whether a text is over with this word: what is behind its end is 0.
bool IsLastWord(std::uint64_t word) {
    return (word & 0xFF) == 0;
}

// A sort of numbers byte by byte, the lowest first: a few passes, however many entries there are, and it
// keeps the order of equal ones.
constexpr int ByteCount = sizeof(std::uint64_t);
constexpr std::size_t ByteValues = 256;
constexpr std::size_t FewEntries = 1024; // are sorted faster by comparing

std::size_t ByteOf(std::uint64_t word, int byte) {
    return (word >> (8 * byte)) & 0xFF;
}

using Counts = std::array<std::array<std::uint32_t, ByteValues>, ByteCount>;

void CountBytes(std::span<const SortKeys::Entry> entries, Counts* counts) {
    for (const SortKeys::Entry& entry : entries)
        for (int byte = 0; byte < ByteCount; ++byte)
            ++(*counts)[static_cast<std::size_t>(byte)][ByteOf(entry.word, byte)];
}

// Sorts by bytes; `scratch` has room for as many entries.
void SortByBytes(std::span<SortKeys::Entry> entries, SortKeys::Entry* scratch) {
    Counts counts{};
    CountBytes(entries, &counts);
    SortKeys::Entry* from = entries.data();
    SortKeys::Entry* to = scratch;
    for (int byte = 0; byte < ByteCount; ++byte) {
        auto& places = counts[static_cast<std::size_t>(byte)];
        if (places[ByteOf(entries.front().word, byte)] == entries.size())
            continue; // the same in all
        std::exclusive_scan(places.begin(), places.end(), places.begin(), 0U);
        for (const SortKeys::Entry* entry = from; entry != from + entries.size(); ++entry)
            to[places[ByteOf(entry->word, byte)]++] = *entry;
        std::swap(from, to);
    }
    if (from != entries.data())
        std::copy_n(from, entries.size(), entries.data());
}

} // namespace

bool SortKeys::Prepare(const COLUMN_ENTRY& column, std::int32_t count) {
    column_ = column;
    const auto entries = static_cast<std::size_t>(count);
    entries_ = TryAllocate<Entry>(entries);
    scratch_ = TryAllocate<Entry>(entries);
    if (column.type == ColumnType::String) {
        constexpr std::size_t word = sizeof(std::uint64_t);
        words_ = std::max<std::size_t>((static_cast<std::size_t>(column.size) + word - 1) / word, 1);
        texts_ = TryAllocate<std::uint64_t>(entries * words_);
    }
    return entries_ && scratch_ && (texts_ || words_ == 0);
}

void SortKeys::Add(std::int32_t slot, std::int32_t record) {
    entries_[count_] = {static_cast<std::uint64_t>(record), slot, count_};
    ++count_;
}

void SortKeys::OrderByRecord() {
    SortByWord(Entries());
}

void SortKeys::SetKey(Entry* entry, const std::uint8_t* data) {
    const std::uint8_t* field = data + column_.offset;
    entry->word = 0;
    if (column_.type == ColumnType::String)
        StoreText(field, entry->index);
    VisitField(column_.type, [&]<class Field>(Field) {
        entry->word = Ordered(Field::Load(field, static_cast<std::size_t>(column_.size)));
    });
}

// Texts are kept as numbers of which the first byte is the highest, so that comparing numbers compares texts.
void SortKeys::StoreText(const std::uint8_t* field, std::int32_t index) {
    std::uint64_t* text = &texts_[static_cast<std::size_t>(index) * words_];
    auto* bytes = reinterpret_cast<std::uint8_t*>(text);
    const std::size_t length = TextIn(field, static_cast<std::size_t>(column_.size)).size();
    CopyLowered(field, length, bytes);
    std::memset(bytes + length, 0, words_ * sizeof(std::uint64_t) - length);
    for (std::size_t i = 0; i < words_; ++i, bytes += sizeof(std::uint64_t)) {
        std::uint64_t word = 0;
        for (std::size_t at = 0; at < sizeof(std::uint64_t); ++at)
            word = word << 8 | bytes[at];
        text[i] = word;
    }
}

void SortKeys::Sort() {
    RestoreOrder();
    if (words_ > 0)
        SortTexts(Sorted(), 0);
    else
        SortNumbers();
}

// Puts the entries that have a key back into the order in which they were added, the others behind them.
void SortKeys::RestoreOrder() {
    for (const Entry& entry : Entries())
        scratch_[entry.index] = entry;
    keys_ = 0;
    Entry* gone = entries_.get() + count_;
    for (std::int32_t i = 0; i < count_; ++i) {
        if (scratch_[i].slot >= 0) {
            entries_[keys_++] = scratch_[i];
        } else {
            *--gone = scratch_[i];
            gone->slot = ~gone->slot;
        }
    }
}

void SortKeys::SortNumbers() {
    const auto isNotANumber = [](const Entry& entry) { return entry.word == NotANumber; };
    const auto end = Sorted().end();
    auto first = Sorted().begin();
    while (first != end) {
        const auto last = std::find_if(first, end, isNotANumber);
        SortByWord({first, last});
        first = std::find_if_not(last, end, isNotANumber);
    }
}

// Sorts entries that agree in `depth` words and stand in the order in which they were added.
void SortKeys::SortTexts(std::span<Entry> entries, std::size_t depth) {
    for (Entry& entry : entries)
        entry.word = texts_[static_cast<std::size_t>(entry.index) * words_ + depth];
    SortByWord(entries);
    if (depth + 1 == words_)
        return;
    for (auto group = entries.begin(); group != entries.end();) {
        const std::uint64_t word = group->word;
        const auto end =
            std::find_if(group, entries.end(), [word](const Entry& entry) { return entry.word != word; });
        if (end - group > 1 && !IsLastWord(word))
            SortTexts({group, end}, depth + 1);
        group = end;
    }
}

// Sorts by word; entries with the same one keep their order.
void SortKeys::SortByWord(std::span<Entry> entries) {
    const auto less = [](const Entry& a, const Entry& b) { return a.word < b.word; };
    if (std::is_sorted(entries.begin(), entries.end(), less))
        return; // as when all are the same
    if (entries.size() < FewEntries) {
        std::sort(
            entries.begin(), entries.end(),
            [](const Entry& a, const Entry& b) {
                return a.word != b.word ? a.word < b.word : a.index < b.index;
            });
    } else {
        SortByBytes(entries, scratch_.get());
    }
}
