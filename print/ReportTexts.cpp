#include "print/ReportTexts.h"

#include "util/CharacterBuffer.h"
#include "util/Dates.h"
#include "util/Numbers.h"

namespace {

void FillNumber(float value, int decimals, char (&cell)[ReportCellSize]) {
    char text[FormatNumberSize];
    FormatNumber(value, text, decimals);
    if (!CopyText(cell, text))
        CopyText(cell, "#####");
}

} // namespace

void FillReportRow(const INVESTMENT_DATA& record, ReportRow& row) {
    CopyText(row[0], FieldText(record.Name));
    CopyText(row[1], FieldText(record.Ticker));
    FillNumber(record.Shares, 3, row[2]);
    FillNumber(record.Price, 2, row[3]);
    FillNumber(record.Value, 2, row[4]);
    CopyText(row[5], FieldText(record.Agent));
    CopyText(row[6], FieldText(record.Risk));
}

void FormatReportDate(int year, int month, int day, ReportText& out) {
    char date[FormatDateSize];
    FormatInto(date, sizeof date, "%.4d%.2d%.2d", year, month, day);
    FormatDate(date, date, 2);
    FormatInto(out, sizeof out, "%s  ", date);
}

void FormatReportCount(long shown, long all, ReportText& out) {
    const char* const plural = all == 1 ? "" : "s";
    if (shown < all)
        FormatInto(out, sizeof out, "%ld of %ld investment%s", shown, all, plural);
    else
        FormatInto(out, sizeof out, "%ld investment%s", all, plural);
}
