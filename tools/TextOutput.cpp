#include "tools/TextOutput.h"

#include <cerrno>
#include <unistd.h>

namespace {
constexpr std::size_t PieceSize = 256 * 1024;
}

void TextOutput::Write(std::string_view text) {
    kept_ += text;
    if (kept_.size() >= PieceSize)
        Flush();
}

int TextOutput::Flush() {
    std::string_view rest = kept_;
    while (error_ == 0 && !rest.empty()) {
        const ssize_t written = write(descriptor_, rest.data(), rest.size());
        if (written >= 0)
            rest.remove_prefix(static_cast<std::size_t>(written));
        else if (errno != EINTR)
            error_ = errno;
    }
    kept_.clear();
    return error_;
}
