#pragma once

#include "platform/View.h"

// A line of text that the person only reads, drawn in the view's high colour.
class BStringView : public BView {
  public:
    BStringView(BRect frame, const char* name, const char* text,
                uint32 resizingMode = B_FOLLOW_LEFT | B_FOLLOW_TOP, uint32 flags = B_WILL_DRAW);

    void SetText(const char* text);
    [[nodiscard]] const char* Text() const { return text_.c_str(); }
    void SetHighColor(rgb_color color) override;

  private:
    std::string text_;
};
