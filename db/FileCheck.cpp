#include "db/FileCheck.h"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <limits>
#include <set>
#include <string_view>
#include <utility>

#include "db/ReadCache.h"

namespace {

constexpr int BlockKilobytes = 256;

std::string Text(std::int64_t number) {
    return std::to_string(number);
}

std::string Counted(std::int64_t number, const char* thing) {
    return Text(number) + " " + thing + (number == 1 ? "" : "s");
}

bool HasTerminator(const char* name) {
    return std::memchr(name, 0, NameSize) != nullptr;
}

bool IsStatus(std::uint8_t byte) {
    return byte == RecordStatus::Active || byte == RecordStatus::Deleted || byte == RecordStatus::Locked;
}

} // namespace

FileCheck::FileCheck(FileOperations& operations) : operations_(operations) {}

// Before the finding at `place`, or as the last one.
void FileCheck::Add(FileFinding finding, std::size_t place) {
    problem_ = problem_ || finding.problem;
    mendable_ = mendable_ || finding.mendable;
    findings_.insert(findings_.begin() + static_cast<std::ptrdiff_t>(std::min(place, findings_.size())),
                     std::move(finding));
    if (findings_.size() == MostFindings) {
        findings_.pop_back();
        ++omitted_;
    }
}

void FileCheck::Misplaced(std::int64_t offset, std::string text) {
    laidOut_ = false;
    Problem(offset, std::move(text));
}

void FileCheck::Forget() {
    findings_.clear();
    omitted_ = 0;
    problem_ = false;
    mendable_ = false;
    laidOut_ = false;
    header_ = {};
    length_ = 0;
}

int FileCheck::Run(const std::string& path) {
    Forget();
    File file(operations_);
    const int error = file.Open(path, FileMode::ReadOnly);
    return error != 0 ? error : Examine(file);
}

int FileCheck::Examine(const File& file) {
    Forget();
    int error = file.Length(&length_);
    error = error != 0 ? error : ExamineHeader(file);
    error = error != 0 || !laidOut_ ? error : ExamineColumns(file);
    // With a wrong layout anything that is said about the records would be wrong as well.
    error = error != 0 || !laidOut_ ? error : ExamineRecords(file);
    if (error != 0) {
        Forget();
    } else if (omitted_ > 0) {
        findings_.push_back(
            {problem_, false, 0, -1,
             Counted(omitted_, "more finding") + (omitted_ == 1 ? " is" : " are") + " not listed"});
    }
    return error;
}

int FileCheck::ExamineHeader(const File& file) {
    if (length_ < static_cast<std::int64_t>(HeaderSize)) {
        Problem(length_, "the file ends after " + Text(length_) + " of the header's 52 bytes");
        return 0;
    }
    if (const int error = file.ReadAt(0, &header_, HeaderSize); error != 0)
        return error;
    if (header_.version != 1.0F)
        Remark(0, "the version is not 1.0");
    if (!HasTerminator(header_.description))
        Remark(offsetof(DATABASE_HEADER, description), "the description has no end within its 32 bytes");
    if (header_.columnCount < 0) {
        Problem(offsetof(DATABASE_HEADER, columnCount), "the column count is " + Text(header_.columnCount));
    } else if (DataStart(header_.columnCount) > length_) {
        Problem(offsetof(DATABASE_HEADER, columnCount),
                "header and " + Counted(header_.columnCount, "column") + " need " +
                    Text(DataStart(header_.columnCount)) + " bytes, the file has " + Text(length_));
    }
    if (header_.recordLength < 1)
        Problem(offsetof(DATABASE_HEADER, recordLength),
                "the record length is " + Text(header_.recordLength));
    laidOut_ = !problem_;
    return 0;
}

int FileCheck::ExamineColumns(const File& file) {
    std::set<std::string, std::less<>> names;
    int end = 0; // of the columns so far, in a record's data
    for (int i = 0; i < header_.columnCount; ++i) {
        const std::int64_t at = DataStart(i);
        COLUMN_ENTRY column{};
        if (const int error = file.ReadAt(at, &column, ColumnEntrySize); error != 0)
            return error;
        const bool nameEnds = HasTerminator(column.name);
        CleanColumn(&column);
        const std::string name = "column " + std::string(column.name);
        ExamineColumn(column, nameEnds, at);
        if (!names.insert(column.name).second)
            Remark(at, name + " has the name of an earlier one, which statements mean");
        if (column.offset != end) {
            const std::string sentence = name + " begins at byte " + Text(column.offset) +
                                         " of the data, the columns before it end at " + Text(end);
            if (column.offset < end)
                Misplaced(at + offsetof(COLUMN_ENTRY, offset), sentence);
            else
                Remark(at + offsetof(COLUMN_ENTRY, offset), sentence);
        }
        end = std::max(end, column.offset + column.size);
    }
    const int uncovered = header_.recordLength - 1 - end;
    if (uncovered > 0) {
        Remark(offsetof(DATABASE_HEADER, recordLength),
               "no column covers the last " + Counted(uncovered, "byte") + " of a record");
    }
    return 0;
}

void FileCheck::ExamineColumn(const COLUMN_ENTRY& column, bool nameEnds, std::int64_t at) {
    const std::string name = "column " + std::string(column.name);
    if (!nameEnds)
        Problem(at, name + " has a name without an end within its 32 bytes");
    if (column.type < ColumnType::String || column.type > ColumnType::Time)
        Problem(at + offsetof(COLUMN_ENTRY, type), name + " is of the unknown type " + Text(column.type));
    if (!ColumnFits(column, header_.recordLength)) {
        Misplaced(at + offsetof(COLUMN_ENTRY, offset),
                  name + " has " + Text(column.size) + " bytes at " + Text(column.offset) + ", outside the " +
                      Text(header_.recordLength - 1) + " bytes of a record's data");
    }
}

// Corrects the record count in header_, too.
void FileCheck::ExamineRecordCount() {
    const std::int64_t whole = (length_ - DataStart(header_.columnCount)) / header_.recordLength;
    const std::int32_t counted = header_.recordCount;
    const std::string sentence =
        "the header counts " + Counted(counted, "record") + ", the file has room for " + Text(whole);
    if (counted >= 0 && CheckRecordCount(&header_, length_) == FileCounts::Agree) {
        const std::int64_t end = DataStart(header_.columnCount) + whole * header_.recordLength;
        const std::int64_t rest = length_ - (end - (whole - counted) * header_.recordLength);
        if (header_.reserved != 0) {
            Remark(offsetof(DATABASE_HEADER, reserved),
                   "the reserved field is " + Text(header_.reserved) +
                       ", as when adding so many records is interrupted; the next append cuts "
                       "off what was written of them");
        } else if (rest > 0) {
            Remark(length_ - rest, Counted(rest, "byte") +
                                       " behind the last record, as an interrupted append leaves them; the "
                                       "next append overwrites them");
        }
    } else if (whole > std::numeric_limits<std::int32_t>::max()) {
        Problem(offsetof(DATABASE_HEADER, recordCount), sentence + ", more than can be counted");
    } else {
        Mendable(offsetof(DATABASE_HEADER, recordCount), sentence);
        header_.recordCount = static_cast<std::int32_t>(whole);
        header_.reserved = 0;
    }
}

// Looks at the counts and notices odd status bytes.
int FileCheck::ExamineRecords(const File& file) {
    ExamineRecordCount();
    const RecordArea area{DataStart(header_.columnCount), header_.recordLength, header_.recordCount};
    const std::size_t behindCounts = findings_.size();
    ReadCache reader;
    if (!reader.Resize(BlockKilobytes))
        return ENOMEM;
    std::int32_t deleted = 0;
    for (std::int32_t i = 0; i < area.recordCount; ++i) {
        if (const int error = reader.Holds(i) ? 0 : reader.FillFrom(file, area, i); error != 0)
            return error;
        const std::uint8_t status = *reader.Record(i);
        deleted += status == RecordStatus::Deleted ? 1 : 0;
        if (!IsStatus(status))
            Add({true, false, area.OffsetOf(i), i,
                 "the status byte is " + Text(status) + ", which counts as active"});
    }
    if (header_.deletedCount != deleted) {
        Mendable(offsetof(DATABASE_HEADER, deletedCount),
                 "the header counts " + Text(header_.deletedCount) + " deleted, the status bytes " +
                     Text(deleted),
                 behindCounts);
        header_.deletedCount = deleted;
    }
    return 0;
}

int FileCheck::Repair(const std::string& path, std::string* backup) {
    backup->clear();
    Forget();
    File file(operations_);
    int error = file.Open(path, FileMode::ReadWrite);
    error = error != 0 ? error : Examine(file);
    if (error != 0 || !CanRepair())
        return error;
    error = WriteBackup(file, path, backup);
    error = error != 0 ? error : WriteCounts(file);
    return error != 0 ? error : Examine(file);
}

int FileCheck::WriteBackup(const File& file, const std::string& path, std::string* backup) {
    const std::string target = FollowLinks(path);
    File copy(operations_);
    std::string name;
    int error = EEXIST;
    constexpr int mostNames = 1000;
    for (int number = 1; error == EEXIST && number <= mostNames; ++number) {
        name = target + ".before-repair";
        if (number > 1) {
            name += "-";
            name += std::to_string(number);
        }
        error = copy.Open(name, FileMode::CreateNew);
    }
    if (error != 0)
        return error;
    error = copy.CopyFrom(file);
    error = error != 0 ? error : SyncFolderOf(operations_, name);
    if (error != 0) {
        static_cast<void>(RemoveFile(operations_, name)); // half a copy is of no use to anybody
        return error;
    }
    *backup = name;
    return 0;
}

// Writes the counts of header_ over those in the file; the texts of the header stay as they are.
int FileCheck::WriteCounts(File& file) const {
    constexpr std::int64_t at = offsetof(DATABASE_HEADER, recordCount);
    DATABASE_HEADER before{};
    if (const int error = file.ReadAt(0, &before, HeaderSize); error != 0)
        return error;
    if (const int error = file.WriteAt(at, &header_.recordCount, HeaderSize - at); error != 0) {
        static_cast<void>(file.WriteAt(at, &before.recordCount, HeaderSize - at));
        return error;
    }
    return file.Sync();
}
