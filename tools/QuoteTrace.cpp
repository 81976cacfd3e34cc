#include "tools/QuoteTrace.h"

#include <algorithm>
#include <ostream>

#include "quotes/QuoteRetrieval.h"
#include "quotes/QuoteSource.h"
#include "util/Numbers.h"
#include "util/Strings.h"
#include "util/Utf8.h"

namespace {

constexpr std::size_t Around = 60;     // bytes shown on either side of the marker
constexpr std::size_t Beginning = 160; // bytes shown of a page without the marker

std::string Printable(std::string_view text) {
    std::string printable;
    AppendEscaped(printable, text, Letters::Ascii);
    return printable;
}

bool HasCommaBehindNumber(std::string_view token) {
    const std::string text(token);
    double number = 0;
    const char* rest = nullptr;
    static_cast<void>(ReadDecimal(text.c_str(), &number, &rest));
    return rest != text.c_str() && *rest == ',';
}

// Whether the text of the price, or of its fraction, goes on to the end of what lies behind the price in its
// piece of the page, so that more of it may be in the next piece.
bool ReachesEnd(std::string_view following, double fraction) {
    constexpr std::string_view digits = "0123456789";
    std::string text = Lowered(following);
    text.erase(0, text.find_first_not_of(" \t\r\n<"));
    if (!text.starts_with("sup"))
        return fraction < 0 || text.find_first_not_of("0123456789/ ") == text.npos ||
               std::string_view("sup").starts_with(text);
    const std::size_t below = text.find('>', std::min(text.find("sub"), text.size()));
    return fraction < 0 || below == text.npos || text.find_first_not_of(digits, below + 1) == text.npos;
}

std::string Number(double value, int decimals) {
    char text[64];
    FormatFixed(value, text, sizeof text, decimals);
    return text;
}

} // namespace

void QuoteTrace::TellWhy(const std::string& why) {
    why_ = why;
    output_ << "  " << why << '\n';
}

void QuoteTrace::SourceTried(const QuoteSource& source) {
    RefusalObserver::SourceTried(source);
    why_.clear();
    marker_ = source.tag;
    beginning_.clear();
    lastBytes_.clear();
    received_ = 0;
    inPieces_ = !std::string_view(source.host).starts_with("https://");
    connected_ = failed_ = markerFound_ = markerDivided_ = priceRead_ = false;
    output_ << "source " << Printable(source.label) << ": asking " << Printable(source.host) << " for "
            << Printable(source.path) << ", marker '" << Printable(source.tag) << "', skip " << source.skip
            << '\n';
}

void QuoteTrace::SourceSkipped(int line, const char* reason) {
    output_ << "line " << line << " is no source: " << reason << '\n';
}

void QuoteTrace::ListEnded(int line) {
    output_ << "line " << line << " ends the list, since it is empty or too short for a source\n";
}

void QuoteTrace::Connected(const char* server) {
    connected_ = true;
    output_ << "  connected to " << server << '\n';
}

void QuoteTrace::Failed(const char* reason) {
    failed_ = true;
    TellWhy("failed: " + Printable(reason));
}

void QuoteTrace::PieceReceived(std::string_view piece) {
    received_ += piece.size();
    beginning_ += piece.substr(0, Beginning - std::min(Beginning, beginning_.size()));
    markerDivided_ = markerDivided_ || CrossesPieces(piece);
    const std::size_t kept = marker_.empty() ? 0 : marker_.size() - 1;
    lastBytes_ += piece.substr(piece.size() - std::min(piece.size(), kept));
    lastBytes_.erase(0, lastBytes_.size() - std::min(lastBytes_.size(), kept));
}

bool QuoteTrace::CrossesPieces(std::string_view piece) const {
    const std::string seam = lastBytes_ + std::string(piece.substr(0, marker_.size()));
    return !lastBytes_.empty() && seam.find(marker_) != seam.npos;
}

void QuoteTrace::MarkerFound(std::string_view piece, std::size_t position) {
    markerFound_ = true;
    const std::size_t start = position - std::min(position, Around);
    const std::size_t behind = position + marker_.size();
    output_ << "  marker found: " << (start > 0 ? "..." : "")
            << Printable(piece.substr(start, position - start)) << '[' << Printable(marker_) << ']'
            << Printable(piece.substr(behind, Around)) << (behind + Around < piece.size() ? "..." : "")
            << '\n';
}

void QuoteTrace::PriceRead(std::string_view token, std::string_view following, double price,
                           double fraction) {
    priceRead_ = true;
    TellWhy("price text '" + Printable(token.substr(0, Around)) + "' read as " + Number(price, 4));
    const std::string behind = "behind it '" + Printable(following.substr(0, Around)) + "': ";
    if (fraction < 0)
        TellWhy(behind + "a malformed fraction");
    else
        output_ << "  " << behind << (fraction == 0 ? "no fraction" : "fraction " + Number(fraction, 4))
                << '\n';
    const bool isNumber = token.find_first_of("0123456789+-.") == 0;
    if (!isNumber && fraction > 0)
        output_ << "  careful: the price text is no number, and the price is only the fraction behind it; is "
                   "the skip one off?\n";
    if (HasCommaBehindNumber(token))
        output_ << "  careful: the price text is read only up to its comma; a price is written with a "
                   "decimal point and without other separators\n";
    if (inPieces_ && ReachesEnd(following, fraction))
        output_ << "  careful: what was read as the price ends where a received piece of the page ends; what "
                   "follows in the next piece is not read, and the price may be another one another time\n";
}

void QuoteTrace::SourceAnswered(float result) {
    if (!priceRead_ && received_ > 0)
        TellWhatIsMissing();
    else if (received_ == 0 && connected_ && !failed_)
        TellWhy("the server closed the connection without sending a byte of the page");
    output_ << (result > 0 ? "  price " : "  no price, ") << Number(static_cast<double>(result), 2) << '\n';
}

void QuoteTrace::TellWhatIsMissing() {
    if (markerFound_)
        TellWhy("the page ended before the skip count was used up, or without a price text");
    else if (markerDivided_)
        TellWhy("the marker arrived in two pieces, and is found only in one; it may be found another time");
    else
        TellWhy("marker not found in the " + std::to_string(received_) + " bytes received, which begin: " +
                Printable(beginning_) + (received_ > beginning_.size() ? "..." : ""));
}
