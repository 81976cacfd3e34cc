#pragma once

#include <string>

// Saves what the screen shows of the program as PNG files in one folder. The screen itself is read, not the
// windows, so that what covers a window or lies beside it is seen as a person would. Interface thread.
class Pictures {
  public:
    explicit Pictures(std::string folder) : folder_(std::move(folder)) {}

    // Paints what waits to be painted and saves the part of the screen that the program's visible windows
    // cover as folder/name.png. False when it could not be written, or is all of one colour.
    [[nodiscard]] bool Take(const std::string& name) const;

  private:
    std::string folder_;
};
