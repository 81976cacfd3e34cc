#pragma once

#include "platform/MenuItem.h"

struct MenuPeer;

// A list of items that opens when asked: from a menu bar, as a submenu, or from a menu field. Owns its items.
class BMenu {
  public:
    explicit BMenu(const char* title);
    virtual ~BMenu();
    BMenu(const BMenu&) = delete;
    BMenu& operator=(const BMenu&) = delete;

    // Takes ownership of the item; false, and it stays the caller's, when it is in a menu already.
    bool AddItem(BMenuItem* item);
    // A submenu under its own title; takes ownership of it.
    bool AddItem(BMenu* submenu);
    // Hands the item back to the caller; false when it is not there.
    bool RemoveItem(BMenuItem* item);

    [[nodiscard]] int32 CountItems() const { return static_cast<int32>(items_.size()); }
    [[nodiscard]] BMenuItem* ItemAt(int32 index) const;
    // The first item with this label; null when there is none.
    [[nodiscard]] BMenuItem* FindItem(const char* label) const;
    // The first item that sends this code, submenus included; null when there is none.
    [[nodiscard]] BMenuItem* FindItem(uint32 code) const;
    // The first marked item; null when none is marked.
    [[nodiscard]] BMenuItem* FindMarked() const;

    [[nodiscard]] const char* Name() const { return title_.c_str(); }
    // Where items without a target of their own send their messages, submenus' items included; null goes back
    // to the window of the menu bar or menu field.
    void SetTargetForItems(const BHandler* target);

  protected:
    // In radio mode, choosing an item marks it and unmarks the others.
    BMenu(const char* title, bool radioMode);
    // For the menu bar, whose widget is its own.
    BMenu(const char* title, std::unique_ptr<MenuPeer> peer);

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
    std::vector<std::unique_ptr<BMenuItem>> items_;
    std::unique_ptr<MenuPeer> peer_;
};

// A menu in radio mode, for a menu field, which shows the marked item.
class BPopUpMenu : public BMenu {
  public:
    explicit BPopUpMenu(const char* title) : BMenu(title, true) {}
};

// The row of menus along a window's top. Its height is that of its content, its width its parent's. Before
// one of its menus opens, the window's MenusBeginning is called. Shortcuts of its items work in the whole
// window.
class BMenuBar : public BView, public BMenu {
  public:
    BMenuBar(BRect frame, const char* name);
    ~BMenuBar() override;

    using BMenu::Name;
    void AttachedToWindow() override;

  private:
    void FitHeight();
};
