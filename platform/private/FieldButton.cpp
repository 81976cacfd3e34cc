#include "platform/private/FieldButton.h"

#include <QKeyEvent>
#include <QMenu>
#include <QScreen>
#include <QStyleOptionButton>
#include <QWindow>

#include "platform/private/Mnemonics.h"

FieldButton::FieldButton() {
    setAutoDefault(false);
}

// The toolkit's own way to open it would not return before the menu is closed.
void FieldButton::SetMenu(QMenu* menu) {
    setMenu(menu);
    if (!menu)
        return;
    // One column that scrolls: the toolkit would go on in further columns, beyond the screen's edge.
    menu->setStyleSheet(QStringLiteral("QMenu { menu-scrollable: 1; }"));
    disconnect(this, &QPushButton::pressed, this, nullptr);
    connect(
        this, &QPushButton::pressed, this, [this] { Open(); });
    connect(menu, &QMenu::aboutToHide, this, [this] { setDown(false); });
}

// Below the button, or above it where the screen ends. Where neither has room for all of it, the toolkit
// uses the screen's whole height. A press outside only closes the menu.
void FieldButton::Open() {
    QMenu* opened = menu();
    if (!opened || opened->isVisible())
        return;
    opened->setMinimumWidth(width());
    const int height = opened->sizeHint().height();
    QPoint place = mapToGlobal(rect().bottomLeft() + QPoint(0, 1));
    if (place.y() + height > screen()->availableGeometry().bottom())
        place = mapToGlobal(QPoint(0, -height));
    opened->setAttribute(Qt::WA_NoMouseReplay);
    opened->winId();
    opened->windowHandle()->setTransientParent(window()->windowHandle());
    opened->popup(place);
    setDown(true);
}

void FieldButton::SetFullText(const QString& text) {
    fullText_ = text;
    setAccessibleDescription(text.trimmed());
    updateGeometry();
    Shorten();
}

QSize FieldButton::SizeFor(const QString& text) const {
    QStyleOptionButton option;
    initStyleOption(&option);
    option.text = text;
    QSize content = fontMetrics().size(Qt::TextSingleLine, text.isEmpty() ? QStringLiteral(" ") : text);
    content.rwidth() += style()->pixelMetric(QStyle::PM_MenuButtonIndicator, &option, this) +
                        fontMetrics().averageCharWidth();
    return style()->sizeFromContents(QStyle::CT_PushButton, &option, content, this);
}

QSize FieldButton::sizeHint() const {
    return SizeFor(fullText_);
}

// Less room than a few letters need is for the arrow alone.
void FieldButton::Shorten() {
    QStyleOptionButton option;
    initStyleOption(&option);
    const int frame = style()->pixelMetric(QStyle::PM_ButtonMargin, &option, this) +
                      2 * style()->pixelMetric(QStyle::PM_DefaultFrameWidth, &option, this);
    const int room = width() - frame - style()->pixelMetric(QStyle::PM_MenuButtonIndicator, &option, this);
    const bool fits = room >= fontMetrics().horizontalAdvance(fullText_);
    QString shown = fits ? fullText_ : fontMetrics().elidedText(fullText_, Qt::ElideMiddle, room);
    if (room < 3 * fontMetrics().averageCharWidth())
        shown.clear();
    setText(EscapeLabel(shown));
    setToolTip(fits ? QString() : fullText_);
}

void FieldButton::resizeEvent(QResizeEvent* event) {
    QPushButton::resizeEvent(event);
    Shorten();
}

void FieldButton::changeEvent(QEvent* event) {
    QPushButton::changeEvent(event);
    if (event->type() == QEvent::FontChange || event->type() == QEvent::StyleChange)
        Shorten();
}

// A field without a label stands beside the control that it fills: it is called after that one.
void FieldButton::showEvent(QShowEvent* event) {
    QPushButton::showEvent(event);
    if (!accessibleName().isEmpty())
        return;
    for (const QWidget* before = previousInFocusChain(); before != this;
         before = before->previousInFocusChain())
        if (before->focusPolicy() != Qt::NoFocus && !before->accessibleName().isEmpty()) {
            setAccessibleName(before->accessibleName() + QLatin1String(" choices"));
            return;
        }
}

void FieldButton::keyPressEvent(QKeyEvent* event) {
    switch (event->key()) {
    case Qt::Key_Up:
    case Qt::Key_Down:
    case Qt::Key_Space:
    case Qt::Key_Enter:
    case Qt::Key_Return:
        Open();
        break;
    default:
        QPushButton::keyPressEvent(event);
    }
}
