#include "ColumnListView/MouseWatcher.h"

#include <mutex>

#include "platform/Kernel.h"

namespace {

constexpr bigtime_t PollInterval = 50000; // microseconds
constexpr int32 Priority = 10;

} // namespace

// What the thread and the watcher share; lives until both are gone.
struct MouseWatcher::Watch {
    BMessenger target;
    BPoint pressedAt;
    uint32 buttons = 0;
    int32 press = 0;

    std::mutex mutex;            // guards view
    const BView* view = nullptr; // null once the watcher is destroyed

    // Looks once and reports. False when there is nothing more to look at.
    bool Poll();
    bool Look(BPoint* where, uint32* held);
    [[nodiscard]] bool Report(uint32 code, BPoint where, uint32 held) const;
};

bool MouseWatcher::Watch::Look(BPoint* where, uint32* held) {
    const std::lock_guard guard(mutex);
    if (view)
        view->GetMouse(where, held);
    return view != nullptr;
}

bool MouseWatcher::Watch::Report(uint32 code, BPoint where, uint32 held) const {
    BMessage message(code);
    message.AddPoint("where", where);
    message.AddInt32("buttons", static_cast<int32>(held));
    message.AddInt32("modifiers", static_cast<int32>(modifiers()));
    message.AddInt32("press", press);
    return target.SendMessage(message) == B_OK;
}

bool MouseWatcher::Watch::Poll() {
    const status_t locked = target.LockTargetWithTimeout(PollInterval);
    if (locked == B_TIMED_OUT)
        return target.IsValid();
    if (locked != B_OK)
        return false;
    BPoint where;
    uint32 held = 0;
    const bool looked = Look(&where, &held);
    target.UnlockTarget();
    if (!looked)
        return false;
    if (held == 0) {
        [[maybe_unused]] const bool heard = Report(MouseWatcherUp, where, held);
        return false;
    }
    if (held != buttons)
        return Report(MouseWatcherDown, where, held);
    return where == pressedAt || Report(MouseWatcherMoved, where, held);
}

std::unique_ptr<MouseWatcher> MouseWatcher::Start(const BView* view, BPoint pressedAt, uint32 buttons,
                                                  int32 press) {
    auto watch = std::make_shared<Watch>();
    watch->target = BMessenger(view);
    watch->pressedAt = pressedAt;
    watch->buttons = buttons;
    watch->press = press;
    watch->view = view;
    auto data = std::make_unique<std::shared_ptr<Watch>>(watch);
    const thread_id thread = spawn_thread(Run, "MouseWatcher", Priority, data.get());
    if (thread <= 0 || resume_thread(thread) != B_OK)
        return nullptr;
    [[maybe_unused]] auto* handedOver = data.release(); // Run deletes it
    return std::unique_ptr<MouseWatcher>(new MouseWatcher(std::move(watch)));
}

int32 MouseWatcher::Run(void* data) {
    const std::unique_ptr<std::shared_ptr<Watch>> watch(static_cast<std::shared_ptr<Watch>*>(data));
    while (snooze(PollInterval) == B_OK && (*watch)->Poll()) {
    }
    return 0;
}

MouseWatcher::MouseWatcher(std::shared_ptr<Watch> watch) : watch_(std::move(watch)) {}

MouseWatcher::~MouseWatcher() {
    const std::lock_guard guard(watch_->mutex);
    watch_->view = nullptr;
}
