#include "db/SortKeys.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstring>
#include <utility>

#include "db/Allocate.h"
#include "db/LittleEndian.h"
#include "db/LoweredText.h"

namespace {

constexpr std::uint64_t NotANumber = std::uint64_t{1} << 32; // no key of a number is that large

// Numbers as unsigned ones of the same order.
std::uint64_t OrderedWhole(std::int64_t value) {
    constexpr std::int64_t lowest = std::int64_t{1} << 31;
    return static_cast<std::uint64_t>(value + lowest);
}

std::uint64_t OrderedFloat(float value) {
    if (std::isnan(value)) {
        return NotANumber;
    }
    constexpr std::uint32_t sign = std::uint32_t{1} << 31;
    const auto bits = std::bit_cast<std::uint32_t>(value == 0 ? 0.0F : value); // -0 and 0 are equal
    return (bits & sign) != 0 ? ~bits : bits | sign;
}

std::uint64_t OrderedNumber(std::int8_t type, const std::uint8_t* field, std::size_t width) {
    switch (type) {
    case ColumnType::Byte:
        return OrderedWhole(static_cast<std::int8_t>(LoadLittleEndian<std::uint8_t>(field, width)));
    case ColumnType::Short:
        return OrderedWhole(static_cast<std::int16_t>(LoadLittleEndian<std::uint16_t>(field, width)));
    case ColumnType::Long:
    case ColumnType::Date:
        return OrderedWhole(static_cast<std::int32_t>(LoadLittleEndian<std::uint32_t>(field, width)));
    case ColumnType::Float:
        return OrderedFloat(std::bit_cast<float>(LoadLittleEndian<std::uint32_t>(field, width)));
    case ColumnType::Time:
        return LoadLittleEndian<std::uint32_t>(field, std::min(width, sizeof(dbTIME)));
    default:
        return 0;
    }
}

bool WordIsLess(const SortKeys::ENTRY& a, const SortKeys::ENTRY& b) {
    return a.word != b.word ? a.word < b.word : a.slot < b.slot;
}

void SortByWord(SortKeys::ENTRY* first, SortKeys::ENTRY* last) {
    if (!std::is_sorted(first, last, WordIsLess)) { // as all the same, or sorted before
        std::sort(first, last, WordIsLess);
    }
}

// Whether a text is over with this word: what is behind its end is 0.
bool IsLastWord(std::uint64_t word) {
    return (word & 0xFF) == 0;
}

} // namespace

bool SortKeys::Prepare(const COLUMN_ENTRY& column, std::int32_t count) {
    column_ = column;
    const auto entries = static_cast<std::size_t>(count);
    entries_ = TryAllocate<ENTRY>(entries);
    if (column.type == ColumnType::String) {
        constexpr std::size_t word = sizeof(std::uint64_t);
        words_ = std::max<std::size_t>((static_cast<std::size_t>(column.size) + word - 1) / word, 1);
        texts_ = TryAllocate<std::uint64_t>(entries * words_);
    }
    return entries_ && (texts_ || column.type != ColumnType::String);
}

void SortKeys::OrderByWord() {
    SortByWord(begin(), end());
}

void SortKeys::OrderBySlot() {
    std::sort(begin(), EndOfKeys(), [](const ENTRY& a, const ENTRY& b) { return a.slot < b.slot; });
}

void SortKeys::TakeKey(const std::uint8_t* data) {
    if (data == nullptr) {
        ++gone_;
        return;
    }
    ENTRY& entry = entries_[keys_];
    std::swap(entry, entries_[keys_ + gone_]);
    entry.key = keys_++;
    const std::uint8_t* field = data + column_.offset;
    if (column_.type == ColumnType::String) {
        StoreText(field, entry.key);
    } else {
        entry.word = OrderedNumber(column_.type, field, static_cast<std::size_t>(column_.size));
    }
}

// Texts are kept as numbers of which the first byte is the highest, so that comparing numbers compares texts.
void SortKeys::StoreText(const std::uint8_t* field, std::int32_t key) {
    std::uint64_t* text = &texts_[static_cast<std::size_t>(key) * words_];
    auto* bytes = reinterpret_cast<std::uint8_t*>(text);
    const std::size_t length =
        strnlen(reinterpret_cast<const char*>(field), static_cast<std::size_t>(column_.size));
    CopyLowered(field, length, bytes);
    std::memset(bytes + length, 0, words_ * sizeof(std::uint64_t) - length);
    for (std::size_t i = 0; i < words_; ++i, bytes += sizeof(std::uint64_t)) {
        std::uint64_t word = 0;
        for (std::size_t at = 0; at < sizeof(std::uint64_t); ++at) {
            word = word << 8 | bytes[at];
        }
        text[i] = word;
    }
}

void SortKeys::Sort() {
    if (words_ > 0) {
        SortTexts(begin(), EndOfKeys(), 0);
    } else {
        SortNumbers();
    }
}

void SortKeys::SortNumbers() {
    const auto isNotANumber = [](const ENTRY& entry) { return entry.word == NotANumber; };
    ENTRY* const end = EndOfKeys();
    ENTRY* first = begin();
    while (first != end) {
        ENTRY* last = std::find_if(first, end, isNotANumber);
        SortByWord(first, last);
        first = std::find_if_not(last, end, isNotANumber);
    }
}

// Sorts entries that agree in `depth` words, and stand in the order of their slots.
void SortKeys::SortTexts(ENTRY* first, ENTRY* last, std::size_t depth) {
    for (ENTRY* entry = first; entry != last; ++entry) {
        entry->word = texts_[static_cast<std::size_t>(entry->key) * words_ + depth];
    }
    SortByWord(first, last);
    if (depth + 1 == words_) {
        return;
    }
    for (ENTRY* group = first; group != last;) {
        ENTRY* end =
            std::find_if(group, last, [group](const ENTRY& entry) { return entry.word != group->word; });
        if (end - group > 1 && !IsLastWord(group->word)) {
            SortTexts(group, end, depth + 1);
        }
        group = end;
    }
}
