#include "platform/Window.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include <QApplication>
#include <QCloseEvent>
#include <QGuiApplication>
#include <QKeyEvent>
#include <QPushButton>
#include <QScreen>

#include "platform/Button.h"
#include "platform/ScrollView.h"
#include "platform/private/ApplicationPeer.h"
#include "platform/private/Convert.h"
#include "platform/private/Loop.h"
#include "platform/private/Mnemonics.h"
#include "platform/private/Placement.h"
#include "platform/private/ViewPeer.h"
#include "platform/private/ViewWidget.h"
#include "platform/private/WindowPeer.h"

namespace {

Qt::WindowFlags ToolkitFlags(window_look look, uint32 flags) {
    Qt::WindowFlags result = look == B_FLOATING_WINDOW_LOOK ? Qt::Dialog : Qt::Window;
    result |=
        Qt::CustomizeWindowHint | Qt::WindowTitleHint | Qt::WindowSystemMenuHint | Qt::WindowCloseButtonHint;
    if (look != B_FLOATING_WINDOW_LOOK)
        result |= Qt::WindowMinimizeButtonHint;
    if (!(flags & (B_NOT_ZOOMABLE | B_NOT_RESIZABLE)))
        result |= Qt::WindowMaximizeButtonHint;
    return result;
}

int PixelCount(float span) {
    return std::clamp(static_cast<int>(std::floor(std::min(span, float{QWIDGETSIZE_MAX}))) + 1, 1,
                      QWIDGETSIZE_MAX);
}

// That of a small window: at least what its title takes, with the buttons that the window manager puts beside
// it and says nothing of; but a title asks for no more than the screen has, with a bar for the form.
float WidthOf(const BRect& frame, const char* title) {
    QFont font = QApplication::font();
    font.setBold(true);
    const QFontMetrics letters(font);
    const int wanted = letters.horizontalAdvance(QString::fromUtf8(title)) + 8 * letters.height();
    const float room = BWindow::RoomAt(frame.LeftTop()).Width() - B_FORM_BAR_WIDTH;
    return std::max(frame.Width(), std::min(static_cast<float>(wanted), room));
}

} // namespace

void WindowWidget::closeEvent(QCloseEvent* event) {
    event->ignore();
    owner_->PostMessage(B_QUIT_REQUESTED);
}

void WindowWidget::changeEvent(QEvent* event) {
    QWidget::changeEvent(event);
    if (event->type() == QEvent::ActivationChange && isActiveWindow())
        WindowAccess::Activated(owner_);
}

void WindowWidget::resizeEvent(QResizeEvent* event) {
    WindowAccess::ContentResized(owner_, static_cast<float>(event->size().width() - 1),
                                 static_cast<float>(event->size().height() - 1));
}

void WindowWidget::keyPressEvent(QKeyEvent* event) {
    const WindowPeer* peer = WindowAccess::Peer(owner_);
    if (event->key() == Qt::Key_Escape && peer->modal) {
        owner_->PostMessage(B_QUIT_REQUESTED);
    } else if (event->key() == Qt::Key_Return || event->key() == Qt::Key_Enter) {
        auto* button = qobject_cast<QPushButton*>(focusWidget());
        if (!button && peer->defaultButton)
            button = qobject_cast<QPushButton*>(ViewAccess::Widget(peer->defaultButton));
        if (button)
            button->click();
    } else {
        QWidget::keyPressEvent(event);
    }
}

void WindowAccess::ContentResized(BWindow* window, float width, float height) {
    const InterfaceLock lock(window);
    window->content_->ResizeTo(width, height);
    window->FrameResized(width, height);
}

// The first time tells how large the frame is that the window manager has drawn.
void WindowAccess::Activated(BWindow* window) {
    if (std::exchange(window->peer_->placed, true))
        return;
    const InterfaceLock lock(window);
    window->PutOnScreen();
}

void ApplicationAccess::QuitModalWindows(BApplication& application) {
    for (int32 index = application.CountWindows() - 1; index >= 0; --index) {
        BWindow* window = application.WindowAt(index);
        if (WindowAccess::Peer(window)->modal)
            window->Quit();
    }
}

BWindow::BWindow(BRect frame, const char* title, window_type, uint32 flags)
    : BWindow(frame, title, B_DOCUMENT_WINDOW_LOOK, B_NORMAL_WINDOW_FEEL, flags) {}

BWindow::BWindow(BRect frame, const char* title, window_look look, window_feel feel, uint32 flags)
    : BLooper(title), peer_(std::make_unique<WindowPeer>(this)) {
    Lock();
    WindowWidget* widget = peer_->widget;
    widget->setWindowFlags(ToolkitFlags(look, flags));
    peer_->modal = feel == B_MODAL_APP_WINDOW_FEEL;
    peer_->resizable = !(flags & B_NOT_RESIZABLE);
    if (peer_->modal)
        widget->setWindowModality(Qt::ApplicationModal);
    content_ =
        std::make_unique<BView>(BRect(0, 0, frame.Width(), frame.Height()), "content", B_FOLLOW_ALL_SIDES, 0);
    ViewAccess::Widget(content_.get())->setParent(widget);
    content_->EnterWindow(this);
    MoveTo(frame.left, frame.top);
    ResizeTo(look == B_FLOATING_WINDOW_LOOK ? WidthOf(frame, title) : frame.Width(), frame.Height());
    widget->setWindowTitle(QString::fromUtf8(title));
    widget->setObjectName(QString::fromUtf8(title));
    ApplicationAccess::AddWindow(this);
}

BWindow::~BWindow() {
    ApplicationAccess::RemoveWindow(this);
    content_.reset();
}

void BWindow::AddChild(BView* child) {
    content_->AddChild(child);
}

BView* BWindow::FindView(const char* name) const {
    return content_->FindView(name);
}

void BWindow::SetAccessibleName(const char* name) {
    peer_->widget->setAccessibleName(QString::fromUtf8(name).trimmed());
}

BRect BWindow::Frame() const {
    return FromQt(QRectF(peer_->widget->geometry()));
}

BRect BWindow::UnzoomedFrame() const {
    const WindowWidget* widget = peer_->widget;
    return widget->isMaximized() ? FromQt(QRectF(widget->normalGeometry())) : Frame();
}

BRect BWindow::Bounds() const {
    return FromQt(QRectF(peer_->widget->rect()));
}

// The toolkit's own move counts the title bar, which differs from one window manager to the next.
void BWindow::MoveTo(float x, float y) {
    QRect place = peer_->widget->geometry();
    place.moveTo(static_cast<int>(std::floor(x)), static_cast<int>(std::floor(y)));
    peer_->widget->setGeometry(place);
}

void BWindow::MoveBy(float dx, float dy) {
    MoveTo(Frame().left + dx, Frame().top + dy);
}

void BWindow::ResizeTo(float width, float height) {
    const QSize size(PixelCount(width), PixelCount(height));
    if (peer_->resizable)
        peer_->widget->resize(size);
    else
        peer_->widget->setFixedSize(size);
    // A hidden widget hears of its new size only when it is shown; its views are laid out now.
    content_->ResizeTo(static_cast<float>(size.width() - 1), static_cast<float>(size.height() - 1));
}

void BWindow::SetSizeLimits(float minWidth, float maxWidth, float minHeight, float maxHeight) {
    peer_->widget->setMinimumSize(PixelCount(minWidth), PixelCount(minHeight));
    peer_->widget->setMaximumSize(PixelCount(maxWidth), PixelCount(maxHeight));
}

BRect BWindow::RoomAt(BPoint where) {
    return FromQt(QRectF(::RoomAt(ToQt(where).toPoint())));
}

void BWindow::PutOnScreen() {
    const QRect wanted = peer_->widget->geometry();
    const QRect place = PutInto(::RoomAt(wanted.center()), wanted);
    if (place.size() != wanted.size())
        ResizeTo(static_cast<float>(place.width() - 1), static_cast<float>(place.height() - 1));
    if (place.topLeft() != wanted.topLeft())
        MoveTo(static_cast<float>(place.left()), static_cast<float>(place.top()));
}

void BWindow::Show() {
    WindowWidget* widget = peer_->widget;
    if (!peer_->shownBefore) {
        AssignMnemonics(widget);
        peer_->activeBefore = peer_->modal ? WindowBelow() : nullptr;
        KeepAbove(*widget, peer_->activeBefore);
        PutOnScreen();
    }
    widget->show();
    if (!peer_->shownBefore) {
        peer_->shownBefore = true;
        Unlock();
    }
}

void BWindow::Hide() {
    peer_->widget->hide();
}

bool BWindow::IsHidden() const {
    return !peer_->widget->isVisible();
}

void BWindow::Activate() {
    peer_->widget->raise();
    peer_->widget->activateWindow();
}

void BWindow::SetDefaultButton(BButton* button) {
    if (peer_->defaultButton)
        qobject_cast<QPushButton*>(ViewAccess::Widget(peer_->defaultButton))->setDefault(false);
    peer_->defaultButton = button;
    if (button)
        qobject_cast<QPushButton*>(ViewAccess::Widget(button))->setDefault(true);
}

void BWindow::UpdateIfNeeded() {
    QCoreApplication::sendPostedEvents(peer_->widget, QEvent::UpdateRequest);
}

void BWindow::FrameResized(float, float) {}

void BWindow::Quit() {
    if (!IsHidden())
        Hide();
    // A window manager that sees an alert and the window below it go together may leave none active.
    if (QWidget* before = peer_->activeBefore; before && before->isVisible())
        before->activateWindow();
    BLooper::Quit();
}

void BWindow::DispatchMessage(BMessage* message, BHandler* handler) {
    if (message->what != MouseDownCode && message->what != MouseUpCode) {
        BLooper::DispatchMessage(message, handler);
        return;
    }
    BPoint where;
    auto* view = dynamic_cast<BView*>(handler);
    if (!view || message->FindPoint("where", &where) != B_OK)
        return;
    if (message->what == MouseDownCode)
        view->MouseDown(where);
    else
        view->MouseUp(where);
}

BRect BScreen::Frame() const {
    const QScreen* screen = QGuiApplication::primaryScreen();
    return screen ? FromQt(QRectF(screen->geometry())) : BRect();
}
