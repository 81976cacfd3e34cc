#include "app/ConnectionCheck.h"

#include <algorithm>
#include <mutex>
#include <string>

#include "dialogs/BDialog.h"
#include "platform/Handler.h"
#include "platform/Kernel.h"
#include "platform/Message.h"
#include "platform/StringView.h"
#include "quotes/QuoteRetrieval.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr uint32 MessageAnswered = 1070; // from the look-up's thread to the dialog
constexpr bigtime_t Instant = 100'000;   // microseconds in which nobody misses a word
constexpr float LeastWidth = 250;
constexpr float FirstHeight = 100;
constexpr float Margin = 10;

// What the look-up's thread and the one that waits for it share.
struct LookUp {
    const char* host;
    sem_id answered; // gone once there is an answer
    bool found = false;
    std::mutex mutex{}; // guards what follows
    bool ended = false;
    BMessenger dialog{}; // to be told of the end
};

int32 LookForHost(void* data) {
    auto* lookUp = static_cast<LookUp*>(data);
    lookUp->found = IsConnected(lookUp->host, thread_stop_fd());
    delete_sem(lookUp->answered);
    const std::lock_guard guard(lookUp->mutex);
    lookUp->ended = true;
    lookUp->dialog.SendMessage(BMessage(MessageAnswered));
    return 0;
}

// A longer name, which no host has, would put Cancel off the screen.
constexpr std::size_t LongestShown = 63;

std::string Sentence(const char* host) {
    return "Looking for " + std::string(CutToBytes(host, LongestShown)) + "...";
}

// Says what is waited for, until the answer comes or the person cancels.
class ConnectionDialog : public BDialog {
  public:
    ConnectionDialog(BPoint leftTop, const char* host)
        : BDialog({leftTop.x, leftTop.y, leftTop.x + WidthFor(host), leftTop.y + FirstHeight},
                  "Looking for a connection", DialogHasCancel) {
        ResizeTo(Bounds().Width(), 6 * FontHeight());
        Form()->AddChild(
            new BStringView({Margin, Margin, Bounds().right - Margin, Margin + 1.5F * FontHeight()}, "host",
                            Sentence(host).c_str()));
    }

    int HandleMessage(BMessage* message) override { return message->what == MessageAnswered ? 2 : 0; }

  private:
    static float WidthFor(const char* host) {
        return std::max(FormWidth(LeastWidth),
                        be_plain_font->StringWidth(Sentence(host).c_str()) + 3 * Margin);
    }
};

// False when the look-up has ended and will tell nobody.
bool WillTell(LookUp& lookUp, const BDialog* dialog) {
    const std::lock_guard guard(lookUp.mutex);
    lookUp.dialog = BMessenger(dialog);
    return !lookUp.ended;
}

// The dialog is made only now: an application that quits takes down every window that waits to be shown.
// False when the person cancelled.
bool WaitWithDialog(LookUp& lookUp, BPoint leftTop) {
    auto* dialog = new ConnectionDialog(leftTop, lookUp.host);
    if (WillTell(lookUp, dialog))
        return dialog->DoModal() == DialogOk;
    dialog->Quit();
    return true;
}

} // namespace

Connection CheckConnection(const char* host, BPoint leftTop) {
    LookUp lookUp{host, create_sem(0, "look-up")};
    const thread_id thread = spawn_thread(LookForHost, "look-up", suggest_thread_priority(), &lookUp);
    if (thread <= 0 || resume_thread(thread) != B_OK) {
        delete_sem(lookUp.answered);
        return Connection::NotFound;
    }
    const bool isWaitedFor =
        acquire_sem_etc(lookUp.answered, 1, B_RELATIVE_TIMEOUT, Instant) != B_TIMED_OUT ||
        WaitWithDialog(lookUp, leftTop);
    kill_thread(thread); // it works with what lies on this stack
    if (!isWaitedFor)
        return Connection::Cancelled;
    return lookUp.found ? Connection::Found : Connection::NotFound;
}
