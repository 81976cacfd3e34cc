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
constexpr float LeastNumberSize = 1; // points
constexpr float LeastTextSize = 7;   // smaller than this, a text is better cut than unreadable
constexpr float RightSlack = 2;      // what placed text leaves at the right

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

void PRINT_TABLE::DrawText(const char* cells, int cellStride) {
    const auto stride = static_cast<std::size_t>(std::max(cellStride, 0));
    BRect cell(0, rowPosition_, 0, rowPosition_ + fontHeight_);
    for (int i = 0; GetColumnXCoords(i, &cell) == 0; ++i) {
        const std::string_view whole(cells + static_cast<std::size_t>(i) * stride, stride);
        const std::string text(whole.substr(0, whole.find('\0')));
        if (columns_[i].alignment & DrawTextRight) {
            cell.left += LineWidth + RightSlack; // a number that just fits stands free of the line
            cell.right -= CellInset;
            DrawFitting(cell, text.c_str(), columns_[i].alignment, LeastNumberSize);
        } else {
            cell.left += CellInset;
            cell.right -= LineWidth; // the edge itself is the line's
            DrawFitting(cell, text.c_str(), columns_[i].alignment, LeastTextSize);
        }
    }
    rowPosition_ += fontHeight_ + RowGap;
}

void PRINT_TABLE::DrawFitting(const BRect& cell, const char* text, std::uint32_t alignment,
                              float leastSize) const {
    BFont usual;
    view_->GetFont(&usual);
    BFont font = usual;
    while (font.StringWidth(text) > cell.Width() - RightSlack && font.Size() > leastSize)
        font.SetSize(font.Size() - 1);
    view_->SetFont(&font);
    ::DrawText(view_, &cell, text, static_cast<uint8>(alignment | DrawTextMiddle));
    view_->SetFont(&usual);
}

void PRINT_TABLE::DrawGridLines() {
    for (int i = 0; i <= columnCount_; ++i) {
        const float x = GetColumnXCoord(i);
        view_->StrokeLine({x, top_ + headingHeight_ / 2}, {x, rowPosition_});
    }
    view_->StrokeLine({left_, rowPosition_}, {left_ + tableWidth_, rowPosition_});
}
