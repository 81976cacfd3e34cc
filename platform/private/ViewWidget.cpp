#include "platform/private/ViewWidget.h"

#include <QMouseEvent>
#include <QPaintEvent>
#include <QPainter>
#include <QTimer>

#include "platform/private/Convert.h"
#include "platform/private/Loop.h"
#include "platform/private/ViewPeer.h"

namespace {

constexpr int kRepaintMilliseconds = 5;

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
    return QWidget::event(event);
}

void ViewWidget::paintEvent(QPaintEvent* event) {
    QPainter painter(this);
    painter.fillRect(event->rect(), ToQt(owner_->ViewColor()));
    const InterfaceLock lock(owner_->Looper());
    if (!lock.IsHeld()) {
        QTimer::singleShot(kRepaintMilliseconds, this, [this] { update(); });
        return;
    }
    const BPoint origin = owner_->Bounds().LeftTop();
    painter.translate(-origin.x, -origin.y);
    BRect update = FromQt(QRectF(event->rect()));
    update.OffsetBy(origin.x, origin.y);
    {
        const PaintPass pass(owner_, &painter);
        owner_->Draw(update);
    }
    const QString description = QString::fromStdString(owner_->AccessibleDescription());
    if (description != accessibleDescription())
        setAccessibleDescription(description);
}

void ViewWidget::mousePressEvent(QMouseEvent* event) {
    NotePointer(*event);
    PostPointerMessage(*event, kMouseDownCode, event->type() == QEvent::MouseButtonDblClick ? 2 : 1);
}

void ViewWidget::mouseMoveEvent(QMouseEvent* event) {
    NotePointer(*event);
}

void ViewWidget::mouseReleaseEvent(QMouseEvent* event) {
    NotePointer(*event);
    PostPointerMessage(*event, kMouseUpCode, 1);
}

void ViewWidget::NotePointer(const QMouseEvent& event) {
    ViewAccess::NotePointer(owner_, FromQt(event.position()) + owner_->Bounds().LeftTop(),
                            ButtonBits(event.buttons()));
}

void ViewWidget::PostPointerMessage(const QMouseEvent& event, uint32 code, int clicks) {
    BMessage message(code);
    message.AddPoint("where", FromQt(event.position()) + owner_->Bounds().LeftTop());
    message.AddInt32("buttons", static_cast<int32>(ButtonBits(event.buttons())));
    message.AddInt32("modifiers", static_cast<int32>(ModifierBits(event.modifiers())));
    message.AddInt32("clicks", clicks);
    BMessenger(owner_).SendMessage(message);
}
