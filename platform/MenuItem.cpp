#include "platform/MenuItem.h"

#include <QKeySequence>

#include "platform/View.h"
#include "platform/private/MenuPeer.h"

BMenuItem::BMenuItem(const char* label, BMessage* message, char shortcut)
    : BInvoker(message, nullptr), label_(label), peer_(std::make_unique<MenuItemPeer>()) {
    if (shortcut)
        peer_->action->setShortcut(QKeySequence(QStringLiteral("Ctrl+") + QLatin1Char(shortcut)));
    peer_->action->setMenuRole(QAction::NoRole);
    peer_->ShowLabel(label);
    QObject::connect(peer_->action, &QAction::triggered, peer_->action,
                     [this] { MenuAccess::Chosen(*this); });
}

BMenuItem::BMenuItem(BMenu* submenu)
    : BInvoker(nullptr, nullptr),
      label_(submenu->Name()),
      submenu_(submenu),
      peer_(std::make_unique<MenuItemPeer>(MenuAccess::Peer(*submenu).menu->menuAction())) {
    MenuAccess::Peer(*submenu).superitem = this;
    peer_->ShowLabel(Label());
}

BMenuItem::~BMenuItem() = default;

void BMenuItem::SetEnabled(bool enabled) {
    peer_->action->setEnabled(enabled);
}

bool BMenuItem::IsEnabled() const {
    return peer_->action->isEnabled();
}

void BMenuItem::SetMarked(bool marked) {
    peer_->marked = marked;
    if (marked)
        peer_->action->setCheckable(true);
    peer_->action->setChecked(marked);
    if (menu_)
        menu_->ItemChanged(this);
}

bool BMenuItem::IsMarked() const {
    return peer_->marked;
}

BMessenger BMenuItem::DefaultTarget() const {
    return menu_ ? menu_->TargetForItems() : BMessenger();
}

// The toolkit has turned the mark over by itself; outside radio mode marks are the program's to change.
void MenuAccess::Chosen(BMenuItem& item) {
    if (item.menu_ && item.menu_->radioMode_)
        item.SetMarked(true);
    else
        item.peer_->action->setChecked(item.peer_->marked);
    item.Invoke();
}

BSeparatorItem::BSeparatorItem() : BMenuItem("", nullptr) {
    MenuAccess::Peer(*this).action->setSeparator(true);
}
