#pragma once

#include <string>
#include <string_view>

// Text for an open file descriptor, kept back and written in large pieces. The first failure ends it: what
// comes later is dropped, and the owner asks for the failure when it is done. It neither opens nor closes the
// descriptor. Used on one thread.
class TextOutput {
  public:
    explicit TextOutput(int descriptor) : descriptor_(descriptor) {}
    TextOutput(const TextOutput&) = delete;
    TextOutput& operator=(const TextOutput&) = delete;

    void Write(std::string_view text);
    // Writes what was kept back. Returns 0, or the errno number of the first failure since the beginning.
    int Flush();
    // False once writing has failed: there is no use in going on.
    [[nodiscard]] bool IsWorking() const { return error_ == 0; }

  private:
    int descriptor_;
    int error_ = 0;
    std::string kept_;
};
