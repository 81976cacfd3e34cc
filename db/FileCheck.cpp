#include "db/FileCheck.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <limits>
#include <set>
#include <string_view>
#include <utility>

namespace {

constexpr std::size_t BlockBytes = 256 * 1024;

std::string Text(std::int64_t number) {
    return std::to_string(number);
}

std::string Counted(std::int64_t number, const char* one, const char* more) {
    return Text(number) + " " + (number == 1 ? one : more);
}

std::string Records(std::int64_t number) {
    return Counted(number, "record", "records");
}

bool HasTerminator(const std::uint8_t* name) {
    return std::memchr(name, 0, NameSize) != nullptr;
}

bool IsStatus(std::uint8_t byte) {
    return byte == RecordStatus::Active || byte == RecordStatus::Deleted || byte == RecordStatus::Locked;
}

} // namespace

FileCheck::FileCheck(FileOperations& operations) : operations_(operations) {}

void FileCheck::Add(FILE_FINDING finding) {
    problem_ = problem_ || finding.problem;
    mendable_ = mendable_ || finding.mendable;
    if (findings_.size() + 1 < MostFindings)
        findings_.push_back(std::move(finding));
    else
        ++omitted_;
}

void FileCheck::Problem(std::int64_t offset, std::string text) {
    Add({true, false, offset, -1, std::move(text)});
}

void FileCheck::Misplaced(std::int64_t offset, std::string text) {
    laidOut_ = false;
    Problem(offset, std::move(text));
}

void FileCheck::Mendable(std::int64_t offset, std::string text) {
    Add({true, true, offset, -1, std::move(text)});
}

void FileCheck::Remark(std::int64_t offset, std::string text) {
    Add({false, false, offset, -1, std::move(text)});
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
             Counted(static_cast<std::int64_t>(omitted_), "more finding is", "more findings are") +
                 " not listed"});
    }
    return error;
}

int FileCheck::ExamineHeader(const File& file) {
    if (length_ < static_cast<std::int64_t>(HeaderSize)) {
        Problem(length_, "the file ends after " + Text(length_) + " of the header's 52 bytes");
        return 0;
    }
    std::uint8_t bytes[HeaderSize];
    if (const int error = file.ReadAt(0, bytes, HeaderSize); error != 0)
        return error;
    header_ = DecodeHeader(bytes);
    if (header_.version != 1.0F)
        Remark(0, "the version is not 1.0");
    if (!HasTerminator(bytes + HeaderOffset::Description))
        Remark(HeaderOffset::Description, "the description has no end within its 32 bytes");
    if (header_.columnCount < 0) {
        Problem(HeaderOffset::ColumnCount, "the column count is " + Text(header_.columnCount));
    } else if (DataStart(header_.columnCount) > length_) {
        Problem(HeaderOffset::ColumnCount, "header and " + Counted(header_.columnCount, "column", "columns") +
                                               " need " + Text(DataStart(header_.columnCount)) +
                                               " bytes, the file has " + Text(length_));
    }
    if (header_.recordLength < 1)
        Problem(HeaderOffset::RecordLength, "the record length is " + Text(header_.recordLength));
    laidOut_ = !problem_;
    return 0;
}

int FileCheck::ExamineColumns(const File& file) {
    std::set<std::string, std::less<>> names;
    int end = 0; // of the columns so far, in a record's data
    for (int i = 0; i < header_.columnCount; ++i) {
        const std::int64_t at = DataStart(i);
        std::uint8_t bytes[ColumnEntrySize];
        if (const int error = file.ReadAt(at, bytes, ColumnEntrySize); error != 0)
            return error;
        const COLUMN_ENTRY column = DecodeColumn(bytes);
        const std::string name = "column " + std::string(column.name);
        ExamineColumn(column, HasTerminator(bytes), at);
        if (!names.insert(column.name).second)
            Remark(at, name + " has the name of an earlier one, which statements mean");
        if (column.offset != end) {
            const std::string sentence = name + " begins at byte " + Text(column.offset) +
                                         " of the data, the columns before it end at " + Text(end);
            if (column.offset < end)
                Misplaced(at + ColumnOffset::Offset, sentence);
            else
                Remark(at + ColumnOffset::Offset, sentence);
        }
        end = std::max(end, column.offset + column.size);
    }
    const int uncovered = header_.recordLength - 1 - end;
    if (uncovered > 0) {
        Remark(HeaderOffset::RecordLength,
               "no column covers the last " + Counted(uncovered, "byte", "bytes") + " of a record");
    }
    return 0;
}

void FileCheck::ExamineColumn(const COLUMN_ENTRY& column, bool nameEnds, std::int64_t at) {
    const std::string name = "column " + std::string(column.name);
    if (!nameEnds)
        Problem(at, name + " has a name without an end within its 32 bytes");
    if (column.type < ColumnType::String || column.type > ColumnType::Time)
        Problem(at + ColumnOffset::Type, name + " is of the unknown type " + Text(column.type));
    if (!ColumnFits(column, header_.recordLength)) {
        Misplaced(at + ColumnOffset::Offset,
                  name + " has " + Text(column.size) + " bytes at " + Text(column.offset) + ", outside the " +
                      Text(header_.recordLength - 1) + " bytes of a record's data");
    }
}

// Corrects the record count in header_, too.
void FileCheck::ExamineRecordCount() {
    const std::int64_t whole = (length_ - DataStart(header_.columnCount)) / header_.recordLength;
    const std::int32_t counted = header_.recordCount;
    const std::string sentence =
        "the header counts " + Records(counted) + ", the file has room for " + Text(whole);
    if (counted >= 0 && CheckRecordCount(&header_, length_) == FileCounts::Agree) {
        const std::int64_t end = DataStart(header_.columnCount) + whole * header_.recordLength;
        const std::int64_t rest = length_ - (end - (whole - counted) * header_.recordLength);
        if (header_.reserved != 0) {
            Remark(HeaderOffset::Reserved,
                   "the reserved field is " + Text(header_.reserved) +
                       ", as when adding so many records is interrupted; the next append cuts "
                       "off what was written of them");
        } else if (rest > 0) {
            Remark(length_ - rest, Counted(rest, "byte", "bytes") +
                                       " behind the last record, as an interrupted append leaves them; the "
                                       "next append overwrites them");
        }
    } else if (whole > std::numeric_limits<std::int32_t>::max()) {
        Problem(HeaderOffset::RecordCount, sentence + ", more than can be counted");
    } else {
        Mendable(HeaderOffset::RecordCount, sentence);
        header_.recordCount = static_cast<std::int32_t>(whole);
        header_.reserved = 0;
    }
}

// Looks at the counts and notices odd status bytes.
int FileCheck::ExamineRecords(const File& file) {
    ExamineRecordCount();
    const std::int64_t start = DataStart(header_.columnCount);
    const auto length = static_cast<std::size_t>(header_.recordLength);
    const auto perBlock = static_cast<std::int32_t>(std::max<std::size_t>(BlockBytes / length, 1));
    std::vector<std::uint8_t> block(static_cast<std::size_t>(perBlock) * length);
    std::int32_t deleted = 0;
    std::vector<FILE_FINDING> odd;
    std::size_t more = 0;
    for (std::int32_t first = 0; first < header_.recordCount;) {
        const std::int32_t count = std::min(perBlock, header_.recordCount - first);
        const std::int64_t at = start + static_cast<std::int64_t>(first) * header_.recordLength;
        const std::size_t bytes = static_cast<std::size_t>(count) * length;
        if (const int error = file.ReadAt(at, block.data(), bytes); error != 0)
            return error;
        for (std::int32_t i = 0; i < count; ++i) {
            const std::uint8_t status = block[static_cast<std::size_t>(i) * length];
            deleted += status == RecordStatus::Deleted ? 1 : 0;
            if (IsStatus(status))
                continue;
            if (odd.size() == MostFindings) {
                ++more;
                continue;
            }
            odd.push_back({true, false, at + static_cast<std::int64_t>(i) * header_.recordLength, first + i,
                           "the status byte is " + Text(status) + ", which counts as active"});
        }
        first += count;
    }
    ExamineDeletedCount(deleted);
    std::for_each(odd.begin(), odd.end(), [this](FILE_FINDING& finding) { Add(std::move(finding)); });
    omitted_ += more;
    return 0;
}

void FileCheck::ExamineDeletedCount(std::int32_t deleted) {
    if (header_.deletedCount != deleted) {
        Mendable(HeaderOffset::DeletedCount, "the header counts " + Text(header_.deletedCount) +
                                                 " deleted, the status bytes " + Text(deleted));
        header_.deletedCount = deleted;
    }
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
    std::uint8_t mended[HeaderSize];
    std::uint8_t before[HeaderSize];
    if (const int error = file.ReadAt(0, before, HeaderSize); error != 0)
        return error;
    EncodeHeader(header_, mended);
    constexpr std::size_t size = HeaderSize - HeaderOffset::RecordCount;
    if (const int error = file.WriteAt(HeaderOffset::RecordCount, mended + HeaderOffset::RecordCount, size);
        error != 0) {
        static_cast<void>(file.WriteAt(HeaderOffset::RecordCount, before + HeaderOffset::RecordCount, size));
        return error;
    }
    return file.Sync();
}
