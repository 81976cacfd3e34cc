#pragma once

#include "platform/Control.h"

class BMenu;
struct MenuItemPeer;

// One line of a menu, which owns it. Choosing it sends its message: to the target set, else to the window of
// the menu bar or menu field that shows the menu.
class BMenuItem : public BInvoker {
  public:
    // Takes ownership of message. shortcut is the letter that, with the Control key, chooses the item; 0 for
    // none.
    BMenuItem(const char* label, BMessage* message, char shortcut = 0);
    // A line that opens a submenu; takes ownership of it.
    explicit BMenuItem(BMenu* submenu);
    ~BMenuItem() override;

    [[nodiscard]] const char* Label() const { return label_.c_str(); }
    void SetEnabled(bool enabled);
    [[nodiscard]] bool IsEnabled() const;
    // In a radio-mode menu, marking an item unmarks the others.
    void SetMarked(bool marked);
    [[nodiscard]] bool IsMarked() const;
    [[nodiscard]] BMenu* Menu() const { return menu_; }
    [[nodiscard]] BMenu* Submenu() const { return submenu_.get(); }

  protected:
    [[nodiscard]] BMessenger DefaultTarget() const override;

  private:
    friend class BMenu;
    friend struct MenuAccess;

    const std::string label_;
    BMenu* menu_ = nullptr;
    std::unique_ptr<BMenu> submenu_;
    std::unique_ptr<MenuItemPeer> peer_;
};

// A line between groups of items.
class BSeparatorItem : public BMenuItem {
  public:
    BSeparatorItem();
};
