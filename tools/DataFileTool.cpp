#include "tools/DataFileTool.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <ostream>

#include "app/model/DailyBackup.h"
#include "app/model/DataFolders.h"
#include "db/Database.h"
#include "db/FileCheck.h"
#include "tools/RecordFields.h"
#include "tools/Sentences.h"
#include "util/Strings.h"

DataFileTool::DataFileTool(std::string file, OutputFormat format, TextOutput& output, std::ostream& errors,
                           FileOperations& operations)
    : file_(std::move(file)),
      format_(format),
      output_(output),
      errors_(errors),
      operations_(operations),
      database_(nullptr, operations) {}

void DataFileTool::Warn(const std::string& sentence) {
    errors_ << "quorvan-cli: " << file_ << ": " << sentence << '\n';
}

int DataFileTool::Fail(const std::string& sentence) {
    Warn(sentence);
    return 1;
}

// What the engine's message leaves open to somebody at a prompt.
const char* DataFileTool::Hint(int code) {
    switch (code) {
    case DatabaseError::QueryInvalidStatement:
    case DatabaseError::QueryInvalidOperator:
        return ": a condition is a column, an operator and a value with blanks between them, as in "
               "'Name = Alder'";
    case DatabaseError::SetInvalidStatement:
    case DatabaseError::SetInvalidOperator:
        return ": a change is a column, an operator and a value with blanks between them, as in "
               "'Name = Alder'";
    default:
        return "";
    }
}

int DataFileTool::FailWithCode(int code, const std::string& about) {
    const int reason = IsFileFailure(code) ? errno : 0;
    return Fail(about + std::to_string(code) + " " + ErrorMessage(code) +
                (reason != 0 ? " (" + Reason(reason) + ")" : "") + Hint(code));
}

bool DataFileTool::IsFileFailure(int code) {
    switch (code) {
    case DatabaseError::LoadOpenFailed:
    case DatabaseError::ExportOpenFailed:
    case DatabaseError::CompressFirstRename:
    case DatabaseError::CompressSecondRename:
    case DatabaseError::CompressRemoveBackup:
    case DatabaseError::CompressOpenTemporary:
    case DatabaseError::CompressWriteFailed:
    case DatabaseError::CompressReadFailed:
    case DatabaseError::AppendFailed:
    case DatabaseError::HeaderFailed:
    case DatabaseError::SyncFailed:
        return true;
    default:
        return code % 10 == 9 && code != DatabaseError::CompressNoFile;
    }
}

bool DataFileTool::TakeFolders() {
    const std::filesystem::path real(RealPath(file_));
    folder_.emplace(FolderOf(real), DailyBackup::FilesKeptWith(real.filename()));
    const std::string wrong = folder_->Lock();
    if (!wrong.empty())
        Warn(wrong);
    return wrong.empty();
}

bool DataFileTool::KeepBackup() {
    const std::string wrong = folder_->KeepBackup();
    if (!wrong.empty())
        Warn(wrong);
    errno = 0;
    return wrong.empty();
}

bool DataFileTool::Open(Access access) {
    if (access == Access::Change && !TakeFolders())
        return false;
    if (database_.Open(file_.c_str()) != 0) {
        const int code = database_.GetLastError(nullptr);
        Warn(std::to_string(code) + " " + ErrorMessage(code) + ": " + WhyNotOpened(file_));
        return false;
    }
    errno = 0; // so that it tells of the operations to come only
    if (access == Access::Change && database_.IsReadOnly()) {
        Warn("the file may only be read, not changed");
        return false;
    }
    if (access == Access::Change && database_.IsDamaged()) {
        Warn("the file is damaged: its header disagrees with it; nothing is changed before `check --repair`");
        return false;
    }
    if (database_.IsDamaged())
        Warn("the file is damaged: its header disagrees with it, and records may be missing; see `check`");
    return access == Access::Read || KeepBackup();
}

int DataFileTool::Print(const std::vector<std::string>& names, const std::vector<std::vector<Cell>>& rows) {
    WriteRows(format_, names, rows, output_);
    return 0;
}

// The result of a command that changes something: a sentence for a person, or a number under a name.
void DataFileTool::Tell(const char* name, long number, const std::string& sentence) {
    if (format_ == OutputFormat::Table)
        output_.Write(sentence + '\n');
    else
        Print({name}, {{NumberCell(number)}});
}

int DataFileTool::Finish(int status) {
    if (database_.Sync() != 0)
        status = FailAsEngine();
    return status;
}

int DataFileTool::Info() {
    if (!Open(Access::Read))
        return 1;
    DATABASE_HEADER header{};
    database_.GetHeaderInfo(&header);
    const std::vector<std::string> names = {"description", "version", "records",    "deleted",   "active",
                                            "columns",     "length",  "data_start", "read_only", "damaged"};
    const std::vector<Cell> values = {
        TextCell(header.description),
        {Cell::Kind::Float, {}, 0, header.version, 1},
        NumberCell(header.recordCount),
        NumberCell(header.deletedCount),
        NumberCell(database_.GetNumberOfActiveRecords()),
        NumberCell(header.columnCount),
        NumberCell(header.recordLength),
        NumberCell(DataStart(header.columnCount)),
        {Cell::Kind::Truth, {}, database_.IsReadOnly()},
        {Cell::Kind::Truth, {}, database_.IsDamaged()},
    };
    if (format_ != OutputFormat::Table)
        return Print(names, {values});
    // A person reads one value under the other more easily.
    std::vector<std::vector<Cell>> rows;
    for (std::size_t i = 0; i < names.size(); ++i)
        rows.push_back({TextCell(names[i]), values[i]});
    return Print({"property", "value"}, rows);
}

int DataFileTool::Columns() {
    if (!Open(Access::Read))
        return 1;
    std::vector<std::vector<Cell>> rows;
    for (const COLUMN_ENTRY& column : AllColumns())
        rows.push_back({TextCell(column.name), TextCell(ColumnTypeName(column.type)), NumberCell(column.size),
                        NumberCell(column.offset),
                        column.type == ColumnType::Float ? NumberCell(column.format & 15) : Cell()});
    return Print({"name", "type", "width", "offset", "decimals"}, rows);
}

std::vector<COLUMN_ENTRY> DataFileTool::AllColumns() {
    DATABASE_HEADER header{};
    database_.GetHeaderInfo(&header);
    std::vector<COLUMN_ENTRY> columns(static_cast<std::size_t>(header.columnCount));
    for (int i = 0; i < header.columnCount; ++i)
        database_.GetColumnInfo(i, &columns[static_cast<std::size_t>(i)]);
    return columns;
}
