#include "quotes/update/UpdateWindow.h"

#include <utility>

#include "ColumnListView/ColumnListView.h"
#include "app/rows/NorvelItem.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "platform/Application.h"
#include "platform/StatusBar.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float Width = 200;
constexpr float Height = 60;
constexpr float Margin = 10;
constexpr bigtime_t LockPatience = 20'000; // microseconds between looks at the stop request

std::vector<long> RecordNumbers(const ColumnListView* list) {
    const bool all = list->CurrentSelection() < 0;
    std::vector<long> numbers;
    for (int32 i = 0; i < list->CountItems(); ++i)
        if (all || list->IsItemSelected(i))
            numbers.push_back(static_cast<const NorvelItem*>(list->ItemAt(i))->RecordNumber());
    return numbers;
}

} // namespace

UpdateWindow::UpdateWindow(BPoint leftTop, const char* portfolioName, DATABASE* database,
                           const ColumnListView* list)
    : BWindow({leftTop.x, leftTop.y, leftTop.x + Width, leftTop.y + Height}, "Getting current prices...",
              B_FLOATING_WINDOW_LOOK, B_MODAL_APP_WINDOW_FEEL,
              B_NOT_RESIZABLE | B_NOT_ZOOMABLE | B_WILL_ACCEPT_FIRST_CLICK),
      recordNumbers_(RecordNumbers(list)),
      database_(database),
      portfolioName_(portfolioName) {
    if (const BWindow* mainWindow = GetAppWindow(be_app, WindowTitle))
        mainWindow_ = BMessenger(mainWindow);
    AddStatusBar(static_cast<float>(recordNumbers_.size()) + 1);
    Show();
    StartWorker();
}

UpdateWindow::~UpdateWindow() {
    if (worker_ > 0)
        kill_thread(worker_);
}

void UpdateWindow::AddStatusBar(float maximum) {
    BRect frame = Bounds();
    frame.InsetBy(Margin, Margin);
    statusBar_ = new BStatusBar(frame, "Status Bar", "Checking:");
    statusBar_->SetMaxValue(maximum);
    AddTopView(*this)->AddChild(statusBar_);
}

void UpdateWindow::StartWorker() {
    Lock();
    statusBar_->Update(1);
    worker_ = spawn_thread(updateThread, "updateThread", suggest_thread_priority(), this);
    if (worker_ <= 0 || resume_thread(worker_) != B_OK) {
        ended_ = true;
        TellMainWindow(true);
        PostMessage(B_QUIT_REQUESTED);
    }
    Unlock();
}

void UpdateWindow::MessageReceived(BMessage* message) {
    if (message->what == B_QUIT_REQUESTED && !ended_) {
        stop_thread(worker_); // which asks again at its end
        return;
    }
    BWindow::MessageReceived(message);
}

bool UpdateWindow::QuitRequested() {
    if (isWaiting_)
        return false;
    isWaiting_ = true;
    kill_thread(worker_);
    isWaiting_ = false;
    PostMessage(B_QUIT_REQUESTED); // in case the application goes on after all
    if (!std::exchange(isOnDisk_, true))
        TellNotSaved();
    return true;
}

int32 UpdateWindow::updateThread(void* window) {
    auto* self = static_cast<UpdateWindow*>(window);
    QuoteContext context;
    context.sourcePath = app_state->quoteSourcePath;
    context.logPath = app_state->logPath;
    context.stopFd = thread_stop_fd();
    self->isOnDisk_ = PriceRun(*self->database_, context, *self).Run(self->recordNumbers_);
    self->TellMainWindow(thread_stop_requested());
    self->ended_ = true;
    self->PostMessage(B_QUIT_REQUESTED);
    return 0;
}

void UpdateWindow::Asking(const std::string& ticker) {
    if (!LockUnlessStopped())
        return;
    statusBar_->SetText((" " + ticker).c_str());
    Unlock();
}

void UpdateWindow::Done(const PriceRunResult& result) {
    switch (result.outcome) {
    case QuoteOutcome::NotRead:
        break;
    case QuoteOutcome::NotSaved:
        TellNotSaved();
        break;
    case QuoteOutcome::Failed:
        if (result.refusedHost.empty())
            TellNotConnected();
        else
            TellNotTrusted(result.refusedHost.c_str());
        break;
    default:
        if (LockUnlessStopped()) {
            statusBar_->Update(1);
            Unlock();
        }
    }
}

bool UpdateWindow::LockUnlessStopped() {
    while (!thread_stop_requested())
        if (LockWithTimeout(LockPatience) == B_OK)
            return true;
    return false;
}

void UpdateWindow::TellMainWindow(bool cancelled) const {
    mainWindow_.SendMessage(BMessage(MessageUpdateEnded));
    if (cancelled)
        return;
    BMessage message(MessagePortfolioSelected);
    message.AddString(PortfolioNameField, portfolioName_.c_str());
    mainWindow_.SendMessage(message);
}
