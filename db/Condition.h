#pragma once

#include <cstddef>
#include <cstdint>

#include "db/RecordTypes.h"
#include "db/Statement.h"

// Comparison operators of query statements, numbered as DATABASE::CompareVals takes them.
namespace CompareOperator {
inline constexpr int Equal = 0;
inline constexpr int Different = 1;
inline constexpr int Less = 2;
inline constexpr int LessOrEqual = 3;
inline constexpr int Greater = 4;
inline constexpr int GreaterOrEqual = 5;
inline constexpr int Contains = 6; // string columns only
} // namespace CompareOperator

// The operator that a token spells in letters of any case; -1 for none.
[[nodiscard]] int CompareOperatorOf(const char* token);

// Compares two numbers of one type: 1 when `op` (a CompareOperator but Contains) holds, 0 when not or for
// any other number.
template <class T>
[[nodiscard]] constexpr int CompareValues(int op, T field, T value) {
    switch (op) {
    case CompareOperator::Equal:
        return field == value ? 1 : 0;
    case CompareOperator::Different:
        return field != value ? 1 : 0;
    case CompareOperator::Less:
        return field < value ? 1 : 0;
    case CompareOperator::LessOrEqual:
        return field <= value ? 1 : 0;
    case CompareOperator::Greater:
        return field > value ? 1 : 0;
    case CompareOperator::GreaterOrEqual:
        return field >= value ? 1 : 0;
    default:
        return 0;
    }
}

// Compares a NUL-terminated field with a value: 1 when `op` (a CompareOperator) holds, 0 when not or for any
// other number. Without `exact` the letters A to Z count as a to z up to the first byte of 128 or above of
// each operand.
[[nodiscard]] int CompareText(int op, const char* field, const char* value, bool exact);

// One query condition, made ready once and then asked about many records. Converting the value and choosing
// the comparison happen in Prepare, nothing but the comparison per record. It reads no byte outside the
// column and knows nothing of files, deleted records or result sets.
class Condition {
  public:
    // `op` must be a CompareOperator, Contains only for a string column; `value` is not empty. A column of
    // unknown type matches nothing.
    void Prepare(const COLUMN_ENTRY& column, int op, const char* value, bool exact);

    // Asks about `count` records that lie `stride` bytes apart, `data` being the data of the first:
    // matches[i] becomes 1 or 0.
    void Match(const std::uint8_t* data, std::size_t stride, std::size_t count, std::uint8_t* matches) const {
        matcher_(*this, data + offset_, stride, count, matches);
    }

  private:
    friend struct Matchers;
    void PrepareText(const char* value, bool exact);
    using Matcher = void (*)(const Condition& self, const std::uint8_t* fields, std::size_t stride,
                             std::size_t count, std::uint8_t* matches);

    Matcher matcher_ = nullptr;
    std::size_t offset_ = 0; // of the column in a record's data
    std::size_t width_ = 0;  // of the column
    double number_ = 0;      // the value for all other columns
    char text_[TokenSize]{}; // the value for strings, lowered unless the comparison is exact
    char bits_[TokenSize]{}; // of each byte of text_ and its terminator, the bits in which an equal field
                             // agrees
    std::size_t length_ = 0; // of text_
};
