#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "platform/Rect.h"

class BFont;
class BView;

// One column of a printed table.
struct TABLE_COLUMN_ENTRY {
    std::int32_t characters; // its width in widths of the letter "m"
    char label[64];          // the heading; none is drawn for an empty one
    std::uint32_t alignment; // DrawTextLeft or DrawTextRight, of the cells
    float x = 0;             // left edge, from the table's; filled in by PRINT_TABLE
    float width = 0;         // in points; filled in by PRINT_TABLE
};

// A table on a printed page: lays out columns in a view's font, and draws the heading, then row after row
// downwards, then the lines. It knows nothing of what the cells mean, of pages or of their ends: the caller
// looks at RowPosition. View and column records are borrowed. The drawing operations are to be called inside
// the view's Draw, in the font that was set at construction.
class PRINT_TABLE {
  public:
    // Fills in x and width of the columns. They are as wide as their characters, or, when tableWidth is
    // above 0, stretched or shrunk in proportion to be that wide together. Column records with a negative
    // character count have no width.
    PRINT_TABLE(BView* view, float left, float top, int columnCount, TABLE_COLUMN_ENTRY* columns,
                float tableWidth);

    // How many rows below a heading have room in a table so high, in that font.
    [[nodiscard]] static long RowsWithin(float height, const BFont& font);

    // Takes the row's cells for those that are to be drawn: the right-aligned ones of a column, being
    // figures, get one size in which the widest of them fits. To be called for every row before the first is
    // drawn.
    void Measure(const char* cells, int cellStride);
    // Draws the heading row, 1.25 lines high: labels in white on black.
    void DrawHeader();
    // Draws one row; cell i is the NUL-terminated text at cells + i * cellStride, and at most cellStride
    // bytes of it. A right-aligned cell ends 5 points before the column's edge and is never cut: without its
    // last digits it would be another number. Any other that is too wide is drawn smaller, and cut at the
    // edge when it would be too small to read.
    void DrawText(const char* cells, int cellStride);
    // Draws the line at each column's edge and the one below the last row.
    void DrawGridLines();

    // The left edge of a column, or for the column count the table's right end; -1 for any other.
    [[nodiscard]] float GetColumnXCoord(int column) const;
    // Sets the rectangle's left and right to the column's edges and returns 0; -1, with the rectangle left
    // alone, for a column that is not there.
    [[nodiscard]] int GetColumnXCoords(int column, BRect* rect) const;
    // Moves the table's top edge, but not the next row.
    void SetTableYPos(float top) { top_ = top; }

    // The top of the next row.
    [[nodiscard]] float RowPosition() const { return rowPosition_; }

  private:
    void LayOut(float tableWidth);
    // Where the text of a cell may stand in its column.
    [[nodiscard]] BRect TextFrame(int column) const;

    BView* view_;
    float left_;
    float top_;
    float rowPosition_;
    TABLE_COLUMN_ENTRY* columns_;
    int columnCount_;
    std::vector<std::string> widestFigures_; // of each column
    float tableWidth_ = 0;
    float headingHeight_;
    float characterWidth_;
    float fontHeight_;
};
