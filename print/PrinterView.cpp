#include "print/PrinterView.h"

#include <algorithm>
#include <array>

#include "app/model/InvestmentTexts.h"
#include "app/model/PortfolioRules.h"
#include "print/PrintTable.h"
#include "util/Dates.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float BarHeight = 18;
constexpr float TableTop = 90;
constexpr float LargestFont = 12;
constexpr float LeastTableFont = 8; // before rows are left out
constexpr float LeastBarFont = 5;   // before the middle text is left out
constexpr float SizeStep = 0.25F;
constexpr float Gap = 6; // between two texts of a bar
constexpr float CornerRadius = 20;

constexpr std::array<TABLE_COLUMN_ENTRY, ReportColumnCount> ReportColumns = {{
    {24, "Name", DrawTextLeft},
    {8, "Ticker", DrawTextLeft},
    {10, "Shares", DrawTextRight},
    {10, "Price", DrawTextRight},
    {10, "Value", DrawTextRight},
    {12, "Agent", DrawTextLeft},
    {7, "Risk", DrawTextLeft},
}};

constexpr std::size_t TableCharacters() {
    std::size_t all = 0;
    for (const TABLE_COLUMN_ENTRY& column : ReportColumns)
        all += static_cast<std::size_t>(column.characters);
    return all;
}

uint8 Placement(short flags) {
    if (flags & BannerRight)
        return DrawTextRight;
    if (flags & BannerLeft)
        return DrawTextLeft;
    return flags & BannerCenter ? DrawTextCenter : DrawTextLeft;
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
    const BRect place(page.left, page.top + TableTop, page.right, page.bottom - BarHeight);
    BFont least(*be_fixed_font);
    least.SetSize(std::min(least.Size(), LeastTableFont));
    least = FittingFont(least, std::string(TableCharacters(), 'm'), place.Width());
    std::vector<Row> rows;
    const long all = ReadRows(PRINT_TABLE::RowsWithin(place.Height(), least), rows);
    DrawTable(place, rows);

    ReportText count, date;
    FormatReportCount(static_cast<long>(rows.size()), all, count);
    int year = 0, month = 0, day = 0;
    GetDate(&year, &month, &day);
    FormatReportDate(year, month, day, date);
    const Bar bars[] = {{"", "Quorvan Personal Portfolio Manager", "Page 1  "},
                        {"", portfolio_, ""},
                        {TotalValueText(totalValue_), "", ""},
                        {"  Quorvan, version " QUORVAN_VERSION, count, date}};
    SetBarFont(page.Width(), bars);
    const float tops[] = {page.top, page.top + 2 * BarHeight, page.top + 3 * BarHeight, place.bottom};
    for (std::size_t i = 0; i < std::size(bars); ++i)
        DrawBar({page.left, tops[i], page.right, tops[i] + BarHeight}, bars[i]);
}

long PrinterView::ReadRows(long wanted, std::vector<Row>& rows) {
    long all = 0;
    hasAll_ = ForEachInvestment(*database_, portfolio_, [&](const INVESTMENT_DATA& record, long) {
        if (all++ < wanted)
            FillReportRow(record, rows.emplace_back().cells);
    });
    return all;
}

bool PrinterView::SetTableFont(BRect place, long rowCount) {
    BFont font(*be_fixed_font);
    font.SetSize(std::min(font.Size(), LargestFont));
    font = FittingFont(font, std::string(TableCharacters(), 'm'), place.Width());
    const float widest = font.Size();
    while (PRINT_TABLE::RowsWithin(place.Height(), font) < rowCount && font.Size() > LeastTableFont)
        font.SetSize(std::max(font.Size() - SizeStep, LeastTableFont));
    SetFont(&font);
    return font.Size() < widest;
}

void PrinterView::DrawTable(BRect place, const std::vector<Row>& rows) {
    // Rows that became less high leave the columns their width.
    const bool areLower = SetTableFont(place, static_cast<long>(rows.size()));
    auto columns = ReportColumns;
    PRINT_TABLE table(this, place.left, place.top, ReportColumnCount, columns.data(),
                      areLower ? place.Width() : 0);
    table.DrawHeader();
    for (const Row& row : rows)
        table.Measure(row.cells[0], ReportCellSize);
    for (const Row& row : rows)
        table.DrawText(row.cells[0], ReportCellSize);
    SetFont(be_plain_font);
    table.DrawGridLines();
}

bool PrinterView::Fits(const Bar& bar, float width) const {
    const float left = StringWidth(bar.left.c_str());
    const float middle = StringWidth(bar.middle.c_str());
    const float right = StringWidth(bar.right.c_str());
    return middle / 2 + Gap + std::max(left, right) <= width / 2 && left + Gap + right <= width;
}

void PrinterView::SetBarFont(float width, std::span<const Bar> bars) {
    BFont font(*be_plain_font);
    font.SetSize(std::min(font.Size(), LargestFont));
    SetFont(&font);
    while (font.Size() > LeastBarFont &&
           std::any_of(bars.begin(), bars.end(), [&](const Bar& bar) { return !Fits(bar, width); })) {
        font.SetSize(font.Size() - SizeStep);
        SetFont(&font);
    }
}

void PrinterView::DrawBar(BRect frame, const Bar& bar) {
    const bool hasSides = !bar.left.empty() || !bar.right.empty();
    const bool black = !bar.middle.empty();
    if (black)
        Banner(this, hasSides && !Fits(bar, frame.Width()) ? "" : bar.middle.c_str(), &frame,
               BannerInverse | BannerCenter);
    else
        SetHighColor(colors::black);
    DrawText(this, &frame, bar.left.c_str(), DrawTextLeft | DrawTextMiddle);
    DrawText(this, &frame, bar.right.c_str(), DrawTextRight | DrawTextMiddle);
}

void Banner(BView* view, const char* text, const BRect* rect, short flags) {
    const bool inverse = (flags & BannerInverse) != 0;
    view->SetHighColor(inverse ? colors::black : colors::white);
    if (flags & BannerRounded)
        view->FillRoundRect(*rect, CornerRadius, CornerRadius);
    else
        view->FillRect(*rect);
    view->SetHighColor(inverse ? colors::white : colors::black);
    DrawText(view, rect, text, static_cast<uint8>(Placement(flags) | DrawTextMiddle));
}
