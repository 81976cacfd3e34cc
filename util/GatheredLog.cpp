#include "util/GatheredLog.h"

#include "util/DebugLog.h"

namespace {

constexpr std::size_t WorthAWrite = 4096;

} // namespace

void GatheredLog::Add(std::string_view text) {
    unwritten_ += text;
    if (unwritten_.size() >= WorthAWrite)
        Write();
}

void GatheredLog::Write() {
    if (!unwritten_.empty())
        PrintDebugStatement(unwritten_.c_str(), path_);
    unwritten_.clear();
}
