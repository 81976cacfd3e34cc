#pragma once

#include <cstdint>
#include <memory>

#include "db/DataFile.h"
#include "util/File.h"

// A range of consecutive whole records held in memory, status bytes included. It reads ahead: a whole buffer
// at first and while records are asked for in order (up or down), a little when they are asked for here and
// there. It does not notice writes: its owner, a DATABASE, tells it what has become stale.
class ReadCache {
  public:
    // The largest cache that can be asked for.
    static constexpr int MaximumKilobytes = 1024 * 1024;

    // Replaces the buffer by an empty one of `kilobytes` KB, or one record if that is longer. 0 leaves it
    // without a buffer. False when there is no memory or the size is outside 0 to MaximumKilobytes: then it
    // has no buffer.
    [[nodiscard]] bool Resize(int kilobytes);
    [[nodiscard]] bool HasBuffer() const { return buffer_ != nullptr; }

    // Forgets all records, as for another file.
    void Reset();
    // Forgets all records.
    void Clear();
    // Forgets record n and those after it when n is held.
    void DropFrom(std::int32_t n);

    [[nodiscard]] bool Holds(std::int64_t n) const { return n >= first_ && n <= last_; }
    // The last record held; meaningful after a successful Fill.
    [[nodiscard]] std::int32_t Last() const { return last_; }
    // The bytes of record n, which must be held; valid until the next Fill, Resize or destruction.
    [[nodiscard]] std::uint8_t* Record(std::int64_t n) const {
        return buffer_.get() + (n - first_) * recordLength_;
    }

    // Reads a range of records that contains n, which must lie in the area. Returns 0 or an errno number
    // (ENODATA when the file has become shorter); after a failure n is not held.
    [[nodiscard]] int Fill(const File& file, const RecordArea& area, std::int32_t n);
    // The same with a whole buffer from record n on, for a reader that wants them all.
    [[nodiscard]] int FillFrom(const File& file, const RecordArea& area, std::int32_t n);
    // Record n for such a reader, read with FillFrom when it is not held; null when it cannot be read. Valid
    // as long as what Record returns.
    [[nodiscard]] const std::uint8_t* Scan(const File& file, const RecordArea& area, std::int32_t n) {
        return Holds(n) || FillFrom(file, area, n) == 0 ? Record(n) : nullptr;
    }
    // How many records of that length it can hold, at least 1.
    [[nodiscard]] std::int32_t Capacity(std::int32_t recordLength) const;

  private:
    [[nodiscard]] int ReadRange(const File& file, const RecordArea& area, std::int32_t first,
                                std::int32_t count);

    std::unique_ptr<std::uint8_t[]> buffer_;
    std::int64_t size_ = 0;   // bytes of the buffer
    std::int32_t first_ = -1; // first and last record held; none when last_ < first_ or both are -1
    std::int32_t last_ = -1;
    std::int32_t recordLength_ = 0; // of the records held
    std::int32_t window_ = 0;       // records that the next read ahead may take; 0: as many as fit
};
