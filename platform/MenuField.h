#pragma once

#include <functional>

#include "platform/Menu.h"

// A label with a button that shows a menu's marked item and opens the menu. Owns the menu. The button is as
// wide as its text asks for, within the frame; a text that does not fit is shortened in the middle and shown
// whole as a tool tip. The menu is one column that stays on the screen and scrolls where it is too high for
// it.
class BMenuField : public BView {
  public:
    // The height is adjusted to what the button needs. Takes ownership of menu.
    BMenuField(BRect frame, const char* name, const char* label, BMenu* menu,
               uint32 resizingMode = B_FOLLOW_LEFT | B_FOLLOW_TOP, uint32 flags = B_WILL_DRAW | B_NAVIGABLE);
    ~BMenuField() override;

    [[nodiscard]] BMenu* Menu() const { return menu_.get(); }
    [[nodiscard]] BMenuItem* MenuItem() const { return menu_->FindMarked(); }
    void SetDivider(float divider);
    // The right edge of what is visible, in the parent's coordinates: the button's, not the frame's.
    [[nodiscard]] float VisibleRight() const;
    // Called after the shown text, and with it VisibleRight, has changed.
    void SetTextChangedHook(std::function<void()> hook);

  private:
    void ShowMarked();
    void PrepareMenu();

    std::string shownText_;
    std::unique_ptr<BMenu> menu_;
    std::function<void()> textChanged_;
};
