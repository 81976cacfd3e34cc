#include "db/TextFile.h"

#include <algorithm>
#include <cstring>
#include <string_view>

#include "db/Bytes.h"

namespace {
constexpr std::size_t BlockSize = 256 * 1024;
}

bool LineReader::Prepare(std::size_t longest) {
    longest_ = longest;
    block_ = TryAllocate<char>(BlockSize);
    line_ = TryAllocate<char>(longest + 1);
    return block_ && line_;
}

int LineReader::Next(std::span<char>* line) {
    std::size_t length = 0;
    const void* newline = nullptr;
    while (newline == nullptr && length < longest_) {
        if (next_ == end_) {
            next_ = 0;
            if (const int error = file_.ReadUpTo(offset_, block_.get(), BlockSize, &end_); error != 0)
                return error;
            offset_ += static_cast<std::int64_t>(end_);
            if (end_ == 0)
                break;
        }
        const char* begin = block_.get() + next_;
        std::size_t count = std::min(end_ - next_, longest_ - length);
        newline = std::memchr(begin, '\n', count);
        if (newline != nullptr)
            count = static_cast<std::size_t>(static_cast<const char*>(newline) - begin) + 1;
        std::memcpy(line_.get() + length, begin, count);
        length += count;
        next_ += count;
    }
    *line = {line_.get(), length};
    return 0;
}

void LineReader::Rewind() {
    offset_ = start_;
    next_ = 0;
    end_ = 0;
}

int LineReader::PassByteOrderMark() {
    constexpr std::string_view mark = "\xEF\xBB\xBF";
    char beginning[mark.size()];
    std::size_t length = 0;
    const int error = file_.ReadUpTo(0, beginning, sizeof(beginning), &length);
    if (error == 0 && std::string_view(beginning, length) == mark)
        start_ = mark.size();
    Rewind();
    return error;
}

bool TextWriter::Prepare(std::size_t longest) {
    longest_ = longest;
    size_ = std::max(longest, BlockSize);
    block_ = TryAllocate<char>(size_);
    return block_ != nullptr;
}

char* TextWriter::Room() {
    if (size_ - used_ < longest_ && Flush() != 0)
        return nullptr;
    return block_.get() + used_;
}

int TextWriter::Flush() {
    const int error = file_.WriteAt(offset_, block_.get(), used_);
    offset_ += static_cast<std::int64_t>(used_);
    used_ = 0;
    return error;
}
