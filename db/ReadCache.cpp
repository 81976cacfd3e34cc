#include "db/ReadCache.h"

#include <algorithm>
#include <cerrno>
#include <limits>

#include "db/Bytes.h"

namespace {
constexpr std::int32_t ScatteredBytes = 4096; // read ahead of a record that does not follow the one before
} // namespace

bool ReadCache::Resize(int kilobytes) {
    buffer_.reset();
    size_ = 0;
    Reset();
    if (kilobytes == 0)
        return true;
    if (kilobytes < 0 || kilobytes > MaximumKilobytes)
        return false;
    std::int64_t size = std::max(std::int64_t{kilobytes} * 1024, std::int64_t{LongestRecord});
    buffer_ = TryAllocate<std::uint8_t>(static_cast<std::size_t>(size));
    size_ = buffer_ ? std::int64_t{kilobytes} * 1024 : 0;
    return HasBuffer();
}

void ReadCache::Reset() {
    first_ = -1;
    last_ = -1;
    window_ = 0;
}

void ReadCache::Clear() {
    Reset();
    window_ = 1; // whoever changes records in between gets little to throw away again
}

void ReadCache::DropFrom(std::int32_t n) {
    if (Holds(n)) {
        last_ = n - 1;
        window_ = 1;
    }
}

std::int32_t ReadCache::Capacity(std::int32_t recordLength) const {
    return static_cast<std::int32_t>(std::max<std::int64_t>(size_ / recordLength, 1));
}

int ReadCache::Fill(const File& file, const RecordArea& area, std::int32_t n) {
    const std::int32_t capacity = Capacity(area.recordLength);
    const std::int32_t scattered = std::clamp(ScatteredBytes / area.recordLength, 1, capacity);
    const bool downwards = n == first_ - 1;
    const bool goesOn = downwards || (n > last_ && n - last_ <= scattered);
    if (window_ == 0 || (goesOn && window_ > capacity / 2))
        window_ = capacity;
    else
        window_ = goesOn ? std::max(window_ * 2, scattered) : scattered;
    if (downwards) {
        const std::int32_t first = std::max(n - window_ + 1, 0);
        const int error = ReadRange(file, area, first, n - first + 1);
        return error == 0 && !Holds(n) ? ENODATA : error;
    }
    return ReadRange(file, area, n, std::min(window_, area.recordCount - n));
}

int ReadCache::FillFrom(const File& file, const RecordArea& area, std::int32_t n) {
    return ReadRange(file, area, n, std::min(Capacity(area.recordLength), area.recordCount - n));
}

int ReadCache::ReadRange(const File& file, const RecordArea& area, std::int32_t first, std::int32_t count) {
    const auto length = static_cast<std::size_t>(area.recordLength);
    std::size_t got = 0;
    int error =
        file.ReadUpTo(area.OffsetOf(first), buffer_.get(), static_cast<std::size_t>(count) * length, &got);
    const auto whole = static_cast<std::int32_t>(got / length);
    if (error == 0 && whole == 0)
        error = ENODATA;
    first_ = error == 0 ? first : -1;
    last_ = error == 0 ? first + whole - 1 : -1;
    recordLength_ = area.recordLength;
    return error;
}
