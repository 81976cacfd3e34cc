#include "platform/Menu.h"

#include <algorithm>

#include <QMenuBar>

#include "platform/Window.h"
#include "platform/private/Loop.h"
#include "platform/private/MenuPeer.h"
#include "platform/private/Mnemonics.h"
#include "platform/private/ViewPeer.h"

namespace {

QMenuBar* Widget(const BMenuBar* bar) {
    return static_cast<QMenuBar*>(ViewAccess::Widget(bar));
}

} // namespace

BMenu::BMenu(const char* title) : BMenu(title, false) {}

BMenu::BMenu(const char* title, bool radioMode) : BMenu(title, std::make_unique<MenuPeer>()) {
    radioMode_ = radioMode;
    QObject::connect(peer_->menu.get(), &QMenu::aboutToShow, peer_->menu.get(),
                     [this] { MenuAccess::Opening(*this); });
}

BMenu::BMenu(const char* title, std::unique_ptr<MenuPeer> peer)
    : title_(title ? title : ""), peer_(std::move(peer)) {
    if (!peer_->menu)
        return;
    peer_->menu->setObjectName(QString::fromUtf8(title_));
    peer_->menu->setAccessibleName(QString::fromUtf8(title_).trimmed());
}

// The items take their actions out of the widget before it goes.
BMenu::~BMenu() {
    peer_->itemsChanged = nullptr;
    items_.clear();
}

bool BMenu::AddItem(BMenuItem* item) {
    if (!item || item->menu_)
        return false;
    items_.emplace_back(item);
    item->menu_ = this;
    QAction* action = item->peer_->action;
    item->peer_->SetHost(peer_->host);
    peer_->host->addAction(action);
    if (radioMode_ && !action->isSeparator()) {
        action->setCheckable(true);
        peer_->radioLook.addAction(action);
    }
    ItemChanged(item);
    return true;
}

bool BMenu::AddItem(BMenu* submenu) {
    if (!submenu)
        return false;
    auto item = std::make_unique<BMenuItem>(submenu);
    return AddItem(item.get()) && item.release();
}

bool BMenu::RemoveItem(BMenuItem* item) {
    const auto found =
        std::find_if(items_.begin(), items_.end(), [&](const auto& owned) { return owned.get() == item; });
    if (found == items_.end())
        return false;
    QAction* action = item->peer_->action;
    peer_->radioLook.removeAction(action);
    if (peer_->host)
        peer_->host->removeAction(action);
    item->peer_->SetHost(nullptr);
    item->menu_ = nullptr;
    [[maybe_unused]] const BMenuItem* released = found->release();
    items_.erase(found);
    if (peer_->itemsChanged)
        peer_->itemsChanged();
    return true;
}

BMenuItem* BMenu::ItemAt(int32 index) const {
    return index >= 0 && index < CountItems() ? items_[static_cast<std::size_t>(index)].get() : nullptr;
}

BMenuItem* BMenu::FindItem(const char* label) const {
    for (const auto& item : items_)
        if (item->label_ == label)
            return item.get();
    return nullptr;
}

BMenuItem* BMenu::FindItem(uint32 code) const {
    for (const auto& item : items_) {
        if (item->Message() && item->Message()->what == code)
            return item.get();
        if (BMenuItem* found = item->Submenu() ? item->Submenu()->FindItem(code) : nullptr)
            return found;
    }
    return nullptr;
}

BMenuItem* BMenu::FindMarked() const {
    for (const auto& item : items_)
        if (item->IsMarked())
            return item.get();
    return nullptr;
}

void BMenu::SetTargetForItems(const BHandler* target) {
    peer_->target = BMessenger(target);
    peer_->hasTarget = target != nullptr;
}

BMessenger BMenu::TargetForItems() const {
    if (peer_->hasTarget)
        return peer_->target;
    if (peer_->superitem)
        return peer_->superitem->DefaultTarget();
    return BMessenger(peer_->shower ? peer_->shower->Window() : nullptr);
}

void BMenu::ItemChanged(BMenuItem* item) {
    if (radioMode_ && item->IsMarked())
        for (const auto& other : items_)
            if (other.get() != item && other->IsMarked()) {
                other->peer_->marked = false;
                other->peer_->action->setChecked(false);
            }
    if (peer_->itemsChanged)
        peer_->itemsChanged();
}

// The window enables and marks the items of its bar's menus.
void MenuAccess::Opening(BMenu& menu) {
    const BMenuItem* superitem = menu.peer_->superitem;
    const BMenu* bar = superitem ? superitem->menu_ : nullptr;
    BWindow* window = bar && !bar->peer_->menu && bar->peer_->shower ? bar->peer_->shower->Window() : nullptr;
    if (window) {
        const InterfaceLock lock(window);
        window->MenusBeginning();
    }
    AssignMnemonics(menu.peer_->menu.get());
}

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
