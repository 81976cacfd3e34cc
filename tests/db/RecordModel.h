#pragma once

#include <string>
#include <vector>

#include "SampleFile.h"

// What an operation is expected to return, and the error code it leaves.
struct OUTCOME {
    long value = 0;
    int code = 0;
    bool operator==(const OUTCOME&) const = default;
};

// A query or set statement in parts: a column of RowColumns by its number, an operator as it is spelt, and
// the value as text and as what it means for that column.
struct MODEL_STATEMENT {
    int column = 0;
    std::string op;
    std::string value;
    double number = 0;
    [[nodiscard]] std::string Text() const;
};

// A data file of ROWs as DATABASE documents it, in plain memory and by the plainest means: every record is
// looked at one by one, a sort is a bubble sort. It sets names and counts, and adds to counts. It knows
// nothing of bytes but those it expects in the file.
class RecordModel {
  public:
    enum Status : std::uint8_t { Active, Deleted, Locked };
    struct RECORD {
        ROW row;
        Status status;
    };

    OUTCOME Append(const std::vector<ROW>& rows);
    OUTCOME Read(long n, ROW* row);
    OUTCOME Write(long n, const ROW& row);
    OUTCOME Update(const ROW& row) { return current_ < 0 ? OUTCOME{-1, 2101} : Write(current_, row); }
    OUTCOME Delete(long n);
    OUTCOME UnDelete(long n) { return Mark(n, Deleted, Active, 1502, 0, 1503); }
    OUTCOME Lock(long n) { return Mark(n, Active, Locked, 2302, 2301, 2303); }
    OUTCOME UnLock(long n) { return Mark(n, Locked, Active, 2402, 2401, 2403); }
    OUTCOME IsLocked(long n);
    OUTCOME Query(const MODEL_STATEMENT* statement, int mode);
    OUTCOME QueryUpdate(const MODEL_STATEMENT& statement);
    OUTCOME Sort(int column);
    // The walk's next record; -1 at the end.
    long Walk(long start, long step);
    std::vector<long> Walked();
    // The lines of all active records, or of those of the walk.
    std::string Export(bool all, std::vector<ROW>* exported);
    // What becomes of a row that is exported and loaded again, byte columns as numbers.
    static ROW Reloaded(const ROW& row);
    void Compress();
    void Reopen();
    void SetHeaderWriting(bool on);
    void SetExact(bool on) { exact_ = on; }

    [[nodiscard]] long Size() const { return static_cast<long>(records_.size()); }
    [[nodiscard]] bool IsHeaderWritten() const { return headerWriting_; }
    [[nodiscard]] bool HasLastStatement() const { return hasLast_; }
    [[nodiscard]] const MODEL_STATEMENT& LastStatement() const { return last_; }
    [[nodiscard]] int IsQueryActive() const;
    [[nodiscard]] long LogicalNumber(long n) const;
    // The counts in memory, and the bytes of the file behind its column table.
    [[nodiscard]] std::pair<std::int32_t, std::int32_t> Counts() const;
    [[nodiscard]] std::pair<std::int32_t, std::int32_t> WrittenCounts() const { return written_; }
    [[nodiscard]] std::string Bytes() const;

  private:
    [[nodiscard]] bool Has(long n) const { return n >= 0 && n < Size(); }
    [[nodiscard]] bool Matches(const ROW& row, const MODEL_STATEMENT& statement) const;
    [[nodiscard]] long SetSize() const;
    OUTCOME Reset();
    void WriteCounts();
    // The code for a record that is not there or deleted; 0 for any other.
    [[nodiscard]] int Refusal(long n, int beyond, int deleted) const;
    // Gives a record of one status another one.
    OUTCOME Mark(long n, Status from, Status to, int beyond, int deleted, int other);
    RECORD& At(long n) { return records_[static_cast<std::size_t>(n)]; }

    std::vector<RECORD> records_;
    bool hasSet_ = false;
    std::vector<long> slots_; // of the result set: a record's number, or -1
    bool sorted_ = false;
    bool hasLast_ = false;
    MODEL_STATEMENT last_;
    long walk_ = 0;
    long current_ = -1;
    bool exact_ = false;
    bool headerWriting_ = true;
    std::pair<std::int32_t, std::int32_t> written_{0, 0};
};
