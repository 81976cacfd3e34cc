#include "quotes/update/UpdateWindow.h"

#include <utility>

#include "ColumnListView/ColumnListView.h"
#include "app/model/PortfolioRules.h"
#include "app/rows/NorvelItem.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "platform/Application.h"
#include "platform/StatusBar.h"
#include "quotes/QuoteObserver.h"
#include "quotes/QuoteRetrieval.h"
#include "quotes/run/PriceUpdate.h"
#include "util/CharacterBuffer.h"
#include "util/Numbers.h"
#include "util/Strings.h"
#include "util/WholeFile.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr const char* MainWindowTitle = "Quorvan";
constexpr float Width = 200;
constexpr float Height = 60;
constexpr float Margin = 10;
constexpr std::size_t MaxSources = 1'000'000;
constexpr bigtime_t LockPatience = 20'000; // microseconds between looks at the stop request

std::vector<int32> RecordNumbers(const ColumnListView* list) {
    const bool all = list->CurrentSelection() < 0;
    std::vector<int32> numbers;
    for (int32 i = 0; i < list->CountItems(); ++i)
        if (all || list->IsItemSelected(i))
            numbers.push_back(static_cast<const NorvelItem*>(list->ItemAt(i))->RecordNumber());
    return numbers;
}

// Remembers whether the source asked last was one that cannot be trusted.
class RefusedCertificate : public QuoteObserver {
  public:
    void SourceTried(const QuoteSource& /*source*/) override { host_.clear(); }
    void CertificateRefused(const char* host) override { host_ = host; }
    // Empty for no.
    [[nodiscard]] const std::string& Host() const { return host_; }

  private:
    std::string host_;
};

} // namespace

UpdateWindow::UpdateWindow(BPoint leftTop, const char* portfolioName, DATABASE* database,
                           const ColumnListView* list)
    : BWindow({leftTop.x, leftTop.y, leftTop.x + Width, leftTop.y + Height}, "Getting current prices...",
              B_FLOATING_WINDOW_LOOK, B_MODAL_APP_WINDOW_FEEL,
              B_NOT_RESIZABLE | B_NOT_ZOOMABLE | B_WILL_ACCEPT_FIRST_CLICK),
      recordNumbers_(RecordNumbers(list)),
      database_(database),
      portfolioName_(portfolioName),
      log_(app_state->logPath) {
    if (const BWindow* mainWindow = GetAppWindow(be_app, MainWindowTitle))
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
    auto* topView = new BView(Bounds(), "top view", B_FOLLOW_ALL_SIDES, B_WILL_DRAW);
    topView->SetViewColor(colors::gray);
    AddChild(topView);
    BRect frame = Bounds();
    frame.InsetBy(Margin, Margin);
    statusBar_ = new BStatusBar(frame, "Status Bar", "Checking:");
    statusBar_->SetMaxValue(maximum);
    topView->AddChild(statusBar_);
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
    self->UpdateAll();
    self->TellMainWindow(thread_stop_requested());
    self->ended_ = true;
    self->PostMessage(B_QUIT_REQUESTED);
    return 0;
}

void UpdateWindow::UpdateAll() {
    // Whatever is wrong with the file, GetPriceQuote tells.
    static_cast<void>(ReadWholeFile(app_state->quoteSourcePath, sources_, MaxSources));
    for (const int32 recordNumber : recordNumbers_)
        if (thread_stop_requested() || !UpdateOne(recordNumber))
            break;
    lastConnection_.Close();
    log_.Write();
    isOnDisk_ = database_->Sync() == 0;
}

bool UpdateWindow::UpdateOne(int32 recordNumber) {
    INVESTMENT_DATA record;
    if (!ReadInvestment(*database_, recordNumber, &record)) {
        log_.Add("Database Read() error -1\n");
        return false;
    }
    const std::string ticker(FieldText(record.Ticker));
    // Without a ticker a page could only give the price of something else.
    if (IsBlank(ticker)) {
        log_.Add("No ticker for '" + std::string(FieldText(record.Name)) + "'\n");
        ShowProgress();
        return true;
    }
    log_.Add("Checking price for '" + ticker + "'\n");
    ShowTicker(ticker.c_str());
    RefusedCertificate refused;
    QuoteContext context;
    context.observer = &refused;
    context.sourcePath = app_state->quoteSourcePath;
    context.log = &log_;
    context.lastConnection = &lastConnection_;
    context.stopFd = thread_stop_fd();
    const float quote = sources_.empty() ? GetPriceQuote(ticker.c_str(), context)
                                         : GetPriceQuoteFrom(sources_, ticker.c_str(), context);
    // Whatever a call that was cut short answers, it says nothing about the price.
    if (thread_stop_requested())
        return false;
    char number[64];
    FormatFixed(quote, number, sizeof number, 2);
    log_.Add(std::string("GetPriceQuote() returned ") + number + "\n");
    if (!Apply(quote, refused.Host().c_str(), recordNumber, &record))
        return false;
    ShowProgress();
    return true;
}

bool UpdateWindow::Apply(float quote, const char* refused, int32 recordNumber, INVESTMENT_DATA* record) {
    if (ApplyQuote(*record, quote) == QuoteOutcome::Failed) {
        log_.Write();
        if (*refused == '\0')
            TellNotConnected();
        else
            TellNotTrusted(refused);
        return false;
    }
    if (database_->Write(recordNumber, record) != 0) {
        TellNotSaved();
        return false;
    }
    return true;
}

void UpdateWindow::ShowTicker(const char* ticker) {
    if (!LockUnlessStopped())
        return;
    statusBar_->SetText((std::string(" ") + ticker).c_str());
    Unlock();
}

void UpdateWindow::ShowProgress() {
    if (!LockUnlessStopped())
        return;
    statusBar_->Update(1);
    Unlock();
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
