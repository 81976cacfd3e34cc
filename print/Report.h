#pragma once

#include <memory>

#include "platform/Message.h"

class BPrintJob;
class BWindow;
class DATABASE;

// The report as a print job, for the main window and for the command line. Interface thread.

enum class ReportResult {
    Printed,
    Cancelled,  // in a dialog
    NotPrinted, // printer or file could not be opened or written; errno says why for a file
    NotRead,    // the investments could not all be read
};

// What the desktop's list of jobs calls it.
inline constexpr const char* ReportJobName = "Quorvan";

// Prints the portfolio's report, exactly one page, on a job that is set up and not begun. The page's view is
// attached to window meanwhile; null for none. Unless the result is Printed, nothing was. The investment
// file's result set is left on the portfolio.
[[nodiscard]] ReportResult PrintReport(BPrintJob& job, BWindow* window, const char* portfolio,
                                       DATABASE& investments);

// What a job starts from: margins of half an inch, within which any printer prints.
[[nodiscard]] BMessage FirstPrintSettings();

// Makes the whole job for a window, which must be locked. Without kept settings it shows the page dialog and
// the job dialog, which proposes the portfolio's name for a file, and keeps what was chosen there; otherwise
// it only asks before it replaces a file, and shows the job dialog for another one. With settings that were
// cancelled halfway or could not be printed with, the next job's dialogs are shown again and start from
// these.
[[nodiscard]] ReportResult RunReportJob(BWindow* window, const char* portfolio, DATABASE& investments,
                                        std::unique_ptr<BMessage>& settings);
