#include "platform/private/ViewWidget.h"

#include <algorithm>
#include <utility>

#include <QAccessible>
#include <QKeyEvent>
#include <QMouseEvent>
#include <QPaintEvent>
#include <QPainter>

#include "platform/View.h"
#include "platform/private/Convert.h"
#include "platform/private/Loop.h"
#include "platform/private/ViewPeer.h"

namespace {

struct KeyCode {
    int toolkit;
    char ours;
};
constexpr KeyCode KeyCodes[] = {{Qt::Key_Home, B_HOME},       {Qt::Key_End, B_END},
                                {Qt::Key_Return, B_ENTER},    {Qt::Key_Enter, B_ENTER},
                                {Qt::Key_Left, B_LEFT_ARROW}, {Qt::Key_Right, B_RIGHT_ARROW},
                                {Qt::Key_Up, B_UP_ARROW},     {Qt::Key_Down, B_DOWN_ARROW}};

// 0 for a key that views do not hear of.
char OurKey(const QKeyEvent& event) {
    if (event.modifiers() & ~(Qt::ShiftModifier | Qt::KeypadModifier))
        return 0;
    for (const KeyCode& code : KeyCodes)
        if (code.toolkit == event.key())
            return code.ours;
    const QString text = event.text();
    return text.size() == 1 && text[0] >= QLatin1Char(' ') && text[0] <= QLatin1Char('~') ? text[0].toLatin1()
                                                                                          : '\0';
}

} // namespace

bool ViewWidget::event(QEvent* event) {
    // A button whose release will never reach the view counts as released.
    const QEvent::Type type = event->type();
    if (type == QEvent::UngrabMouse || type == QEvent::WindowDeactivate || type == QEvent::Hide) {
        BPoint where;
        uint32 buttons = 0;
        owner_->GetMouse(&where, &buttons);
        ViewAccess::NotePointer(owner_, where, 0);
    }
    if (type == QEvent::Leave)
        TellMove(B_EXITED_VIEW);
    return QWidget::event(event);
}

void ViewWidget::paintEvent(QPaintEvent* event) {
    QPainter painter(this);
    painter.fillRect(event->rect(), ToQt(owner_->ViewColor()));
    const InterfaceLock lock(owner_->Looper());
    const BPoint origin = owner_->Bounds().LeftTop();
    painter.translate(-origin.x, -origin.y);
    BRect update = FromQt(QRectF(event->rect()));
    update.OffsetBy(origin.x, origin.y);
    {
        const PaintPass pass(owner_, &painter);
        owner_->Draw(update);
    }
    TellAccessibility();
}

// What is read of a view follows what it shows.
void ViewWidget::TellAccessibility() {
    const QString description = QString::fromStdString(owner_->AccessibleDescription());
    if (description != accessibleDescription())
        setAccessibleDescription(description);
    if (!QAccessible::isActive())
        return;
    const std::vector<AccessiblePart> parts = owner_->AccessibleParts();
    const auto marked =
        std::find_if(parts.begin(), parts.end(), [](const auto& part) { return part.marked; });
    const int index = hasFocus() && marked != parts.end() ? static_cast<int>(marked - parts.begin()) : -1;
    if (std::exchange(markedPart_, index) == index || index < 0)
        return;
    QAccessibleEvent focus(this, QAccessible::Focus);
    focus.setChild(index);
    QAccessible::updateAccessibility(&focus);
}

// At once and not by message, since the answer decides who gets the key.
void ViewWidget::keyPressEvent(QKeyEvent* event) {
    const char key = OurKey(*event);
    const InterfaceLock lock(owner_->Looper());
    if (key == '\0' || !owner_->KeyDown(key))
        QWidget::keyPressEvent(event);
}

void ViewWidget::mousePressEvent(QMouseEvent* event) {
    NotePointer(*event);
    PostPointerMessage(*event, MouseDownCode);
}

void ViewWidget::mouseMoveEvent(QMouseEvent* event) {
    NotePointer(*event);
    TellMove(B_INSIDE_VIEW);
}

void ViewWidget::TellMove(uint32 transit) {
    if (!hasMouseTracking())
        return;
    BPoint where;
    uint32 buttons = 0;
    owner_->GetMouse(&where, &buttons);
    const InterfaceLock lock(owner_->Looper());
    owner_->MouseMoved(where, transit);
}

void ViewWidget::mouseReleaseEvent(QMouseEvent* event) {
    NotePointer(*event);
    PostPointerMessage(*event, MouseUpCode);
}

void ViewWidget::NotePointer(const QMouseEvent& event) {
    ViewAccess::NotePointer(owner_, FromQt(event.position()) + owner_->Bounds().LeftTop(),
                            ButtonBits(event.buttons()));
}

void ViewWidget::PostPointerMessage(const QMouseEvent& event, uint32 code) {
    BMessage message(code);
    message.AddPoint("where", FromQt(event.position()) + owner_->Bounds().LeftTop());
    message.AddInt32("buttons", static_cast<int32>(ButtonBits(event.buttons())));
    message.AddInt32("modifiers", static_cast<int32>(ModifierBits(event.modifiers())));
    BMessenger(owner_).SendMessage(message);
}

void DrawTree(BView* view, QPainter& painter, const BRect& part) {
    auto* plain = dynamic_cast<ViewWidget*>(ViewAccess::Widget(view));
    if (!plain) {
        const BPoint origin = view->Bounds().LeftTop();
        ViewAccess::Widget(view)->render(&painter,
                                         QPoint(static_cast<int>(origin.x), static_cast<int>(origin.y)),
                                         QRegion(), QWidget::DrawChildren);
        return;
    }
    painter.fillRect(ToQt(part), ToQt(view->ViewColor()));
    {
        const PaintPass pass(view, &painter);
        view->Draw(part);
    }
    for (int32 index = 0; BView* child = view->ChildAt(index); ++index) {
        const BPoint shift = child->Frame().LeftTop() - child->Bounds().LeftTop();
        BRect inner = part & child->Frame();
        if (child->IsHidden() || !inner.IsValid())
            continue;
        painter.save();
        painter.setClipRect(ToQt(inner), Qt::IntersectClip);
        painter.translate(ToQt(shift));
        inner.OffsetBy(-shift.x, -shift.y);
        DrawTree(child, painter, inner);
        painter.restore();
    }
}
