#include "db/FieldChange.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstring>

#include "db/Allocate.h"
#include "db/DatesTimes.h"
#include "db/LittleEndian.h"
#include "util/CharacterBuffer.h"

namespace {

// Changes the integer in a column that may be narrower than its type.
template <class T>
void ChangeInteger(int op, std::uint8_t* field, std::size_t width, std::int64_t value) {
    using Unsigned = std::make_unsigned_t<T>;
    auto number = static_cast<T>(LoadLittleEndian<Unsigned>(field, width));
    ChangeNumber(op, &number, static_cast<T>(value));
    StoreLittleEndian(field, static_cast<Unsigned>(number), width);
}

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

bool FieldChange::Prepare(const COLUMN_ENTRY& column, int op, const char* value) {
    type_ = column.type;
    op_ = op;
    offset_ = static_cast<std::size_t>(column.offset);
    width_ = static_cast<std::size_t>(column.size);
    if (type_ == ColumnType::Float) {
        single_ = SingleNumber(value);
    } else if (type_ != ColumnType::String) {
        whole_ = WholeNumber(value);
    } else if (width_ > 0) {
        text_ = TryAllocate<std::uint8_t>(width_);
        if (!text_)
            return false;
        std::memset(text_.get(), 0, width_);
        CopyText(reinterpret_cast<char*>(text_.get()), width_, value);
    }
    return true;
}

void FieldChange::Apply(std::uint8_t* data) const {
    std::uint8_t* field = data + offset_;
    switch (type_) {
    case ColumnType::String:
        std::copy_n(text_.get(), width_, field);
        break;
    case ColumnType::Byte:
        ChangeInteger<std::int8_t>(op_, field, width_, whole_);
        break;
    case ColumnType::Short:
        ChangeInteger<std::int16_t>(op_, field, width_, whole_);
        break;
    case ColumnType::Long:
        ChangeInteger<std::int32_t>(op_, field, width_, whole_);
        break;
    case ColumnType::Float: {
        auto number = std::bit_cast<float>(LoadLittleEndian<std::uint32_t>(field, width_));
        ChangeNumber(op_, &number, single_);
        StoreLittleEndian(field, std::bit_cast<std::uint32_t>(number), width_);
        break;
    }
    case ColumnType::Date:
        ApplyDate(field);
        break;
    case ColumnType::Time:
        ApplyTime(field);
        break;
    default:
        break;
    }
}

void FieldChange::ApplyDate(std::uint8_t* field) const {
    dbDATE date = UnpackDate(static_cast<std::int32_t>(LoadLittleEndian<std::uint32_t>(field, width_)));
    ChangeDate(op_, &date, static_cast<std::int32_t>(whole_));
    NormaliseDate(&date);
    StoreLittleEndian(field, static_cast<std::uint32_t>(PackDate(date)), width_);
}

void FieldChange::ApplyTime(std::uint8_t* field) const {
    const std::size_t width = std::min<std::size_t>(width_, sizeof(dbTIME));
    dbTIME time = UnpackTime(static_cast<std::int32_t>(LoadLittleEndian<std::uint32_t>(field, width)));
    ChangeTime(op_, &time, static_cast<std::int32_t>(whole_));
    NormaliseTime(&time);
    StoreLittleEndian(field, static_cast<std::uint32_t>(PackTime(time)), width);
}
