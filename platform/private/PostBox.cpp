#include "platform/private/PostBox.h"

#include <sys/eventfd.h>
#include <unistd.h>

PostBox::PostBox()
    : wakeFd_(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)), notifier_(wakeFd_, QSocketNotifier::Read) {
    QObject::connect(
        &notifier_, &QSocketNotifier::activated, &notifier_, [this] { DoOne(); });
}

PostBox::~PostBox() {
    notifier_.setEnabled(false);
    close(wakeFd_);
}

void PostBox::Wake() const {
    const std::uint64_t one = 1;
    [[maybe_unused]] const auto written = write(wakeFd_, &one, sizeof one);
}

void PostBox::Post(std::function<void()> work, QObject* context) {
    {
        const std::lock_guard guard(mutex_);
        queue_.push_back({std::move(work), context, context != nullptr});
    }
    Wake();
}

void PostBox::DoOne() {
    std::uint64_t wakes = 0;
    [[maybe_unused]] const auto got = read(wakeFd_, &wakes, sizeof wakes);
    Item item;
    {
        const std::lock_guard guard(mutex_);
        if (queue_.empty())
            return;
        item = std::move(queue_.front());
        queue_.pop_front();
        if (!queue_.empty())
            Wake();
    }
    if (!item.hasContext || item.context)
        item.work();
}
