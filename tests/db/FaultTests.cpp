#include "InChild.h"
#include "SampleFile.h"
#include "db/FileCheck.h"

namespace {

// Each operation that changes a file.
struct OPERATION {
    const char* step;
    std::vector<int> codes;  // of each of its calls that fails; none where another test has them
    int result;              // when nothing fails
    bool byRecord = false;   // it may end between two records
    bool leavesSync = true;  // its bytes are still to be brought to the disk
    bool changesFile = true; // and not another one
};

const OPERATION Operations[] = {
    {"append", {2801, 2801, 2901}, 150},
    {"write 3", {1309}, 0},
    {"delete 2", {1409, 2901}, 0},
    {"undelete 1", {1509, 2901}, 0},
    {"lock 0", {2309}, 0},
    {"unlock 3", {2409}, 0},
    {"compress", {}, 0, false, false},
    {"change Name = other", {1309, 1309, 1309}, 3, true}, // 0, 140 and 141
    {"append-all", {2801, 2901, 2801, 2901}, 150},
    {"load \t\n", {2801, 2901, 2801, 2901, 2901, 2801, 2901}, 8000, true}, // in more than one batch
    {"export 1", {1901, 1901, 1909, 1909}, 149, false, false, false},      // in more than one block
};

// Whether the content is the old one or, where an operation works by record, that of a moment between.
bool IsUnfinished(const CONTENT& found, const CONTENT& old, const CONTENT& changed, bool byRecord) {
    bool whole = byRecord && found.size() >= old.size() && found.size() <= changed.size();
    for (std::size_t i = 0; whole && i < found.size(); ++i)
        whole = (i < old.size() && found[i] == old[i]) || found[i] == changed[i];
    return whole || found == old;
}

// Behind 150 records, of which 1 is deleted and 3 locked, lie three of an interrupted append.
class FaultTest : public RowsTest {
  protected:
    FaultTest() {
        MakeRows(150, 3);
        fresh_ = With(folder_.Read("rows.db"), 48, "\x03") + std::string(3 * RowLength, '\0');
        std::string text;
        for (int i = 0; i < 8000; ++i)
            text += "loaded\t1\t2\t" + std::to_string(i) + "\t4\t20000101\t120000\n";
        texts_.Write("text", text);
    }

    void OpenFresh() {
        folder_.Clear();
        ASSERT_EQ(Open(fresh_), 0);
        Play("new Small < 2: 3");
    }

    // The error's code of an operation that should succeed so.
    int CodeOf(const OPERATION& operation) {
        const auto result = static_cast<int>(Run(operation.step));
        if (result == 149 && !operation.changesFile)
            EXPECT_GT(texts_.Read("text").size(), 149U * 2100);
        return result == operation.result ? 0 : result;
    }

    // The code of a Sync that fails when it gets as far as the disk.
    int SyncCode() {
        files_.Arm(Fault::Error, 0, EIO);
        const auto code = static_cast<int>(Run("sync"));
        EXPECT_EQ(files_.Disarm(), code != 0);
        return code;
    }

    // What the file holds for whoever opens it next. The check mends counts at most, and changes no record.
    CONTENT Reopened() {
        EXPECT_GE(RestoreCompactionBackup(path_.c_str()), 0);
        DATABASE database(path_.c_str());
        EXPECT_TRUE(database.IsOpen() && !database.IsDamaged());
        CONTENT content = ContentOf(database);
        FileCheck check(files_);
        std::string backup;
        EXPECT_EQ(check.Repair(path_, &backup), 0);
        EXPECT_TRUE(check.IsSound());
        if (std::filesystem::remove(backup))
            EXPECT_EQ(ContentOf(*std::make_unique<DATABASE>(path_.c_str())), content);
        return content;
    }

    // What an operation leaves that meets no fault, and whether that is still to be brought to the disk.
    CONTENT ContentAfter(const OPERATION& operation) {
        OpenFresh();
        EXPECT_EQ(SyncCode(), 0);
        EXPECT_EQ(CodeOf(operation), 0) << operation.step;
        EXPECT_EQ(SyncCode(), operation.leavesSync ? 3001 : 0) << operation.step;
        EXPECT_EQ(SyncCode(), 0) << "told once";
        return Reopened();
    }

    std::string fresh_;
};

TEST_F(FaultTest, FailedOrKilledLeavesTheOldContentOrTheNew) {
    OpenFresh();
    const CONTENT old = ContentOf(database_);
    for (const OPERATION& operation : Operations) {
        const CONTENT changed = ContentAfter(operation);
        for (const Fault fault :
             {Fault::Error, Fault::HalfThenError, Fault::Broken, Fault::NoRead, Fault::ShortWrite,
              Fault::Interrupted, Fault::KilledBefore, Fault::KilledAfter}) {
            const bool passes = fault == Fault::ShortWrite || fault == Fault::Interrupted;
            const bool kills = fault >= Fault::KilledBefore;
            const bool coded = fault != Fault::NoRead && !kills && !operation.codes.empty();
            for (std::size_t at = 0;; ++at) {
                SCOPED_TRACE(std::string(operation.step) + " call " + std::to_string(at) + " fault " +
                             std::to_string(static_cast<int>(fault)));
                OpenFresh();
                files_.Arm(fault, static_cast<int>(at));
                const auto run = [&] { return CodeOf(operation); };
                const int code = kills ? ResultInChild(run) : run();
                if (!files_.Disarm() && code >= 0) {
                    EXPECT_EQ(code, 0);
                    EXPECT_TRUE(coded ? at == operation.codes.size() : at > 0 || !kills);
                    break;
                }
                EXPECT_TRUE(passes ? code == 0 : !coded || code == operation.codes[at]) << code;
                // Whoever opens it next, and what is compacted but could not be opened again.
                const bool reopened = kills || !database_.IsOpen();
                if (reopened)
                    ASSERT_GE(RestoreCompactionBackup(path_.c_str()) + Run("open"), 0);
                const CONTENT found = ContentOf(database_);
                // A broken disk cannot be given back the old bytes, but nothing is shown that it lacks.
                EXPECT_TRUE(fault == Fault::Broken || ((code == 0 || reopened) && found == changed) ||
                            (code != 0 && IsUnfinished(found, old, changed, operation.byRecord)));
                EXPECT_EQ(Reopened(), found);
                // What stays behind the counted records is no obstacle, and does not come back.
                EXPECT_EQ(Run("append"), static_cast<long>(found.size()));
                EXPECT_EQ(Reopened().size(), found.size() + 1);
            }
        }
    }
}

TEST_F(FaultTest, FileThatMayOnlyBeReadIsRead) {
    for (int error : {EACCES, EPERM, EROFS}) {
        files_.writingError = error;
        OpenFresh();
        files_.writingError = 0;
        ASSERT_TRUE(database_.IsReadOnly());
        const CONTENT content = ContentOf(database_);
        for (const OPERATION& operation : Operations)
            EXPECT_EQ(CodeOf(operation) != 0, operation.changesFile) << operation.step;
        EXPECT_EQ(ContentOf(database_), content);
        EXPECT_EQ(Reopened(), content);
    }
}

} // namespace
