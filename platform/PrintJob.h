#pragma once

#include <memory>

#include "platform/Message.h"

class BView;
struct PrintJobPeer;

// One job for a printer or a PDF file, page by page, through the toolkit's own page and job dialogs. Units on
// the page are points (1/72 inch). Order of use: ConfigPage and ConfigJob (or SetSettings with what Settings
// gave earlier), BeginJob, then for each page DrawView and SpoolPage, then CommitJob. Interface thread.
//
// A set-up is a message with the fields "page size" (string, the toolkit's key, such as "A4"), "page width",
// "page height" and "left margin", "top margin", "right margin", "bottom margin" (floats, points, of the page
// held upright), "landscape" (bool), "printer" (string, empty for a file), "output file" (string), "copies"
// and "resolution" (int32), "colour" (bool).
class BPrintJob {
  public:
    explicit BPrintJob(const char* name);
    // A job that was begun and not committed is cancelled.
    ~BPrintJob();
    BPrintJob(const BPrintJob&) = delete;
    BPrintJob& operator=(const BPrintJob&) = delete;

    // What the job dialog calls a file, without folder and extension, while the person has named none.
    void ProposeFile(const char* name);

    // Each shows its dialog and waits: B_OK, or B_ERROR when the person cancels.
    status_t ConfigPage();
    status_t ConfigJob();

    // A new message with the page and job set-up, which the caller owns.
    [[nodiscard]] BMessage* Settings() const;
    // Takes the set-up from message; what it lacks keeps its default.
    void SetSettings(const BMessage* message);

    // False when the printer is not there, or printer or file cannot be opened; errno then says why for a
    // file.
    [[nodiscard]] bool BeginJob();
    // The part of the page that can be printed; its left top is (0, 0).
    [[nodiscard]] BRect PrintableRect() const;
    // Draws that part of the view, and of the views and controls in it that are not hidden, at the given
    // place of the page, in the view's own code. The view itself may be hidden.
    void DrawView(BView* view, BRect rect, BPoint where);
    // Ends the page; what is drawn next goes on a new one.
    void SpoolPage();
    // Hands the pages over, or puts the finished file in its place: until then one that was there before
    // stays. False when the job was not begun, or could not be written; errno then says why for a file, and
    // there is no new one.
    [[nodiscard]] bool CommitJob();
    // Drops the pages, and a file begun.
    void CancelJob();

  private:
    std::unique_ptr<PrintJobPeer> peer_;
};
