#pragma once

#include <string>
#include <string_view>

class QuoteReport;

// Reads a price out of a page that arrives in pieces: finds a marker text, passes a number of characters ">",
// and takes the next run of text as the price, with the fraction behind it (doc/quote-sources.md).
//
// It keeps no page text. Of the pieces before it knows only whether the marker was found and how many ">"
// remain, so that a marker, a price or a fraction that lies across two pieces is not put together. It knows
// no socket, bounds no piece's length, and takes any bytes; a NUL is a byte like any other, and ends only a
// fraction. A local object of one exchange.
class QuoteScanner {
  public:
    // The number of ">" counts from the marker's first character on; 0 or less lets the price text begin
    // right there. The report is told what is found, and must outlive the scanner.
    QuoteScanner(std::string_view tag, int skip, QuoteReport& report);

    // Reads the next piece. True when the search has ended with it: pieces after that are not looked at.
    [[nodiscard]] bool Scan(std::string_view piece);

    // The price once Scan has said true; it may be 0 or less when the text is no positive number. NoQuote
    // before that, when the fraction is malformed, and for a number that no float holds.
    [[nodiscard]] float Price() const { return price_; }

  private:
    // Both move `rest` on, and are false when the next piece must come first.
    [[nodiscard]] bool FindTag(std::string_view& rest);
    [[nodiscard]] bool PassBrackets(std::string_view& rest);
    void ReadPrice(std::string_view token, std::string_view following);

    QuoteReport& report_;
    std::string tag_;
    int remaining_; // characters ">" to be passed yet
    bool tagFound_ = false;
    float price_;
};

// The fraction at the start of the page text behind a price, to be added to the price: "3/8" in plain form
// (what stands behind "12 " in "12 3/8"), or the raised and lowered numbers of "12<sup>3</sup>/<sub>8</sub>".
//
// Above 0 the fraction, 0 when there is none; below 0 it is malformed: -1 when the text has "sup" but not all
// that belongs to it, else what a negative number makes of it. Turns `text` into lower case in place, as
// strlwr does. Integers beyond an int count as the nearest int.
[[nodiscard]] double LookForFraction(char* text);
