#pragma once

// What menus and their items have on the toolkit's side. Only for the layer's own sources.

#include <functional>
#include <memory>

#include <QAction>
#include <QActionGroup>
#include <QMenu>
#include <QPointer>

#include "platform/Menu.h"
#include "platform/private/Mnemonics.h"

// A menu's peer: the widget that shows the items, which is a toolkit menu of its own or, for the menu bar,
// the bar's widget, which belongs to the bar's view.
struct MenuPeer {
    MenuPeer() : menu(std::make_unique<QMenu>()), host(menu.get()) {}
    explicit MenuPeer(QWidget* bar) : host(bar) {}

    std::unique_ptr<QMenu> menu;
    QPointer<QWidget> host;
    // Marks in radio mode look like radio marks; who is marked is the layer's own business.
    QActionGroup radioLook{nullptr};
    BMenuItem* superitem = nullptr; // the item that opens this menu
    // The bar or field that shows this menu, with what it does when items or marks change.
    BView* shower = nullptr;
    std::function<void()> itemsChanged;
    BMessenger target;
    bool hasTarget = false;
};

// An item's peer. An ordinary item owns its action, which is a child of the widget that shows it; one that
// opens a submenu uses the submenu's.
struct MenuItemPeer {
    MenuItemPeer() : action(new QAction), own(true) {}
    explicit MenuItemPeer(QAction* submenu) : action(submenu), own(false) {}
    ~MenuItemPeer() {
        if (own)
            delete action;
    }
    MenuItemPeer(const MenuItemPeer&) = delete;
    MenuItemPeer& operator=(const MenuItemPeer&) = delete;

    void ShowLabel(const char* label) const {
        ::ShowLabel(action.data(), label);
        action->setObjectName(QString::fromUtf8(label));
    }
    void SetHost(QWidget* host) {
        if (own)
            action->setParent(host);
    }

    QPointer<QAction> action;
    const bool own;
    bool marked = false;
};

// The layer's own way into menus.
struct MenuAccess {
    static MenuPeer& Peer(const BMenu& menu) { return *menu.peer_; }
    static MenuItemPeer& Peer(const BMenuItem& item) { return *item.peer_; }
    // The person chose the item.
    static void Chosen(BMenuItem& item);
    // The toolkit is about to open the menu.
    static void Opening(BMenu& menu);
};
