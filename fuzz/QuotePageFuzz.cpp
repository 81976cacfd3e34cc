// A page of any bytes in pieces of any sizes: the scan stays inside each piece and its price is a price.
//
// The input begins with the marker's length, the skip count, and the number of pieces less one, a byte each;
// then come a byte for each piece's length (the last piece gets all that is left), the marker and the page.
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string_view>

#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"
#include "quotes/QuoteScanner.h"

namespace {

class Input {
  public:
    Input(const std::uint8_t* data, std::size_t size) : rest_(reinterpret_cast<const char*>(data), size) {}
    std::uint8_t Byte() {
        const std::string_view byte = Take(1);
        return byte.empty() ? 0 : static_cast<std::uint8_t>(byte.front());
    }
    std::string_view Take(std::size_t size) {
        const std::string_view taken = rest_.substr(0, size);
        rest_.remove_prefix(taken.size());
        return taken;
    }

  private:
    std::string_view rest_;
};

// In memory of its own, so that the sanitizer sees a step beyond the piece.
bool ScanCopy(QuoteScanner& scanner, std::string_view piece) {
    const std::unique_ptr<char[]> copy(new char[piece.size()]);
    std::copy(piece.begin(), piece.end(), copy.get());
    return scanner.Scan({copy.get(), piece.size()});
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Input input(data, size);
    const std::size_t tagLength = input.Byte() % 32;
    const int skip = input.Byte();
    const std::string_view lengths = input.Take(input.Byte());
    QuoteReport nobody(nullptr, nullptr);
    QuoteScanner scanner(input.Take(tagLength), skip, nobody);
    bool ended = false;
    for (const char length : lengths)
        ended = ended || ScanCopy(scanner, input.Take(static_cast<std::uint8_t>(length)));
    ended = ended || ScanCopy(scanner, input.Take(size));
    if (!std::isfinite(scanner.Price()) || (!ended && scanner.Price() != NoQuote)) {
        std::fprintf(stderr, "no price and no status: %g\n", static_cast<double>(scanner.Price()));
        std::abort();
    }
    return 0;
}
