#include "quotes/QuoteSource.h"

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <string>

#include "util/CharacterBuffer.h"
#include "util/Strings.h"

namespace {

constexpr std::size_t MaxPiece = 255;
constexpr std::size_t MinLine = 10; // a shorter one ends the list
constexpr std::string_view WhiteSpace = " \t\n\v\f\r";

constexpr const char* TooFewFields = "it has fewer than five fields";

// Null, or why the word cannot be the field.
template <std::size_t Size>
const char* TakeField(std::string_view& line, char (&field)[Size], const char* tooLong) {
    const auto word = TakeToken(line, WhiteSpace);
    if (!word)
        return TooFewFields;
    if (word->size() >= Size)
        return tooLong;
    CopyText(field, *word);
    return nullptr;
}

// Reads as far as there are digits.
const char* TakeNumber(std::string_view& line, int* number) {
    const auto word = TakeToken(line, WhiteSpace);
    if (!word)
        return TooFewFields;
    const std::string text(*word);
    char* end = nullptr;
    const long value = std::strtol(text.c_str(), &end, 10);
    *number = static_cast<int>(std::clamp<long>(value, INT_MIN, INT_MAX));
    return end == text.c_str() ? "its skip count is no number" : nullptr;
}

// Null, or why the line is no source; then `source` holds nothing of use.
const char* ParseQuoteSource(std::string_view line, QuoteSource* source) {
    *source = {};
    const char* problem = TakeField(line, source->label, "its label has more than 31 bytes");
    if (!problem)
        problem = TakeField(line, source->host, "its host has more than 63 bytes");
    if (!problem)
        problem = TakeField(line, source->path, "its path has more than 127 bytes");
    if (!problem)
        problem = TakeField(line, source->tag, "its marker has more than 31 bytes");
    if (!problem)
        problem = TakeNumber(line, &source->skip);
    return problem;
}

} // namespace

bool AppendTicker(QuoteSource* source, std::string_view ticker) {
    const std::size_t length = std::strlen(source->path);
    if (length + ticker.size() >= sizeof source->path)
        return false;
    CopyText(source->path + length, sizeof source->path - length, ticker);
    return true;
}

QuoteSourceReader::Line QuoteSourceReader::Next() {
    problem_ = nullptr;
    if (rest_.empty())
        return Line::EndOfFile;
    const std::size_t feed = rest_.substr(0, MaxPiece).find('\n');
    const std::size_t length = feed == rest_.npos ? std::min(MaxPiece, rest_.size()) : feed + 1;
    std::string_view piece = rest_.substr(0, length);
    piece = piece.substr(0, piece.find('\0'));
    lineNumber_ += insideLine_ ? 0 : 1;
    insideLine_ = feed == rest_.npos;
    rest_.remove_prefix(length);
    if (piece.size() < MinLine)
        return Line::EndOfList;
    if (piece.front() == ';')
        return Line::Skipped;
    problem_ = ParseQuoteSource(piece, &source_);
    return problem_ ? Line::Skipped : Line::Source;
}
