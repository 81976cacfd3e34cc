#include "platform/private/Placement.h"

#include <algorithm>

#include <QApplication>
#include <QDialog>
#include <QLabel>
#include <QLayout>
#include <QScreen>
#include <QScrollArea>
#include <QStyle>
#include <QWindow>

#include "platform/Application.h"
#include "platform/private/WindowPeer.h"

namespace {

// As the window manager draws it around those that are shown; it tells nothing of others.
QMargins WindowFrame() {
    QMargins frame;
    for (const QWidget* window : QApplication::topLevelWidgets())
        if (window->isVisible())
            frame = frame | window->windowHandle()->frameMargins();
    return frame;
}

// Places a dialog as it is about to be seen: an alert finds its size only then. Belongs to the dialog.
class DialogPlacer : public QObject {
  public:
    DialogPlacer(QDialog& dialog, const QWidget* below)
        : QObject(&dialog), dialog_(dialog), middle_((below ? below->geometry() : RoomAt({})).center()) {}

    bool eventFilter(QObject* watched, QEvent* event) override {
        // The desktop's own dialog, in the place of the toolkit's, has its place from the desktop.
        const bool isOurs = !dialog_.testAttribute(Qt::WA_DontShowOnScreen);
        if (event->type() == QEvent::Show && !event->spontaneous() && isOurs) {
            const QRect room = RoomAt(middle_);
            LayOut();
            QWidget* part = LargePart();
            if (part && room.size().expandedTo(dialog_.size()) != room.size())
                LetScroll(part, room.size());
            QRect place(QPoint(), dialog_.size());
            place.moveCenter(middle_);
            dialog_.setGeometry(PutInto(room, place));
        }
        return QObject::eventFilter(watched, event);
    }

  private:
    void LayOut() {
        QEvent request(QEvent::LayoutRequest);
        QApplication::sendEvent(&dialog_, &request);
    }
    // The text of an alert, or else what the dialog begins with; null when that is not most of it.
    [[nodiscard]] QWidget* LargePart() const {
        QWidget* part = dialog_.findChild<QLabel*>(QStringLiteral("qt_msgbox_label"));
        const QLayoutItem* first = dialog_.layout() ? dialog_.layout()->itemAt(0) : nullptr;
        if (!part && first)
            part = const_cast<QLayoutItem*>(first)->widget();
        return part && 2 * part->height() > dialog_.height() ? part : nullptr;
    }
    void LetScroll(QWidget* part, QSize room) {
        const QSize most = room - (dialog_.size() - part->size());
        const bool isText = part->hasHeightForWidth();
        const int bar = dialog_.style()->pixelMetric(QStyle::PM_ScrollBarExtent);
        const int width = isText ? most.width() : std::min(part->width() + bar, most.width());
        const int height = isText ? part->heightForWidth(width) : part->height();
        auto* area = new QScrollArea(&dialog_);
        area->setFrameShape(QFrame::NoFrame);
        area->setWidgetResizable(true);
        delete dialog_.layout()->replaceWidget(part, area);
        area->setWidget(part);
        area->setFixedSize(width, std::min(height, most.height()));
        area->show();
        LayOut();
        dialog_.adjustSize();
    }

    QDialog& dialog_;
    const QPoint middle_;
};

} // namespace

QWidget* WindowBelow() {
    if (QWidget* dialog = QApplication::activeModalWidget())
        return dialog;
    if (QWidget* active = QApplication::activeWindow())
        return active;
    for (int32 index = be_app->CountWindows() - 1; index >= 0; --index)
        if (QWidget* window = WindowAccess::Widget(be_app->WindowAt(index)); window->isVisible())
            return window;
    return nullptr;
}

void KeepAbove(QWidget& window, const QWidget* below) {
    if (!below)
        return;
    window.winId();
    window.windowHandle()->setTransientParent(below->windowHandle());
}

QRect RoomAt(QPoint place) {
    const auto distance = [place](const QScreen* screen) {
        const QRect all = screen->geometry();
        const QPoint nearest(std::clamp(place.x(), all.left(), all.right()),
                             std::clamp(place.y(), all.top(), all.bottom()));
        return (place - nearest).manhattanLength();
    };
    const QList<QScreen*> screens = QGuiApplication::screens();
    const QScreen* screen =
        *std::min_element(screens.begin(), screens.end(),
                          [&](const QScreen* a, const QScreen* b) { return distance(a) < distance(b); });
    return screen->availableGeometry().marginsRemoved(WindowFrame());
}

QRect PutInto(const QRect& room, const QRect& wanted) {
    const QSize size = wanted.size().boundedTo(room.size());
    return {QPoint(std::clamp(wanted.left(), room.left(), room.right() + 1 - size.width()),
                   std::clamp(wanted.top(), room.top(), room.bottom() + 1 - size.height())),
            size};
}

void PlaceDialog(QDialog& dialog, const QWidget* below) {
    KeepAbove(dialog, below);
    dialog.installEventFilter(new DialogPlacer(dialog, below));
}
