#include "tools/RecordFields.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>
#include <optional>
#include <type_traits>
#include <vector>

#include "db/FieldValue.h"
#include "util/CharacterBuffer.h"
#include "util/Dates.h"

namespace {

constexpr std::string_view Unknown = "unknown";
constexpr std::size_t DateDigits = 8;
constexpr std::size_t TimeDigits = 6;

template <class Field>
constexpr bool IsWhole = std::is_base_of_v<WholeField<typename Field::Value>, Field>;

std::size_t WidthOf(const COLUMN_ENTRY& column) {
    return static_cast<std::size_t>(column.size);
}

// The text read as a whole; nothing when it is no number, has more to it or is beyond the range.
template <class Number>
std::optional<Number> NumberIn(std::string_view text) {
    if (text.size() > 1 && text[0] == '+' && text[1] != '-')
        text.remove_prefix(1);
    Number number{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc{} || end != text.data() + text.size())
        return std::nullopt;
    if constexpr (std::is_floating_point_v<Number>) {
        if (!std::isfinite(number))
            return std::nullopt;
    }
    return number;
}

// A number of `count` digits in the middle of a text that has nothing but digits.
int Digits(std::string_view text, std::size_t from, std::size_t count) {
    return NumberIn<int>(text.substr(from, count)).value_or(0);
}

bool IsDigits(std::string_view text, std::size_t count) {
    return text.size() == count && text.find_first_not_of("0123456789") == text.npos;
}

std::optional<std::int32_t> PackedDateIn(std::string_view text) {
    if (!IsDigits(text, DateDigits) ||
        CheckDate(Digits(text, 0, 4), Digits(text, 4, 2), Digits(text, 6, 2)) != 0)
        return std::nullopt;
    return PackedDate(std::string(text).c_str());
}

std::optional<std::int32_t> PackedTimeIn(std::string_view text) {
    if (!IsDigits(text, TimeDigits) || Digits(text, 0, 2) > 23 || Digits(text, 2, 2) > 59 ||
        Digits(text, 4, 2) > 59)
        return std::nullopt;
    return PackedTime(std::string(text).c_str());
}

template <class Field>
std::optional<typename Field::Value> ValueIn(std::string_view text) {
    if constexpr (std::is_same_v<Field, DateField>)
        return PackedDateIn(text);
    else if constexpr (std::is_same_v<Field, TimeField>)
        return PackedTimeIn(text);
    else
        return NumberIn<typename Field::Value>(text);
}

template <class Field>
std::string WhatItIsNot() {
    using Value = typename Field::Value;
    if constexpr (std::is_same_v<Field, DateField>)
        return "is no date of the form YYYYMMDD";
    else if constexpr (std::is_same_v<Field, TimeField>)
        return "is no time of the form HHMMSS";
    else if constexpr (std::is_same_v<Field, FloatField>)
        return "is no number, or too large or too small for a float";
    else
        return "is no whole number from " + std::to_string(std::numeric_limits<Value>::min()) + " to " +
               std::to_string(std::numeric_limits<Value>::max());
}

// A whole number must fit a column narrower than its type, too.
template <class Field>
std::string StoreValue(const COLUMN_ENTRY& column, std::string_view text, std::uint8_t* field) {
    const std::optional<typename Field::Value> value = ValueIn<Field>(text);
    if (value)
        Field::Store(field, WidthOf(column), *value);
    if (!value || (IsWhole<Field> && Field::Load(field, WidthOf(column)) != *value))
        return WhatItIsNot<Field>();
    return {};
}

std::string StoreText(const COLUMN_ENTRY& column, std::string_view text, std::uint8_t* field) {
    if (text.size() + 1 > WidthOf(column) && !text.empty())
        return "is too long: " + std::to_string(text.size()) + " bytes, and the column holds " +
               std::to_string(std::max(column.size - 1, 0));
    if (text.find('\0') != text.npos)
        return "has a byte 0 in it, where it would end";
    std::copy(text.begin(), text.end(), field);
    return {};
}

std::vector<std::string_view> SplitAtColons(std::string_view text) {
    std::vector<std::string_view> parts;
    for (std::size_t end = 0; end != text.npos;) {
        end = text.find(':');
        parts.push_back(text.substr(0, end));
        text.remove_prefix(end == text.npos ? text.size() : end + 1);
    }
    return parts;
}

std::string ReadWidth(std::string_view text, COLUMN_ENTRY* column) {
    int least = 1;
    VisitField(column->type, [&least]<class Field>(Field) { least = static_cast<int>(Field::Bytes); });
    const std::optional<std::int16_t> width = NumberIn<std::int16_t>(text);
    if (!width || *width < least)
        return std::string("a ") + ColumnTypeName(column->type) + "'s width is a number of bytes from " +
               std::to_string(least) + " up, not '" + std::string(text) + "'";
    column->size = *width;
    return {};
}

std::string ReadDecimals(std::string_view text, COLUMN_ENTRY* column) {
    const std::optional<int> decimals = NumberIn<int>(text);
    if (column->type != ColumnType::Float || !decimals || *decimals < 1 || *decimals > DecimalsMask)
        return "only a float has decimals, 1 to 15 of them";
    column->format = *decimals;
    return {};
}

} // namespace

const char* ColumnTypeName(std::int8_t type) {
    const char* name = type == ColumnType::String ? "string" : Unknown.data();
    VisitField(type, [&name]<class Field>(Field) { name = Field::Name; });
    return name;
}

void FillCell(const COLUMN_ENTRY& column, const std::uint8_t* data, Cell* cell) {
    const std::uint8_t* field = data + column.offset;
    cell->kind = Cell::Kind::Nothing;
    if (column.type == ColumnType::String)
        cell->SetText(TextIn(field, WidthOf(column)));
    VisitField(column.type, [&]<class Field>(Field) {
        const auto value = Field::Load(field, WidthOf(column));
        char text[Field::LongestText];
        if constexpr (std::is_same_v<Field, FloatField>)
            cell->SetFloat(value, column.format & DecimalsMask);
        else if constexpr (IsWhole<Field>)
            cell->SetNumber(value);
        else
            cell->SetText({text, static_cast<std::size_t>(Field::Put(value, 0, text) - text)});
    });
}

std::string StoreField(const COLUMN_ENTRY& column, std::string_view text, std::uint8_t* data) {
    std::uint8_t* field = data + column.offset;
    if (column.type == ColumnType::String)
        return StoreText(column, text, field);
    if (column.type == ColumnType::Date && (text.empty() || text == "00000000"))
        return {};
    std::string wrong = "cannot be stored: the column's type is unknown";
    VisitField(column.type, [&]<class Field>(Field) { wrong = StoreValue<Field>(column, text, field); });
    return wrong;
}

std::string ParseColumn(std::string_view text, COLUMN_ENTRY* column) {
    const std::vector<std::string_view> parts = SplitAtColons(text);
    *column = {};
    if (parts.size() < 2 || parts.size() > 4)
        return "a column is NAME:TYPE[:WIDTH[:DECIMALS]], not '" + std::string(text) + "'";
    if (parts[0].empty() || parts[0].find_first_of(" \t\r\n") != parts[0].npos ||
        !CopyTextZeroed(column->name, parts[0]))
        return "a column's name has 1 to 31 bytes without blanks, unlike '" + std::string(parts[0]) + "'";
    while (ColumnTypeName(column->type) != parts[1] && ColumnTypeName(column->type) != Unknown)
        ++column->type;
    if (ColumnTypeName(column->type) == Unknown)
        return std::string("'").append(parts[1]).append(
            "' is none of the types string, byte, short, long, float, date, time");
    column->size = -1;
    const bool hasWidth = parts.size() > 2 && !parts[2].empty();
    if (!hasWidth && column->type == ColumnType::String)
        return "the string column " + std::string(parts[0]) + " needs a width: " + std::string(parts[0]) +
               ":string:32";
    std::string wrong = hasWidth ? ReadWidth(parts[2], column) : std::string();
    if (wrong.empty() && parts.size() > 3)
        wrong = ReadDecimals(parts[3], column);
    return wrong;
}
