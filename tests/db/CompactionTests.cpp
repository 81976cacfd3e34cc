#include "SampleFile.h"
#include "Shell.h"

namespace {

using Names = std::vector<std::string>;

class CompactionTest : public RowsTest {
  protected:
    CompactionTest() { MakeRows(3); }
};

TEST_F(CompactionTest, DropsDeletedRecordsAndLocks) {
    MakeRows(9000);                                                // more than are read at once
    std::string bytes = With(folder_.Read("rows.db"), 48, "\x07"); // the reserved field
    ASSERT_EQ(Open(bytes), 0);
    folder_.Write("rows.bak", "left over");
    folder_.Write("rows.new", std::string(400'000, 'x'));
    Play("new Name contains row: 8999; compress: 0");
    EXPECT_EQ(folder_.Names(), Names{"rows.db"});
    bytes.erase(DataStartOfRows + RowLength, RowLength);
    bytes.replace(36, 8, std::string("\x27\x23\0\0\0\0\0\0", 8)); // the counts
    bytes[DataStartOfRows + RowLength] = RecordStatus::Active;
    EXPECT_TRUE(folder_.Read("rows.db") == bytes);
    EXPECT_TRUE(files_.Order().ends_with("xnwwwwwwmssxrrsx")) << "on the disk before the swap";
}

TEST_F(CompactionTest, KeepsLinkOwnerAndPermissions) {
    std::filesystem::create_directory(folder_.File("home"));
    std::filesystem::rename(path_, folder_.File("home/rows.db"));
    std::filesystem::create_symlink("home/rows.db", path_);
    // A group of its own where the test may give files away.
    const std::string look = "stat -Lc '%u %g %a' " + path_;
    const std::string before = Output("chgrp -f 12346 " + path_ + "; chmod 640 " + path_ + "; " + look);
    Play("open: 0; compress: 0");
    EXPECT_EQ(Output(look), before);
    EXPECT_EQ(files_.firstMode, 0600U) << "nobody else looks into it before";
    EXPECT_TRUE(std::filesystem::is_symlink(path_));
    EXPECT_FALSE(folder_.Has("home/rows.bak") || folder_.Has("home/rows.new"));
}

// What each failing step leaves on disk. Whatever it is, the object goes on working with complete data.
TEST_F(CompactionTest, OutcomesOfFailingSteps) {
    // Call 0 removes a leftover; then come open, header, columns, records, header and columns, mode, sync,
    // sync of the folder, remove, rename, rename, sync of the folder, remove.
    const std::tuple<int, int, int, Names, long> cases[] = {
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
    for (const auto& [call, error, code, left, records] : cases) {
        SCOPED_TRACE("call " + std::to_string(call) + " error " + std::to_string(error));
        MakeRows(3);
        if (call == 10)
            folder_.Write("rows.bak", "left over");
        files_.Arm(Fault::Error, call, error);
        EXPECT_EQ(Run("compress"), code);
        EXPECT_TRUE(files_.Disarm());
        EXPECT_EQ(folder_.Names(), left);
        EXPECT_EQ(Run("append"), records);
        Play("compress: 0; reset: 3"); // which mends what the failed one left
        EXPECT_EQ(folder_.Names(), Names{"rows.db"});
    }
}

TEST_F(CompactionTest, RefusesWhereItWouldLoseData) {
    // Their derived names would be their own, or one byte too long.
    const std::string longest = std::string(PathBufferSize - 1 - folder_.File(".db").size(), 'x') + ".db";
    const std::string before = folder_.Read("rows.db");
    for (const std::string& name : {std::string("rows.new"), std::string("rows.bak"), longest}) {
        const std::string path = folder_.File(name);
        std::filesystem::rename(path_, path);
        ASSERT_EQ(database_.Open(path.c_str()), 0);
        Play("compress: 2705");
        EXPECT_EQ(folder_.Read(name), before);
        EXPECT_EQ(folder_.Names(), Names{name});
        std::filesystem::rename(path, path_);
    }
    Play("open: 0");
    std::filesystem::remove(path_);
    folder_.Write("rows.db", before); // another file in its place
    Play("compress: 2702");
    EXPECT_EQ(folder_.Names(), Names{"rows.db"});
}

TEST_F(CompactionTest, BackupIsRestoredOnlyInPlaceOfNothing) {
    folder_.Write("rows.bak", "older");
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 0);
    EXPECT_EQ(folder_.Read("rows.bak"), "older");
    std::filesystem::rename(path_, folder_.File("rows.bak"));
    files_.Arm(Fault::Error, 0, EACCES);
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str(), files_), -1);
    EXPECT_EQ(RestoreCompactionBackup(path_.c_str()), 1);
    EXPECT_EQ(folder_.Names(), Names{"rows.db"});
    EXPECT_EQ(RestoreCompactionBackup(folder_.File("nowhere/rows.db").c_str()), 0);
    EXPECT_EQ(RestoreCompactionBackup(nullptr), 0);
}

} // namespace
