#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "db/RecordTypes.h"

// Takes the fields off lines of text. A field ends at any character of a set; several of them in a row count
// as one, and those before the first field do not count.
class FieldSplitter {
  public:
    // Null is the empty set: then a line is one field.
    explicit FieldSplitter(const char* separators);

    // Whether a line is blank: it begins with its newline, or has nothing but carriage returns and newlines
    // where both are in the set.
    [[nodiscard]] bool IsBlank(std::string_view line) const;
    // Begins a line. It must stay where it is, one byte behind it included, and loses its separators.
    void Begin(std::span<char> line);
    // The next field, ended by a NUL; empty when there is none left.
    [[nodiscard]] std::string_view Next();
    // How many fields are left; they are gone then.
    [[nodiscard]] int Count();

  private:
    [[nodiscard]] bool IsSeparator(char c) const { return separators_[static_cast<unsigned char>(c)]; }

    std::array<bool, 256> separators_{};
    char* next_ = nullptr;
    char* end_ = nullptr;
};

// A record's data as a line of text, and back; doc/text-file.md describes the lines. It knows the columns,
// which it borrows, but no files.
class RecordText {
  public:
    // `byteCharacters`: byte columns are written as one character and read as the first one's code, instead
    // of as a number.
    RecordText(std::span<const COLUMN_ENTRY> columns, bool byteCharacters)
        : columns_(columns), byteCharacters_(byteCharacters) {}

    // The most characters that Format and FormatHeading write with a separator of that size.
    [[nodiscard]] std::size_t LongestLine(std::size_t separatorSize) const;
    // Writes a record's line, its newline included and no NUL, and returns where it ends.
    [[nodiscard]] char* Format(const std::uint8_t* data, std::string_view separator, char* line) const;
    // Writes a line of the columns' names in the same way.
    [[nodiscard]] char* FormatHeading(std::string_view separator, char* line) const;
    // Sets all columns in a record's data from the fields that are left, one for each; a column without a
    // field becomes empty or 0. Other bytes of the data are not touched.
    void Parse(FieldSplitter& fields, std::uint8_t* data) const;

  private:
    [[nodiscard]] char* FormatField(const COLUMN_ENTRY& column, const std::uint8_t* field, char* out) const;

    std::span<const COLUMN_ENTRY> columns_;
    bool byteCharacters_;
};
