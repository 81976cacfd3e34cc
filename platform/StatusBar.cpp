#include "platform/StatusBar.h"

#include <algorithm>
#include <cmath>

#include <QGridLayout>
#include <QLabel>
#include <QProgressBar>
#include <QTimer>

#include "platform/private/Loop.h"
#include "platform/private/ViewPeer.h"

namespace {

constexpr int kSteps = 10000; // of the toolkit's bar, which counts in whole numbers
// As often as an eye can follow: painting every change would slow down a worker that makes a thousand of them
// in a second.
constexpr int kRefreshMilliseconds = 30;

// The bar with its texts above. Owns its children.
class StatusWidget : public QWidget {
    Q_DISABLE_COPY_MOVE(StatusWidget)

  public:
    StatusWidget() : text_(new QLabel(this)), trailing_(new QLabel(this)), bar_(new QProgressBar(this)) {
        text_->setTextFormat(Qt::PlainText);
        trailing_->setTextFormat(Qt::PlainText);
        bar_->setRange(0, kSteps);
        bar_->setTextVisible(false);
        bar_->setMinimumHeight(bar_->fontMetrics().height() / 2);
        auto* layout = new QGridLayout(this);
        layout->setContentsMargins(0, 0, 0, 0);
        layout->setVerticalSpacing(2);
        layout->addWidget(text_, 0, 0);
        layout->addWidget(trailing_, 0, 1);
        layout->addWidget(bar_, 1, 0, 1, 2);
        layout->setColumnStretch(0, 1);
        layout->setRowStretch(2, 1);
    }

    void SetNames(const QString& name) {
        bar_->setObjectName(name);
        text_->setObjectName(name + QLatin1String(" text"));
        setObjectName(name + QLatin1String(" container"));
    }

    void Show(const QString& text, const QString& trailing, float part) {
        text_->setText(text);
        trailing_->setText(trailing);
        bar_->setValue(static_cast<int>(std::lround(part * kSteps)));
        bar_->setAccessibleName(text);
    }

  private:
    QLabel* text_;
    QLabel* trailing_;
    QProgressBar* bar_;
};

StatusWidget* Widget(const BStatusBar* bar) {
    return static_cast<StatusWidget*>(ViewAccess::Widget(bar));
}

} // namespace

BStatusBar::BStatusBar(BRect frame, const char* name, const char* label, const char* trailingLabel)
    : BView(frame, name, B_FOLLOW_LEFT | B_FOLLOW_TOP, B_WILL_DRAW,
            std::make_unique<ViewPeer>(new StatusWidget)),
      label_(label ? label : ""),
      trailingLabel_(trailingLabel ? trailingLabel : "") {
    Widget(this)->SetNames(QString::fromUtf8(Name()));
    Refresh();
}

BStatusBar::~BStatusBar() = default;

void BStatusBar::SetMaxValue(float maximum) {
    const std::lock_guard guard(mutex_);
    maximum_ = std::max(maximum, 0.0F);
    value_ = std::min(value_, maximum_);
    ScheduleRefresh();
}

float BStatusBar::MaxValue() const {
    const std::lock_guard guard(mutex_);
    return maximum_;
}

float BStatusBar::CurrentValue() const {
    const std::lock_guard guard(mutex_);
    return value_;
}

void BStatusBar::Update(float delta, const char* text, const char* trailingText) {
    const std::lock_guard guard(mutex_);
    value_ = std::clamp(value_ + delta, 0.0F, maximum_);
    if (text)
        text_ = text;
    if (trailingText)
        trailing_ = trailingText;
    ScheduleRefresh();
}

void BStatusBar::SetText(const char* text) {
    const std::lock_guard guard(mutex_);
    text_ = text ? text : "";
    ScheduleRefresh();
}

std::string BStatusBar::Text() const {
    const std::lock_guard guard(mutex_);
    return text_;
}

// Called with mutex_ held. The widget lives as long as the view, and whoever calls from another thread holds
// the window's lock, so the view does.
void BStatusBar::ScheduleRefresh() {
    if (refreshPending_)
        return;
    refreshPending_ = true;
    RunOnInterfaceThread(
        [this] { QTimer::singleShot(kRefreshMilliseconds, Widget(this), [this] { Refresh(); }); },
        ViewAccess::Widget(this));
}

void BStatusBar::Refresh() {
    QString text;
    QString trailing;
    float part = 1;
    {
        const std::lock_guard guard(mutex_);
        refreshPending_ = false;
        text = QString::fromStdString(label_ + text_);
        trailing = QString::fromStdString(trailing_ + trailingLabel_);
        if (maximum_ > 0)
            part = value_ / maximum_;
    }
    Widget(this)->Show(text, trailing, part);
}
