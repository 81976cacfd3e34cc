#include "tools/DataFileTool.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <ostream>
#include <system_error>

#include "app/model/DailyBackup.h"
#include "app/model/DataFolders.h"
#include "db/Compaction.h"
#include "db/FileCheck.h"
#include "tools/RecordFields.h"

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
                (reason != 0 ? " (" + std::generic_category().message(reason) + ")" : "") + Hint(code));
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
    const std::vector<std::string> together = DailyBackup::FilesKeptWith(real.filename());
    const std::vector<std::string> folders = FoldersOf(FolderOf(real), together);
    return std::all_of(folders.begin(), folders.end(),
                       [this](const std::string& folder) { return TakeFolder(folder); });
}

bool DataFileTool::TakeFolder(const std::string& folder) {
    FolderLock& lock = locks_.emplace_back();
    const FolderLock::Outcome outcome = lock.Take(folder, "quorvan-cli");
    if (outcome == FolderLock::Outcome::Held)
        Warn("the folder is in use by " + DescribeHolder(lock.Holder()) + "; nothing is changed");
    else if (outcome == FolderLock::Outcome::Doubtful)
        Warn("the folder was in use by " + DescribeHolder(lock.Holder()) +
             "; once that program has ended, delete " + folder + "/" + FolderLock::FileName);
    else if (outcome == FolderLock::Outcome::Failed && lock.Error() != ENOENT)
        Warn("other programs cannot be kept out of the folder: " + folder + "/" + FolderLock::FileName +
             (lock.Error() == EINVAL ? " is in the way"
                                     : " cannot be made: " + std::generic_category().message(lock.Error())));
    else
        return true; // where there is no folder, there is no file either
    return false;
}

bool DataFileTool::KeepBackup() {
    const std::filesystem::path real(RealPath(file_));
    const int error = DailyBackup(FolderOf(real), DailyBackup::FilesKeptWith(real.filename())).Keep();
    if (error != 0)
        Warn(std::string("the day's backup cannot be made in the folder ") + DailyBackup::FolderName +
             " beside it: " + std::generic_category().message(error) + "; nothing is changed");
    errno = 0;
    return error == 0;
}

bool DataFileTool::Open(Access access) {
    if (access == Access::Change && !TakeFolders())
        return false;
    if (database_.Open(file_.c_str()) != 0) {
        const int code = database_.GetLastError(nullptr);
        Warn(std::to_string(code) + " " + ErrorMessage(code) + ": " + WhyNotOpened());
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

std::string DataFileTool::WhyNotOpened() const {
    FileCheck check;
    const int error = check.Run(file_);
    if (error == 0 && !check.Findings().empty() && !check.IsSound())
        return check.Findings().front().text;
    if (const std::string leftover = FindCompactionLeftover(file_); error == ENOENT && !leftover.empty())
        return "there is no such file, but " + leftover +
               ", as an interrupted compaction leaves it; `check --repair` gives it the file's name";
    if (error == EINVAL)
        return "this is no regular file";
    if (error != 0)
        return std::generic_category().message(error);
    return file_.size() >= PathBufferSize ? "the path is longer than 127 bytes" : "there is no memory for it";
}

// The result of a command that changes something: a sentence for a person, or a number under a name.
void DataFileTool::Tell(const char* name, long number, const std::string& sentence) {
    if (format_ == OutputFormat::Table) {
        output_.Write(sentence + '\n');
        return;
    }
    CELL cell;
    cell.SetNumber(number);
    TableWriter writer(format_, {name}, output_);
    writer.WriteHeading();
    writer.WriteRow({&cell, 1});
}

int DataFileTool::Finish(int status) {
    if (database_.Sync() != 0)
        status = FailAsEngine();
    const int error = output_.Flush();
    if (error == 0 || error == EPIPE)
        return status;
    errors_ << "quorvan-cli: the output cannot be written: " << std::generic_category().message(error)
            << '\n';
    return 1;
}

int DataFileTool::Info() {
    if (!Open(Access::Read))
        return 1;
    DATABASE_HEADER header{};
    database_.GetHeaderInfo(&header);
    const std::vector<std::string> names = {"description", "version", "records",    "deleted",   "active",
                                            "columns",     "length",  "data_start", "read_only", "damaged"};
    std::vector<CELL> values(names.size());
    auto* next = values.data();
    (next++)->SetText(header.description);
    (next++)->SetFloat(header.version, 1);
    for (const std::int64_t number :
         {std::int64_t{header.recordCount}, std::int64_t{header.deletedCount},
          std::int64_t{database_.GetNumberOfActiveRecords()}, std::int64_t{header.columnCount},
          std::int64_t{header.recordLength}, DataStart(header.columnCount)})
        (next++)->SetNumber(number);
    (next++)->SetTruth(database_.IsReadOnly());
    next->SetTruth(database_.IsDamaged());
    if (format_ != OutputFormat::Table) {
        TableWriter writer(format_, names, output_);
        writer.WriteHeading();
        writer.WriteRow(values);
        return 0;
    }
    // A person reads one value under the other more easily.
    TableWriter writer(format_, {"property", "value"}, output_);
    for (const bool write : {false, true}) {
        if (write)
            writer.WriteHeading();
        for (std::size_t i = 0; i < names.size(); ++i) {
            CELL row[2];
            row[0].SetText(names[i]);
            row[1] = values[i];
            write ? writer.WriteRow(row) : writer.Measure(row);
        }
    }
    return 0;
}

int DataFileTool::Columns() {
    if (!Open(Access::Read))
        return 1;
    TableWriter writer(format_, {"name", "type", "width", "offset", "decimals"}, output_);
    const std::vector<COLUMN_ENTRY> columns = AllColumns();
    for (const bool write : {false, true}) {
        if (write)
            writer.WriteHeading();
        for (const COLUMN_ENTRY& column : columns) {
            CELL row[5];
            row[0].SetText(column.name);
            row[1].SetText(ColumnTypeName(column.type));
            row[2].SetNumber(column.size);
            row[3].SetNumber(column.offset);
            if (column.type == ColumnType::Float)
                row[4].SetNumber(column.format & 15);
            write ? writer.WriteRow(row) : writer.Measure(row);
        }
    }
    return 0;
}

std::vector<COLUMN_ENTRY> DataFileTool::AllColumns() {
    DATABASE_HEADER header{};
    database_.GetHeaderInfo(&header);
    std::vector<COLUMN_ENTRY> columns(static_cast<std::size_t>(header.columnCount));
    for (int i = 0; i < header.columnCount; ++i)
        database_.GetColumnInfo(i, &columns[static_cast<std::size_t>(i)]);
    return columns;
}
