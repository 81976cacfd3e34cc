#include "print/PrinterView.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "app/model/PortfolioRules.h"
#include "print/Banner.h"
#include "print/PrintTable.h"
#include "print/ReportTexts.h"
#include "util/Dates.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float BarHeight = 18;
constexpr float TableTop = 90;
constexpr float LargestTableFont = 12;

constexpr std::array<TABLE_COLUMN_ENTRY, ReportColumnCount> ReportColumns = {{
    {24, "Name", DrawTextLeft},
    {8, "Ticker", DrawTextLeft},
    {10, "Shares", DrawTextRight},
    {10, "Price", DrawTextRight},
    {10, "Value", DrawTextRight},
    {12, "Agent", DrawTextLeft},
    {7, "Risk", DrawTextLeft},
}};

constexpr float TableCharacters() {
    float all = 0;
    for (const TABLE_COLUMN_ENTRY& column : ReportColumns)
        all += static_cast<float>(column.characters);
    return all;
}

} // namespace

PrinterView::PrinterView(BRect frame, const char* portfolio, float totalValue, DATABASE* database)
    : BView(frame, "printer view", B_FOLLOW_ALL_SIDES, B_WILL_DRAW),
      database_(database),
      portfolio_(portfolio),
      totalValue_(totalValue) {
    SetViewColor(colors::white);
}

void PrinterView::Draw(BRect page) {
    SetFont(be_plain_font);
    DrawTitles({page.left, page.top, page.right, page.top + BarHeight});
    const Rows rows = DrawInvestments(page);
    DrawFooter({page.left, page.bottom - BarHeight, page.right, page.bottom}, rows);
}

void PrinterView::DrawTitles(BRect bar) {
    Banner(this, "Quorvan Personal Portfolio Manager", &bar, BannerInverse | BannerCenter);
    DrawText(this, &bar, "Page 1  ", DrawTextRight | DrawTextMiddle);
    bar.OffsetBy(0, 2 * BarHeight);
    Banner(this, portfolio_, &bar, BannerInverse | BannerCenter);
    bar.OffsetBy(0, BarHeight);
    ReportText total;
    FormatReportTotal(totalValue_, total);
    SetHighColor(colors::black);
    DrawText(this, &bar, total, DrawTextLeft | DrawTextMiddle);
}

void PrinterView::SetTableFont(float pageWidth) {
    BFont font(*be_fixed_font);
    font.SetSize(std::min(font.Size(), LargestTableFont));
    while (font.StringWidth("m") * TableCharacters() > pageWidth && font.Size() > 1)
        font.SetSize(font.Size() - 1);
    SetFont(&font);
}

PrinterView::Rows PrinterView::DrawInvestments(BRect page) {
    SetTableFont(page.Width());
    auto columns = ReportColumns;
    PRINT_TABLE table(this, page.left, page.top + TableTop, ReportColumnCount, columns.data(), 0);
    table.DrawHeader();
    const float footerTop = page.bottom - BarHeight;
    Rows rows;
    hasAll_ = ForEachInvestment(*database_, portfolio_, [&](const INVESTMENT_DATA& record, long) {
        ++rows.all;
        rows.shown += table.RowEnd() <= footerTop;
        if (table.RowPosition() > footerTop) // unseen, and a hundred thousand would only make the file large
            return;
        ReportRow row;
        FillReportRow(record, row);
        table.DrawText(row[0], ReportCellSize);
    });
    SetFont(be_plain_font);
    table.DrawGridLines();
    return rows;
}

void PrinterView::DrawFooter(BRect bar, Rows rows) {
    ReportText text;
    FormatReportCount(rows.shown, rows.all, text);
    Banner(this, text, &bar, BannerInverse | BannerCenter);
    DrawText(this, &bar, "  Quorvan, version 1.0", DrawTextLeft | DrawTextMiddle);
    int year = 0;
    int month = 0;
    int day = 0;
    GetDate(&year, &month, &day);
    FormatReportDate(year, month, day, text);
    DrawText(this, &bar, text, DrawTextRight | DrawTextMiddle);
}
