#include <gtest/gtest.h>

#include <algorithm>

#include <sys/stat.h>

#include "FaultyFiles.h"
#include "SampleFile.h"
#include "db/FileCheck.h"

namespace {

constexpr std::size_t DataStartOfRows = 52 + 44 * 7;
constexpr std::size_t Length = sizeof(ROW) + 1;
constexpr std::size_t FirstColumn = 52;

std::string With(std::string bytes, std::size_t at, const std::string& other) {
    return bytes.replace(at, other.size(), other);
}

// A file of four records of which one is deleted and one locked, to be damaged, checked and repaired.
class FileCheckTest : public testing::Test {
  protected:
    void SetUp() override {
        DATABASE database(nullptr);
        ASSERT_EQ(CreateRows(database, path_), 0);
        for (int i = 0; i < 4; ++i) {
            const ROW row = Row("row " + std::to_string(i));
            ASSERT_EQ(database.Append(&row), i);
        }
        ASSERT_EQ(database.Delete(1) + database.Lock(2), 0);
        intact_ = folder_.Read("rows.db");
    }

    // The names in the folder besides the file itself.
    std::vector<std::string> Others() const {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(folder_.Path())) {
            if (entry.path() != path_) {
                names.push_back(entry.path().filename().string());
            }
        }
        return names;
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    std::string intact_;
};

TEST_F(FileCheckTest, SaysWhatIsWrongAndWhere) {
    const std::string ff2 = "\xFF\xFF";
    const std::string name32(32, 'n');
    const std::size_t second = DataStartOfRows + Length;
    enum { Sound, Broken, Mended }; // what is left after a repair: remarks, problems, nothing
    const struct {
        std::string bytes;
        int kind;
        std::int64_t offset; // of a finding; -1 for none
        std::int64_t record;
        const char* text; // in that finding
    } cases[] = {
        {intact_, Sound, -1, -1, ""},
        {"", Broken, 0, -1, "0 of the header's 52 bytes"},
        {intact_.substr(0, 51), Broken, 51, -1, "51 of the header's"},
        {intact_.substr(0, 359), Broken, 44, -1, "7 columns need 360 bytes, the file has 359"},
        {intact_.substr(0, 360), Mended, 36, -1, "counts 4 records, the file has room for 0"},
        {intact_.substr(0, intact_.size() - 1), Mended, 36, -1, "counts 4 records, the file has room for 3"},
        {With(intact_, 36, "\x01"), Mended, 36, -1, "counts 1 record, the file has room for 4"},
        {With(intact_, 36, ff2 + ff2), Mended, 36, -1, "counts -1 records"},
        {With(intact_, 40, "\x02"), Mended, 40, -1, "counts 2 deleted, the status bytes 1"},
        {With(intact_, second, std::string(1, '\0')), Mended, 40, -1, "counts 1 deleted, the status bytes 0"},
        {With(intact_, 44, ff2), Broken, 44, -1, "column count is -1"},
        {With(intact_, 44, "\x08"), Broken, FirstColumn + 44 * 7 + 36, -1, "outside the 34"},
        {With(intact_, 46, std::string(2, '\0')), Broken, 46, -1, "record length is 0"},
        {With(intact_, 46, "\x22"), Broken, FirstColumn + 44 * 6 + 36, -1, "column At has 3 bytes at 31"},
        {With(intact_, FirstColumn + 32, "\x63"), Broken, FirstColumn + 32, -1, "unknown type 99"},
        {With(intact_, FirstColumn + 36, "\x09"), Broken, FirstColumn + 44 + 36, -1, "Tag begins at byte 16"},
        {With(intact_, FirstColumn + 34, "\x11"), Broken, FirstColumn + 44 + 36, -1, "column Tag begins at"},
        {With(intact_, FirstColumn, name32), Broken, FirstColumn, -1, "name without an end"},
        {With(intact_, second + Length, "\x55"), Broken, static_cast<std::int64_t>(second + Length), 2,
         "status byte is 85"},
        {With(intact_, 0, ff2), Sound, 0, -1, "version"},
        {With(intact_, 4, name32), Sound, 4, -1, "description"},
        {With(intact_, FirstColumn + 44, "Name"), Sound, FirstColumn + 44, -1, "column Name has the name"},
        {With(intact_, FirstColumn + 34, "\x0F"), Sound, FirstColumn + 44 + 36, -1, "Tag begins at byte 16"},
        {With(intact_, 44, "\x06").erase(52 + 44 * 6, 44), Sound, 46, -1, "covers the last 3 bytes"},
        {intact_ + "abc", Sound, static_cast<std::int64_t>(intact_.size()), -1, "3 bytes behind the last"},
        {With(intact_ + std::string(2 * Length, 'x'), 48, "\x02"), Sound, 48, -1, "reserved field is 2"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(testing::Message() << "case " << &c - cases << ": " << c.text);
        std::filesystem::remove(path_);
        folder_.Write("rows.db", c.bytes);
        FileCheck check;
        ASSERT_EQ(check.Run(path_), 0);
        EXPECT_EQ(check.IsSound(), c.kind == Sound);
        EXPECT_EQ(check.CanRepair(), c.kind == Mended);
        ASSERT_EQ(check.Findings().empty(), c.offset < 0);
        const auto found =
            std::find_if(check.Findings().begin(), check.Findings().end(), [&c](const FILE_FINDING& finding) {
                return finding.offset == c.offset && finding.text.find(c.text) != std::string::npos;
            });
        if (c.offset >= 0) {
            ASSERT_NE(found, check.Findings().end()) << check.Findings().front().text;
            EXPECT_EQ(found->record, c.record);
            EXPECT_EQ(found->problem, c.kind != Sound);
        }
        EXPECT_EQ(folder_.Read("rows.db"), c.bytes) << "looking must not change anything";
        std::string backup;
        ASSERT_EQ(check.Repair(path_, &backup), 0);
        EXPECT_EQ(check.IsSound(), c.kind != Broken);
        EXPECT_FALSE(check.CanRepair());
        EXPECT_EQ(backup.empty(), c.kind != Mended);
        if (c.kind != Mended) {
            EXPECT_EQ(folder_.Read("rows.db"), c.bytes);
            EXPECT_TRUE(Others().empty());
            continue;
        }
        EXPECT_EQ(backup, path_ + ".before-repair");
        EXPECT_EQ(folder_.Read("rows.db.before-repair"), c.bytes);
        const std::string mended = folder_.Read("rows.db");
        EXPECT_EQ(With(mended, 36, c.bytes.substr(36, 16)), c.bytes) << "only counts may change";
        const DATABASE database(path_.c_str());
        EXPECT_TRUE(database.IsOpen() && !database.IsDamaged());
        std::filesystem::remove(backup);
    }
}

TEST_F(FileCheckTest, ListsNoMoreThanItsBound) {
    std::string bytes = With(intact_, 36, std::string("\xFA\0\0\0", 4)); // 250 records
    folder_.Write("rows.db", bytes.substr(0, DataStartOfRows) + std::string(250 * Length, '\x07'));
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
    const std::string damaged = With(intact_, 40, "\x03");
    folder_.Write("home/rows.db", damaged);
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
    EXPECT_EQ(folder_.Read("home/rows.db.before-repair-3"), damaged);
    struct stat status {};
    ASSERT_EQ(stat(backup.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0640U);
}

// Whatever fails, the file is the old one or the mended one, and it is mended only when the backup is whole.
TEST_F(FileCheckTest, FailedRepairLosesNothing) {
    const std::string damaged = With(intact_, 40, "\x03");
    for (Fault fault :
         {Fault::Error, Fault::HalfThenError, Fault::ShortWrite, Fault::Interrupted, Fault::Broken}) {
        for (int at = 0;; ++at) {
            SCOPED_TRACE("call " + std::to_string(at) + " fault " + std::to_string(static_cast<int>(fault)));
            std::filesystem::remove_all(folder_.Path());
            std::filesystem::create_directory(folder_.Path());
            folder_.Write("rows.db", damaged);
            FaultyFiles files;
            FileCheck check(files);
            std::string backup;
            files.Arm(fault, at);
            const int error = check.Repair(path_, &backup);
            const bool met = files.Disarm();
            EXPECT_EQ(error != 0, met && fault != Fault::ShortWrite && fault != Fault::Interrupted);
            const std::string found = folder_.Read("rows.db");
            EXPECT_TRUE(found == damaged || found == intact_ || fault == Fault::Broken);
            EXPECT_TRUE(error != 0 || found == intact_);
            if (found != damaged) {
                EXPECT_EQ(folder_.Read("rows.db.before-repair"), damaged);
            }
            EXPECT_TRUE(fault == Fault::Broken || backup.empty() == Others().empty())
                << "no half copy is left";
            if (!met) {
                EXPECT_EQ(at, 7) << "open, write, mode, sync, sync of the folder, write, sync";
                break;
            }
        }
    }
}

} // namespace
