#include "tools/TextCheck.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "db/Errors.h"
#include "db/TextFile.h"
#include "tools/DisplayText.h"
#include "tools/RecordFields.h"

namespace {

std::size_t DataSize(std::span<const COLUMN_ENTRY> columns) {
    int size = 0;
    for (const COLUMN_ENTRY& column : columns)
        size = std::max(size, column.offset + column.size);
    return static_cast<std::size_t>(size);
}

std::string Counted(std::size_t count, const char* thing) {
    return std::to_string(count) + " " + thing + (count == 1 ? "" : "s");
}

// A text of any bytes between quotation marks.
std::string Quoted(std::string_view text) {
    std::string quoted = "'";
    AppendEscaped(quoted, text);
    return quoted + "'";
}

} // namespace

TextCheck::TextCheck(std::span<const COLUMN_ENTRY> columns, const TEXT_FORMAT& format,
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
    for (long number = 1;; ++number) {
        std::span<char> line;
        errno = reader.Next(&line);
        if (errno != 0)
            return DatabaseError::LoadReadFailed;
        const bool heading = heading_ && number == 1;
        if (line.empty() && !heading)
            return 0;
        wrong_ = WhatIsWrong(line, longest, heading);
        if (!wrong_.empty()) {
            wrong_.insert(0, "line " + std::to_string(number) + ": ");
            return 0;
        }
    }
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
    for (std::size_t i = 0; i < columns_.size(); ++i) {
        if (const std::string wrong = Store(columns_[i], fields_[i]); !wrong.empty())
            return std::string(columns_[i].name) + ": " + Quoted(fields_[i]) + " " + wrong;
    }
    return {};
}

std::string TextCheck::Store(const COLUMN_ENTRY& column, std::string_view text) {
    if (column.type == ColumnType::String && text == " ")
        return {}; // also in a column that has no room for it
    if (column.type == ColumnType::Byte && characters_)
        return text.size() == 1 ? std::string() : "is more than one character";
    return StoreField(column, text, data_.data());
}
