#pragma once

#include "platform/Control.h"

class TextControlFilter;

// A line of text with a label to its left. It sends no message.
class BTextControl : public BControl {
  public:
    // The height is adjusted to what the line needs. The divider is half the width at first.
    BTextControl(BRect frame, const char* name, const char* label, const char* text,
                 uint32 resizingMode = B_FOLLOW_LEFT | B_FOLLOW_TOP,
                 uint32 flags = B_WILL_DRAW | B_NAVIGABLE);

    void SetText(const char* text);
    // UTF-8; valid until the text changes or the next call.
    [[nodiscard]] const char* Text() const;
    // Width of the label's part, from the control's left edge to the text field.
    void SetDivider(float divider);

    // Limits the text to a number of bytes of UTF-8. What is typed, pasted or dropped and does not fit is not
    // taken, not even in part, and the person hears and reads so; the tool tip names the limit. What the
    // program sets, or had set before the limit, is cut at its end, between whole characters. With or without
    // a limit, line ends, tabs and other control characters are left out at the end and turned into blanks
    // elsewhere.
    void SetMaxBytes(int32 bytes);

    void MakeFocus(bool focus = true) override;
    [[nodiscard]] bool IsFocus() const override;

  private:
    TextControlFilter* filter_; // belongs to the line
    mutable std::string text_;
};
