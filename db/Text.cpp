#include <algorithm>

#include "db/Bytes.h"
#include "db/Database.h"
#include "db/RecordText.h"
#include "db/TextFile.h"

namespace {

constexpr int CharacterFormat = 1; // of byte columns

std::string_view TextOrNone(const char* text) {
    return text != nullptr ? text : "";
}

} // namespace

// What Export writes, record by record.
struct DATABASE::Exporting {
    const RecordText& text;
    TextWriter& writer;
    std::string_view separator;
    long lines = 0;

    // A record's line, or the heading without data. False when the text file could not be written.
    [[nodiscard]] bool Write(const std::uint8_t* data) {
        char* line = writer.Room();
        if (line == nullptr)
            return false;
        writer.Take(data != nullptr ? text.Format(data, separator, line)
                                    : text.FormatHeading(separator, line));
        lines += data != nullptr ? 1 : 0;
        return true;
    }
};

// What Load reads, line by line.
struct DATABASE::Loading {
    const RecordText& text;
    LineReader& reader;
    FieldSplitter& fields;
    std::uint8_t* batch;       // data of records that are appended together
    std::int32_t batchRecords; // how many it has room for
    long records = 0;          // appended
};

RecordText DATABASE::Text(int byteFormat) const {
    return {{columns_.get(), static_cast<std::size_t>(header_.columnCount)}, byteFormat == CharacterFormat};
}

void DATABASE::FormatRecordData(std::string* line, const void* record, const char* separator) const {
    const RecordText text = Text(byteOutputFormat_);
    const std::string_view between = TextOrNone(separator);
    line->resize(text.LongestLine(between.size()));
    const char* end = text.Format(static_cast<const std::uint8_t*>(record), between, line->data());
    line->resize(static_cast<std::size_t>(end - line->data()));
}

long DATABASE::Export(const char* path, int all, const char* separator) {
    if (!IsOpen())
        return Fail(DatabaseError::ExportNoFile);
    const RecordText text = Text(byteOutputFormat_);
    File file(operations_);
    TextWriter writer(file);
    Exporting work{text, writer, TextOrNone(separator)};
    if (!writer.Prepare(text.LongestLine(work.separator.size())))
        return Fail(DatabaseError::ExportNoMemoryForLine);
    // The file's old text goes when nothing but reading and writing can fail any more.
    if (all == 0 && !slots_ && QueryReset() < 0)
        return -1;
    if (!OpenForExport(path, &file))
        return Fail(DatabaseError::ExportOpenFailed);
    int code = DatabaseError::ExportWriteFailed;
    if (!headingLine_ || work.Write(nullptr))
        code = all != 0 ? ExportAll(work) : ExportResultSet(work);
    if (code == DatabaseError::None && writer.Flush() != 0)
        code = DatabaseError::ExportWriteFailed;
    return code == DatabaseError::None ? work.lines : Fail(code);
}

bool DATABASE::OpenForExport(const char* path, File* file) const {
    // Emptied only when it is known not to be the data file by another name.
    return path != nullptr && file->Open(path, FileMode::WriteOnly) == 0 && !file_.IsAt(path) &&
           file->Truncate(0) == 0;
}

int DATABASE::ExportAll(Exporting& work) {
    ReadCache own;
    ReadCache* reader = ScanCache(&own);
    if (reader == nullptr)
        return DatabaseError::ExportNoMemoryForRecord;
    for (std::int32_t i = 0; i < header_.recordCount; ++i) {
        const std::uint8_t* record = reader->Scan(file_, Area(), i);
        if (record == nullptr)
            return DatabaseError::ExportReadFailed;
        if (*record != RecordStatus::Deleted && !work.Write(record + 1))
            return DatabaseError::ExportWriteFailed;
    }
    return DatabaseError::None;
}

int DATABASE::ExportResultSet(Exporting& work) {
    bool found = false;
    for (long start = 0;; start = -1) {
        if (MoveWalk(start, 1, &found) != DatabaseError::None)
            return DatabaseError::ExportReadFailed;
        if (!found)
            return DatabaseError::None;
        if (!work.Write(recordBuffer_.get()))
            return DatabaseError::ExportWriteFailed;
    }
}

std::size_t DATABASE::LongestLoadLine() const {
    // What Export writes is never taken apart.
    const auto buffer = static_cast<std::size_t>(std::max(CalculateIOBufferSize(), 1));
    return std::max(buffer - 1, Text(byteInputFormat_).LongestLine(1));
}

long DATABASE::Load(const char* path, const char* separators) {
    constexpr std::int32_t batchBytes = 256 * 1024;
    if (!IsOpen())
        return Fail(DatabaseError::LoadNoFile);
    File file(operations_);
    // The data file would grow while it is read.
    if (path == nullptr || file_.IsAt(path) || file.Open(path, FileMode::ReadOnly) != 0)
        return Fail(DatabaseError::LoadOpenFailed);
    const RecordText text = Text(byteInputFormat_);
    LineReader reader(file);
    if (!reader.Prepare(LongestLoadLine()))
        return Fail(DatabaseError::LoadNoMemoryForLine);
    if (byteOrderMark_ && reader.PassByteOrderMark() != 0)
        return Fail(DatabaseError::LoadReadFailed);
    const std::int32_t batchRecords = std::max(batchBytes / header_.recordLength, 1);
    const auto batch = TryAllocate<std::uint8_t>(static_cast<std::size_t>(batchRecords) * DataSize());
    if (!batch)
        return Fail(DatabaseError::LoadNoMemoryForRecord);
    std::fill_n(batch.get(), static_cast<std::size_t>(batchRecords) * DataSize(), std::uint8_t{0});
    FieldSplitter fields(separators);
    Loading work{text, reader, fields, batch.get(), batchRecords};
    int code = CheckFirstLine(work);
    if (code == DatabaseError::None)
        code = LoadLines(work);
    return code == DatabaseError::None ? work.records : Fail(code);
}

// Goes to the first line of a record. False when the text cannot be read.
bool DATABASE::BeginLines(Loading& work) const {
    work.reader.Rewind();
    std::span<char> heading;
    return !headingLine_ || work.reader.Next(&heading) == 0;
}

// The first line that is not blank must have as many fields as there are columns.
int DATABASE::CheckFirstLine(Loading& work) const {
    if (!BeginLines(work))
        return DatabaseError::LoadReadFailed;
    for (;;) {
        std::span<char> line;
        if (work.reader.Next(&line) != 0)
            return DatabaseError::LoadReadFailed;
        if (line.empty())
            return DatabaseError::None;
        if (!work.fields.IsBlank({line.data(), line.size()})) {
            work.fields.Begin(line);
            return work.fields.Count() == header_.columnCount ? DatabaseError::None
                                                              : DatabaseError::LoadInvalidFormat;
        }
    }
}

int DATABASE::LoadLines(Loading& work) {
    if (!BeginLines(work))
        return DatabaseError::LoadReadFailed;
    std::int32_t waiting = 0; // records in the batch
    for (;;) {
        std::span<char> line;
        const int error = work.reader.Next(&line);
        const bool over = error != 0 || line.empty();
        if (!over && !work.fields.IsBlank({line.data(), line.size()})) {
            work.fields.Begin(line);
            work.text.Parse(work.fields, work.batch + static_cast<std::size_t>(waiting) * DataSize());
            ++waiting;
        }
        if (waiting == work.batchRecords || over) {
            if (AppendAll(work.batch, DataSize(), waiting) < 0)
                return lastError_;
            work.records += waiting;
            waiting = 0;
        }
        if (over)
            return error == 0 ? DatabaseError::None : DatabaseError::LoadReadFailed;
    }
}
