#include "print/PrintTable.h"

#include <algorithm>
#include <string>
#include <string_view>

#include "platform/View.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float HeadingLines = 1.25F;
constexpr float CellInset = 5; // from the column's line
constexpr float LineWidth = 1;
constexpr float RowGap = 5;
constexpr float LeastTextSize = 7; // smaller than this, a text is better cut than unreadable
constexpr float RightSlack = 2;    // what placed text leaves at the right

// The text of cell i, which ends with its stride at the latest.
std::string Cell(const char* cells, int cellStride, int i) {
    const auto stride = static_cast<std::size_t>(std::max(cellStride, 0));
    const std::string_view whole(cells + static_cast<std::size_t>(i) * stride, stride);
    return std::string(whole.substr(0, whole.find('\0')));
}

float FontHeightOf(const BView* view) {
    BFont font;
    view->GetFont(&font);
    return GetFontHeight(&font);
}

} // namespace

PRINT_TABLE::PRINT_TABLE(BView* view, float left, float top, int columnCount, TABLE_COLUMN_ENTRY* columns,
                         float tableWidth)
    : view_(view),
      left_(left),
      top_(top),
      rowPosition_(top),
      columns_(columns),
      columnCount_(columns ? std::max(columnCount, 0) : 0),
      widestFigures_(static_cast<std::size_t>(columnCount_)),
      headingHeight_(FontHeightOf(view) * HeadingLines),
      characterWidth_(view->StringWidth("m")),
      fontHeight_(FontHeightOf(view)) {
    LayOut(tableWidth);
}

void PRINT_TABLE::LayOut(float tableWidth) {
    float total = 0;
    for (int i = 0; i < columnCount_; ++i)
        total += static_cast<float>(std::max(columns_[i].characters, 0));
    float unit = characterWidth_;
    if (tableWidth > 0 && total > 0)
        unit = tableWidth / total;
    float before = 0;
    for (int i = 0; i < columnCount_; ++i) {
        const auto characters = static_cast<float>(std::max(columns_[i].characters, 0));
        columns_[i].x = before * unit;
        columns_[i].width = characters * unit;
        before += characters;
    }
    tableWidth_ = tableWidth > 0 ? tableWidth : total * unit;
}

long PRINT_TABLE::RowsWithin(float height, const BFont& font) {
    const float row = GetFontHeight(&font);
    const float below = height - row * HeadingLines;
    return below < row ? 0 : 1 + static_cast<long>((below - row) / (row + RowGap));
}

float PRINT_TABLE::GetColumnXCoord(int column) const {
    if (column == columnCount_)
        return left_ + tableWidth_;
    return column >= 0 && column < columnCount_ ? left_ + columns_[column].x : -1;
}

int PRINT_TABLE::GetColumnXCoords(int column, BRect* rect) const {
    if (column < 0 || column >= columnCount_)
        return -1;
    rect->left = left_ + columns_[column].x;
    rect->right = rect->left + columns_[column].width;
    return 0;
}

void PRINT_TABLE::DrawHeader() {
    BRect heading(left_, top_, left_ + tableWidth_, top_ + headingHeight_);
    view_->SetHighColor(colors::black);
    // The line at the bottom is the first row's, whose letters would touch it.
    view_->FillRect({heading.left, heading.top, heading.right, heading.bottom - LineWidth});
    view_->SetHighColor(colors::white);
    for (int i = 0; i < columnCount_; ++i)
        if (columns_[i].label[0] != '\0' && GetColumnXCoords(i, &heading) == 0)
            ::DrawText(view_, &heading, columns_[i].label, DrawTextCenter | DrawTextMiddle);
    view_->SetHighColor(colors::black);
    rowPosition_ = top_ + headingHeight_;
}

void PRINT_TABLE::Measure(const char* cells, int cellStride) {
    for (int i = 0; i < columnCount_; ++i) {
        std::string& widest = widestFigures_[static_cast<std::size_t>(i)];
        std::string text = Cell(cells, cellStride, i);
        if (view_->StringWidth(text.c_str()) > view_->StringWidth(widest.c_str()))
            widest = std::move(text);
    }
}

BRect PRINT_TABLE::TextFrame(int column) const {
    BRect frame(0, rowPosition_, 0, rowPosition_ + fontHeight_);
    static_cast<void>(GetColumnXCoords(column, &frame));
    const bool right = (columns_[column].alignment & DrawTextRight) != 0;
    frame.left += right ? 2 * LineWidth : CellInset;
    frame.right -= right ? CellInset : LineWidth + RightSlack;
    return frame;
}

void PRINT_TABLE::DrawText(const char* cells, int cellStride) {
    Measure(cells, cellStride); // a row that was not foretold fits all the same
    BFont usual;
    view_->GetFont(&usual);
    for (int i = 0; i < columnCount_; ++i) {
        const std::string text = Cell(cells, cellStride, i);
        const bool right = (columns_[i].alignment & DrawTextRight) != 0;
        const std::string& widest = right ? widestFigures_[static_cast<std::size_t>(i)] : text;
        BRect frame = TextFrame(i);
        const BFont font = right ? FittingFont(usual, widest, frame.Width())
                                 : FittingFont(usual, widest, frame.Width(), LeastTextSize);
        view_->SetFont(&font);
        frame.right += RightSlack;
        ::DrawText(view_, &frame, text.c_str(), static_cast<uint8>(columns_[i].alignment | DrawTextMiddle));
    }
    view_->SetFont(&usual);
    rowPosition_ += fontHeight_ + RowGap;
}

void PRINT_TABLE::DrawGridLines() {
    for (int i = 0; i <= columnCount_; ++i) {
        const float x = GetColumnXCoord(i);
        view_->StrokeLine({x, top_ + headingHeight_ / 2}, {x, rowPosition_});
    }
    view_->StrokeLine({left_, rowPosition_}, {left_ + tableWidth_, rowPosition_});
}
