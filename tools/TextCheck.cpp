#include "tools/TextCheck.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "db/Errors.h"
#include "tools/RecordFields.h"
#include "tools/Sentences.h"
#include "util/Utf8.h"

namespace {

std::size_t DataSize(std::span<const COLUMN_ENTRY> columns) {
    int size = 0;
    for (const COLUMN_ENTRY& column : columns)
        size = std::max(size, column.offset + column.size);
    return static_cast<std::size_t>(size);
}

} // namespace

TextCheck::TextCheck(std::span<const COLUMN_ENTRY> columns, const TextFormat& format,
                     const std::string& separators)
    : columns_(columns),
      characters_(format.characters),
      heading_(format.heading),
      splitter_(separators.c_str()),
      data_(DataSize(columns)) {}

int TextCheck::Run(const File& text, std::size_t longest) {
    LineReader reader(text);
    if (!reader.Prepare(longest + 1))
        return DatabaseError::LoadNoMemoryForLine;
    errno = reader.PassByteOrderMark();
    errno = errno != 0 ? errno : ReadLines(reader, longest);
    return errno == 0 ? 0 : DatabaseError::LoadReadFailed;
}

// Returns 0 or an errno number.
int TextCheck::ReadLines(LineReader& reader, std::size_t longest) {
    bool behindPiece = false; // the line began in the piece before
    for (long number = 1;;) {
        std::span<char> line;
        if (const int error = reader.Next(&line); error != 0)
            return error;
        const bool heading = heading_ && number == 1;
        if (line.empty() && (behindPiece || !heading))
            return 0;
        const bool ends = line.empty() || line.back() == '\n'; // before it is split
        if (!behindPiece)
            Tell(number, WhatIsWrong(line, longest, heading));
        behindPiece = !ends;
        number += ends ? 1 : 0;
    }
}

void TextCheck::Tell(long line, const std::string& wrong) {
    if (!wrong.empty())
        wrong_.push_back("line " + std::to_string(line) + ": " + wrong);
}

std::string TextCheck::WhatIsWrong(std::span<char> line, std::size_t longest, bool heading) {
    if (line.size() > longest)
        return "the line is longer than " + std::to_string(longest) + " bytes";
    if (!heading && splitter_.IsBlank({line.data(), line.size()}))
        return {};
    SplitFields(line);
    if (fields_.size() != columns_.size())
        return Counted(fields_.size(), "field") + ", the data file has " +
               Counted(columns_.size(), "column") +
               (fields_.size() < columns_.size() ? " (an empty field needs a blank in it)" : "");
    return heading ? WrongName() : WrongValue();
}

void TextCheck::SplitFields(std::span<char> line) {
    fields_.clear();
    splitter_.Begin(line);
    for (std::string_view field = splitter_.Next(); !field.empty(); field = splitter_.Next())
        fields_.push_back(field);
}

std::string TextCheck::WrongName() const {
    for (std::size_t i = 0; i < columns_.size(); ++i) {
        const std::string_view name(columns_[i].name, strnlen(columns_[i].name, NameSize));
        if (fields_[i] != name)
            return Quoted(fields_[i]) + " stands where the column " + std::string(name) + " is to be named";
    }
    return {};
}

std::string TextCheck::WrongValue() {
    std::fill(data_.begin(), data_.end(), std::uint8_t{0});
    for (std::size_t i = 0; i < columns_.size(); ++i)
        if (const std::string wrong = Store(columns_[i], fields_[i]); !wrong.empty())
            return std::string(columns_[i].name) + ": " + Quoted(fields_[i]) + " " + wrong;
    return {};
}

std::string TextCheck::Store(const COLUMN_ENTRY& column, std::string_view text) {
    if (column.type == ColumnType::String && text == " ")
        return {}; // also in a column that has no room for it
    if (column.type == ColumnType::Byte && characters_)
        return text.size() == 1 ? std::string() : "is more than one character";
    if (column.type == ColumnType::String && !IsUtf8(text))
        return "is no UTF-8";
    return StoreField(column, text, data_.data());
}
