#pragma once

#include <cstdint>
#include <memory>
#include <type_traits>

#include "db/RecordTypes.h"
#include "db/Statement.h"

// Operators of set statements, numbered as DATABASE::QueryUpdateFunction takes them.
namespace SetOperator {
inline constexpr int Assign = 0;
inline constexpr int Add = 1;
inline constexpr int Subtract = 2;
inline constexpr int Multiply = 3;
inline constexpr int Divide = 4;
} // namespace SetOperator

// The operator that a token spells; -1 for none.
[[nodiscard]] int SetOperatorOf(const char* token);

// The quotient of two numbers; of integers the dividend when there is none, and the wrapped one.
template <class T>
[[nodiscard]] constexpr T Quotient(T field, T value) {
    if constexpr (std::is_integral_v<T>)
        return value == 0 ? field : static_cast<T>(std::int64_t{field} / value);
    else
        return field / value;
}

// Changes a number in place. Integers wrap at their width, and dividing one by 0 leaves it as it is; floats
// follow floating-point rules. Any other `op` than the five changes nothing.
template <class T>
constexpr void ChangeNumber(int op, T* field, T value) {
    // So wide that nothing overflows before it is wrapped.
    static_assert(sizeof(T) <= 4);
    using Wide = std::conditional_t<std::is_integral_v<T>, std::int64_t, T>;
    switch (op) {
    case SetOperator::Assign:
        *field = value;
        break;
    case SetOperator::Add:
        *field = static_cast<T>(Wide{*field} + value);
        break;
    case SetOperator::Subtract:
        *field = static_cast<T>(Wide{*field} - value);
        break;
    case SetOperator::Multiply:
        *field = static_cast<T>(Wide{*field} * value);
        break;
    case SetOperator::Divide:
        *field = Quotient(*field, value);
        break;
    default:
        break;
    }
}

// Change a date or a time part by part, without carrying from one to another; `packed` is the packed form of
// the value. Only the operators =, + and - do something.
void ChangeDate(int op, dbDATE* date, std::int32_t packed);
void ChangeTime(int op, dbTIME* time, std::int32_t packed);

// One set statement, made ready once and then applied to the field of many records. It writes no byte
// outside the column and knows nothing of files and result sets.
class FieldChange {
  public:
    // `op` must be a SetOperator, Assign for a string column. A column of unknown type is never changed.
    // False when there is no memory.
    [[nodiscard]] bool Prepare(const COLUMN_ENTRY& column, int op, const char* value);

    // Changes the column in a record's data.
    void Apply(std::uint8_t* data) const;

  private:
    std::int8_t type_ = ColumnType::String;
    int op_ = SetOperator::Assign;
    std::size_t offset_ = 0;               // of the column in a record's data
    std::size_t width_ = 0;                // of the column
    double number_ = 0;                    // the value for all other columns
    std::unique_ptr<std::uint8_t[]> text_; // the value for strings, as wide as the column
};
