#pragma once

#include "platform/Menu.h"

// The row of menus along a window's top. Its height is that of its content, its width its parent's. Before
// one of its menus opens, the window's MenusBeginning is called. Shortcuts of its items work in the whole
// window.
class BMenuBar : public BView, public BMenu {
  public:
    BMenuBar(BRect frame, const char* name, uint32 resizingMode = B_FOLLOW_LEFT_RIGHT | B_FOLLOW_TOP,
             menu_layout layout = B_ITEMS_IN_ROW, bool resizeToFit = true);
    ~BMenuBar() override;

    using BMenu::Name;
    void AttachedToWindow() override;

  private:
    void FitHeight();

    bool resizeToFit_;
};
