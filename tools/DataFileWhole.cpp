// What DataFileTool does with whole files: text files, compaction, new files, the check.
#include <cerrno>

#include "db/Database.h"
#include "db/FileCheck.h"
#include "tools/DataFileTool.h"
#include "tools/RecordFields.h"
#include "tools/Sentences.h"
#include "util/Strings.h"

namespace {

// As the engine numbers it.
int ByteFormat(const TextFormat& format) {
    return format.characters ? 1 : 2;
}

} // namespace

int DataFileTool::Export(const std::string& path, const TextFormat& format, const Selection* selection) {
    if (!Open(Access::Read))
        return 1;
    if (selection != nullptr && !Select(*selection))
        return FailAsEngine();
    database_.SetByteOutputFormat(ByteFormat(format));
    database_.SetHeadingLine(format.heading);
    errno = 0;
    const long lines = database_.Export(path.c_str(), selection == nullptr ? 1 : 0, format.separator.c_str());
    if (lines < 0)
        return FailAsEngine(path + ": ");
    Tell("exported", lines, Counted(lines, "record") + " exported to " + path);
    return 0;
}

// Tells of the lines that are wrong, or why the text cannot be read. Returns an exit status.
int DataFileTool::CheckText(const std::string& path, const TextFormat& format,
                            const std::string& separators) {
    File text(SystemFiles());
    errno = text.Open(path, FileMode::ReadOnly);
    if (errno != 0 || text.IsAt(file_))
        return FailWithCode(DatabaseError::LoadOpenFailed, path + ": ");
    const std::vector<COLUMN_ENTRY> columns = AllColumns();
    TextCheck check(columns, format, separators);
    if (const int code = check.Run(text, database_.LongestLoadLine()); code != 0)
        return FailWithCode(code, path + ": ");
    const std::string where = path + ", ";
    for (const std::string& wrong : check.Wrong())
        Warn(where + wrong);
    return check.Wrong().empty() ? 0 : 1;
}

int DataFileTool::Load(const std::string& path, const TextFormat& format) {
    const std::string separators = format.separator + "\r\n";
    if (!Open(Access::Change) || CheckText(path, format, separators) != 0)
        return 1;
    database_.SetByteInputFormat(ByteFormat(format));
    database_.SetHeadingLine(format.heading);
    database_.SetByteOrderMark(true);
    errno = 0;
    const long loaded = database_.Load(path.c_str(), separators.c_str());
    if (loaded < 0)
        return FailAsEngine(path + ": ");
    Tell("loaded", loaded, Counted(loaded, "record") + " loaded from " + path);
    return 0;
}

int DataFileTool::Compact() {
    if (!Open(Access::Change))
        return 1;
    DATABASE_HEADER header{};
    database_.GetHeaderInfo(&header);
    if (database_.Compress(0) != 0)
        return FailAsEngine();
    DATABASE_HEADER compacted{};
    database_.GetHeaderInfo(&compacted);
    const long removed = static_cast<long>(header.recordCount) - compacted.recordCount;
    Tell("removed", removed,
         "compacted: " + Counted(removed, "record") + " removed, " +
             Counted(compacted.recordCount, "record") + " left");
    return 0;
}

int DataFileTool::Create(const std::string& description, const std::vector<std::string>& columns) {
    std::vector<COLUMN_ENTRY> entries;
    for (const std::string& text : columns) {
        COLUMN_ENTRY column{};
        if (const std::string wrong = ParseColumn(text, &column); !wrong.empty())
            return Fail(wrong);
        for (const COLUMN_ENTRY& other : entries)
            if (std::string_view(other.name) == column.name)
                return Fail(std::string("the column ") + column.name + " is given twice");
        entries.push_back(column);
    }
    if (description.size() >= NameSize)
        return Fail("the description is longer than 31 bytes");
    if (!TakeFolders())
        return 1;
    if (!FindCompactionLeftover(file_).empty())
        return Fail(WhyNotOpened(file_) + "; nothing is made");
    errno = 0;
    if (database_.Create(file_.c_str(), description.c_str(), static_cast<int>(entries.size()),
                         entries.data()) != 0)
        return FailAsEngine();
    if (database_.Sync() != 0)
        return FailAsEngine();
    errno = SyncFolderOf(operations_, file_);
    if (errno != 0)
        return FailWithCode(DatabaseError::SyncFailed);
    Tell("columns", static_cast<long>(entries.size()), "created with " + Counted(entries.size(), "column"));
    return 0;
}

// Gives what an interrupted compaction left the name of the file that is missing. False when it could not.
bool DataFileTool::RestoreLeftover() {
    const std::string leftover = FindCompactionLeftover(file_);
    if (leftover.empty())
        return true;
    if (const int restored = RestoreCompactionBackup(file_.c_str(), operations_); restored != 0) {
        Warn(restored > 0 ? "the backup of an interrupted compaction was given back its name"
                          : leftover + " cannot be given back its name: " + Reason(errno));
        return restored > 0;
    }
    // Without a backup there is nothing better than the other file, which may have been written in part only.
    const int error = RenameFile(operations_, leftover, FollowLinks(file_));
    Warn(leftover + (error == 0
                         ? ", of an interrupted compaction, was given the file's name; it may lack records"
                         : " cannot be given the file's name: " + Reason(error)));
    return error == 0;
}

int DataFileTool::Check(bool repair) {
    if (repair && (!TakeFolders() || !RestoreLeftover()))
        return 1;
    FileCheck check;
    if (const int error = check.Run(file_); error != 0)
        return Fail(error == ENOENT ? WhyNotOpened(file_) : Reason(error));
    if (repair && check.CanRepair()) {
        PrintFindings(check);
        std::string backup;
        if (const int error = check.Repair(file_, &backup); error != 0)
            return Fail("the counts cannot be mended: " + Reason(error));
        Warn("the counts are mended; the file as it was is " + backup);
        return check.IsSound() ? 0 : Fail("what is no count is left as it is");
    }
    PrintFindings(check);
    return check.IsSound() ? 0 : 1;
}

void DataFileTool::PrintFindings(const FileCheck& check) {
    if (format_ == OutputFormat::Table && check.Findings().empty()) {
        output_.Write("nothing is wrong\n");
        return;
    }
    std::vector<std::vector<Cell>> rows;
    for (const FileFinding& finding : check.Findings())
        rows.push_back({TextCell(finding.problem ? "problem" : "remark"), NumberCell(finding.offset),
                        finding.record >= 0 ? NumberCell(finding.record) : Cell(), TextCell(finding.text)});
    Print({"kind", "offset", "record", "finding"}, rows);
}
