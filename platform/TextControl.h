#pragma once

#include "platform/Control.h"

class TextControlFilter;

// A line of text with a label to its left. Its message, if any, goes out when the person leaves a changed
// text or presses Enter in it.
class BTextControl : public BControl {
  public:
    // The height is adjusted to what the line needs. The divider is half the width at first.
    BTextControl(BRect frame, const char* name, const char* label, const char* text, BMessage* message,
                 uint32 resizingMode = B_FOLLOW_LEFT | B_FOLLOW_TOP,
                 uint32 flags = B_WILL_DRAW | B_NAVIGABLE);
    ~BTextControl() override;

    void SetLabel(const char* label) override;
    void SetText(const char* text);
    // UTF-8; valid until the text changes or the next call.
    [[nodiscard]] const char* Text() const;
    // Width of the label's part, from the control's left edge to the text field.
    void SetDivider(float divider);
    [[nodiscard]] float Divider() const;

    // Limits the text to a number of bytes of UTF-8, typed, pasted, dropped or set: what is put in is cut,
    // between whole characters, and what was there stays (a text too long when the limit is set is cut at its
    // end). With or without a limit, line ends, tabs and other control characters are turned into blanks.
    void SetMaxBytes(int32 bytes);

    void MakeFocus(bool focus = true) override;
    [[nodiscard]] bool IsFocus() const override;

  private:
    void Send();

    TextControlFilter* filter_; // belongs to the line
    mutable std::string text_;
    std::string sent_; // the text as of the last message or as set
};
