#include "platform/View.h"

#include <algorithm>
#include <atomic>
#include <cmath>
#include <iterator>

#include <QApplication>
#include <QEvent>
#include <QKeyEvent>
#include <QLineEdit>
#include <QMessageBox>
#include <QMouseEvent>

#include "platform/Window.h"
#include "platform/private/ApplicationPeer.h"
#include "platform/private/Convert.h"
#include "platform/private/MenuPeer.h"
#include "platform/private/ViewPeer.h"
#include "platform/private/ViewWidget.h"

namespace {

std::atomic<uint32> gModifiers{0};

// Looks at every input event, for the modifier keys that it carries and for the repeats of a held key. Such a
// key types on in a text and goes on in a list, but what it has pressed once it does not press again: it
// would confirm the dialog that the press itself has opened.
class InputWatcher : public QObject {
  public:
    using QObject::QObject;

    bool eventFilter(QObject* watched, QEvent* event) override {
        if (event->isInputEvent())
            gModifiers = ModifierBits(static_cast<QInputEvent*>(event)->modifiers());
        if (event->type() == QEvent::KeyRelease)
            NoteRelease(*static_cast<QKeyEvent*>(event));
        if (event->type() == QEvent::KeyPress || event->type() == QEvent::ShortcutOverride) {
            const auto* key = static_cast<QKeyEvent*>(event);
            if (IsRepeat(*key) && Presses(*key)) {
                event->accept(); // as no shortcut
                return true;
            }
        }
        return QObject::eventFilter(watched, event);
    }

  private:
    void NoteRelease(const QKeyEvent& event) {
        releasedKey_ = event.key();
        releaseTime_ = event.timestamp();
    }
    // The toolkit takes a repeat for a press when it comes to a window that has just opened. No finger
    // releases a key and presses it again in one millisecond.
    [[nodiscard]] bool IsRepeat(const QKeyEvent& event) const {
        return event.isAutoRepeat() ||
               (event.timestamp() != 0 && event.timestamp() == releaseTime_ && event.key() == releasedKey_);
    }
    // A button, or an item of a menu; there and in an alert a letter alone does.
    static bool Presses(const QKeyEvent& event) {
        constexpr int moving[] = {Qt::Key_Left, Qt::Key_Right, Qt::Key_Up,     Qt::Key_Down,
                                  Qt::Key_Home, Qt::Key_End,   Qt::Key_PageUp, Qt::Key_PageDown};
        const int key = event.key();
        if (QApplication::activePopupWidget() ||
            qobject_cast<QMessageBox*>(QApplication::activeModalWidget()))
            return std::find(std::begin(moving), std::end(moving), key) == std::end(moving);
        return key == Qt::Key_Return || key == Qt::Key_Enter || key == Qt::Key_Escape ||
               (key == Qt::Key_Space && !qobject_cast<QLineEdit*>(QApplication::focusWidget())) ||
               (event.modifiers() & Qt::AltModifier);
    }

    int releasedKey_ = 0;
    quint64 releaseTime_ = 0;
};

// The whole pixels that a frame covers; a part of a pixel belongs to the frame that begins before it.
QRect PixelRect(const BRect& frame) {
    const auto left = static_cast<int>(std::floor(frame.left));
    const auto top = static_cast<int>(std::floor(frame.top));
    const auto right = static_cast<int>(std::floor(frame.right));
    const auto bottom = static_cast<int>(std::floor(frame.bottom));
    return {QPoint(left, top), QPoint(std::max(right, left), std::max(bottom, top))};
}

// Where one pair of edges comes to lie when the parent grows by delta.
void FollowEdges(float& low, float& high, float delta, bool followsLow, bool followsHigh) {
    if (!followsHigh)
        return;
    high += delta;
    if (!followsLow)
        low += delta;
}

} // namespace

uint32 modifiers() {
    return gModifiers;
}

void ApplicationAccess::WatchInput(QApplication& toolkit) {
    toolkit.installEventFilter(new InputWatcher(&toolkit));
}

uint32 ButtonBits(Qt::MouseButtons buttons) {
    return (buttons & Qt::LeftButton ? B_PRIMARY_MOUSE_BUTTON : 0) |
           (buttons & Qt::RightButton ? B_SECONDARY_MOUSE_BUTTON : 0) |
           (buttons & Qt::MiddleButton ? B_TERTIARY_MOUSE_BUTTON : 0);
}

uint32 ModifierBits(Qt::KeyboardModifiers keys) {
    return keys & Qt::ShiftModifier ? B_SHIFT_KEY : 0;
}

QWidget* ViewAccess::Worked(const BView* view) {
    QWidget* worked = Widget(view)->focusProxy();
    return worked ? worked : Widget(view);
}

void ViewAccess::SetFrame(BView* view, const BRect& frame) {
    view->frame_ = frame;
}

void ViewAccess::NotePointer(BView* view, BPoint where, uint32 buttons) {
    const std::lock_guard guard(view->peer_->pointerMutex);
    view->peer_->pointer = where;
    view->peer_->buttons = buttons;
}

BView::BView(BRect frame, const char* name, uint32 resizingMode, uint32 flags)
    : BView(frame, name, resizingMode, flags, std::make_unique<ViewPeer>(new ViewWidget(this))) {
    peer_->widget->setAccessibleName(QString::fromUtf8(Name()));
    peer_->widget->setFocusPolicy(flags & B_NAVIGABLE ? Qt::TabFocus : Qt::NoFocus);
    peer_->widget->setMouseTracking(flags & B_MOUSE_MOVES);
}

BView::BView(BRect frame, const char* name, uint32 resizingMode, uint32 flags, std::unique_ptr<ViewPeer> peer)
    : BHandler(name), frame_(frame), resizingMode_(resizingMode), flags_(flags), peer_(std::move(peer)) {
    peer_->widget->setObjectName(QString::fromUtf8(Name()));
    if (!(flags & B_NAVIGABLE))
        peer_->widget->setFocusPolicy(Qt::NoFocus);
    PlaceWidget();
}

// The children go first, while their place in the toolkit's tree still stands.
BView::~BView() {
    while (!children_.empty())
        children_.pop_back();
}

// The actions are the view's too, since a closed menu's shortcuts are not heard of.
void BView::SetContextMenu(BMenu* menu) {
    QWidget* widget = peer_->widget;
    MenuPeer& peer = MenuAccess::Peer(*menu);
    peer.shower = this;
    widget->addActions(peer.menu->actions());
    widget->setContextMenuPolicy(Qt::CustomContextMenu);
    QObject::connect(
        widget, &QWidget::customContextMenuRequested, peer.menu.get(),
        [widget, shown = peer.menu.get()](const QPoint& at) { shown->popup(widget->mapToGlobal(at)); });
    peer_->contextMenu.reset(menu);
}

void BView::SetAccessibleName(const char* name) {
    ViewAccess::Worked(this)->setAccessibleName(QString::fromUtf8(name));
}

std::string BView::AccessibleName() const {
    return ViewAccess::Worked(this)->accessibleName().toStdString();
}

BLooper* BView::Looper() const {
    return window_;
}

void BView::AddChild(BView* child) {
    if (!child || child->parent_ || child->window_)
        return;
    children_.emplace_back(child);
    child->parent_ = this;
    child->peer_->widget->setParent(peer_->Canvas());
    child->PlaceWidget();
    child->peer_->widget->setVisible(child->hideCount_ == 0);
    if (window_)
        child->EnterWindow(window_);
}

bool BView::RemoveChild(BView* child) {
    const auto found = std::find_if(children_.begin(), children_.end(),
                                    [&](const auto& owned) { return owned.get() == child; });
    if (found == children_.end())
        return false;
    if (window_)
        child->LeaveWindow();
    child->parent_ = nullptr;
    child->peer_->widget->hide();
    child->peer_->widget->setParent(nullptr);
    [[maybe_unused]] const BView* released = found->release();
    children_.erase(found);
    return true;
}

bool BView::RemoveSelf() {
    return parent_ && parent_->RemoveChild(this);
}

BView* BView::ChildAt(int32 index) const {
    return index >= 0 && index < CountChildren() ? children_[static_cast<std::size_t>(index)].get() : nullptr;
}

BView* BView::FindView(const char* name) const {
    if (std::string_view(Name()) == name)
        return const_cast<BView*>(this);
    for (const auto& child : children_)
        if (BView* found = child->FindView(name))
            return found;
    return nullptr;
}

void BView::EnterWindow(BWindow* window) {
    window_ = window;
    AttachedToWindow();
    for (std::size_t i = 0; i < children_.size(); ++i)
        children_[i]->EnterWindow(window);
    if (focusWanted_) {
        focusWanted_ = false;
        MakeFocus(true);
    }
}

void BView::LeaveWindow() {
    for (const auto& child : children_)
        child->LeaveWindow();
    DetachedFromWindow();
    window_ = nullptr;
}

void BView::Draw(BRect) {}

void BView::FrameResized(float, float) {}

void BView::MouseDown(BPoint) {}

void BView::MouseUp(BPoint) {}

void BView::MouseMoved(BPoint, uint32) {}

bool BView::KeyDown(char) {
    return false;
}

BRect BView::Frame() const {
    return frame_;
}

BRect BView::Bounds() const {
    return {origin_.x, origin_.y, origin_.x + frame_.Width(), origin_.y + frame_.Height()};
}

void BView::PlaceWidget() {
    QRect place = PixelRect(frame_);
    if (parent_)
        place.translate(-static_cast<int>(std::floor(parent_->origin_.x)),
                        -static_cast<int>(std::floor(parent_->origin_.y)));
    if (peer_->widget)
        peer_->widget->setGeometry(place);
}

void BView::MoveTo(float x, float y) {
    frame_.OffsetTo(x, y);
    PlaceWidget();
}

void BView::ResizeTo(float width, float height) {
    const float dx = width - frame_.Width();
    const float dy = height - frame_.Height();
    if (dx == 0 && dy == 0)
        return;
    frame_.right += dx;
    frame_.bottom += dy;
    PlaceWidget();
    for (const auto& child : children_)
        child->ParentResized(dx, dy);
    if (flags_ & B_FRAME_EVENTS)
        FrameResized(frame_.Width(), frame_.Height());
}

void BView::ParentResized(float dx, float dy) {
    BRect frame = frame_;
    const uint32 mode = resizingMode_;
    FollowEdges(frame.left, frame.right, dx, mode & B_FOLLOW_LEFT, mode & B_FOLLOW_RIGHT);
    FollowEdges(frame.top, frame.bottom, dy, mode & B_FOLLOW_TOP, mode & B_FOLLOW_BOTTOM);
    MoveTo(frame.left, frame.top);
    ResizeTo(frame.Width(), frame.Height());
}

void BView::ScrollTo(BPoint where) {
    if (where == origin_)
        return;
    origin_ = where;
    for (const auto& child : children_)
        child->PlaceWidget();
    Invalidate();
}

void BView::Show() {
    if (hideCount_ > 0 && --hideCount_ == 0)
        peer_->widget->show();
}

void BView::Hide() {
    if (hideCount_++ == 0)
        peer_->widget->hide();
}

// A view that is in no window yet takes the focus when it enters one.
void BView::MakeFocus(bool focus) {
    if (!window_)
        focusWanted_ = focus;
    else if (focus)
        peer_->widget->setFocus(Qt::OtherFocusReason);
    else
        peer_->widget->clearFocus();
}

bool BView::IsFocus() const {
    return peer_->widget->hasFocus();
}

void BView::GetMouse(BPoint* where, uint32* buttons) const {
    const std::lock_guard guard(peer_->pointerMutex);
    *where = peer_->pointer;
    *buttons = peer_->buttons;
}

void BView::SetViewColor(rgb_color color) {
    viewColor_ = color;
    Invalidate();
}

void BView::SetHighColor(rgb_color color) {
    highColor_ = color;
}

void BView::SetFont(const BFont* font) {
    font_ = *font;
}

void BView::SetFontSize(float size) {
    BFont font = font_;
    font.SetSize(size);
    SetFont(&font);
}

void BView::Invalidate() {
    if (peer_->widget)
        peer_->Canvas()->update();
}

void BView::Invalidate(BRect rect) {
    if (!peer_->widget || !rect.IsValid())
        return;
    const BPoint origin = Bounds().LeftTop();
    rect.OffsetBy(-origin.x, -origin.y);
    peer_->Canvas()->update(ToQt(rect).toAlignedRect());
}
