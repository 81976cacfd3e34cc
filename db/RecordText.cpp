#include "db/RecordText.h"

#include <algorithm>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstring>
#include <limits>

#include "db/DatesTimes.h"
#include "db/LittleEndian.h"
#include "db/Statement.h"
#include "util/CharacterBuffer.h"

namespace {

constexpr std::size_t LongestWhole = 11; // -2147483648
constexpr std::size_t LongestFloat = std::numeric_limits<float>::max_exponent10 + 3 + DecimalsMask; // -, .
constexpr std::size_t LongestDate = 6 + 4 + 4;
constexpr std::size_t LongestTime = 4 + 4 + 4;

std::size_t LongestField(const COLUMN_ENTRY& column) {
    switch (column.type) {
    case ColumnType::String:
        return static_cast<std::size_t>(std::max<int>(column.size, 1));
    case ColumnType::Byte:
    case ColumnType::Short:
    case ColumnType::Long:
        return LongestWhole;
    case ColumnType::Float:
        return LongestFloat;
    case ColumnType::Date:
        return LongestDate;
    case ColumnType::Time:
        return LongestTime;
    default:
        return 0;
    }
}

char* PutWhole(std::int32_t value, char* out) {
    return std::to_chars(out, out + LongestWhole, value).ptr;
}

// At least `width` characters, a minus sign among them.
char* PutPadded(int value, int width, char* out) {
    if (value < 0) {
        *out++ = '-';
        --width;
    }
    char digits[LongestWhole];
    const char* end = PutWhole(std::abs(value), digits);
    out = std::fill_n(out, std::max<std::ptrdiff_t>(width - (end - digits), 0), '0');
    return std::copy<const char*>(digits, end, out);
}

// An empty text is written as a blank, so that splitting the line finds a field there.
char* PutText(const std::uint8_t* field, std::size_t width, char* out) {
    const std::size_t length = strnlen(reinterpret_cast<const char*>(field), width);
    if (length == 0) {
        *out = ' ';
        return out + 1;
    }
    return std::copy_n(reinterpret_cast<const char*>(field), length, out);
}

// What is no number has no sign either.
char* PutFloat(float value, int decimals, char* out) {
    value = std::isnan(value) ? std::numeric_limits<float>::quiet_NaN() : value;
    return std::to_chars(out, out + LongestFloat, static_cast<double>(value), std::chars_format::fixed,
                         decimals)
        .ptr;
}

char* PutDate(const dbDATE& date, char* out) {
    return PutPadded(date.day, 2, PutPadded(date.month, 2, PutPadded(date.year, 4, out)));
}

char* PutTime(const dbTIME& time, char* out) {
    return PutPadded(time.second, 2, PutPadded(time.minute, 2, PutPadded(time.hour, 2, out)));
}

std::string_view NameOf(const COLUMN_ENTRY& column) {
    return {column.name, strnlen(column.name, NameSize)};
}

std::uint32_t Number(const std::uint8_t* field, std::size_t width) {
    return LoadLittleEndian<std::uint32_t>(field, width);
}

std::uint8_t ByteIn(std::string_view text, bool character) {
    if (character)
        return static_cast<std::uint8_t>(text.empty() ? 0 : text.front());
    return static_cast<std::uint8_t>(WholeNumber(text.data()));
}

// "-nan" is what files have that were exported when the sign of a float that is no number was written.
float FloatIn(std::string_view text) {
    return text == "-nan" ? std::numeric_limits<float>::quiet_NaN() : SingleNumber(text.data());
}

// Sets a column from a field that ends with a NUL, and all bytes of it.
void StoreField(const COLUMN_ENTRY& column, std::string_view text, bool byteCharacters, std::uint8_t* field) {
    const auto width = static_cast<std::size_t>(column.size);
    std::memset(field, 0, width);
    switch (column.type) {
    case ColumnType::String:
        CopyText(reinterpret_cast<char*>(field), width, text);
        break;
    case ColumnType::Byte:
        StoreLittleEndian(field, ByteIn(text, byteCharacters), width);
        break;
    case ColumnType::Short:
        StoreLittleEndian(field, static_cast<std::uint16_t>(WholeNumber(text.data())), width);
        break;
    case ColumnType::Long:
        StoreLittleEndian(field, static_cast<std::uint32_t>(WholeNumber(text.data())), width);
        break;
    case ColumnType::Float:
        StoreLittleEndian(field, std::bit_cast<std::uint32_t>(FloatIn(text)), width);
        break;
    case ColumnType::Date:
        StoreLittleEndian(field, static_cast<std::uint32_t>(PackedDate(text.data())), width);
        break;
    case ColumnType::Time:
        StoreLittleEndian(field, static_cast<std::uint32_t>(PackedTime(text.data())),
                          std::min(width, sizeof(dbTIME)));
        break;
    default:
        break;
    }
}

} // namespace

FieldSplitter::FieldSplitter(const char* separators) {
    for (; separators != nullptr && *separators != '\0'; ++separators)
        separators_[static_cast<unsigned char>(*separators)] = true;
}

bool FieldSplitter::IsBlank(std::string_view line) const {
    return line.starts_with('\n') ||
           (IsSeparator('\r') && IsSeparator('\n') && line.find_first_not_of("\r\n") == line.npos);
}

void FieldSplitter::Begin(std::span<char> line) {
    next_ = line.data();
    end_ = line.data() + line.size();
}

std::string_view FieldSplitter::Next() {
    const auto isSeparator = [this](char c) { return IsSeparator(c); };
    char* begin = std::find_if_not(next_, end_, isSeparator);
    char* end = std::find_if(begin, end_, isSeparator);
    if (begin == end) {
        next_ = end_;
        return "";
    }
    *end = '\0';
    next_ = std::min(end + 1, end_);
    return {begin, static_cast<std::size_t>(end - begin)};
}

int FieldSplitter::Count() {
    int count = 0;
    while (!Next().empty())
        ++count;
    return count;
}

std::size_t RecordText::LongestLine(std::size_t separatorSize) const {
    std::size_t longest = 1 + columns_.size() * separatorSize;
    for (const COLUMN_ENTRY& column : columns_)
        longest += std::max(LongestField(column), NameOf(column).size());
    return longest;
}

char* RecordText::Format(const std::uint8_t* data, std::string_view separator, char* line) const {
    for (const COLUMN_ENTRY& column : columns_) {
        line = FormatField(column, data + column.offset, line);
        line = std::copy(separator.begin(), separator.end(), line);
    }
    *line++ = '\n';
    return line;
}

char* RecordText::FormatHeading(std::string_view separator, char* line) const {
    for (const COLUMN_ENTRY& column : columns_) {
        const std::string_view name = NameOf(column);
        line = std::copy(name.begin(), name.end(), line);
        line = std::copy(separator.begin(), separator.end(), line);
    }
    *line++ = '\n';
    return line;
}

char* RecordText::FormatField(const COLUMN_ENTRY& column, const std::uint8_t* field, char* out) const {
    const auto width = static_cast<std::size_t>(column.size);
    switch (column.type) {
    case ColumnType::String:
        return PutText(field, width, out);
    case ColumnType::Byte:
        if (byteCharacters_) {
            *out = static_cast<char>(Number(field, std::min<std::size_t>(width, 1)));
            return out + 1;
        }
        return PutWhole(static_cast<std::int8_t>(Number(field, std::min<std::size_t>(width, 1))), out);
    case ColumnType::Short:
        return PutWhole(static_cast<std::int16_t>(Number(field, std::min<std::size_t>(width, 2))), out);
    case ColumnType::Long:
        return PutWhole(static_cast<std::int32_t>(Number(field, width)), out);
    case ColumnType::Float:
        return PutFloat(std::bit_cast<float>(Number(field, width)), column.format & DecimalsMask, out);
    case ColumnType::Date:
        return PutDate(UnpackDate(static_cast<std::int32_t>(Number(field, width))), out);
    case ColumnType::Time:
        return PutTime(UnpackTime(static_cast<std::int32_t>(Number(field, width))), out);
    default:
        return out;
    }
}

void RecordText::Parse(FieldSplitter& fields, std::uint8_t* data) const {
    for (const COLUMN_ENTRY& column : columns_)
        StoreField(column, fields.Next(), byteCharacters_, data + column.offset);
}
