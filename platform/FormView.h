#pragma once

#include "platform/View.h"

// What the scroll bar of a form takes of its width.
constexpr float B_FORM_BAR_WIDTH = 16;

// Holds the controls of a form. Where it is less high than they are together they scroll, and the one that
// gets the keyboard comes into sight. It lays out nothing and paints nothing.
class BFormView : public BView {
  public:
    BFormView(BRect frame, const char* name, uint32 resizingMode);
};
