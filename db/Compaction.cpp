
#include <cerrno>
#include <cstring>

#include "db/Database.h"

namespace {

std::string WithExtension(const std::string& path, const char* extension) {
    char folder[PathBufferSize];
    char name[PathBufferSize];
    char oldExtension[PathBufferSize];
    char result[PathBufferSize];
    _splitpath(path.c_str(), nullptr, folder, name, oldExtension);
    _makepath(result, nullptr, folder, name, extension);
    return result;
}

bool IsPermissionDenied(int error) {
    return error == EACCES || error == EPERM;
}

// Moves the records that are not deleted to the front, without their locks; returns how many there are.
std::size_t PackActive(std::uint8_t* records, std::size_t count, std::size_t length) {
    std::uint8_t* target = records;
    for (const std::uint8_t* record = records; count > 0; --count, record += length) {
        if (*record == RecordStatus::Deleted)
            continue;
        if (target != record)
            std::memmove(target, record, length);
        *target = RecordStatus::Active;
        target += length;
    }
    return static_cast<std::size_t>(target - records) / length;
}

} // namespace

bool FindCompactionPaths(const std::string& path, CompactionPaths* paths) {
    paths->data = FollowLinks(path);
    if (paths->data.empty() || paths->data.size() >= PathBufferSize)
        return false;
    paths->temporary = WithExtension(paths->data, "new");
    paths->backup = WithExtension(paths->data, "bak");
    return !paths->temporary.empty() && !paths->backup.empty() && paths->data != paths->temporary &&
           paths->data != paths->backup;
}

std::string FindCompactionLeftover(const std::string& path) {
    CompactionPaths paths;
    if (!FindCompactionPaths(path, &paths) || FileExists(paths.data))
        return {};
    if (FileExists(paths.backup))
        return paths.backup;
    return FileExists(paths.temporary) ? paths.temporary : std::string();
}

int RestoreCompactionBackup(const char* path, FileOperations& operations) {
    CompactionPaths paths;
    if (path == nullptr || !FindCompactionPaths(path, &paths) || FileExists(paths.data) ||
        !FileExists(paths.backup))
        return 0;
    return RenameFile(operations, paths.backup, paths.data) == 0 ? 1 : -1;
}

int DATABASE::Compress(int /*ignored*/) {
    if (!IsOpen())
        return Fail(DatabaseError::CompressNoFile);
    if (IsDamaged())
        return Fail(DatabaseError::CompressDamaged);
    CompactionPaths paths;
    if (readOnly_ || !FindCompactionPaths(path_, &paths))
        return Fail(DatabaseError::CompressOpenTemporary);
    // After an earlier failure the data may still lie under the backup's name, from where it must not be
    // removed.
    if (RestoreCompactionBackup(path_, operations_) < 0 || !file_.IsAt(paths.data))
        return Fail(DatabaseError::CompressFirstRename);
    static_cast<void>(RemoveFile(operations_, paths.temporary)); // a leftover, or a link to somewhere else
    File target(operations_);
    // Until it has the data file's permissions, nobody may look who may not look into that.
    if (target.Open(paths.temporary, FileMode::CreateNew) != 0)
        return Fail(DatabaseError::CompressOpenTemporary);
    int code = WriteCompacted(target);
    if (code == DatabaseError::None && SyncFolderOf(operations_, paths.temporary) != 0)
        code = DatabaseError::CompressWriteFailed;
    if (code != DatabaseError::None) {
        target.Close();
        static_cast<void>(RemoveFile(operations_, paths.temporary)); // gives back the room it took
        return Fail(code);
    }
    target.Close();
    return SwapIn(paths);
}

// Writes header, columns and active records, through to the disk. Returns an error code.
int DATABASE::WriteCompacted(File& target) {
    DATABASE_HEADER header = header_;
    header.recordCount = 0;
    header.deletedCount = 0;
    if (WriteLayout(target, header, columns_.get()) != 0)
        return DatabaseError::CompressWriteFailed;
    if (int code = CopyActiveRecords(target, &header.recordCount); code != DatabaseError::None)
        return code;
    if (WriteLayout(target, header, columns_.get()) != 0 || target.TakeOwnerAndMode(file_) != 0 ||
        target.Sync() != 0)
        return DatabaseError::CompressWriteFailed;
    return DatabaseError::None;
}

int DATABASE::CopyActiveRecords(File& target, std::int32_t* copied) {
    constexpr int bufferKilobytes = 256;
    ReadCache reader; // its records are moved about, so it is not the object's own cache
    if (!reader.Resize(bufferKilobytes))
        return DatabaseError::CompressNoMemory;
    const auto length = static_cast<std::size_t>(header_.recordLength);
    RecordArea area = Area();
    for (std::int32_t i = 0; i < header_.recordCount; i = reader.Last() + 1) {
        if (reader.FillFrom(file_, area, i) != 0)
            return DatabaseError::CompressReadFailed;
        std::uint8_t* records = reader.Record(i);
        const std::size_t active =
            PackActive(records, static_cast<std::size_t>(reader.Last() + 1 - i), length);
        if (target.WriteAt(area.OffsetOf(*copied), records, active * length) != 0)
            return DatabaseError::CompressWriteFailed;
        *copied += static_cast<std::int32_t>(active);
    }
    return DatabaseError::None;
}

// Puts the temporary file in the place of the data file. The data file stays open until the new one has its
// name, so that after a failure the object goes on with the old data, under whichever name that is.
int DATABASE::SwapIn(const CompactionPaths& paths) {
    if (IsPermissionDenied(RemoveFile(operations_, paths.backup)))
        return Fail(DatabaseError::CompressRemoveBackup);
    if (RenameFile(operations_, paths.data, paths.backup) != 0)
        return Fail(DatabaseError::CompressFirstRename);
    if (RenameFile(operations_, paths.temporary, paths.data) != 0)
        return Fail(DatabaseError::CompressSecondRename);
    // The names must be on the disk before the old data goes; else it stays until the next run.
    const bool swapped = SyncFolderOf(operations_, paths.data) == 0;
    const bool denied = swapped && IsPermissionDenied(RemoveFile(operations_, paths.backup));
    char path[PathBufferSize];
    std::memcpy(path, path_, PathBufferSize);
    const int opened = Open(path);
    return denied ? Fail(DatabaseError::CompressRemoveBackup) : opened;
}
