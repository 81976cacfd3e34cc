#pragma once

#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

// Text for an open file descriptor, kept back and written in large pieces, or without one kept as a whole.
// The first failure ends it: what comes later is dropped, and the owner asks for the failure when it is done.
// It neither opens nor closes the descriptor. Used on one thread.
class TextOutput {
  public:
    TextOutput() = default;
    explicit TextOutput(int descriptor) : descriptor_(descriptor) {}
    TextOutput(const TextOutput&) = delete;
    TextOutput& operator=(const TextOutput&) = delete;

    void Write(std::string_view text);
    // Writes what was kept back. Returns 0, or the errno number of the first failure since the beginning.
    int Flush();
    // False once writing has failed: there is no use in going on.
    [[nodiscard]] bool IsWorking() const { return error_ == 0; }
    // What is kept so far.
    [[nodiscard]] const std::string& Kept() const { return kept_; }

  private:
    int descriptor_ = -1;
    int error_ = 0;
    std::string kept_;
};

// To be called last: writes what was kept back and returns `status`, or 1 with a sentence on `errors` when
// the output could not be written. A reader that has gone away is no failure.
int FinishOutput(TextOutput& output, std::ostream& errors, int status);

enum class OutputFormat {
    Table, // aligned with blanks, under a heading line
    Tsv,   // separated by tabs, under a heading line; texts as AppendEscaped writes them
    Csv,   // as spreadsheets read it (RFC 4180): texts as they are, in quotation marks where they need them
    Json,  // an object on a line of its own for each row
};

// One value of a row. A row's cells are filled again and again, so that their texts keep their room.
struct Cell {
    enum class Kind {
        Nothing, // empty; null in JSON
        Text,    // bytes; what is no valid UTF-8 becomes U+FFFD in JSON
        Figure,  // the text of a number
        Number,
        Float, // as short as it can be read back exactly; in a table with so many decimals
        Truth, // yes or no; true or false in JSON
    };
    Kind kind = Kind::Nothing;
    std::string text;
    std::int64_t number = 0;
    float value = 0;
    int decimals = 0;

    void SetText(std::string_view bytes);
    void SetNumber(std::int64_t whole);
    void SetFloat(float single, int shownDecimals);
};

[[nodiscard]] inline Cell TextCell(std::string_view text) {
    return {Cell::Kind::Text, std::string(text)};
}
[[nodiscard]] inline Cell NumberCell(std::int64_t number) {
    return {Cell::Kind::Number, {}, number};
}

// Writes rows of cells as a table, as tab- or comma-separated text or as JSON lines. It keeps no row: for a
// table, all rows are to be measured before the first is written, and those not measured stand out of line.
class TableWriter {
  public:
    // `output` must outlive the writer. Names that occur twice get a number in JSON ("Name_2").
    TableWriter(OutputFormat format, const std::vector<std::string>& names, TextOutput& output);
    ~TableWriter();

    // Makes the columns of a table as wide as this row needs; nothing in the other formats.
    void Measure(std::span<const Cell> row);
    // Writes the heading line, which JSON has none of. To be called once, before the first row.
    void WriteHeading();
    void WriteRow(std::span<const Cell> row);

  private:
    class JsonLine;
    void AppendAligned(std::size_t column, bool toTheRight, bool last);
    void Render(const Cell& cell);
    void WriteLine();

    OutputFormat format_;
    std::vector<std::string> names_;
    std::vector<std::size_t> widths_; // of a table's columns
    std::vector<bool> right_;         // whether a table's heading stands to the right, as its numbers do
    TextOutput& output_;
    std::unique_ptr<JsonLine> json_;
    std::string field_; // of the cell at hand
    std::string line_;
};

// Rows that are there all at once.
void WriteRows(OutputFormat format, const std::vector<std::string>& names,
               const std::vector<std::vector<Cell>>& rows, TextOutput& output);
