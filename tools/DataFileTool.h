#pragma once

#include <functional>
#include <iosfwd>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "db/Database.h"
#include "tools/TableWriter.h"
#include "tools/TextCheck.h"
#include "tools/ToolFolder.h"

// Which records a command is about.
struct Selection {
    std::string statement; // a query statement; empty for all records
    // Further statements in their order, each with QueryMode::And or QueryMode::Or.
    std::vector<std::pair<int, std::string>> further;
    std::string sortColumn; // empty for the order of the file
    bool exact = false;     // the case of letters matters
};

// One run of `quorvan-cli db`: works on one data file and tells about it. Every operation returns the
// process's exit status, 0 when all was done and 1 when something was refused or failed. Results go to
// `output` in the chosen format, messages to `errors`: a sentence each, with the engine's code and text where
// the engine refused. Operations that change the file refuse one that may only be read, one whose header
// disagrees with it, one in a folder that another program uses, and one whose state before the day's first
// change cannot be kept. A symbolic link stands for the file that it leads to, in the folder of that.
//
// It knows nothing of command-line options. The command owns it, for one operation each.
class DataFileTool {
  public:
    // Both streams and the operations must outlive the tool.
    DataFileTool(std::string file, OutputFormat format, TextOutput& output, std::ostream& errors,
                 FileOperations& operations = SystemFiles());

    // The header; the columns.
    int Info();
    int Columns();
    // The records of the selection.
    int Query(const Selection& selection);
    // Applies a set statement to the selection. With "=" a value is taken as Append takes it, or refused.
    int Set(const std::string& statement, const Selection& selection);
    // Adds a record. The values are NAME=VALUE; columns without one are zero or empty.
    int Append(const std::vector<std::string>& values);

    // Marks records, by number or those of a selection, by an operation of the engine; `done` says in a word
    // what that does. A record that is refused is told of, and the others are done all the same.
    int Mark(const char* done, int (DATABASE::*mark)(long), const std::vector<long>& records,
             const Selection* selection);

    // Writes text lines of the selection, or of all records when it is null, to a file that is replaced. Load
    // reads them with the same format.
    int Export(const std::string& path, const TextFormat& format, const Selection* selection);
    // Appends the records of a text file, or none when TextCheck finds a line wrong. A field ends at any
    // character of the separator and at the line's end.
    int Load(const std::string& path, const TextFormat& format);

    int Compact();
    // Makes a new file. The columns are as ParseColumn reads them. Refused in the place of a file of which an
    // interrupted compaction left something: the next compaction would remove that.
    int Create(const std::string& description, const std::vector<std::string>& columns);
    // Says what is wrong with the file and where: 0 only when nothing is. With `repair`, mends counts and
    // gives what an interrupted compaction left in the file's place its name first.
    int Check(bool repair);

    // To be called last: waits until the changes are on the disk. Returns `status`, or 1 when that failed.
    int Finish(int status);

  private:
    enum class Access { Read, Change };

    [[nodiscard]] bool Open(Access access);
    // Keep other programs out of the folders of the file, and of those that are backed up with it, while the
    // tool lives.
    [[nodiscard]] bool TakeFolders();
    [[nodiscard]] bool KeepBackup();
    [[nodiscard]] int Fail(const std::string& sentence);
    // Tells of a failure of the engine, by default its latest, with the system's reason for one of the file.
    // Returns 1.
    [[nodiscard]] int FailWithCode(int code, const std::string& about = "");
    [[nodiscard]] int FailAsEngine(const std::string& about = "") {
        return FailWithCode(database_.GetLastError(nullptr), about);
    }
    // The system failed; else the engine refused.
    [[nodiscard]] static bool IsFileFailure(int code);
    [[nodiscard]] static const char* Hint(int code);
    void Warn(const std::string& sentence);
    // Rows that are there all at once. Returns 0.
    int Print(const std::vector<std::string>& names, const std::vector<std::vector<Cell>>& rows);
    void Tell(const char* name, long number, const std::string& sentence);

    [[nodiscard]] std::vector<COLUMN_ENTRY> AllColumns();
    [[nodiscard]] bool Select(const Selection& selection);
    [[nodiscard]] int PrintSet();
    [[nodiscard]] int WalkSet(const std::function<void(long, const std::uint8_t*)>& use);
    [[nodiscard]] std::string StoreValue(const std::vector<COLUMN_ENTRY>& columns,
                                         const std::string& assignment, std::vector<bool>& given,
                                         std::uint8_t* data) const;
    [[nodiscard]] int SetValue(const COLUMN_ENTRY& column, const std::string& value,
                               const Selection& selection);
    [[nodiscard]] std::vector<std::uint8_t> EmptyData() const;
    // To records by number and those of the selection, once the file is open.
    int Apply(const char* done, const std::function<int(long)>& apply, std::vector<long> records,
              const Selection* selection);
    [[nodiscard]] int CheckText(const std::string& path, const TextFormat& format,
                                const std::string& separators);
    [[nodiscard]] bool RestoreLeftover();
    void PrintFindings(const class FileCheck& check);

    std::string file_;
    OutputFormat format_;
    TextOutput& output_;
    std::ostream& errors_;
    FileOperations& operations_;
    std::optional<ToolFolder> folder_; // of a file that is to be changed
    DATABASE database_;
};
