#include <sys/stat.h>
#include <unistd.h>

#include "FaultyFiles.h"
#include "SampleFile.h"
#include "db/Database.h"

namespace {

using Names = std::vector<std::string>;

class CompactionTest : public testing::Test {
  protected:
    CompactionTest() { MakeRows(path_, 3); }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    FaultyFiles files_;
};

TEST_F(CompactionTest, DropsDeletedRecordsAndLocks) {
    folder_.Clear();
    MakeRows(path_, 9000); // more than are read at once
    folder_.Write("rows.bak", "left over");
    folder_.Write("rows.new", std::string(400'000, 'x'));
    std::string bytes = With(folder_.Read("rows.db"), 48, "\x07"); // the reserved field
    folder_.Write("rows.db", bytes);
    DATABASE database(path_.c_str(), files_);
    ASSERT_EQ(database.Query("Name contains row", QueryMode::New), 8999);
    ASSERT_EQ(database.Compress(1), 0);
    EXPECT_EQ(folder_.Names(), Names{"rows.db"});
    bytes.erase(DataStartOfRows + RowLength, RowLength);
    bytes.replace(36, 8, std::string("\x27\x23\0\0\0\0\0\0", 8)); // the counts
    bytes[DataStartOfRows + RowLength] = RecordStatus::Active;
    EXPECT_TRUE(folder_.Read("rows.db") == bytes);
    EXPECT_EQ(files_.Order(), "x" + std::string(6, 'w') + "ssxrrsx") << "on the disk before the swap";
    folder_.Write("precious", "untouched");
    std::filesystem::create_symlink("precious", folder_.File("rows.new"));
    EXPECT_EQ(database.Compress(0), 0);
    EXPECT_TRUE(folder_.Read("rows.db") == bytes);
    EXPECT_EQ(folder_.Read("precious"), "untouched") << "a leftover link is not written through";
}

// Where the test may give files away.
TEST_F(CompactionTest, KeepsOwnerAndPermissions) {
    for (const auto& [user, group] : {std::pair(uid_t{12345}, getgid()), {getuid(), gid_t{12346}}}) {
        static_cast<void>(!chown(path_.c_str(), user, group));
        ASSERT_EQ(chmod(path_.c_str(), 0640), 0);
        struct stat before {};
        struct stat after {};
        ASSERT_EQ(stat(path_.c_str(), &before), 0);
        ASSERT_EQ(std::make_unique<DATABASE>(path_.c_str(), files_)->Compress(0), 0);
        ASSERT_EQ(stat(path_.c_str(), &after), 0);
        EXPECT_EQ(std::tuple(after.st_uid, after.st_gid, after.st_mode),
                  std::tuple(before.st_uid, before.st_gid, before.st_mode));
        EXPECT_EQ(files_.FirstMode(), 0600U) << "nobody else looks into it before";
    }
}

// What each failing step leaves on disk. Whatever it is, the object goes on working with complete data.
TEST_F(CompactionTest, OutcomesOfFailingSteps) {
    const struct {
        int call; // 0 removes a leftover, then open, header, columns, records, header and columns, mode,
                  // sync, sync of the folder, remove, rename, rename, sync of the folder, remove
        int error;
        int code;
        Names files; // in alphabetical order
        std::size_t records;
    } cases[] = {
        {1, EACCES, 2705, {"rows.db"}, 3},
        {2, ENOSPC, 2706, {"rows.db"}, 3},
        {8, EIO, 2706, {"rows.db"}, 3},
        {9, EIO, 2706, {"rows.db"}, 3},
        {10, EACCES, 2704, {"rows.bak", "rows.db", "rows.new"}, 3},
        {10, EPERM, 2704, {"rows.bak", "rows.db", "rows.new"}, 3},
        {10, ENOENT, 0, {"rows.db"}, 2},
        {11, EACCES, 2702, {"rows.db", "rows.new"}, 3},
        {12, EIO, 2703, {"rows.bak", "rows.new"}, 3},
        {13, EIO, 0, {"rows.bak", "rows.db"}, 2},
        {14, EACCES, 2704, {"rows.bak", "rows.db"}, 2},
        {14, EIO, 0, {"rows.bak", "rows.db"}, 2},
    };
    for (const auto& failure : cases) {
        SCOPED_TRACE("call " + std::to_string(failure.call) + " error " + std::to_string(failure.error));
        folder_.Clear();
        MakeRows(path_, 3);
        if (failure.call == 10)
            folder_.Write("rows.bak", "left over");
        DATABASE database(path_.c_str(), files_);
        files_.Arm(Fault::Error, failure.call, failure.error);
        EXPECT_EQ(Code(database, database.Compress(0)), failure.code);
        EXPECT_TRUE(files_.Disarm());
        EXPECT_EQ(folder_.Names(), failure.files);
        EXPECT_EQ(ContentOf(database).size(), failure.records);
        const ROW row = Row("later");
        EXPECT_EQ(database.Append(&row), static_cast<long>(failure.records));
        EXPECT_EQ(database.Compress(0), 0) << "the next run mends what the failed one left";
        EXPECT_EQ(folder_.Names(), Names{"rows.db"});
        EXPECT_EQ(ContentOf(database).size(), 3U);
    }
}

TEST_F(CompactionTest, WorksOnTheTargetOfALink) {
    std::filesystem::create_directory(folder_.File("home"));
    std::filesystem::rename(path_, folder_.File("home/rows.db"));
    std::filesystem::create_symlink("home/rows.db", path_);
    ASSERT_EQ(std::make_unique<DATABASE>(path_.c_str())->Compress(0), 0);
    EXPECT_TRUE(std::filesystem::is_symlink(path_));
    EXPECT_FALSE(folder_.Has("home/rows.bak") || folder_.Has("home/rows.new"));
}

TEST_F(CompactionTest, RefusesWhereItWouldLoseData) {
    // Their derived names would be their own, or one byte too long.
    const std::string longest = std::string(PathBufferSize - 1 - folder_.File(".db").size(), 'x') + ".db";
    for (const std::string& name : {std::string("rows.new"), std::string("rows.bak"), longest}) {
        const std::string path = folder_.File(name);
        std::filesystem::rename(path_, path);
        const std::string before = folder_.Read(name);
        DATABASE database(path.c_str());
        EXPECT_EQ(Code(database, database.Compress(0)), 2705);
        EXPECT_EQ(folder_.Read(name), before);
        EXPECT_EQ(folder_.Names(), Names{name});
        std::filesystem::rename(path, path_);
    }
    DATABASE database(path_.c_str());
    std::filesystem::remove(path_);
    MakeRows(path_, 3); // another file in its place
    EXPECT_EQ(Code(database, database.Compress(0)), 2702);
    EXPECT_EQ(folder_.Names(), Names{"rows.db"});
}

TEST_F(CompactionTest, BackupIsRestoredOnlyInPlaceOfNothing) {
    folder_.Write("rows.bak", "older");
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 0);
    EXPECT_EQ(folder_.Read("rows.bak"), "older");
    std::filesystem::rename(path_, folder_.File("rows.bak"));
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 1);
    EXPECT_EQ(folder_.Names(), Names{"rows.db"});
    EXPECT_EQ(RestoreCompactionBackup(folder_.File("nowhere/rows.db").c_str()), 0);
    EXPECT_EQ(RestoreCompactionBackup(nullptr), 0);
    std::filesystem::rename(path_, folder_.File("rows.bak"));
    files_.Arm(Fault::Error, 0, EACCES);
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str(), files_), -1);
}

} // namespace
