#pragma once

#include <mutex>

#include "platform/View.h"

// A progress bar with a line of text above it: the label followed by the text. The value runs from 0 to the
// maximum (100 at first). Update, Reset and SetText may be called from any thread that holds the window's
// lock; what they change is on screen a moment later.
class BStatusBar : public BView {
  public:
    BStatusBar(BRect frame, const char* name, const char* label = nullptr,
               const char* trailingLabel = nullptr);
    ~BStatusBar() override;

    void SetMaxValue(float maximum);
    [[nodiscard]] float MaxValue() const;
    [[nodiscard]] float CurrentValue() const;
    // Advances the value, at most to the maximum; a text that is not null replaces the present one.
    void Update(float delta, const char* text = nullptr, const char* trailingText = nullptr);
    void SetText(const char* text);
    [[nodiscard]] std::string Text() const;

  private:
    void ScheduleRefresh();
    void Refresh();

    mutable std::mutex mutex_; // guards what follows
    std::string label_;
    std::string text_;
    std::string trailing_;
    float value_ = 0;
    float maximum_ = 100;
};
