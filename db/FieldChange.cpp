#include "db/FieldChange.h"

#include <array>

#include "db/DatesTimes.h"
#include "db/FieldValue.h"
#include "util/CharacterBuffer.h"

namespace {

// One part of a date or time: `packed` shifted right has the value's part in its lowest bits.
template <class T>
void ChangePart(int op, T* part, std::int32_t packed, int shift) {
    if (op == SetOperator::Assign || op == SetOperator::Add || op == SetOperator::Subtract)
        ChangeNumber(op, part, static_cast<T>(packed >> shift));
}

} // namespace

int SetOperatorOf(const char* token) {
    constexpr std::array<const char*, 5> spellings = {"=", "+", "-", "*", "/"};
    const auto* found = std::find_if(spellings.begin(), spellings.end(), [token](const char* spelling) {
        return std::strcmp(token, spelling) == 0;
    });
    return found == spellings.end() ? -1 : static_cast<int>(found - spellings.begin());
}

void ChangeDate(int op, dbDATE* date, std::int32_t packed) {
    ChangePart(op, &date->day, packed, 0);
    ChangePart(op, &date->month, packed, 8);
    ChangePart(op, &date->year, packed, 16);
}

void ChangeTime(int op, dbTIME* time, std::int32_t packed) {
    ChangePart(op, &time->second, packed, 0);
    ChangePart(op, &time->minute, packed, 8);
    ChangePart(op, &time->hour, packed, 16);
}

namespace {

template <class Field>
void ChangeValue(Field /*type*/, int op, typename Field::Value* number, typename Field::Value value) {
    ChangeNumber(op, number, value);
}

void ChangeValue(DateField /*type*/, int op, std::int32_t* packed, std::int32_t value) {
    dbDATE date = UnpackDate(*packed);
    ChangeDate(op, &date, value);
    NormaliseDate(&date);
    *packed = PackDate(date);
}

void ChangeValue(TimeField /*type*/, int op, std::int32_t* packed, std::int32_t value) {
    dbTIME time = UnpackTime(*packed);
    ChangeTime(op, &time, value);
    NormaliseTime(&time);
    *packed = PackTime(time);
}

} // namespace

bool FieldChange::Prepare(const COLUMN_ENTRY& column, int op, const char* value) {
    type_ = column.type;
    op_ = op;
    offset_ = static_cast<std::size_t>(column.offset);
    width_ = static_cast<std::size_t>(column.size);
    // Dates and times are changed by packed numbers.
    VisitField(type_, [&]<class Field>(Field) {
        number_ = static_cast<double>(NumberField<typename Field::Value>::Parse(value));
    });
    if (type_ != ColumnType::String || width_ == 0)
        return true;
    text_ = TryAllocate<std::uint8_t>(width_);
    if (text_) {
        std::memset(text_.get(), 0, width_);
        CopyText(reinterpret_cast<char*>(text_.get()), width_, value);
    }
    return text_ != nullptr;
}

void FieldChange::Apply(std::uint8_t* data) const {
    std::uint8_t* field = data + offset_;
    if (type_ == ColumnType::String)
        std::copy_n(text_.get(), width_, field);
    VisitField(type_, [&]<class Field>(Field type) {
        auto value = Field::Load(field, width_);
        ChangeValue(type, op_, &value, static_cast<typename Field::Value>(number_));
        Field::Store(field, width_, value);
    });
}
