#pragma once

#include "platform/View.h"

class DATABASE;

// The report's page: title, the portfolio's name and total value, the table of its investments, and the
// footer with version, count and date. It lives, hidden, for one print job only, and draws all of the page
// wherever the job draws it; it neither selects a printer nor begins pages. Rows that the page has no room
// for are lost, and the footer tells so. Interface thread.
class PrinterView : public BView {
  public:
    // portfolio and database, the investment file, are borrowed.
    PrinterView(BRect frame, const char* portfolio, float totalValue, DATABASE* database);

    // Draws the report into page. The investment file's result set is left on the portfolio.
    void Draw(BRect page) override;
    // Whether what was drawn has all of the portfolio's investments; false when some could not be read.
    [[nodiscard]] bool HasAll() const { return hasAll_; }

  private:
    struct Rows {
        long shown = 0; // above the footer, whole
        long all = 0;
    };

    void DrawTitles(BRect bar);
    Rows DrawInvestments(BRect page);
    void DrawFooter(BRect bar, Rows rows);
    // Sets the fixed-width font, at most as large as the table still fits the page in its width.
    void SetTableFont(float pageWidth);

    DATABASE* database_;
    const char* portfolio_;
    float totalValue_;
    bool hasAll_ = false;
};
