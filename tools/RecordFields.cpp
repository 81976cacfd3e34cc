#include "tools/RecordFields.h"

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstring>
#include <iterator>
#include <limits>
#include <optional>
#include <type_traits>
#include <vector>

#include "db/DatesTimes.h"
#include "db/LittleEndian.h"
#include "db/Statement.h"
#include "util/CharacterBuffer.h"
#include "util/Dates.h"

namespace {

constexpr std::array<const char*, 7> TypeNames = {"string", "byte", "short", "long", "float", "date", "time"};
constexpr std::array<int, 7> TypeBytes = {1, 1, 2, 4, 4, 4, 3}; // that a value takes
constexpr std::size_t DateDigits = 8;
constexpr std::size_t TimeDigits = 6;

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

template <class Whole>
std::string StoreWhole(const COLUMN_ENTRY& column, std::string_view text, std::uint8_t* field) {
    using Bits = std::make_unsigned_t<Whole>;
    const std::optional<Whole> number = NumberIn<Whole>(text);
    if (number)
        StoreLittleEndian(field, static_cast<Bits>(*number), WidthOf(column));
    if (!number || static_cast<Whole>(LoadLittleEndian<Bits>(field, WidthOf(column))) != *number)
        return "is no whole number from " + std::to_string(std::numeric_limits<Whole>::min()) + " to " +
               std::to_string(std::numeric_limits<Whole>::max());
    return {};
}

std::string StorePacked(const COLUMN_ENTRY& column, std::optional<std::int32_t> packed, std::size_t bytes,
                        std::uint8_t* field) {
    if (!packed)
        return column.type == ColumnType::Date ? "is no date of the form YYYYMMDD"
                                               : "is no time of the form HHMMSS";
    StoreLittleEndian(field, static_cast<std::uint32_t>(*packed), std::min(bytes, WidthOf(column)));
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

std::string StoreFloat(const COLUMN_ENTRY& column, std::string_view text, std::uint8_t* field) {
    const std::optional<float> number = NumberIn<float>(text);
    if (!number)
        return "is no number, or too large or too small for a float";
    StoreLittleEndian(field, std::bit_cast<std::uint32_t>(*number), WidthOf(column));
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
    const int least = TypeBytes[static_cast<std::uint8_t>(column->type)];
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
    const auto code = static_cast<std::uint8_t>(type);
    return code < TypeNames.size() ? TypeNames[code] : "unknown";
}

void FillCell(const COLUMN_ENTRY& column, const std::uint8_t* data, Cell* cell) {
    const std::uint8_t* field = data + column.offset;
    const std::size_t width = WidthOf(column);
    const auto bits = [field, width](std::size_t most) {
        return LoadLittleEndian<std::uint32_t>(field, std::min(width, most));
    };
    char text[32];
    switch (column.type) {
    case ColumnType::String:
        cell->SetText(
            {reinterpret_cast<const char*>(field), strnlen(reinterpret_cast<const char*>(field), width)});
        break;
    case ColumnType::Byte:
        cell->SetNumber(static_cast<std::int8_t>(bits(1)));
        break;
    case ColumnType::Short:
        cell->SetNumber(static_cast<std::int16_t>(bits(2)));
        break;
    case ColumnType::Long:
        cell->SetNumber(static_cast<std::int32_t>(bits(4)));
        break;
    case ColumnType::Float:
        cell->SetFloat(std::bit_cast<float>(bits(4)), column.format & DecimalsMask);
        break;
    case ColumnType::Date: {
        const dbDATE date = UnpackDate(static_cast<std::int32_t>(bits(4)));
        FormatInto(text, sizeof(text), "%04d%02d%02d", date.year, date.month, date.day);
        cell->SetText(text);
        break;
    }
    case ColumnType::Time: {
        const dbTIME time = UnpackTime(static_cast<std::int32_t>(bits(3)));
        FormatInto(text, sizeof(text), "%02d%02d%02d", time.hour, time.minute, time.second);
        cell->SetText(text);
        break;
    }
    default:
        cell->kind = Cell::Kind::Nothing;
    }
}

std::string StoreField(const COLUMN_ENTRY& column, std::string_view text, std::uint8_t* data) {
    std::uint8_t* field = data + column.offset;
    switch (column.type) {
    case ColumnType::String:
        return StoreText(column, text, field);
    case ColumnType::Byte:
        return StoreWhole<std::int8_t>(column, text, field);
    case ColumnType::Short:
        return StoreWhole<std::int16_t>(column, text, field);
    case ColumnType::Long:
        return StoreWhole<std::int32_t>(column, text, field);
    case ColumnType::Float:
        return StoreFloat(column, text, field);
    case ColumnType::Date:
        return text.empty() || text == "00000000" ? std::string()
                                                  : StorePacked(column, PackedDateIn(text), 4, field);
    case ColumnType::Time:
        return StorePacked(column, PackedTimeIn(text), 3, field);
    default:
        return "cannot be stored: the column's type is unknown";
    }
}

std::string ParseColumn(std::string_view text, COLUMN_ENTRY* column) {
    const std::vector<std::string_view> parts = SplitAtColons(text);
    *column = {};
    if (parts.size() < 2 || parts.size() > 4)
        return "a column is NAME:TYPE[:WIDTH[:DECIMALS]], not '" + std::string(text) + "'";
    if (parts[0].empty() || parts[0].find_first_of(" \t\r\n") != parts[0].npos ||
        !CopyTextZeroed(column->name, parts[0]))
        return "a column's name has 1 to 31 bytes without blanks, unlike '" + std::string(parts[0]) + "'";
    const auto* const type = std::find(TypeNames.begin(), TypeNames.end(), parts[1]);
    if (type == TypeNames.end())
        return std::string("'").append(parts[1]).append(
            "' is none of the types string, byte, short, long, float, date, time");
    column->type = static_cast<std::int8_t>(type - TypeNames.begin());
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
