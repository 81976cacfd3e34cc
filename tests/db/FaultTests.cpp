#include <functional>
#include <memory>

#include "FaultyFiles.h"
#include "InChild.h"
#include "SampleFile.h"
#include "db/Database.h"
#include "db/FileCheck.h"

namespace {

// Each operation that changes a file, on a file of 150 records of which 1 is deleted and 3 locked, and behind
// which lie three more of an append that was interrupted.
struct OPERATION {
    const char* name;
    std::function<long(DATABASE&)> run;
    long result;             // when nothing fails
    std::vector<int> codes;  // of each of its calls that fails; none where another test has them
    bool byRecord = false;   // it may end between two records
    bool leavesSync = true;  // its bytes are still to be brought to the disk
    bool changesFile = true; // and not another one
};

const ROW NewRow = Row("new", 1, 2, 3, 4);

// Where the text files lie.
const TemporaryFolder& TextFolder() {
    static const TemporaryFolder folder;
    return folder;
}

// Loads so many lines that they are appended in more than one batch.
long LoadText(DATABASE& database) {
    std::string text;
    for (int i = 0; i < 8000; ++i)
        text += "loaded\t1\t2\t" + std::to_string(i) + "\t4\t20000101\t120000\n";
    TextFolder().Write("load.txt", text);
    return database.Load(TextFolder().File("load.txt").c_str(), "\t\n");
}

// Exports lines so long that they are written in more than one block.
long ExportText(DATABASE& database) {
    const std::string path = TextFolder().File("export.txt");
    const long lines = database.Export(path.c_str(), 1, std::string(300, '-').c_str());
    EXPECT_TRUE(lines < 0 || std::filesystem::file_size(path) > 149 * 2100);
    return lines;
}

// Changes 0, 140 and 141.
long ChangeScattered(DATABASE& database) {
    return database.Query("Small < 2", QueryMode::New) < 0 ? -1 : database.QueryUpdate("Name = other");
}

long AppendThree(DATABASE& database) {
    const ROW rows[] = {NewRow, Row("newer", 5, 6, 7, 8), NewRow};
    return database.AppendAll(rows, sizeof(ROW), 3);
}

const OPERATION Operations[] = {
    {"Append", [](DATABASE& database) { return database.Append(&NewRow); }, 150, {2801, 2801, 2901}},
    {"Write", [](DATABASE& database) { return database.Write(3, &NewRow); }, 0, {1309}},
    {"Delete", [](DATABASE& database) { return database.Delete(2); }, 0, {1409, 2901}},
    {"UnDelete", [](DATABASE& database) { return database.UnDelete(1); }, 0, {1509, 2901}},
    {"Lock", [](DATABASE& database) { return database.Lock(0); }, 0, {2309}},
    {"UnLock", [](DATABASE& database) { return database.UnLock(3); }, 0, {2409}},
    {"Compress", [](DATABASE& database) { return database.Compress(0); }, 0, {}, false, false},
    {"QueryUpdate", ChangeScattered, 3, {1309, 1309, 1309}, true},
    {"AppendAll", AppendThree, 150, {2801, 2901, 2801, 2901}},
    {"Load", LoadText, 8000, {2801, 2901, 2801, 2901, 2901, 2801, 2901}, true},
    {"Export", ExportText, 149, {1901, 1901, 1909, 1909}, false, false, false},
};

// Tells whether the content is the old one or, where an operation works record by record, that of some moment
// between.
bool IsUnfinished(const CONTENT& found, const CONTENT& old, const CONTENT& changed,
                  const OPERATION& operation) {
    if (!operation.byRecord)
        return found == old;
    bool whole = found.size() >= old.size() && found.size() <= changed.size();
    for (std::size_t i = 0; whole && i < found.size(); ++i)
        whole = (i < old.size() && found[i] == old[i]) || found[i] == changed[i];
    return whole;
}

class FaultTest : public testing::Test {
  protected:
    FaultTest() {
        MakeRows(path_, 150, 3);
        fresh_ = With(folder_.Read("rows.db"), 48, "\x03") + std::string(3 * RowLength, '\0');
    }

    // A fresh file, opened through the operations that meet faults.
    std::unique_ptr<DATABASE> Fresh() {
        folder_.Clear();
        folder_.Write("rows.db", fresh_);
        return std::make_unique<DATABASE>(path_.c_str(), files_);
    }

    // The code of a Sync that fails when it gets as far as the disk.
    int SyncCode(DATABASE& database) {
        files_.Arm(Fault::Error, 0, EIO);
        const int code = Code(database, database.Sync());
        EXPECT_EQ(files_.Disarm(), code != 0);
        return code;
    }

    // What the file holds for whoever opens it next. The check finds nothing but counts to mend, and mending
    // them changes no record.
    CONTENT Reopened() {
        EXPECT_GE(RestoreCompactionBackup(path_.c_str()), 0);
        DATABASE database(path_.c_str());
        EXPECT_TRUE(database.IsOpen() && !database.IsDamaged());
        CONTENT content = ContentOf(database);
        FileCheck check(files_);
        std::string backup;
        EXPECT_EQ(check.Repair(path_, &backup), 0);
        EXPECT_TRUE(check.IsSound());
        if (!backup.empty()) {
            std::filesystem::remove(backup);
            EXPECT_EQ(ContentOf(*std::make_unique<DATABASE>(path_.c_str())), content);
        }
        return content;
    }

    // What an operation leaves that meets no fault, and whether that is still to be brought to the disk.
    CONTENT ContentAfter(const OPERATION& operation) {
        const auto database = Fresh();
        EXPECT_EQ(SyncCode(*database), 0);
        EXPECT_EQ(operation.run(*database), operation.result) << operation.name;
        EXPECT_EQ(SyncCode(*database), operation.leavesSync ? 3001 : 0) << operation.name;
        EXPECT_EQ(SyncCode(*database), 0) << "told once";
        return Reopened();
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    std::string fresh_;
    FaultyFiles files_;
};

// What a call can meet, and whether the operation must go on all the same.
constexpr std::pair<Fault, bool> Faults[] = {{Fault::Error, false},        {Fault::HalfThenError, false},
                                             {Fault::Broken, false},       {Fault::NoRead, false},
                                             {Fault::ShortWrite, true},    {Fault::Interrupted, true},
                                             {Fault::KilledBefore, false}, {Fault::KilledAfter, false}};

TEST_F(FaultTest, FailedOrKilledLeavesTheOldContentOrTheNew) {
    const CONTENT old = ContentOf(*Fresh());
    for (const OPERATION& operation : Operations) {
        const CONTENT changed = ContentAfter(operation);
        for (const auto& [fault, passes] : Faults) {
            const bool kills = fault >= Fault::KilledBefore;
            const bool coded = fault != Fault::NoRead && !kills && !operation.codes.empty();
            for (std::size_t at = 0;; ++at) {
                SCOPED_TRACE(std::string(operation.name) + " call " + std::to_string(at) + " fault " +
                             std::to_string(static_cast<int>(fault)));
                auto database = Fresh();
                files_.Arm(fault, static_cast<int>(at));
                const auto run = [&] { return Code(*database, operation.run(*database)); };
                const int code = kills ? ResultInChild([&] { return run() == 0 ? 0 : 1; }) : run();
                if (!files_.Disarm() && code >= 0) {
                    EXPECT_EQ(code, 0);
                    EXPECT_TRUE(coded ? at == operation.codes.size() : at > 0 || !kills);
                    break;
                }
                EXPECT_TRUE(passes ? code == 0 : !coded || code == operation.codes[at]) << code;
                // Whoever opens it next, and what is compacted but could not be opened again.
                const bool reopened = kills || !database->IsOpen();
                if (reopened)
                    ASSERT_GE(RestoreCompactionBackup(path_.c_str()) + database->Open(path_.c_str()), 0);
                const CONTENT found = ContentOf(*database);
                // A disk that takes nothing any more cannot be given back the old bytes, but never is
                // anything shown that it does not hold.
                EXPECT_TRUE(fault == Fault::Broken || ((code == 0 || reopened) && found == changed) ||
                            (code != 0 && IsUnfinished(found, old, changed, operation)));
                EXPECT_EQ(Reopened(), found);
                // What stays behind the counted records is no obstacle, and does not come back.
                EXPECT_GE(database->Append(&NewRow), 0);
                EXPECT_EQ(Reopened().size(), found.size() + 1);
            }
        }
    }
}

TEST_F(FaultTest, HeaderThatIsNotToBeWrittenIsNotAfterAFailureEither) {
    auto database = Fresh();
    database->SetImmediateHeaderWrite(false);
    ASSERT_GE(database->Append(&NewRow), 0);
    const std::string header = folder_.Read("rows.db").substr(0, HeaderSize);
    files_.Arm(Fault::Error, 0);
    EXPECT_EQ(database->AppendAll(&NewRow, sizeof(ROW), 1), -1);
    ASSERT_TRUE(files_.Disarm());
    EXPECT_EQ(folder_.Read("rows.db").substr(0, HeaderSize), header);
}

TEST_F(FaultTest, CreateThatFailsLeavesNoFile) {
    for (int call = 0; call < 3; ++call) {
        DATABASE database(nullptr, files_);
        files_.Arm(Fault::HalfThenError, call);
        EXPECT_EQ(Code(database, CreateRows(database, folder_.File("new.db"))), 1109);
        EXPECT_TRUE(files_.Disarm());
        EXPECT_FALSE(folder_.Has("new.db"));
    }
}

TEST_F(FaultTest, FileThatMayOnlyBeReadIsRead) {
    for (int error : {EACCES, EPERM, EROFS}) {
        const CONTENT content = ContentOf(*Fresh());
        files_.RefuseWriting(error);
        DATABASE database(path_.c_str(), files_);
        files_.RefuseWriting(0);
        ASSERT_TRUE(database.IsReadOnly());
        EXPECT_EQ(database.Query("Name contains row", QueryMode::New), 149);
        for (const OPERATION& operation : Operations)
            EXPECT_EQ(Code(database, operation.run(database)) != 0, operation.changesFile) << operation.name;
        EXPECT_EQ(ContentOf(database), content);
        EXPECT_EQ(Reopened(), content);
    }
}

} // namespace
