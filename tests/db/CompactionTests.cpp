#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include "FaultyFiles.h"
#include "SampleFile.h"
#include "db/Compaction.h"

namespace {

class CompactionTest : public testing::Test {
  protected:
    void SetUp() override { MakeFile(path_); }

    static void MakeFile(const std::string& path) {
        DATABASE database(nullptr);
        ASSERT_EQ(CreateRows(database, path), 0);
        for (int i = 0; i < 3; ++i) {
            const ROW row = Row("row " + std::to_string(i));
            ASSERT_EQ(database.Append(&row), i);
        }
        ASSERT_EQ(database.Delete(1) + database.Lock(2), 0);
    }

    bool HasOnly(const std::vector<std::string>& names) const {
        std::size_t count = 0;
        for ([[maybe_unused]] const auto& entry : std::filesystem::directory_iterator(folder_.Path())) {
            ++count;
        }
        return count == names.size() && std::all_of(names.begin(), names.end(),
                                                    [this](const auto& name) { return folder_.Has(name); });
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    FaultyFiles files_;
};

TEST_F(CompactionTest, DropsDeletedRecordsAndLocks) {
    folder_.Write("rows.bak", "left over");
    folder_.Write("rows.new", std::string(10000, 'x'));
    ASSERT_EQ(chmod(path_.c_str(), 0640), 0);
    const auto size = folder_.Read("rows.db").size();
    DATABASE database(path_.c_str());
    ASSERT_EQ(database.Query("Name contains row", QueryMode::New), 2);
    ASSERT_EQ(database.Compress(1), 0);
    EXPECT_TRUE(HasOnly({"rows.db"}));
    EXPECT_EQ(folder_.Read("rows.db").size(), size - sizeof(ROW) - 1);
    ROW row{};
    EXPECT_EQ(database.Update(&row), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 2101) << "no record is current";
    EXPECT_EQ(database.IsQueryActive(), 0) << "the old result set is gone";
    EXPECT_EQ(Walked(database), (std::vector<long>{0, 1}));
    EXPECT_EQ(database.IsLocked(1), 0);
    EXPECT_EQ(database.Read(1, &row), 1);
    EXPECT_STREQ(row.name, "row 2");
    struct stat status {};
    ASSERT_EQ(stat(path_.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0640U);
    const std::string compacted = folder_.Read("rows.db");
    folder_.Write("precious", "untouched");
    std::filesystem::create_symlink("precious", folder_.File("rows.new"));
    EXPECT_EQ(database.Compress(0), 0);
    EXPECT_EQ(folder_.Read("rows.db"), compacted);
    EXPECT_EQ(folder_.Read("precious"), "untouched") << "a leftover link is not written through";
}

TEST_F(CompactionTest, CopyOfAPrivateFileIsPrivateFromTheStart) {
    struct : FileOperations {
        mode_t seen = 0;
        ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
            struct stat status {};
            seen |= Status(file, &status) == 0 ? status.st_mode : 077U;
            return FileOperations::WriteAt(file, data, size, offset);
        }
    } watched;
    ASSERT_EQ(chmod(path_.c_str(), 0600), 0);
    DATABASE database(path_.c_str(), watched);
    ASSERT_EQ(database.Compress(0), 0);
    EXPECT_EQ(watched.seen & 0777U, 0600U);
}

TEST_F(CompactionTest, IsOnTheDiskBeforeTheSwap) {
    struct : FileOperations {
        std::vector<std::string> calls;
        static std::string Name(const std::string& path) { return path.substr(path.rfind('/') + 1); }
        int Sync(int file) override {
            struct stat status {};
            calls.push_back(Status(file, &status) == 0 && S_ISDIR(status.st_mode) ? "sync folder" : "sync");
            return FileOperations::Sync(file);
        }
        ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
            if (calls.empty() || calls.back() != "write") {
                calls.emplace_back("write");
            }
            return FileOperations::WriteAt(file, data, size, offset);
        }
        int Rename(const char* from, const char* to) override {
            calls.push_back(Name(from) + " to " + Name(to));
            return FileOperations::Rename(from, to);
        }
        int Remove(const char* path) override {
            calls.push_back("remove " + Name(path));
            return FileOperations::Remove(path);
        }
    } watched;
    DATABASE database(path_.c_str(), watched);
    ASSERT_EQ(database.Compress(0), 0);
    EXPECT_EQ(watched.calls,
              (std::vector<std::string>{"remove rows.new", "write", "sync", "sync folder", "remove rows.bak",
                                        "rows.db to rows.bak", "rows.new to rows.db", "sync folder",
                                        "remove rows.bak"}));
}

TEST_F(CompactionTest, KeepsTheOwner) {
    struct stat status {};
    if (chown(path_.c_str(), 12345, 12346) != 0) {
        GTEST_SKIP() << "only root may give files away";
    }
    DATABASE database(path_.c_str());
    ASSERT_EQ(database.Compress(0), 0);
    ASSERT_EQ(stat(path_.c_str(), &status), 0);
    EXPECT_EQ(status.st_uid, 12345U);
    EXPECT_EQ(status.st_gid, 12346U);
}

// What each failing step leaves on disk. Whatever it is, the object goes on working with complete data.
TEST_F(CompactionTest, OutcomesOfFailingSteps) {
    const struct {
        int call; // 0 removes a leftover, then open, header and 7 columns, records, header and columns, mode,
                  // sync, sync of the folder, remove, rename, rename, sync of the folder, remove
        int error;
        int code;
        std::vector<std::string> files;
        std::size_t records;
    } cases[] = {
        {1, EACCES, 2705, {"rows.db"}, 3},
        {2, ENOSPC, 2706, {"rows.db"}, 3},
        {10, ENOSPC, 2706, {"rows.db"}, 3},
        {18, EIO, 2706, {"rows.db"}, 3},
        {20, EIO, 2706, {"rows.db"}, 3},
        {21, EIO, 2706, {"rows.db"}, 3},
        {22, EACCES, 2704, {"rows.db", "rows.new", "rows.bak"}, 3},
        {22, EPERM, 2704, {"rows.db", "rows.new", "rows.bak"}, 3},
        {22, ENOENT, 0, {"rows.db"}, 2},
        {23, EACCES, 2702, {"rows.db", "rows.new"}, 3},
        {24, EIO, 2703, {"rows.new", "rows.bak"}, 3},
        {25, EIO, 0, {"rows.db", "rows.bak"}, 2},
        {26, EACCES, 2704, {"rows.db", "rows.bak"}, 2},
        {26, EIO, 0, {"rows.db", "rows.bak"}, 2},
    };
    for (const auto& failure : cases) {
        SCOPED_TRACE("call " + std::to_string(failure.call) + " error " + std::to_string(failure.error));
        std::filesystem::remove_all(folder_.Path());
        std::filesystem::create_directory(folder_.Path());
        MakeFile(path_);
        if (failure.call == 22) {
            folder_.Write("rows.bak", "left over");
        }
        const std::string before = folder_.Read("rows.db");
        DATABASE database(path_.c_str(), files_);
        files_.Arm(Fault::Error, failure.call, failure.error);
        EXPECT_EQ(database.Compress(0), failure.code == 0 ? 0 : -1);
        EXPECT_TRUE(files_.Disarm());
        EXPECT_EQ(database.GetLastError(nullptr), failure.code);
        EXPECT_TRUE(HasOnly(failure.files));
        EXPECT_EQ(ContentOf(database).size(), failure.records);
        const ROW row = Row("later");
        EXPECT_EQ(database.Append(&row), static_cast<long>(failure.records));
        EXPECT_EQ(database.Compress(0), 0) << "the next run mends what the failed one left";
        EXPECT_TRUE(HasOnly({"rows.db"}));
        EXPECT_EQ(ContentOf(database).size(), 3U);
    }
}

TEST_F(CompactionTest, WorksOnTheTargetOfALink) {
    std::filesystem::create_directory(folder_.File("home"));
    std::filesystem::rename(path_, folder_.File("home/rows.db"));
    std::filesystem::create_symlink("home/rows.db", path_);
    {
        DATABASE database(path_.c_str());
        ASSERT_EQ(database.Compress(0), 0);
        EXPECT_EQ(ContentOf(database).size(), 2U);
    }
    EXPECT_TRUE(std::filesystem::is_symlink(path_));
    EXPECT_FALSE(folder_.Has("home/rows.bak") || folder_.Has("home/rows.new"));
    std::filesystem::rename(folder_.File("home/rows.db"), folder_.File("home/rows.bak"));
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 1);
    DATABASE database(path_.c_str());
    EXPECT_EQ(ContentOf(database).size(), 2U);
}

TEST_F(CompactionTest, RefusesWhereItWouldLoseData) {
    // Their derived names would be their own, or one byte too long.
    const std::string longest = std::string(PathBufferSize - 1 - folder_.File(".db").size(), 'x') + ".db";
    for (const std::string& name : {std::string("rows.new"), std::string("rows.bak"), longest}) {
        const std::string path = folder_.File(name);
        std::filesystem::rename(path_, path);
        const std::string before = folder_.Read(name);
        DATABASE database(path.c_str());
        EXPECT_EQ(database.Compress(0), -1);
        EXPECT_EQ(database.GetLastError(nullptr), 2705);
        EXPECT_EQ(folder_.Read(name), before);
        EXPECT_TRUE(HasOnly({name}));
        std::filesystem::rename(path, path_);
    }
    DATABASE database(path_.c_str());
    std::filesystem::remove(path_);
    MakeFile(path_); // another file in its place
    EXPECT_EQ(database.Compress(0), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 2702);
    EXPECT_TRUE(HasOnly({"rows.db"}));
}

TEST_F(CompactionTest, BackupIsRestoredOnlyInPlaceOfNothing) {
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 0);
    folder_.Write("rows.bak", "older");
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 0);
    EXPECT_EQ(folder_.Read("rows.bak"), "older");
    std::filesystem::rename(path_, folder_.File("rows.bak"));
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 1);
    EXPECT_TRUE(HasOnly({"rows.db"}));
    EXPECT_EQ(RestoreCompactionBackup(folder_.File("nowhere/rows.db").c_str()), 0);
    EXPECT_EQ(RestoreCompactionBackup(nullptr), 0);
    std::filesystem::rename(path_, folder_.File("rows.bak"));
    files_.Arm(Fault::Error, 0, EACCES);
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str(), files_), -1);
}

} // namespace
