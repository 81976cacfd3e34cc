#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string>

#include "db/Condition.h"
#include "db/DataFile.h"
#include "db/DatesTimes.h"
#include "db/Errors.h"
#include "db/FieldChange.h"
#include "db/ReadCache.h"
#include "db/RecordTypes.h"
#include "util/File.h"
#include "util/Strings.h"

// How a query works on the result set that is there.
namespace QueryMode {
inline constexpr int New = 0; // begin a new set from all records
inline constexpr int And = 1; // keep the records of the set that also match
inline constexpr int Or = 2;  // add the records that match
} // namespace QueryMode

class RecordText;
class SortKeys;

// The files that take part in a compaction (DATABASE::Compress).
struct CompactionPaths {
    std::string data;      // the data file itself, symbolic links followed
    std::string temporary; // the same name with the extension .new
    std::string backup;    // the same name with the extension .bak
};

// One open data file of fixed-length records with typed columns: makes or opens it, reads and writes its
// records, selects records by queries, sorts them, changes them together, writes and reads them as text and
// rewrites the file without its deleted records. The file's bytes are described in doc/data-file.md.
//
// It keeps no record that the file does not have: every operation that changes the file returns after the
// kernel has taken the bytes, which is enough for them to outlast the program; for them to outlast the
// machine there is Sync. It does not guard the file against other processes, and does not lock: an object is
// used by one thread at a time. Any number of objects, each on its own file, work independently.
//
// Unless said otherwise an operation returns 0 on success and -1 on failure and then leaves file, counts and
// result set as they were; GetLastError tells why. Record numbers count from 0, deleted records included; a
// record keeps its number until Compress. "Record data" is the record without its status byte, recordLength
// - 1 bytes.
class DATABASE {
  public:
    // Opens the file at `path`; with a null path the object waits for Open or Create. The outcome is known
    // from GetLastError or IsOpen. An object without an open file has no records and no columns: every
    // operation on it fails or finds nothing. `operations` must outlive the object.
    explicit DATABASE(const char* path, FileOperations& operations = SystemFiles());
    DATABASE(const DATABASE&) = delete;
    DATABASE& operator=(const DATABASE&) = delete;
    // Closes the file. The header is not written: see SetImmediateHeaderWrite.
    ~DATABASE();

    // File and header

    // Makes a new file without records, its owner's alone, and opens it. `name`, `type`, `size` and, for
    // floats, `format` are taken from each of the `columns`; a negative size becomes the type's own
    // (AdjustColumnSize), a float without decimals gets 2. Fails with 1102 when the path exists, 1110 when
    // the columns do not fit a record of 32767 bytes, a string has no positive width or there are no column
    // entries for the count, 1109 when the file cannot be written or the path is longer than 127 characters,
    // 1104 or 1106 without memory. A failure leaves no file behind, and the object with what it had open
    // before.
    int Create(const char* path, const char* description, int columnCount, const COLUMN_ENTRY* columns);

    // Opens an existing file, closing the one that was open. A file that may not be written is opened for
    // reading: operations that would change it then fail. Nothing is written. Fails with 1103 when the file
    // cannot be opened, the path is longer than 127 characters, or header and columns make no sense
    // (negative counts, a column table that is cut off, a column outside the record), 1105 or 1107
    // without memory; then no file is open. When fewer records are there than the header counts, those that
    // are there whole can be read; a deleted count that cannot be is counted afresh. See IsDamaged.
    int Open(const char* path);

    [[nodiscard]] bool IsOpen() const { return file_.IsOpen(); }
    // Tells whether the file could be opened for reading only.
    [[nodiscard]] bool IsReadOnly() const { return readOnly_; }

    // Tells whether the counts in the header disagreed with the file when it was opened: records missing,
    // more than one record too many, or an impossible deleted count. Compress refuses such a file, and with
    // records too many Append does, because they would throw away what is there.
    [[nodiscard]] bool IsDamaged() const { return fileCounts_ != FileCounts::Agree || deletedCountWasWrong_; }

    // Writes the header while immediate header writing is on (the default). Fails with 2901.
    int WriteDbHeader();
    // Switches writing the header after each change of the counts; switching on writes it at once. While
    // off, the header in the file keeps the old counts, also after the object is gone. Fails with 2901.
    int SetImmediateHeaderWrite(int on);
    // Returns when every change made so far is on the disk and outlasts a power cut; at once when there was
    // none since the last time, or no file is open. Fails with 3001, once: the changes are in the file then,
    // but nobody knows for how long, and the system tells no second time.
    int Sync();
    // Gives a column with a negative size the width of its type; strings and unknown types keep theirs.
    // Returns 0.
    int AdjustColumnSize(COLUMN_ENTRY* column) const;
    // Bytes of a text line that holds a record: per string column its width + 2, per byte 1, short, long or
    // float 16, date 8, time 6, and one for every column.
    [[nodiscard]] int CalculateIOBufferSize() const;
    // Copies column `index` to `out`. Fails with 1101.
    int GetColumnInfo(int index, COLUMN_ENTRY* out);
    // Copies the header in memory, which is always current, to `out`. Returns 0.
    int GetHeaderInfo(DATABASE_HEADER* out) const;

    // Records

    // Adds a record with the given data behind the last one and returns its number, which becomes the
    // current record; -1 on failure: 2801 write error, 2802 no file, 2803 the file holds records that its
    // header does not count, 2804 no more record numbers, 2901 header not written.
    long Append(const void* data);
    // Adds `count` records at once, their data `stride` bytes apart, and returns the first one's number, or
    // the next free one for no records; the last one becomes current. All are there or, after a failure (as
    // Append's) and when the program is killed meanwhile, none. Much faster than as many calls of Append.
    long AppendAll(const void* data, std::size_t stride, std::int32_t count);
    // Copies the data of record `n` to `data`, through the read cache when there is one, and makes it
    // current. Returns 1 on success. Fails with 1201, 1202 or 1209 (read error).
    int Read(long n, void* data);
    // The same, always from the file.
    int UnBufferedRead(long n, void* data);
    // Overwrites the current record, as Write does. Fails with 2101 when there is none.
    int Update(const void* data);
    // Overwrites record `n`, which loses its lock, and makes it current. Fails with 1302, 1303 or 1309 (file
    // error).
    int Write(long n, const void* data);
    // Marks record `n` as deleted; it leaves the result set, and no record is current. Fails with 1402,
    // 1403, 1409 (file error) or 2901.
    int Delete(long n);
    // Makes deleted record `n` active and current again; it does not return to the result set. Fails with
    // 1502, 1503, 1509 (file error) or 2901.
    int UnDelete(long n);
    // Marks record `n` as locked and makes it current. The mark stops nothing; only UnLock, IsLocked and a
    // second Lock look at it. Fails with 2301, 2302, 2303 or 2309 (file error).
    int Lock(long n);
    // 1 when record `n` is marked as locked, 0 when not. Fails with 2501, 2502 or 2509 (file error).
    int IsLocked(long n);
    // Takes the mark off and makes the record current. Fails with 2401, 2402, 2403 or 2409 (file error).
    int UnLock(long n);
    // Gives the read cache a size in units of 1024 bytes; 0 removes it. Fails with 2601 (no memory, or more
    // than ReadCache::MaximumKilobytes): then there is no cache.
    int SetReadCache(int kilobytes);
    // How many records of the result set come before record `n` in the order of the walk; -1 when it is not
    // in it.
    [[nodiscard]] long ConvertPhysToLogRecordNumber(long n) const;
    [[nodiscard]] long GetNumberOfActiveRecords() const {
        return static_cast<long>(header_.recordCount) - header_.deletedCount;
    }
    // Returns the code of the latest failure and forgets it; 0 when there was none. Copies the code's
    // message, at most 57 characters and the terminator, to `message` unless that is null.
    int GetLastError(char* message);

    // Queries

    // Selects records by a statement such as "Name contains fund" and a QueryMode; returns the number of
    // records in the set or -1: 1601 AND or OR after a sort, 1602 column, 1603 operator, 1604 and 1605
    // memory, 1606 "contains" on a column that is no string, 1607 AND or OR without a set, 1608 statement or
    // mode, 1609 read error. A failure leaves set and walk as they were, except that after 1605 and 1609
    // there is no set. A null or empty statement is QueryReset. The walk begins anew.
    long Query(const char* statement, int mode);
    // Takes a statement apart into buffers of 32 bytes each. Returns 0, or 1 when a token is missing or too
    // long.
    int ParseQueryStatement(const char* statement, char* column, char* op, char* value) const;
    // Makes the result set hold all active records and returns their number; -1 on failure: 1001 or 1002
    // memory, 1609 read error.
    long QueryReset();
    // Runs the last statement again as a new query, QueryReset when there was none.
    void QueryRefresh();
    // 1 when there is a result set that holds fewer than all active records, else 0.
    [[nodiscard]] int IsQueryActive() const;

    // The walk through the result set; QueryReset when there is none. Each returns the data of the record
    // found, which becomes the current one, and stores its number in `*record` unless that is null; null at
    // the end. The data may be changed and given to Update; it is valid until the next walk call, Open,
    // Create or Compress. Records deleted since the query drop out of the set; records appended since are
    // not in it. A read error returns null with 1209 and leaves the record in the set.
    void* QueryGetFirst(long* record);
    void* QueryGetNext(long* record);
    void* QueryGetLast(long* record);
    void* QueryGetPrev(long* record);
    // The one operation behind these: searches from slot `start`, or from one `step` after the last record
    // found when it is negative, in steps of `step`.
    void* QueryGetXXX(long start, long step, long* record);

    // 0 (the default): queries ignore the case of the letters A to Z. Otherwise strings are compared
    // exactly.
    void SetCaseSensitivity(int on) { caseSensitive_ = on != 0; }
    // Compares as queries do, the CompareOperator `op` between field and value: 1 when it holds, else 0.
    [[nodiscard]] int CompareStringVals(int op, const char* field, const char* value) const;
    template <class T>
    [[nodiscard]] int CompareVals(int op, T field, T value) const {
        return CompareValues(op, field, value);
    }

    // Sort

    // Puts the records of the result set (of all active ones when there is none) into ascending order of a
    // column, for the walk and for what goes by it; from then on AND and OR queries are refused until a new
    // query. Texts are compared ignoring the case of A to Z. Equal records keep their order, and so do all
    // when the column's type is unknown; a record whose float is no number keeps its place, the records
    // before and behind it being sorted apart. Records deleted since the query drop out. Fewer than two
    // records are left as they are. The second argument has no effect. Fails with 1701 column, 1702 or 1704
    // memory, 1709 read error, or as QueryReset; then the set keeps its order.
    int SortBy(const char* column, int ignored);
    // Moves a pair of slots one step on: `*first` to the first used slot of the set behind it, `*second` to
    // the first used one behind that. Where there is none, to the number of records.
    void GetNextSortSlots(long* first, long* second) const;

    // Text

    // Writes records as lines of text (doc/text-file.md) to a file at `path`, which is created or replaced:
    // with `all` every active record in the order of the file, without it the records of the result set in
    // the order of the walk, QueryReset when there is none. Returns the number of lines. -1 on failure: 1901
    // the file cannot be opened for writing, is no regular file or is this data file; 1902 memory, 1907 read
    // error, 1908 no data file is open, 1909 write error, or as QueryReset. After 1907 and 1909 the text
    // file is there in part.
    long Export(const char* path, int all, const char* separator);
    // Appends the records in a text file. A field ends at any of the `separators`, several of them count as
    // one; a blank line is skipped, and a field that a line lacks is empty or 0. The
    // newline separates too only when it is given. Returns the number of records; -1 on failure: 1801 the
    // file cannot be opened, is no regular file or is this data file; 1802 the first line has not as many
    // fields as there are columns; 1803 or 1804 memory, 1808 no data file is open, 1809 read error, or as
    // AppendAll. Records appended before a failure stay; killed meanwhile, the file has the first so many of
    // them, whole.
    long Load(const char* path, const char* separators);
    // Characters, the newline included, of the longest line that Load takes whole; of a longer one it takes
    // pieces, each as a line.
    [[nodiscard]] std::size_t LongestLoadLine() const;
    // Makes `line` the line, newline included, that Export writes for a record's data.
    void FormatRecordData(std::string* line, const void* record, const char* separator) const;
    // 1: byte columns are written as the character of that code, otherwise (2 at first) as a number.
    void SetByteOutputFormat(int format) { byteOutputFormat_ = format; }
    // 1 (the default): Load takes the code of a byte column's first character, otherwise its number, the low
    // 8 bits of it. With the format that Export wrote in, every byte comes back as it was.
    void SetByteInputFormat(int format) { byteInputFormat_ = format; }
    // On: Export writes a first line of the columns' names, which its result does not count, and Load skips
    // the first line, whatever it holds. Off by default.
    void SetHeadingLine(bool on) { headingLine_ = on; }
    // On: a UTF-8 byte order mark at the beginning of a text is no part of it for Load. Off by default: then
    // it belongs to the first field, as any bytes.
    void SetByteOrderMark(bool on) { byteOrderMark_ = on; }

    // Set statements

    // Changes one column of every record in the result set by a set statement such as "Shares * 2"; without
    // a set, or with no query since the last reset, of all active records. A value for a date or time is a
    // packed number. Returns the number of records rewritten; each loses its lock, the last one becomes
    // current, and the set stays as it is. -1 on failure: 2201 empty statement or unknown operator, 2202
    // column, 2203 strings can only be set, 2204 memory, 2205 statement; then nothing has changed. 2206 read
    // error, 1309 write error: records before that stay changed, every record is whole.
    long QueryUpdate(const char* statement);
    // Applies a SetOperator to a number in place; integers wrap, and dividing one by 0 leaves it as it is.
    // Any other operator changes nothing.
    template <class T>
    void QueryUpdateFunction(int op, T* field, T value) const {
        ChangeNumber(op, field, value);
    }
    // Apply =, + or - to a date or time part by part, the parts of the packed value being its bytes. There
    // is no carry; any other operator changes nothing.
    void QueryUpdateDateFunction(int op, dbDATE* field, const long* value) const;
    void QueryUpdateTimeFunction(int op, dbTIME* field, const long* value) const;

    // Dates and times; none of these touches the file

    // Brings an out-of-range month into 1 to 12, then a day outside its month by one month into range.
    void MakeDateValid(dbDATE* date) const;
    // Carries seconds and minutes, and moves an hour outside 0 to 23 by one day.
    void MakeTimeValid(dbTIME* time) const;
    // Writes a date to `out`, which has FormattedDateSize bytes: style 1 "Jan 05, 1999", 2 "January 05,
    // 1999", 3 "01-05-1999"; "Invalid date" without a day or month. Other styles write nothing.
    void GetFormattedDateString(const dbDATE* date, char* out, int style) const;
    // Writes a time as "09:05:07" to `out`, which has FormattedTimeSize bytes; on a 12-hour clock unless the
    // style is 2.
    void GetFormattedTimeString(const dbTIME* time, char* out, int style) const;
    // Today's date and the time of day, local.
    void SetToCurrentDate(dbDATE* date) const;
    void SetToCurrentTime(dbTIME* time) const;
    // 0 when equal, 1 when `a` is later, -1 when it is earlier.
    [[nodiscard]] int CompareDates(const dbDATE* a, const dbDATE* b) const;
    [[nodiscard]] int CompareTimes(const dbTIME* a, const dbTIME* b) const;
    // Copies a time with its hour on a 12-hour clock: 13 to 23 become 1 to 11, 0 becomes 12.
    void ConvertTo12HourTime(const dbTIME* in, dbTIME* out) const;

    // Compaction

    // Rewrites the file without its deleted records, through a temporary file (extension .new) and a backup
    // of the old one (.bak), both gone afterwards. Records are renumbered in their old order, locks are
    // gone, the result set is dropped. Owner and permissions stay; of a symbolic link the target is
    // rewritten. The argument has no effect. Fails with 2701 to 2709; file and object are then as before and
    // usable, except: after 2703 the data is in the backup only, which the object goes on using
    // (RestoreCompactionBackup, or the next Compress, puts it back), and after 2704 the file may be
    // compacted already, with the backup left beside it.
    int Compress(int ignored);

  private:
    static constexpr std::int32_t NotInSet = -1; // in a slot whose record the result set lacks

    // File and header
    [[nodiscard]] int Fail(int code);
    [[nodiscard]] int OpenFile(const char* path);
    [[nodiscard]] bool LayOutColumns(const COLUMN_ENTRY* wanted, DATABASE_HEADER* header,
                                     COLUMN_ENTRY* columns) const;
    [[nodiscard]] static int ReadLayout(const File& file, std::int64_t length, DATABASE_HEADER* header,
                                        std::unique_ptr<COLUMN_ENTRY[]>* columns);
    [[nodiscard]] bool RecountDeleted();
    [[nodiscard]] int WriteHeaderBytes();
    [[nodiscard]] static int WriteLayout(File& file, const DATABASE_HEADER& header,
                                         const COLUMN_ENTRY* columns);
    void Adopt(File file, const char* path, const DATABASE_HEADER& header,
               std::unique_ptr<COLUMN_ENTRY[]> columns, std::unique_ptr<std::uint8_t[]> recordBuffer);
    void CloseFile();
    void DropResultSet();
    [[nodiscard]] const COLUMN_ENTRY* FindColumn(const char* name) const;

    // Records
    [[nodiscard]] RecordArea Area() const { return {dataStart_, header_.recordLength, header_.recordCount}; }
    [[nodiscard]] bool IsRecordNumber(long n) const { return n >= 0 && n < header_.recordCount; }
    [[nodiscard]] std::size_t DataSize() const { return static_cast<std::size_t>(header_.recordLength) - 1; }
    [[nodiscard]] int PrepareAppend(std::int32_t count);
    [[nodiscard]] int WriteNewRecords(const std::uint8_t* data, std::size_t stride, std::int32_t count);
    [[nodiscard]] int FetchRecord(long n, void* data, bool cached);
    [[nodiscard]] int LookUpStatus(long n, int invalidRecord, int readFailed, std::uint8_t* status);
    [[nodiscard]] int WriteStatus(long n, std::uint8_t status);
    [[nodiscard]] int ChangeStatus(long n, std::uint8_t from, std::uint8_t to, int failure);
    [[nodiscard]] int ChangeCounts(std::int32_t recordCount, std::int32_t deletedCount,
                                   std::int32_t reserved);
    struct LockCodes {
        int invalidRecord, deleted, unchanged, failed;
    };
    [[nodiscard]] int ChangeLock(long n, std::uint8_t to, const LockCodes& codes);
    void RemoveFromResultSet(long n);

    // Queries
    [[nodiscard]] int PrepareCondition(const char* statement, Condition* condition) const;
    [[nodiscard]] bool NewSlots();
    [[nodiscard]] ReadCache* ScanCache(ReadCache* own);
    [[nodiscard]] int TakeOutDeleted();
    [[nodiscard]] int RunQuery(const Condition& condition, int mode, ReadCache& reader);
    void MergeMatches(const Condition& condition, int mode, std::int32_t first, std::int32_t count,
                      const std::uint8_t* records);

    // Walk, sort, text
    [[nodiscard]] int MoveWalk(long start, long step, bool* found);
    [[nodiscard]] int ReadSortKeys(SortKeys* keys);
    void TakeSortOrder(const SortKeys& keys);
    struct Exporting;
    struct Loading;
    [[nodiscard]] RecordText Text(int byteFormat) const;
    [[nodiscard]] bool OpenForExport(const char* path, File* file) const;
    [[nodiscard]] int ExportAll(Exporting& work);
    [[nodiscard]] int ExportResultSet(Exporting& work);
    [[nodiscard]] bool BeginLines(Loading& work) const;
    [[nodiscard]] int CheckFirstLine(Loading& work) const;
    [[nodiscard]] int LoadLines(Loading& work);

    // Set statements
    [[nodiscard]] int PrepareChange(const char* statement, FieldChange* change) const;
    [[nodiscard]] int ChangeRecords(const FieldChange& change, long* changed);
    [[nodiscard]] int ChangeRecord(const FieldChange& change, ReadCache& reader, std::int32_t number);

    // Compaction
    [[nodiscard]] int WriteCompacted(File& target);
    [[nodiscard]] int CopyActiveRecords(File& target, std::int32_t* copied);
    [[nodiscard]] int SwapIn(const CompactionPaths& paths);

    DATABASE_HEADER header_{};
    std::unique_ptr<COLUMN_ENTRY[]> columns_;
    char path_[PathBufferSize]{};
    FileOperations& operations_;
    File file_;
    std::unique_ptr<std::int32_t[]> slots_; // the result set: slot i holds a record number, or -1 for none
    std::int32_t slotCount_ = 0;            // records when the set was built
    std::int32_t resultCount_ = 0;          // slots that are not -1
    long walkPosition_ = 0;                 // slot of the record that the walk found last; may lie outside
    std::unique_ptr<std::uint8_t[]> recordBuffer_; // what the walk hands out
    char lastStatement_[256]{};
    bool sorted_ = false;
    bool immediateHeaderWrite_ = true;
    bool caseSensitive_ = false;
    int byteOutputFormat_ = 2;
    int byteInputFormat_ = 1;
    bool headingLine_ = false;
    bool byteOrderMark_ = false; // may be there
    ReadCache cache_;
    std::int64_t dataStart_ = 0;
    int lastError_ = DatabaseError::None;
    std::int32_t currentRecord_ = -1;
    FileCounts fileCounts_ = FileCounts::Agree;
    bool deletedCountWasWrong_ = false;
    bool readOnly_ = false;
};

// Derives the paths for the data file at `path`, which need not exist. False when its folder does not exist,
// when a derived path is longer than 127 characters, or when the data file itself has one of the derived
// names.
[[nodiscard]] bool FindCompactionPaths(const std::string& path, CompactionPaths* paths);

// What an interrupted compaction left where nothing is at `path` itself: its backup, which is whole for
// certain, or else its temporary file. Empty for neither. No new file may be made there: the next compaction
// of that would remove it.
[[nodiscard]] std::string FindCompactionLeftover(const std::string& path);

// Undoes what a compaction that was ended between its two renames leaves behind: when nothing is at `path`
// but its backup lies beside it, the backup gets its name back. To be called before the file is opened.
// Nothing else is touched; a temporary file that was left over is overwritten by the next compaction.
// Returns 1 when the backup was put back, 0 when there was nothing to do, -1 when it could not be renamed.
int RestoreCompactionBackup(const char* path, FileOperations& operations = SystemFiles());
