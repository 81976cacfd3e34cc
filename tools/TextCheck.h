#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "db/RecordText.h"
#include "db/TextFile.h"
#include "util/File.h"

// How records are written as lines of text, and read.
struct TextFormat {
    std::string separator = "\t"; // behind each field; read, any one of its characters ends a field
    bool characters = false;      // a byte is the character of that code instead of a number
    bool heading = false;         // the first line names the columns
};

// Looks through a text before it is loaded, because loading takes what it finds: text that is no number for
// 0, bytes that are no UTF-8 for a text, and lines with fields too many or too few. The lines are split as
// loading does. Each must have a field for every column, one that StoreField takes; a blank is also an empty
// text, as exporting writes it. Blank lines, and a UTF-8 byte order mark at the beginning, are passed over.
//
// It changes no file. Its owner uses it for one text, and keeps the columns meanwhile.
class TextCheck {
  public:
    // `separators` are the characters that end a field, those at the end of a line included.
    TextCheck(std::span<const COLUMN_ENTRY> columns, const TextFormat& format, const std::string& separators);

    // Reads the whole text. A line may have `longest` characters, its newline included. Returns 0 or, with
    // errno set, the engine's code of what hindered it.
    [[nodiscard]] int Run(const File& text, std::size_t longest);
    // Where the text is wrong and why, line by line: "line 3: Price: '5,5' is no number". Empty when nothing
    // is.
    [[nodiscard]] const std::vector<std::string>& Wrong() const { return wrong_; }

  private:
    [[nodiscard]] int ReadLines(LineReader& reader, std::size_t longest);
    void Tell(long line, const std::string& wrong);
    void SplitFields(std::span<char> line);
    [[nodiscard]] std::string WhatIsWrong(std::span<char> line, std::size_t longest, bool heading);
    [[nodiscard]] std::string WrongName() const;
    [[nodiscard]] std::string WrongValue();
    [[nodiscard]] std::string Store(const COLUMN_ENTRY& column, std::string_view text);

    std::span<const COLUMN_ENTRY> columns_;
    bool characters_;
    bool heading_;
    FieldSplitter splitter_;
    std::vector<std::string_view> fields_; // of the line
    std::vector<std::uint8_t> data_;       // a record's, which nobody reads
    std::vector<std::string> wrong_;
};
