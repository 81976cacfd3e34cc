#include "platform/MenuBar.h"

#include <QMenuBar>

#include "platform/private/MenuPeer.h"
#include "platform/private/ViewPeer.h"

namespace {

QMenuBar* Widget(const BMenuBar* bar) {
    return static_cast<QMenuBar*>(ViewAccess::Widget(bar));
}

} // namespace

BMenuBar::BMenuBar(BRect frame, const char* name, uint32 resizingMode, menu_layout layout, bool resizeToFit)
    : BView(frame, name, resizingMode, B_WILL_DRAW, std::make_unique<ViewPeer>(new QMenuBar)),
      BMenu(name, layout, std::make_unique<MenuPeer>(ViewAccess::Widget(this))),
      resizeToFit_(resizeToFit) {
    Widget(this)->setNativeMenuBar(false);
    Widget(this)->setAccessibleName(QString::fromUtf8(BView::Name()));
    MenuPeer& peer = MenuAccess::Peer(*this);
    peer.shower = this;
    peer.itemsChanged = [this] { FitHeight(); };
    FitHeight();
}

BMenuBar::~BMenuBar() = default;

void BMenuBar::AttachedToWindow() {
    if (resizeToFit_ && Parent())
        ResizeTo(Parent()->Bounds().Width(), Frame().Height());
    FitHeight();
}

void BMenuBar::FitHeight() {
    if (resizeToFit_)
        ResizeTo(Frame().Width(), static_cast<float>(Widget(this)->sizeHint().height() - 1));
}
