#include "db/Database.h"

#include <cerrno>
#include <cstring>
#include <limits>
#include <utility>

#include "db/Bytes.h"
#include "util/CharacterBuffer.h"

namespace {

constexpr int DefaultCacheKilobytes = 256;
constexpr std::int32_t DefaultDecimals = 2;

bool IsUsablePath(const char* path) {
    return path != nullptr && *path != '\0' && strnlen(path, PathBufferSize) < PathBufferSize;
}

bool MayOnlyBeRead(int error) {
    return error == EACCES || error == EPERM || error == EROFS;
}

COLUMN_ENTRY ColumnFor(const COLUMN_ENTRY& wanted) {
    COLUMN_ENTRY column{};
    CopyTextZeroed(column.name, FieldText(wanted.name));
    column.type = wanted.type;
    column.size = wanted.size;
    if (wanted.type == ColumnType::Float)
        column.format = (wanted.format & DecimalsMask) != 0 ? wanted.format : DefaultDecimals;
    return column;
}

bool IsWidthAllowed(const COLUMN_ENTRY& column) {
    return column.type == ColumnType::String ? column.size > 0 : column.size >= 0;
}

} // namespace

DATABASE::DATABASE(const char* path, FileOperations& operations)
    : operations_(operations), file_(operations) {
    SetReadCache(DefaultCacheKilobytes);
    if (path != nullptr)
        Open(path);
}

DATABASE::~DATABASE() = default;

int DATABASE::Fail(int code) {
    lastError_ = code;
    return -1;
}

int DATABASE::Create(const char* path, const char* description, int columnCount,
                     const COLUMN_ENTRY* columns) {
    if (!IsUsablePath(path))
        return Fail(DatabaseError::CreateFailed);
    if (FileExists(path))
        return Fail(DatabaseError::CreateFileExists);
    if (columnCount < 0 || columnCount > std::numeric_limits<std::int16_t>::max() ||
        (columnCount > 0 && columns == nullptr))
        return Fail(DatabaseError::CreateInvalidColumns);
    auto table = TryAllocate<COLUMN_ENTRY>(static_cast<std::size_t>(columnCount));
    if (!table)
        return Fail(DatabaseError::CreateNoMemoryForColumns);
    DATABASE_HEADER header{};
    header.version = 1.0F;
    CopyTextZeroed(header.description, description != nullptr ? description : "");
    header.columnCount = static_cast<std::int16_t>(columnCount);
    if (!LayOutColumns(columns, &header, table.get()))
        return Fail(DatabaseError::CreateInvalidColumns);
    auto recordBuffer = TryAllocate<std::uint8_t>(static_cast<std::size_t>(header.recordLength));
    if (!recordBuffer)
        return Fail(DatabaseError::CreateNoMemoryForRecord);
    File file(operations_);
    if (int error = file.Open(path, FileMode::CreateNew); error != 0)
        return Fail(error == EEXIST ? DatabaseError::CreateFileExists : DatabaseError::CreateFailed);
    if (WriteLayout(file, header, table.get()) != 0) {
        static_cast<void>(RemoveFile(operations_, path)); // nothing more can be done about half a file
        return Fail(DatabaseError::CreateFailed);
    }
    Adopt(std::move(file), path, header, std::move(table), std::move(recordBuffer));
    return 0;
}

bool DATABASE::LayOutColumns(const COLUMN_ENTRY* wanted, DATABASE_HEADER* header,
                             COLUMN_ENTRY* columns) const {
    int offset = 0;
    for (int i = 0; i < header->columnCount; ++i) {
        columns[i] = ColumnFor(wanted[i]);
        columns[i].offset = static_cast<std::int16_t>(offset);
        AdjustColumnSize(&columns[i]);
        CleanColumn(&columns[i]);
        if (!IsWidthAllowed(columns[i]))
            return false;
        offset += columns[i].size;
        if (offset >= std::numeric_limits<std::int16_t>::max())
            return false;
    }
    header->recordLength = static_cast<std::int16_t>(offset + 1);
    return true;
}

int DATABASE::Open(const char* path) {
    CloseFile();
    return OpenFile(path);
}

int DATABASE::OpenFile(const char* path) {
    if (!IsUsablePath(path))
        return Fail(DatabaseError::OpenFailed);
    File file(operations_);
    int error = file.Open(path, FileMode::ReadWrite);
    const bool readOnly = MayOnlyBeRead(error);
    if (readOnly)
        error = file.Open(path, FileMode::ReadOnly);
    std::int64_t length = 0;
    if (error != 0 || file.Length(&length) != 0)
        return Fail(DatabaseError::OpenFailed);
    DATABASE_HEADER header{};
    std::unique_ptr<COLUMN_ENTRY[]> columns;
    if (int code = ReadLayout(file, length, &header, &columns); code != DatabaseError::None)
        return Fail(code);
    auto recordBuffer = TryAllocate<std::uint8_t>(static_cast<std::size_t>(header.recordLength));
    if (!recordBuffer)
        return Fail(DatabaseError::OpenNoMemoryForRecord);
    const FileCounts counts = CheckRecordCount(&header, length);
    Adopt(std::move(file), path, header, std::move(columns), std::move(recordBuffer));
    fileCounts_ = counts;
    readOnly_ = readOnly;
    const bool impossible = header.deletedCount < 0 || header.deletedCount > header.recordCount;
    if ((impossible || counts == FileCounts::TooFew) && !RecountDeleted()) {
        CloseFile();
        return Fail(DatabaseError::OpenFailed);
    }
    deletedCountWasWrong_ = impossible;
    return 0;
}

int DATABASE::ReadLayout(const File& file, std::int64_t length, DATABASE_HEADER* header,
                         std::unique_ptr<COLUMN_ENTRY[]>* columns) {
    if (file.ReadAt(0, header, HeaderSize) != 0)
        return DatabaseError::OpenFailed;
    header->description[NameSize - 1] = '\0';
    if (!HeaderMakesSense(*header, length))
        return DatabaseError::OpenFailed;
    const auto count = static_cast<std::size_t>(header->columnCount);
    *columns = TryAllocate<COLUMN_ENTRY>(count);
    if (!*columns)
        return DatabaseError::OpenNoMemoryForColumns;
    if (file.ReadAt(HeaderSize, columns->get(), count * ColumnEntrySize) != 0)
        return DatabaseError::OpenFailed;
    for (std::size_t i = 0; i < count; ++i) {
        CleanColumn(&(*columns)[i]);
        if (!ColumnFits((*columns)[i], header->recordLength))
            return DatabaseError::OpenFailed;
    }
    return DatabaseError::None;
}

void DATABASE::Adopt(File file, const char* path, const DATABASE_HEADER& header,
                     std::unique_ptr<COLUMN_ENTRY[]> columns, std::unique_ptr<std::uint8_t[]> recordBuffer) {
    CloseFile();
    file_ = std::move(file);
    CopyText(path_, path);
    header_ = header;
    columns_ = std::move(columns);
    recordBuffer_ = std::move(recordBuffer);
    dataStart_ = DataStart(header_.columnCount);
}

void DATABASE::CloseFile() {
    file_.Close();
    header_ = {};
    columns_.reset();
    recordBuffer_.reset();
    dataStart_ = 0;
    currentRecord_ = -1;
    fileCounts_ = FileCounts::Agree;
    deletedCountWasWrong_ = false;
    readOnly_ = false;
    cache_.Reset();
    DropResultSet();
    lastStatement_[0] = '\0';
}

bool DATABASE::RecountDeleted() {
    ReadCache own;
    ReadCache* reader = ScanCache(&own);
    if (reader == nullptr)
        return false;
    std::int32_t deleted = 0;
    for (std::int32_t i = 0; i < header_.recordCount; ++i) {
        const std::uint8_t* record = reader->Scan(file_, Area(), i);
        if (record == nullptr)
            return false;
        deleted += *record == RecordStatus::Deleted ? 1 : 0;
    }
    header_.deletedCount = deleted;
    return true;
}
