#pragma once

#include "platform/Control.h"

// A push button.
class BButton : public BControl {
  public:
    BButton(BRect frame, const char* name, const char* label, BMessage* message,
            uint32 resizingMode = B_FOLLOW_LEFT | B_FOLLOW_TOP, uint32 flags = B_WILL_DRAW | B_NAVIGABLE);
};

// A box to tick: value B_CONTROL_ON or B_CONTROL_OFF. Its message goes out after the value changed by the
// person's hand.
class BCheckBox : public BControl {
  public:
    BCheckBox(BRect frame, const char* name, const char* label, BMessage* message,
              uint32 resizingMode = B_FOLLOW_LEFT | B_FOLLOW_TOP, uint32 flags = B_WILL_DRAW | B_NAVIGABLE);

    void SetValue(int32 value) override;
};
