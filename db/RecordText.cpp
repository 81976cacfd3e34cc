#include "db/RecordText.h"

#include <algorithm>

#include "db/FieldValue.h"
#include "util/CharacterBuffer.h"

namespace {

std::size_t LongestField(const COLUMN_ENTRY& column) {
    std::size_t longest = column.type == ColumnType::String ? std::max<std::size_t>(column.size, 1) : 0;
    VisitField(column.type, [&longest]<class Field>(Field) { longest = Field::LongestText; });
    return longest;
}

// An empty text is written as a blank, so that splitting the line finds a field there.
char* PutText(std::string_view text, char* out) {
    return text.empty() ? std::fill_n(out, 1, ' ') : std::copy(text.begin(), text.end(), out);
}

std::string_view NameOf(const COLUMN_ENTRY& column) {
    return {column.name, strnlen(column.name, NameSize)};
}

// Sets a column from a field that ends with a NUL, and all bytes of it. "-nan" is what files have that were
// exported when the sign of a float that is no number was written.
void StoreField(const COLUMN_ENTRY& column, std::string_view text, bool byteCharacters, std::uint8_t* field) {
    const auto width = static_cast<std::size_t>(column.size);
    std::memset(field, 0, width);
    if (column.type == ColumnType::Float && text == "-nan")
        text = "nan";
    if (column.type == ColumnType::String)
        CopyText(reinterpret_cast<char*>(field), width, text);
    else if (column.type == ColumnType::Byte && byteCharacters)
        StoreBytes(field, text.empty() ? '\0' : text.front(), width);
    else
        VisitField(column.type,
                   [&]<class Field>(Field) { Field::Store(field, width, Field::Parse(text.data())); });
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
    if (column.type == ColumnType::String)
        return PutText(TextIn(field, width), out);
    if (column.type == ColumnType::Byte && byteCharacters_)
        return std::fill_n(out, 1, LoadBytes<char>(field, width));
    VisitField(column.type, [&]<class Field>(Field) {
        out = Field::Put(Field::Load(field, width), column.format & DecimalsMask, out);
    });
    return out;
}

void RecordText::Parse(FieldSplitter& fields, std::uint8_t* data) const {
    for (const COLUMN_ENTRY& column : columns_)
        StoreField(column, fields.Next(), byteCharacters_, data + column.offset);
}
