#include <functional>
#include <memory>

#include "FaultyFiles.h"
#include "InChild.h"
#include "SampleFile.h"
#include "db/Compaction.h"
#include "db/FileCheck.h"

namespace {

// Each operation that changes a file, on a file of 150 records of which 1 is deleted and 3 locked.
struct OPERATION {
    const char* name;
    std::function<long(DATABASE&)> run;
    bool byRecord = false;   // it may end between two records
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
    constexpr int lines = 8000;
    std::string text;
    for (int i = 0; i < lines; ++i) {
        text += "loaded\t1\t2\t" + std::to_string(i) + "\t4\t20000101\t120000\n";
    }
    TextFolder().Write("load.txt", text);
    const long loaded = database.Load(TextFolder().File("load.txt").c_str(), "\t\n");
    EXPECT_TRUE(loaded == lines || loaded == -1);
    return loaded;
}

// Exports lines so long that they are written in more than one block.
long ExportText(DATABASE& database) {
    const std::string path = TextFolder().File("export.txt");
    const std::string separator(300, '-');
    const long lines = database.Export(path.c_str(), 1, separator.c_str());
    EXPECT_TRUE(lines == -1 || (lines == 149 && std::filesystem::file_size(path) > 149 * 2100));
    return lines;
}

const OPERATION Operations[] = {
    {"Append", [](DATABASE& database) { return database.Append(&NewRow); }},
    {"Write", [](DATABASE& database) { return database.Write(3, &NewRow); }},
    {"Delete", [](DATABASE& database) { return database.Delete(2); }},
    {"UnDelete", [](DATABASE& database) { return database.UnDelete(1); }},
    {"Lock", [](DATABASE& database) { return database.Lock(0); }},
    {"UnLock", [](DATABASE& database) { return database.UnLock(3); }},
    {"Compress", [](DATABASE& database) { return database.Compress(0); }},
    {"QueryUpdate",
     [](DATABASE& database) { // 0, 1, 140 and 141: too far apart to be written together
         return database.Query("Small < 2", QueryMode::New) < 0 ? -1 : database.QueryUpdate("Name = other");
     },
     true},
    {"AppendAll",
     [](DATABASE& database) {
         const ROW rows[] = {NewRow, Row("newer", 5, 6, 7, 8), NewRow};
         return database.AppendAll(rows, sizeof(ROW), 3);
     }},
    {"Load", LoadText, true},
    {"Export", ExportText, false, false},
};

// Tells whether the content is the old one or, where an operation works record by record, that of some moment
// between.
bool IsUnfinished(const CONTENT& found, const CONTENT& old, const CONTENT& changed,
                  const OPERATION& operation) {
    if (!operation.byRecord) {
        return found == old;
    }
    bool whole = found.size() >= old.size() && found.size() <= changed.size();
    for (std::size_t i = 0; whole && i < found.size(); ++i) {
        whole = (i < old.size() && found[i] == old[i]) || found[i] == changed[i];
    }
    return whole;
}

class FaultTest : public testing::Test {
  protected:
    // A fresh file, opened through the operations that meet faults.
    std::unique_ptr<DATABASE> Fresh() {
        folder_.Clear();
        MakeRows(path_, 150, 3);
        return std::make_unique<DATABASE>(path_.c_str(), files_);
    }

    // What the file holds for whoever opens it next. The check finds nothing but counts to mend, and mending
    // them changes no record.
    CONTENT Reopened() const {
        EXPECT_GE(RestoreCompactionBackup(path_.c_str()), 0);
        DATABASE database(path_.c_str());
        EXPECT_TRUE(database.IsOpen());
        EXPECT_FALSE(database.IsDamaged());
        CONTENT content = ContentOf(database);
        FileCheck check;
        std::string backup;
        EXPECT_EQ(check.Repair(path_, &backup), 0);
        EXPECT_TRUE(check.IsSound());
        if (!backup.empty()) {
            std::filesystem::remove(backup);
            EXPECT_EQ(ContentOf(*std::make_unique<DATABASE>(path_.c_str())), content);
        }
        return content;
    }

    CONTENT ContentAfter(const OPERATION& operation) {
        EXPECT_GE(operation.run(*Fresh()), 0) << operation.name;
        return Reopened();
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    FaultyFiles files_;
};

// What a call can meet, and whether the operation must go on all the same.
constexpr struct {
    Fault fault;
    int error;
    bool passes;
} Faults[] = {
    {Fault::Error, ENOSPC, false},      {Fault::Error, EIO, false},  {Fault::HalfThenError, ENOSPC, false},
    {Fault::HalfThenError, EIO, false}, {Fault::Broken, EIO, false}, {Fault::ShortWrite, 0, true},
    {Fault::Interrupted, EINTR, true},
};

TEST_F(FaultTest, FailedCallLeavesTheOldContentOrTheNew) {
    const CONTENT old = ContentOf(*Fresh());
    for (const OPERATION& operation : Operations) {
        const CONTENT changed = ContentAfter(operation);
        for (const auto& [fault, error, passes] : Faults) {
            for (int at = 0;; ++at) {
                SCOPED_TRACE(std::string(operation.name) + " call " + std::to_string(at) + " fault " +
                             std::to_string(static_cast<int>(fault)) + " error " + std::to_string(error));
                auto database = Fresh();
                files_.Arm(fault, at, error);
                const bool succeeded = operation.run(*database) >= 0;
                if (!files_.Disarm()) {
                    EXPECT_TRUE(succeeded);
                    ASSERT_GT(at, 0) << "no call was met";
                    break;
                }
                EXPECT_EQ(database->GetLastError(nullptr) != 0, !succeeded);
                EXPECT_TRUE(succeeded || !passes);
                const CONTENT found = ContentOf(*database);
                // A disk that takes nothing any more cannot be given back the old bytes, but never is
                // anything shown that it does not hold.
                EXPECT_TRUE(fault == Fault::Broken ||
                            (succeeded ? found == changed : IsUnfinished(found, old, changed, operation)));
                EXPECT_EQ(Reopened(), found);
            }
        }
    }
}

// Writes records but says that it could not, and cannot take them back; the header it can write.
class StickyFiles : public FileOperations {
  public:
    bool sticky = true;
    ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
        const ssize_t written = FileOperations::WriteAt(file, data, size, offset);
        return sticky && size >= 3 * sizeof(ROW) ? Refuse() : written;
    }
    int Truncate(int file, off_t length) override {
        return sticky ? Refuse() : FileOperations::Truncate(file, length);
    }

  private:
    static int Refuse() {
        errno = EIO;
        return -1;
    }
};

TEST_F(FaultTest, RecordsThatCannotBeTakenBackStayAnnounced) {
    const CONTENT old = ContentOf(*Fresh());
    StickyFiles sticky;
    DATABASE database(path_.c_str(), sticky);
    const ROW rows[] = {NewRow, NewRow, NewRow};
    EXPECT_EQ(database.AppendAll(rows, sizeof(ROW), 3), -1);
    EXPECT_EQ(Reopened(), old);
    sticky.sticky = false;
    EXPECT_EQ(database.Append(&NewRow), static_cast<long>(old.size()));
    EXPECT_EQ(Reopened().size(), old.size() + 1);
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

TEST_F(FaultTest, KilledAtAnyCallLeavesTheOldContentOrTheNew) {
    const CONTENT old = ContentOf(*Fresh());
    for (const OPERATION& operation : Operations) {
        const CONTENT changed = ContentAfter(operation);
        for (Fault fault : {Fault::KilledBefore, Fault::KilledAfter}) {
            bool killed = true;
            for (int at = 0; killed; ++at) {
                SCOPED_TRACE(std::string(operation.name) + " call " + std::to_string(at));
                auto database = Fresh();
                const int result = ResultInChild([&] {
                    files_.Arm(fault, at);
                    return operation.run(*database) >= 0 ? 0 : 1;
                });
                killed = result < 0;
                EXPECT_TRUE(killed || (at > 0 && result == 0));
                const CONTENT found = Reopened();
                EXPECT_TRUE(found == changed || (killed && IsUnfinished(found, old, changed, operation)));
                // What was left behind the counted records is no obstacle, and does not come back.
                EXPECT_GE(DATABASE(path_.c_str()).Append(&NewRow), 0);
                EXPECT_EQ(Reopened().size(), found.size() + 1);
            }
        }
    }
}

TEST_F(FaultTest, SyncReachesTheDiskAfterEveryChangeAndNotOtherwise) {
    for (const OPERATION& operation : Operations) {
        const auto database = Fresh();
        const auto asks = [&](int code) {
            files_.Arm(Fault::Error, 0, EIO);
            EXPECT_EQ(database->Sync(), code == 0 ? 0 : -1);
            EXPECT_EQ(database->GetLastError(nullptr), code);
            return files_.Disarm();
        };
        EXPECT_FALSE(asks(0)) << operation.name;
        ASSERT_GE(operation.run(*database), 0);
        if (!operation.changesFile || operation.name == std::string("Compress")) { // which does so itself
            EXPECT_FALSE(asks(0)) << operation.name;
            continue;
        }
        EXPECT_TRUE(asks(3001)) << operation.name;
        EXPECT_FALSE(asks(0)) << operation.name << ": told once";
        ASSERT_EQ(database->Lock(4), 0);
        EXPECT_EQ(database->Open("no such file"), -1);
        EXPECT_EQ(database->Sync(), 0);
    }
}

TEST_F(FaultTest, CodesNameTheOperationThatFailed) {
    const struct {
        std::size_t operation;
        int call;
        int code;
    } cases[] = {{0, 0, 2801}, {0, 1, 2901}, {1, 0, 1309},  {2, 0, 1409},  {2, 1, 2901},
                 {3, 0, 1509}, {4, 0, 2309}, {5, 0, 2409},  {7, 1, 1309},  {9, 0, 2901},
                 {9, 1, 2801}, {9, 4, 2801}, {10, 0, 1901}, {10, 1, 1901}, {10, 3, 1909}};
    for (const auto& failure : cases) {
        auto database = Fresh();
        files_.Arm(Fault::HalfThenError, failure.call, EIO);
        EXPECT_EQ(Code(*database, Operations[failure.operation].run(*database)), failure.code)
            << Operations[failure.operation].name;
        EXPECT_TRUE(files_.Disarm());
    }
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
        for (const OPERATION& operation : Operations) {
            EXPECT_EQ(Code(database, operation.run(database)) != 0, operation.changesFile) << operation.name;
        }
        EXPECT_EQ(ContentOf(database), content);
        EXPECT_EQ(Reopened(), content);
    }
}

} // namespace
