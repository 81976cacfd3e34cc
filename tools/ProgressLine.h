#pragma once

#include <chrono>
#include <string>

// A line on a terminal that rewrites itself while something takes its time, and is gone at the end. Nothing
// where the descriptor is no terminal. Used on one thread.
class ProgressLine {
  public:
    explicit ProgressLine(int descriptor);
    ProgressLine(const ProgressLine&) = delete;
    ProgressLine& operator=(const ProgressLine&) = delete;
    ~ProgressLine();

    // Shows the text, unless the one before is less than a tenth of a second old.
    void Show(const std::string& text);

  private:
    void Write(const std::string& text) const;

    int descriptor_;
    bool shows_;
    std::chrono::steady_clock::time_point next_{};
    bool shown_ = false;
};
