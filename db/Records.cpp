#include <algorithm>
#include <cstring>
#include <limits>

#include "db/Bytes.h"
#include "db/Database.h"

int DATABASE::PrepareAppend(std::int32_t count) {
    if (!IsOpen())
        return DatabaseError::AppendNoFile;
    if (fileCounts_ == FileCounts::TooMany)
        return DatabaseError::AppendDamaged;
    if (count > std::numeric_limits<std::int32_t>::max() - header_.recordCount)
        return DatabaseError::AppendFull;
    // What an AppendAll that was killed left behind the counted records is cut off while the header tells of
    // it.
    if (header_.reserved != 0) {
        if (file_.Truncate(Area().OffsetOf(header_.recordCount)) != 0)
            return DatabaseError::AppendFailed;
        header_.reserved = 0;
    }
    return DatabaseError::None;
}

long DATABASE::AppendAll(const void* data, std::size_t stride, std::int32_t count) {
    if (const int code = PrepareAppend(count); code != DatabaseError::None)
        return Fail(code);
    const std::int32_t number = header_.recordCount;
    if (count <= 0)
        return number;
    header_.reserved = count;
    int code = WriteDbHeader() == 0 ? DatabaseError::None : DatabaseError::HeaderFailed;
    if (code == DatabaseError::None &&
        WriteNewRecords(static_cast<const std::uint8_t*>(data), stride, count) != 0)
        code = DatabaseError::AppendFailed;
    if (code == DatabaseError::None && ChangeCounts(number + count, header_.deletedCount, 0) != 0)
        code = DatabaseError::HeaderFailed;
    if (code != DatabaseError::None) {
        // While the header still announces them. What cannot be cut off now stays announced, for the next
        // append to cut it.
        if (file_.Truncate(Area().OffsetOf(number)) == 0) {
            header_.reserved = 0;
            static_cast<void>(WriteDbHeader());
        }
        return Fail(code);
    }
    currentRecord_ = number + count - 1;
    return number;
}

int DATABASE::WriteNewRecords(const std::uint8_t* data, std::size_t stride, std::int32_t count) {
    constexpr std::size_t blockSize = 256 * 1024;
    const std::size_t length = DataSize() + 1;
    const auto perBlock = static_cast<std::int32_t>(std::max<std::size_t>(blockSize / length, 1));
    const auto block =
        TryAllocate<std::uint8_t>(length * static_cast<std::size_t>(std::min(perBlock, count)));
    if (!block)
        return -1;
    for (std::int32_t first = 0; first < count; first += perBlock) {
        const std::int32_t records = std::min(perBlock, count - first);
        std::uint8_t* end = block.get();
        for (std::int32_t i = 0; i < records; ++i, data += stride, end += length) {
            *end = RecordStatus::Active;
            std::memcpy(end + 1, data, DataSize());
        }
        if (file_.WriteAt(Area().OffsetOf(header_.recordCount + first), block.get(),
                          static_cast<std::size_t>(end - block.get())) != 0)
            return -1;
    }
    return 0;
}

long DATABASE::Append(const void* data) {
    if (const int code = PrepareAppend(1); code != DatabaseError::None)
        return Fail(code);
    const std::int32_t number = header_.recordCount;
    std::uint8_t record[LongestRecord];
    record[0] = RecordStatus::Active;
    std::memcpy(record + 1, data, DataSize());
    const std::int64_t end = Area().OffsetOf(number);
    if (file_.WriteAt(end, record, DataSize() + 1) != 0) {
        static_cast<void>(file_.Truncate(end)); // bytes behind the last record do no harm if this fails too
        return Fail(DatabaseError::AppendFailed);
    }
    if (ChangeCounts(number + 1, header_.deletedCount, 0) != 0)
        return Fail(DatabaseError::HeaderFailed);
    currentRecord_ = number;
    return number;
}

int DATABASE::Read(long n, void* data) {
    int code = FetchRecord(n, data, cache_.HasBuffer());
    return code == DatabaseError::None ? 1 : Fail(code);
}

int DATABASE::UnBufferedRead(long n, void* data) {
    int code = FetchRecord(n, data, false);
    return code == DatabaseError::None ? 1 : Fail(code);
}

int DATABASE::FetchRecord(long n, void* data, bool cached) {
    if (!IsRecordNumber(n))
        return DatabaseError::ReadInvalidRecord;
    std::uint8_t bytes[LongestRecord];
    const std::uint8_t* record = bytes;
    if (cached) {
        if (!cache_.Holds(n) && cache_.Fill(file_, Area(), static_cast<std::int32_t>(n)) != 0)
            return DatabaseError::ReadFailed;
        record = cache_.Record(n);
    } else if (file_.ReadAt(Area().OffsetOf(n), bytes, DataSize() + 1) != 0) {
        return DatabaseError::ReadFailed;
    }
    if (*record == RecordStatus::Deleted)
        return DatabaseError::ReadDeleted;
    std::memcpy(data, record + 1, DataSize());
    currentRecord_ = static_cast<std::int32_t>(n);
    return DatabaseError::None;
}

int DATABASE::Update(const void* data) {
    return currentRecord_ < 0 ? Fail(DatabaseError::UpdateNoRecord) : Write(currentRecord_, data);
}

int DATABASE::Write(long n, const void* data) {
    if (!IsRecordNumber(n))
        return Fail(DatabaseError::WriteInvalidRecord);
    const std::int64_t offset = Area().OffsetOf(n);
    const std::size_t length = DataSize() + 1;
    std::uint8_t before[LongestRecord];
    if (file_.ReadAt(offset, before, length) != 0)
        return Fail(DatabaseError::WriteFailed);
    if (before[0] == RecordStatus::Deleted)
        return Fail(DatabaseError::WriteDeleted);
    std::uint8_t after[LongestRecord];
    after[0] = RecordStatus::Active;
    std::memcpy(after + 1, data, length - 1);
    cache_.DropFrom(static_cast<std::int32_t>(n));
    if (file_.WriteAt(offset, after, length) != 0) {
        static_cast<void>(
            file_.WriteAt(offset, before, length)); // part of the new record may have been written
        return Fail(DatabaseError::WriteFailed);
    }
    currentRecord_ = static_cast<std::int32_t>(n);
    return 0;
}

// Reads the status byte of record n. On failure the pending error is one of the two given.
int DATABASE::LookUpStatus(long n, int invalidRecord, int readFailed, std::uint8_t* status) {
    if (!IsRecordNumber(n))
        return Fail(invalidRecord);
    return file_.ReadAt(Area().OffsetOf(n), status, 1) == 0 ? 0 : Fail(readFailed);
}

int DATABASE::WriteStatus(long n, std::uint8_t status) {
    return file_.WriteAt(Area().OffsetOf(n), &status, 1);
}

// Changes the counts in memory and, while that is on, in the file; a failure leaves both as they were.
int DATABASE::ChangeCounts(std::int32_t recordCount, std::int32_t deletedCount, std::int32_t reserved) {
    const DATABASE_HEADER before = header_;
    header_.recordCount = recordCount;
    header_.deletedCount = deletedCount;
    header_.reserved = reserved;
    if (WriteDbHeader() == 0)
        return 0;
    header_ = before;
    static_cast<void>(WriteHeaderBytes()); // part of the new header may have been written
    return -1;
}

int DATABASE::Delete(long n) {
    std::uint8_t status = 0;
    if (LookUpStatus(n, DatabaseError::DeleteInvalidRecord, DatabaseError::DeleteFailed, &status) != 0)
        return -1;
    if (status == RecordStatus::Deleted)
        return Fail(DatabaseError::DeleteDeleted);
    if (int code = ChangeStatus(n, status, RecordStatus::Deleted, DatabaseError::DeleteFailed); code != 0)
        return Fail(code);
    currentRecord_ = -1;
    RemoveFromResultSet(n);
    return 0;
}

int DATABASE::UnDelete(long n) {
    std::uint8_t status = 0;
    if (LookUpStatus(n, DatabaseError::UnDeleteInvalidRecord, DatabaseError::UnDeleteFailed, &status) != 0)
        return -1;
    if (status != RecordStatus::Deleted)
        return Fail(DatabaseError::UnDeleteNotDeleted);
    if (int code = ChangeStatus(n, status, RecordStatus::Active, DatabaseError::UnDeleteFailed); code != 0)
        return Fail(code);
    currentRecord_ = static_cast<std::int32_t>(n);
    return 0;
}

// Takes a record into or out of the deleted ones, the counts with it. Returns an error code; after a failure
// the record is what it was.
int DATABASE::ChangeStatus(long n, std::uint8_t from, std::uint8_t to, int failure) {
    if (WriteStatus(n, to) != 0)
        return failure;
    cache_.Clear();
    // A count that an interrupted run left too low stays in its range.
    const std::int32_t deleted = to == RecordStatus::Deleted
                                     ? std::min(header_.deletedCount + 1, header_.recordCount)
                                     : std::max(header_.deletedCount - 1, 0);
    if (ChangeCounts(header_.recordCount, deleted, header_.reserved) != 0) {
        static_cast<void>(WriteStatus(n, from));
        return DatabaseError::HeaderFailed;
    }
    return DatabaseError::None;
}

void DATABASE::RemoveFromResultSet(long n) {
    // Until a sort record n can be in slot n only.
    const std::int32_t first = sorted_ ? 0 : static_cast<std::int32_t>(n);
    const std::int32_t last = sorted_ ? slotCount_ - 1 : first;
    for (std::int32_t i = first; i <= last && i < slotCount_; ++i) {
        if (slots_[i] == n) {
            slots_[i] = -1;
            --resultCount_;
            return;
        }
    }
}

int DATABASE::Lock(long n) {
    return ChangeLock(n, RecordStatus::Locked,
                      {DatabaseError::LockInvalidRecord, DatabaseError::LockDeleted,
                       DatabaseError::LockLocked, DatabaseError::LockFailed});
}

int DATABASE::UnLock(long n) {
    return ChangeLock(n, RecordStatus::Active,
                      {DatabaseError::UnLockInvalidRecord, DatabaseError::UnLockDeleted,
                       DatabaseError::UnLockNotLocked, DatabaseError::UnLockFailed});
}

int DATABASE::ChangeLock(long n, std::uint8_t to, const LockCodes& codes) {
    std::uint8_t status = 0;
    if (LookUpStatus(n, codes.invalidRecord, codes.failed, &status) != 0)
        return -1;
    if (status == RecordStatus::Deleted)
        return Fail(codes.deleted);
    if ((status == RecordStatus::Locked) == (to == RecordStatus::Locked))
        return Fail(codes.unchanged);
    if (WriteStatus(n, to) != 0)
        return Fail(codes.failed);
    currentRecord_ = static_cast<std::int32_t>(n);
    return 0;
}

int DATABASE::IsLocked(long n) {
    std::uint8_t status = 0;
    if (LookUpStatus(n, DatabaseError::IsLockedInvalidRecord, DatabaseError::IsLockedFailed, &status) != 0)
        return -1;
    if (status == RecordStatus::Deleted)
        return Fail(DatabaseError::IsLockedDeleted);
    return status == RecordStatus::Locked ? 1 : 0;
}

int DATABASE::SetReadCache(int kilobytes) {
    return cache_.Resize(kilobytes) ? 0 : Fail(DatabaseError::CacheNoMemory);
}

int DATABASE::GetLastError(char* message) {
    const int code = lastError_;
    if (message != nullptr)
        std::strcpy(message, ErrorMessage(code));
    lastError_ = DatabaseError::None;
    return code;
}
