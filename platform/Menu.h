#pragma once

#include "platform/MenuItem.h"

struct MenuPeer;

enum menu_layout { B_ITEMS_IN_ROW, B_ITEMS_IN_COLUMN };

// A list of items that opens when asked: from a menu bar, as a submenu, or from a menu field. Owns its items.
class BMenu {
  public:
    explicit BMenu(const char* title, menu_layout layout = B_ITEMS_IN_COLUMN);
    virtual ~BMenu();
    BMenu(const BMenu&) = delete;
    BMenu& operator=(const BMenu&) = delete;

    // Takes ownership of the item; false, and it stays the caller's, when it is in a menu already or the
    // index lies outside 0 to CountItems().
    bool AddItem(BMenuItem* item);
    bool AddItem(BMenuItem* item, int32 index);
    // A submenu under its own title; takes ownership of it.
    bool AddItem(BMenu* submenu);
    // Hand the item back to the caller; false or null when it is not there.
    bool RemoveItem(BMenuItem* item);
    BMenuItem* RemoveItem(int32 index);

    [[nodiscard]] int32 CountItems() const { return static_cast<int32>(items_.size()); }
    [[nodiscard]] BMenuItem* ItemAt(int32 index) const;
    [[nodiscard]] int32 IndexOf(const BMenuItem* item) const;
    // The first item with this label; null when there is none.
    [[nodiscard]] BMenuItem* FindItem(const char* label) const;
    // The first item that sends this code, submenus included; null when there is none.
    [[nodiscard]] BMenuItem* FindItem(uint32 code) const;
    // The first marked item; null when none is marked.
    [[nodiscard]] BMenuItem* FindMarked() const;

    // In radio mode, choosing an item marks it and unmarks the others.
    void SetRadioMode(bool on);
    [[nodiscard]] bool IsRadioMode() const { return radioMode_; }
    // Whether a menu field shows the marked item's label instead of the menu's title.
    void SetLabelFromMarked(bool on);
    [[nodiscard]] bool IsLabelFromMarked() const { return labelFromMarked_; }

    [[nodiscard]] const char* Name() const { return title_.c_str(); }
    // Where items without a target of their own send their messages, submenus' items included; null goes back
    // to the window of the menu bar or menu field.
    void SetTargetForItems(const BHandler* target);

  protected:
    // For the menu bar, whose widget is its own.
    BMenu(const char* title, menu_layout layout, std::unique_ptr<MenuPeer> peer);

  private:
    friend class BMenuItem;
    friend class BMenuBar;
    friend class BMenuField;
    friend struct MenuAccess;

    [[nodiscard]] BMessenger TargetForItems() const;
    // An item's mark or label has changed.
    void ItemChanged(BMenuItem* item);

    std::string title_;
    bool radioMode_ = false;
    bool labelFromMarked_ = false;
    std::vector<std::unique_ptr<BMenuItem>> items_;
    std::unique_ptr<MenuPeer> peer_;
};

// A menu for a menu field: in radio mode it shows the marked item.
class BPopUpMenu : public BMenu {
  public:
    explicit BPopUpMenu(const char* title, bool radioMode = true, bool labelFromMarked = true,
                        menu_layout layout = B_ITEMS_IN_COLUMN);
};
