#pragma once

#include <cstddef>
#include <iosfwd>
#include <string>
#include <string_view>

#include "quotes/QuoteReport.h"

// Writes down what a look-up of a price does and finds, line by line, for a person who wants to know why a
// quote source works or does not. Page text is cut to what stands around the place in question, and all that
// is not plain printable ASCII is written as an escape, so that no page can play with the terminal.
class QuoteTrace : public RefusalObserver {
  public:
    explicit QuoteTrace(std::ostream& output) : output_(output) {}

    void SourceTried(const QuoteSource& source) override;
    void SourceSkipped(int line, const char* reason) override;
    void ListEnded(int line) override;
    void Connected(const char* server) override;
    void Failed(const char* reason) override;
    void PieceReceived(std::string_view piece) override;
    void MarkerFound(std::string_view piece, std::size_t position) override;
    void PriceRead(std::string_view token, std::string_view following, double price,
                   double fraction) override;
    void SourceAnswered(float result) override;

    static constexpr const char* NoSource = "there is no source to ask";
    // Why there is no price: NoSource while none was asked, else what is known of the one asked last.
    [[nodiscard]] const std::string& Why() const { return why_; }

  private:
    // Writes a line that says why there is no price.
    void TellWhy(const std::string& why);
    void TellWhatIsMissing();
    [[nodiscard]] bool CrossesPieces(std::string_view piece) const;

    std::ostream& output_;
    std::string why_ = NoSource;
    // Of the source being asked:
    std::string marker_;
    std::string beginning_;    // of the page
    std::string lastBytes_;    // of the page so far, fewer than the marker has
    std::size_t received_ = 0; // bytes
    bool inPieces_ = false;    // the page comes so; over TLS it comes whole
    bool connected_ = false;
    bool failed_ = false;        // and the reason was told
    bool markerFound_ = false;   // in one piece
    bool markerDivided_ = false; // between two pieces
    bool priceRead_ = false;
};
