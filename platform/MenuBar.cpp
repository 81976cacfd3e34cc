#include "platform/MenuBar.h"

#include <QMenuBar>

#include "platform/private/MenuPeer.h"
#include "platform/private/ViewPeer.h"

namespace {

QMenuBar* Widget(const BMenuBar* bar) {
    return static_cast<QMenuBar*>(ViewAccess::Widget(bar));
}

} // namespace

BMenuBar::BMenuBar(BRect frame, const char* name)
    : BView(frame, name, B_FOLLOW_LEFT_RIGHT | B_FOLLOW_TOP, B_WILL_DRAW,
            std::make_unique<ViewPeer>(new QMenuBar)),
      BMenu(name, std::make_unique<MenuPeer>(ViewAccess::Widget(this))) {
    Widget(this)->setNativeMenuBar(false);
    Widget(this)->setAccessibleName(QString::fromUtf8(BView::Name()));
    MenuPeer& peer = MenuAccess::Peer(*this);
    peer.shower = this;
    peer.itemsChanged = [this] { FitHeight(); };
    FitHeight();
}

BMenuBar::~BMenuBar() = default;

void BMenuBar::AttachedToWindow() {
    if (Parent())
        ResizeTo(Parent()->Bounds().Width(), Frame().Height());
    FitHeight();
}

void BMenuBar::FitHeight() {
    ResizeTo(Frame().Width(), static_cast<float>(Widget(this)->sizeHint().height() - 1));
}
