#pragma once

#include <cstdint>
#include <memory>
#include <type_traits>

#include "db/RecordTypes.h"
#include "db/Statement.h"

/// Operators of set statements, numbered as DATABASE::QueryUpdateFunction takes them.
namespace SetOperator {
inline constexpr int Assign = 0;
inline constexpr int Add = 1;
inline constexpr int Subtract = 2;
inline constexpr int Multiply = 3;
inline constexpr int Divide = 4;
} // namespace SetOperator

/// The operator that a token spells; -1 for none.
[[nodiscard]] int SetOperatorOf(const char* token);

/// Changes a number in place. Integers wrap at their width, and dividing one by 0 leaves it as it is; floats
/// follow floating-point rules. Any other `op` than the five changes nothing.
template <class T>
constexpr void ChangeNumber(int op, T* field, T value) {
    const auto wrapped = [](auto number) { return static_cast<T>(number); };
    if constexpr (std::is_integral_v<T>) {
        // Unsigned arithmetic wraps where signed arithmetic must not overflow.
        const auto a = static_cast<std::uint64_t>(std::int64_t{*field});
        const auto b = static_cast<std::uint64_t>(std::int64_t{value});
        switch (op) {
        case SetOperator::Assign:
            *field = value;
            break;
        case SetOperator::Add:
            *field = wrapped(a + b);
            break;
        case SetOperator::Subtract:
            *field = wrapped(a - b);
            break;
        case SetOperator::Multiply:
            *field = wrapped(a * b);
            break;
        case SetOperator::Divide:
            if (value == -1)
                *field = wrapped(0 - a); // the quotient of the smallest number does not fit
            else if (value != 0)
                *field = wrapped(*field / value);
            break;
        default:
            break;
        }
    } else {
        switch (op) {
        case SetOperator::Assign:
            *field = value;
            break;
        case SetOperator::Add:
            *field = value + *field;
            break;
        case SetOperator::Subtract:
            *field = *field - value;
            break;
        case SetOperator::Multiply:
            *field = value * *field;
            break;
        case SetOperator::Divide:
            *field = *field / value;
            break;
        default:
            break;
        }
    }
}

/// Change a date or a time part by part, without carrying from one to another; `packed` is the packed form of
/// the value. Only the operators =, + and - do something.
void ChangeDate(int op, dbDATE* date, std::int32_t packed);
void ChangeTime(int op, dbTIME* time, std::int32_t packed);

/// One set statement, made ready once and then applied to the field of many records. It writes no byte
/// outside the column and knows nothing of files and result sets.
class FieldChange {
  public:
    /// `op` must be a SetOperator, Assign for a string column. A column of unknown type is never changed.
    /// False when there is no memory.
    [[nodiscard]] bool Prepare(const COLUMN_ENTRY& column, int op, const char* value);

    /// Changes the column in a record's data.
    void Apply(std::uint8_t* data) const;

  private:
    void ApplyDate(std::uint8_t* field) const;
    void ApplyTime(std::uint8_t* field) const;

    std::int8_t type_ = ColumnType::String;
    int op_ = SetOperator::Assign;
    std::size_t offset_ = 0;               // of the column in a record's data
    std::size_t width_ = 0;                // of the column
    std::int64_t whole_ = 0;               // the value for integers, dates and times
    float single_ = 0;                     // the value for floats
    std::unique_ptr<std::uint8_t[]> text_; // the value for strings, as wide as the column
};
