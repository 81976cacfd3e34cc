#pragma once

#include <algorithm>
#include <limits>
#include <string_view>
#include <type_traits>

#include "db/Bytes.h"
#include "db/RecordTypes.h"
#include "db/Statement.h"

// The column types: how a field's value lies in a record and how it is written as text. A new type is a
// struct here, with its line in VisitField.

// Each writes a value at `out` and returns where its text ends; no NUL.
char* PutWhole(std::int32_t value, char* out);
char* PutFloat(float value, int decimals, char* out);
char* PutDate(std::int32_t packed, char* out);
char* PutTime(std::int32_t packed, char* out);

// The text in a column, which may lack its end.
[[nodiscard]] inline std::string_view TextIn(const std::uint8_t* field, std::size_t width) {
    const auto* text = reinterpret_cast<const char*>(field);
    return {text, strnlen(text, width)};
}

// What the types of numbers have in common. `Bytes` are those of a value; the column may have more or fewer.
template <class T, std::size_t Size = sizeof(T)>
struct NumberField {
    using Value = T;
    static constexpr std::size_t Bytes = Size;

    static T Load(const std::uint8_t* field, std::size_t width) {
        return LoadBytes<T>(field, std::min(width, Bytes));
    }
    static void Store(std::uint8_t* field, std::size_t width, T value) {
        StoreBytes(field, value, std::min(width, Bytes));
    }
    static T Parse(const char* text) {
        if constexpr (std::is_floating_point_v<T>)
            return SingleNumber(text);
        else
            return static_cast<T>(WholeNumber(text));
    }
};

template <class T>
struct WholeField : NumberField<T> {
    static constexpr int LineBytes = 16;           // of a field in a line of text, as the engine counts them
    static constexpr std::size_t LongestText = 11; // -2147483648
    static char* Put(T value, int /*decimals*/, char* out) { return PutWhole(value, out); }
};

// `Width` is what a column has that asks for none.
struct ByteField : WholeField<std::int8_t> {
    static constexpr const char* Name = "byte";
    static constexpr std::int16_t Width = 1;
    static constexpr int LineBytes = 1;
};

struct ShortField : WholeField<std::int16_t> {
    static constexpr const char* Name = "short";
    static constexpr std::int16_t Width = 2;
};

struct LongField : WholeField<std::int32_t> {
    static constexpr const char* Name = "long";
    static constexpr std::int16_t Width = 4;
};

struct FloatField : NumberField<float> {
    static constexpr const char* Name = "float";
    static constexpr std::int16_t Width = 8;
    static constexpr int LineBytes = 16;
    static constexpr std::size_t LongestText =
        std::numeric_limits<float>::max_exponent10 + 3 + DecimalsMask; // -, .
    static char* Put(float value, int decimals, char* out) { return PutFloat(value, decimals, out); }
};

// Dates and times are handed on in their packed form.
struct DateField : NumberField<std::int32_t> {
    static constexpr const char* Name = "date";
    static constexpr std::int16_t Width = 4;
    static constexpr int LineBytes = 8;
    static constexpr std::size_t LongestText = 6 + 4 + 4;
    static std::int32_t Parse(const char* text) { return PackedDate(text); }
    static char* Put(std::int32_t value, int /*decimals*/, char* out) { return PutDate(value, out); }
};

struct TimeField : NumberField<std::int32_t, sizeof(dbTIME)> {
    static constexpr const char* Name = "time";
    static constexpr std::int16_t Width = 3;
    static constexpr int LineBytes = 6;
    static constexpr std::size_t LongestText = 4 + 4 + 4;
    static std::int32_t Parse(const char* text) { return PackedTime(text); }
    static char* Put(std::int32_t value, int /*decimals*/, char* out) { return PutTime(value, out); }
};

// Calls `visit` with the struct of a type of numbers. False for text and an unknown type.
template <class Visit>
bool VisitField(std::int8_t type, const Visit& visit) {
    switch (type) {
    case ColumnType::Byte:
        visit(ByteField{});
        break;
    case ColumnType::Short:
        visit(ShortField{});
        break;
    case ColumnType::Long:
        visit(LongField{});
        break;
    case ColumnType::Float:
        visit(FloatField{});
        break;
    case ColumnType::Date:
        visit(DateField{});
        break;
    case ColumnType::Time:
        visit(TimeField{});
        break;
    default:
        return false;
    }
    return true;
}
