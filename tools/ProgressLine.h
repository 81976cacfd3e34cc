#pragma once

#include <chrono>
#include <string>

// A line on a terminal that rewrites itself while something takes its time, and is gone at the end. Nothing
// where the descriptor is no terminal. Used on one thread.
class ProgressLine {
  public:
    // A text that is younger than `pause` is not replaced.
    explicit ProgressLine(int descriptor, std::chrono::milliseconds pause = std::chrono::milliseconds(100));
    ProgressLine(const ProgressLine&) = delete;
    ProgressLine& operator=(const ProgressLine&) = delete;
    ~ProgressLine();

    // Shows the text in place of the one before.
    void Show(const std::string& text);

  private:
    void Write(const std::string& text) const;

    int descriptor_;
    std::chrono::milliseconds pause_;
    bool shows_;
    std::chrono::steady_clock::time_point next_{};
    bool shown_ = false;
};
