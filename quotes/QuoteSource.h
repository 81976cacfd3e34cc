#pragma once

#include <string_view>

// One source of prices, as a line of the quote-source file names it (doc/quote-sources.md).
struct QuoteSource {
    char label[32] = "";
    char host[64] = "";
    char path[128] = "";
    char tag[32] = "";
    int skip = 0;
};

// Puts the ticker right behind the path. False, with nothing changed, when both do not fit together.
[[nodiscard]] bool AppendTicker(QuoteSource* source, std::string_view ticker);

// Goes through the lines of a quote-source file's content. It opens no file, and borrows the content. A local
// object of one look-up.
//
// A source that cannot be used has fewer than five fields, one that is too long, or a skip count that is no
// number. A skip count beyond an int counts as the nearest int; what follows the fifth field is ignored.
class QuoteSourceReader {
  public:
    enum class Line {
        EndOfFile,
        EndOfList, // fewer than 10 bytes: what follows is never read
        Skipped,   // a comment, or a source that cannot be used: Problem says why
        Source
    };

    explicit QuoteSourceReader(std::string_view content) : rest_(content) {}

    // Takes the next line, of which at most 255 bytes (its line feed included) are read at a time: the rest
    // of a longer one counts as another line. A line's text ends at its first NUL.
    [[nodiscard]] Line Next();

    // Of the line taken last.
    [[nodiscard]] const QuoteSource& Source() const { return source_; }
    [[nodiscard]] const char* Problem() const { return problem_; } // null for none
    [[nodiscard]] int LineNumber() const { return lineNumber_; }   // of the file, from 1

  private:
    std::string_view rest_;
    QuoteSource source_;
    const char* problem_ = nullptr;
    int lineNumber_ = 0;
    bool insideLine_ = false; // the piece taken last had no line feed
};
