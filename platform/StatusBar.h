#pragma once

#include <mutex>

#include "platform/View.h"

// A progress bar with a line of text above it: the label followed by the text. The value runs from 0 to the
// maximum (100 at first).
// Everything may be called from any thread that holds the window's lock; what is changed is on screen a
// moment later.
class BStatusBar : public BView {
  public:
    BStatusBar(BRect frame, const char* name, const char* label);

    void SetMaxValue(float maximum);
    // Advances the value, at most to the maximum.
    void Update(float delta);
    void SetText(const char* text);

  private:
    void Refresh();

    std::mutex mutex_; // guards what follows
    std::string label_;
    std::string text_;
    float value_ = 0;
    float maximum_ = 100;
    bool changed_ = true; // since the last refresh
};
