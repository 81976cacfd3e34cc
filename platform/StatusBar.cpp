#include "platform/StatusBar.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include <QLabel>
#include <QProgressBar>
#include <QTimer>
#include <QVBoxLayout>

#include "platform/private/ViewPeer.h"

namespace {

constexpr int Steps = 10000; // of the toolkit's bar, which counts in whole numbers
// As often as an eye can follow: painting every change would slow down a worker that makes a thousand of them
// in a second.
constexpr int RefreshMilliseconds = 30;

// The bar with its text above. Owns its children.
class StatusWidget : public QWidget {
    Q_DISABLE_COPY_MOVE(StatusWidget)

  public:
    StatusWidget() : text_(new QLabel(this)), bar_(new QProgressBar(this)) {
        text_->setTextFormat(Qt::PlainText);
        bar_->setRange(0, Steps);
        bar_->setTextVisible(false);
        bar_->setMinimumHeight(bar_->fontMetrics().height() / 2);
        auto* layout = new QVBoxLayout(this);
        layout->setContentsMargins(0, 0, 0, 0);
        layout->setSpacing(2);
        layout->addWidget(text_);
        layout->addWidget(bar_);
        layout->addStretch(1);
    }

    void SetNames(const QString& name) {
        bar_->setObjectName(name);
        text_->setObjectName(name + QLatin1String(" text"));
        setObjectName(name + QLatin1String(" container"));
    }

    void Show(const QString& text, float part) {
        text_->setText(text);
        bar_->setValue(static_cast<int>(std::lround(part * Steps)));
        bar_->setAccessibleName(text);
    }

  private:
    QLabel* text_;
    QProgressBar* bar_;
};

StatusWidget* Widget(const BStatusBar* bar) {
    return static_cast<StatusWidget*>(ViewAccess::Widget(bar));
}

} // namespace

BStatusBar::BStatusBar(BRect frame, const char* name, const char* label)
    : BView(frame, name, B_FOLLOW_LEFT | B_FOLLOW_TOP, B_WILL_DRAW,
            std::make_unique<ViewPeer>(new StatusWidget)),
      label_(label) {
    Widget(this)->SetNames(QString::fromUtf8(Name()));
    Refresh();
    auto* timer = new QTimer(Widget(this));
    QObject::connect(timer, &QTimer::timeout, Widget(this), [this] { Refresh(); });
    timer->start(RefreshMilliseconds);
}

void BStatusBar::SetMaxValue(float maximum) {
    const std::lock_guard guard(mutex_);
    maximum_ = std::max(maximum, 0.0F);
    value_ = std::min(value_, maximum_);
    changed_ = true;
}

void BStatusBar::Update(float delta) {
    const std::lock_guard guard(mutex_);
    value_ = std::clamp(value_ + delta, 0.0F, maximum_);
    changed_ = true;
}

void BStatusBar::SetText(const char* text) {
    const std::lock_guard guard(mutex_);
    text_ = text ? text : "";
    changed_ = true;
}

void BStatusBar::Refresh() {
    std::string text;
    float part = 1;
    {
        const std::lock_guard guard(mutex_);
        if (!std::exchange(changed_, false))
            return;
        text = label_ + text_;
        if (maximum_ > 0)
            part = value_ / maximum_;
    }
    // Without the mutex: the toolkit paints at once, and that waits for a worker which holds the window's
    // lock and may be about to update the bar.
    Widget(this)->Show(QString::fromStdString(text), part);
}
