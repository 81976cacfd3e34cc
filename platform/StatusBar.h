#pragma once

#include <mutex>

#include "platform/View.h"

// A progress bar with a line of text above it: to the left the label followed by the text, to the right the
// trailing text followed by the trailing label. The value runs from 0 to the maximum (100 at first).
// Everything may be called from any thread that holds the window's lock; what is changed is on screen a
// moment later.
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
    std::string trailingLabel_;
    float value_ = 0;
    float maximum_ = 100;
    bool refreshPending_ = false;
};
