// A quote-source file of any bytes: the reading ends, and what it calls a source has all fields within their
// limits, a host that can be told from others, and room for a ticker or none.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "quotes/Host.h"
#include "quotes/QuoteSource.h"

namespace {

void Require(bool condition, const char* what) {
    if (!condition) {
        std::fprintf(stderr, "%s\n", what);
        std::abort();
    }
}

template <std::size_t Size>
bool IsWord(const char (&field)[Size]) {
    const std::size_t length = strnlen(field, Size);
    return length > 0 && length < Size && std::strcspn(field, " \t\n\v\f\r") == length;
}

void Check(QuoteSource source) {
    Require(IsWord(source.label) && IsWord(source.host) && IsWord(source.path) && IsWord(source.tag),
            "a field is no word");
    const std::size_t length = std::strlen(source.path);
    const bool fits = AppendTicker(&source, "TICKER");
    Require(fits == (length + 6 < sizeof source.path) && IsWord(source.path), "the ticker is not bounded");
    HostField host;
    if (ParseHostField(source.host, &host))
        Require(!host.name.empty() && host.port != 0 && host.name.find(':') == host.name.npos, "no host");
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using Line = QuoteSourceReader::Line;
    const std::string content(reinterpret_cast<const char*>(data), size);
    QuoteSourceReader reader(content);
    std::size_t lines = 0;
    for (Line line = reader.Next(); line != Line::EndOfFile; line = reader.Next()) {
        Require(++lines <= size, "more lines than bytes");
        if (line == Line::Source)
            Check(reader.Source());
    }
    return 0;
}
