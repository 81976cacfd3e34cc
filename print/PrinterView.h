#pragma once

#include <span>
#include <string>
#include <vector>

#include "platform/View.h"
#include "print/ReportTexts.h"

class DATABASE;

// The report's page: title, the portfolio's name and total value, the table of its investments, and the
// footer with version, count and date. It lives, hidden, for one print job only, and draws all of the page
// wherever the job draws it; it neither selects a printer nor begins pages. Its fonts are the person's, as
// far as the page has room. Rows that it has no room for even in small letters are left out, and the footer
// tells so. Interface thread.
class PrinterView : public BView {
  public:
    // portfolio and database, the investment file, are borrowed.
    PrinterView(BRect frame, const char* portfolio, float totalValue, DATABASE* database);

    // Draws the report into page. The investment file's result set is left on the portfolio.
    void Draw(BRect page) override;
    // Whether what was drawn has all of the portfolio's investments; false when some could not be read.
    [[nodiscard]] bool HasAll() const { return hasAll_; }

  private:
    // A bar's texts at its left end, in its middle and at its right end; any may be empty.
    struct Bar {
        std::string left, middle, right;
    };
    struct Row {
        ReportRow cells;
    };

    // Reads the first rows of the portfolio, as many as may be wanted. Returns how many it has in all.
    [[nodiscard]] long ReadRows(long wanted, std::vector<Row>& rows);
    // Sets the largest font in which the table fits the place in its width, and that many rows its height.
    // Whether the rows made it smaller.
    bool SetTableFont(BRect place, long rowCount);
    void DrawTable(BRect place, const std::vector<Row>& rows);
    // Sets the largest font in which the texts of all these bars, so wide, fit side by side.
    void SetBarFont(float width, std::span<const Bar> bars);
    [[nodiscard]] bool Fits(const Bar& bar, float width) const;
    void DrawBar(BRect frame, const Bar& bar);

    DATABASE* database_;
    const char* portfolio_;
    float totalValue_;
    bool hasAll_ = false;
};

// How Banner draws its bar and places its text. Of the three placements the first one given counts, in this
// order; without any the text is left-aligned.
inline constexpr short BannerInverse = 0x02; // white text on a black bar; otherwise black on white
inline constexpr short BannerRight = 0x04;
inline constexpr short BannerLeft = 0x08;
inline constexpr short BannerCenter = 0x10;
inline constexpr short BannerRounded = 0x20; // corners of radius 20

// Fills rect as a bar and draws the text in it, centred between top and bottom and cut at the bar's edges, in
// the view's font. The view's high colour is the text's afterwards. To be called inside the view's Draw.
void Banner(BView* view, const char* text, const BRect* rect, short flags);
