#pragma once

#include "platform/Menu.h"

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
