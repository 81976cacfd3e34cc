#pragma once

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "db/DataFile.h"
#include "util/File.h"

// Something that a check noticed about a data file.
struct FileFinding {
    bool problem = false;     // header, columns or status bytes disagree; else it is only worth knowing
    bool mendable = false;    // a count that FileCheck::Repair sets right
    std::int64_t offset = 0;  // of the first byte concerned, in the file
    std::int32_t record = -1; // the record concerned; -1 for none
    std::string text;         // one sentence without its full stop
};

// Checks a data file from its bytes alone: the header against the file's length, its counts against the
// status bytes, the column table against the record length. doc/data-file.md says what a file should look
// like. It does not judge what the records' fields hold, and opens no DATABASE, so that it can tell what is
// wrong with a file that DATABASE refuses. A file must not be changed while it is checked or repaired.
//
// A function that made the object owns it; it is used on one thread at a time.
class FileCheck {
  public:
    // At most so many findings are listed; the last one says how many more there were.
    static constexpr std::size_t MostFindings = 100;

    // `operations` must outlive the object.
    explicit FileCheck(FileOperations& operations = SystemFiles());

    // Looks at the whole file at `path` and changes nothing. Returns 0 when it could be read, whatever was
    // found in it, else an errno number; then there are no findings.
    [[nodiscard]] int Run(const std::string& path);

    // What the latest Run or Repair found, in the order header, columns, counts, records.
    [[nodiscard]] const std::vector<FileFinding>& Findings() const { return findings_; }
    // Tells whether no finding, listed or not, is a problem.
    [[nodiscard]] bool IsSound() const { return !problem_; }
    // Tells whether Repair has a count to set right.
    [[nodiscard]] bool CanRepair() const { return mendable_; }

    // Runs, copies the file to a new name beside it (its owner's alone, unless the file is several people's)
    // and sets right the counts in its header: the record count to the whole records that are there, the
    // deleted count to the status bytes. No other byte is changed, and none at all when the columns do not
    // fit the record: then the counts may be right. Copy and counts have reached the disk before it returns.
    // `backup` becomes the copy's path, empty when there was nothing to mend. Returns 0, and the findings
    // are what is left; or an errno number, and the counts are what they were as far as the file can still
    // be written. A copy that was completed is kept.
    [[nodiscard]] int Repair(const std::string& path, std::string* backup);

  private:
    [[nodiscard]] int Examine(const File& file);
    [[nodiscard]] int ExamineHeader(const File& file);
    [[nodiscard]] int ExamineColumns(const File& file);
    void ExamineColumn(const COLUMN_ENTRY& column, bool nameEnds, std::int64_t at);
    void ExamineRecordCount();
    [[nodiscard]] int ExamineRecords(const File& file);
    void Problem(std::int64_t offset, std::string text) { Add({true, false, offset, -1, std::move(text)}); }
    void Misplaced(std::int64_t offset, std::string text);
    void Mendable(std::int64_t offset, std::string text, std::size_t place = MostFindings) {
        Add({true, true, offset, -1, std::move(text)}, place);
    }
    void Remark(std::int64_t offset, std::string text) { Add({false, false, offset, -1, std::move(text)}); }
    void Add(FileFinding finding, std::size_t place = MostFindings);
    void Forget();
    [[nodiscard]] int WriteBackup(const File& file, const std::string& path, std::string* backup);
    [[nodiscard]] int WriteCounts(File& file) const;

    FileOperations& operations_;
    std::vector<FileFinding> findings_;
    std::int64_t omitted_ = 0;
    bool problem_ = false;
    bool mendable_ = false;
    bool laidOut_ = false; // header and columns agree on where the records and their fields lie
    DATABASE_HEADER header_{};
    std::int64_t length_ = 0; // of the file
};
