#pragma once

#include <memory>

#include "platform/Message.h"

class BView;
struct PrintJobPeer;

// One job for a printer or a PDF file, page by page, through the toolkit's own page and job dialogs. Units on
// the page are points (1/72 inch). Order of use: ConfigPage and ConfigJob (or SetSettings with what Settings
// gave earlier), BeginJob, then for each page DrawView and SpoolPage, then CommitJob. Interface thread.
class BPrintJob {
  public:
    explicit BPrintJob(const char* name);
    // A job that was begun and not committed is cancelled.
    ~BPrintJob();
    BPrintJob(const BPrintJob&) = delete;
    BPrintJob& operator=(const BPrintJob&) = delete;

    // Each shows its dialog and waits: B_OK, or B_ERROR when the person cancels.
    status_t ConfigPage();
    status_t ConfigJob();

    // A new message with the page and job set-up, which the caller owns.
    [[nodiscard]] BMessage* Settings() const;
    // Takes the set-up from message; what it lacks keeps its default.
    void SetSettings(const BMessage* message);

    // False when the printer or file cannot be opened.
    [[nodiscard]] bool BeginJob();
    [[nodiscard]] bool CanContinue() const;
    [[nodiscard]] BRect PaperRect() const;
    // The part of the page that can be printed; its left top is (0, 0).
    [[nodiscard]] BRect PrintableRect() const;
    // Draws that part of the view, and of what lies in it, at the given place of the page, in the view's own
    // code.
    void DrawView(BView* view, BRect rect, BPoint where);
    // Ends the page; what is drawn next goes on a new one.
    void SpoolPage();
    void CommitJob();
    void CancelJob();

  private:
    std::unique_ptr<PrintJobPeer> peer_;
};
