#pragma once

// The file that a print job writes. Only for the layer's own sources.

#include <string>

// A PDF file in the making: written to a temporary beside the wanted path, which takes its place when it is
// whole. Until then, and when anything fails, what was there before stays as it was. A path that is no
// regular file, such as a device, is written directly.
class OutputFile {
  public:
    OutputFile() = default;
    ~OutputFile() { Drop(); }
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;

    // Makes the temporary. False, with errno telling why, when the path cannot be written.
    [[nodiscard]] bool Begin(const std::string& path);
    // The file to write, with the wanted path's extension.
    [[nodiscard]] const std::string& WritePath() const { return temporary_.empty() ? path_ : temporary_; }
    // Moves the temporary, now closed, to the wanted path. False, with errno telling why and nothing left of
    // it, when it is no whole PDF file or cannot be moved.
    [[nodiscard]] bool Commit();
    // Removes the temporary.
    void Drop();

  private:
    [[nodiscard]] bool MakeTemporary(const std::string& folderAndStem, const std::string& extension);

    std::string path_;
    std::string temporary_; // empty when there is none
};
