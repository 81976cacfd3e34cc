#pragma once

#include <atomic>
#include <string>
#include <vector>

#include "platform/Kernel.h"
#include "platform/Message.h"
#include "platform/Window.h"
#include "quotes/run/PriceRun.h"

class BStatusBar;
class ColumnListView;

// Brings the prices of a portfolio's investments up to date, one after another on a worker thread, and shows
// how far it has come. At the end it asks the main window to show the portfolio anew, and goes. Closing it
// cancels what remains: an investment in hand is then wholly updated or as it was.
//
// The caller creates it with new on the interface thread and keeps no pointer to it; it deletes itself. It
// does not touch the records itself (PriceRun does) and looks at the list no more once it is built. While it
// is there the person can do nothing else in the program, and the worker has the investment file to itself:
// the database must outlive the window, and app_state both.
class UpdateWindow : public BWindow, private PriceRunObserver {
  public:
    // Builds and shows the window with its left top corner at the given place of the screen, and starts on
    // the list's selected rows, or all of them when none is selected. The rows are NorvelItems. An investment
    // without a ticker keeps its price.
    UpdateWindow(BPoint leftTop, const char* portfolioName, DATABASE* database, const ColumnListView* list);
    // Stops the worker, if it still runs, and waits until it has ended, which it does promptly.
    ~UpdateWindow() override;

    // When it is closed it asks the worker to end and goes once that has happened: the person is kept out of
    // the program until then.
    void MessageReceived(BMessage* message) override;
    // Stops the worker and waits for its end, for when the application quits. Tells when what the worker
    // wrote may not be on the disk.
    bool QuitRequested() override;

  private:
    static int32 updateThread(void* window);

    void AddStatusBar(float maximum);
    void StartWorker();

    // --- on the worker ---
    void Asking(const std::string& ticker) override;
    void Done(const PriceRunResult& result) override;
    // False, without the lock, when the worker is to stop: then the window may be going, and its lock would
    // never come.
    [[nodiscard]] bool LockUnlessStopped();
    // Tells the main window that the investment file is its own again, and has it show the new prices unless
    // the run was cancelled.
    void TellMainWindow(bool cancelled) const;

    BStatusBar* statusBar_ = nullptr; // the window's
    thread_id worker_ = -1;
    std::vector<long> recordNumbers_; // of the investments to be asked for, in the list's order
    DATABASE* database_;
    std::string portfolioName_;
    bool isOnDisk_ = true; // what the worker wrote; to be looked at when that has ended
    std::atomic<bool> ended_ = false;
    bool isWaiting_ = false; // for the worker's end; what comes meanwhile must not delete the window
    BMessenger mainWindow_;  // found at the start, on the thread on which windows come and go
};
