#include <algorithm>

#include <sys/stat.h>

#include "FaultyFiles.h"
#include "SampleFile.h"
#include "db/FileCheck.h"

namespace {

// A file of four records of which one is deleted and one locked, to be damaged, checked and repaired.
class FileCheckTest : public testing::Test {
  protected:
    FileCheckTest() {
        MakeRows(path_, 4);
        intact_ = folder_.Read("rows.db");
        damaged_ = With(intact_, 40, "\x03");
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    std::string intact_;
    std::string damaged_; // with a wrong count
};

TEST_F(FileCheckTest, ListsNoMoreThanItsBound) {
    std::string bytes = With(intact_, 36, std::string("\xFA\0\0\0", 4)); // 250 records
    folder_.Write("rows.db", bytes.substr(0, DataStartOfRows) + std::string(250 * RowLength, '\x07'));
    FileCheck check;
    ASSERT_EQ(check.Run(path_), 0);
    ASSERT_EQ(check.Findings().size(), FileCheck::MostFindings);
    EXPECT_EQ(check.Findings()[98].record, 97) << "the deleted count comes first";
    EXPECT_EQ(check.Findings().back().text, "152 more findings are not listed");
}

TEST_F(FileCheckTest, WhatCannotBeReadIsNoSoundFile) {
    FileCheck check;
    EXPECT_EQ(check.Run(folder_.File("nothing")), ENOENT);
    EXPECT_EQ(check.Run(folder_.Path()), EINVAL);
    struct : FileOperations {
        ssize_t ReadAt(int file, void* data, std::size_t size, off_t offset) override {
            errno = EIO;
            return offset > 300 ? -1 : FileOperations::ReadAt(file, data, size, offset);
        }
    } unreadable;
    FileCheck broken(unreadable);
    EXPECT_EQ(broken.Run(path_), EIO);
    EXPECT_TRUE(broken.Findings().empty());
}

TEST_F(FileCheckTest, BackupTakesAFreeNameAndThePermissions) {
    std::filesystem::create_directory(folder_.File("home"));
    folder_.Write("home/rows.db", damaged_);
    ASSERT_EQ(chmod(folder_.File("home/rows.db").c_str(), 0640), 0);
    std::filesystem::remove(path_);
    std::filesystem::create_symlink("home/rows.db", path_);
    folder_.Write("home/rows.db.before-repair", "precious");
    std::filesystem::create_symlink("nowhere", folder_.File("home/rows.db.before-repair-2"));
    FileCheck check;
    std::string backup;
    ASSERT_EQ(check.Repair(path_, &backup), 0);
    EXPECT_TRUE(check.IsSound());
    EXPECT_TRUE(std::filesystem::is_symlink(path_));
    EXPECT_EQ(folder_.Read("home/rows.db"), intact_);
    EXPECT_EQ(folder_.Read("home/rows.db.before-repair"), "precious");
    EXPECT_EQ(folder_.Read("home/rows.db.before-repair-3"), damaged_);
    struct stat status {};
    ASSERT_EQ(stat(backup.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0600U);
}

// Whatever fails, the file is the old one or the mended one, and it is mended only when the backup is whole.
TEST_F(FileCheckTest, FailedRepairLosesNothing) {
    for (Fault fault :
         {Fault::Error, Fault::HalfThenError, Fault::ShortWrite, Fault::Interrupted, Fault::Broken}) {
        for (int at = 0;; ++at) {
            SCOPED_TRACE("call " + std::to_string(at) + " fault " + std::to_string(static_cast<int>(fault)));
            folder_.Clear();
            folder_.Write("rows.db", damaged_);
            FaultyFiles files;
            FileCheck check(files);
            std::string backup;
            files.Arm(fault, at);
            const int error = check.Repair(path_, &backup);
            const bool met = files.Disarm();
            EXPECT_EQ(error != 0, met && fault != Fault::ShortWrite && fault != Fault::Interrupted);
            const std::string found = folder_.Read("rows.db");
            EXPECT_TRUE(found == damaged_ || found == intact_ || fault == Fault::Broken);
            EXPECT_TRUE(error != 0 || found == intact_);
            if (found != damaged_) {
                EXPECT_EQ(folder_.Read("rows.db.before-repair"), damaged_);
            }
            EXPECT_TRUE(fault == Fault::Broken || backup.empty() == (folder_.Names().size() == 1))
                << "no half copy is left";
            if (!met) {
                EXPECT_EQ(at, 7) << "open, write, mode, sync, sync of the folder, write, sync";
                break;
            }
        }
    }
}

} // namespace
