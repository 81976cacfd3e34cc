#include "SampleFile.h"
#include "db/FileCheck.h"

namespace {

enum Kind { Sound, Broken, Mended }; // by a repair, which sets counts right

// A file of four records whose bytes are damaged, checked and repaired.
class DamageTest : public RowsTest {
  protected:
    DamageTest() {
        MakeRows(4);
        intact_ = folder_.Read("rows.db");
        miscounted_ = With(intact_, 40, "\x03");
    }

    std::string intact_;
    std::string miscounted_;
};

TEST_F(DamageTest, IsReadAsFarAsItGoesAndToldOf) {
    const auto cut = [this](std::size_t size) { return intact_.substr(0, size); };
    const auto put = [this](std::size_t at, const std::vector<int>& bytes) {
        return With(intact_, at, std::string(bytes.begin(), bytes.end()));
    };
    const std::string long32(32, 'n');
    const struct {
        std::string bytes;
        long readable; // records; -1: refused
        bool damaged;
        Kind kind;
        std::string finding; // its offset and the beginning of its text; empty when there is none
        long active = std::max(readable, 0L); // as the counts say
    } cases[] = {
        {intact_, 3, false, Sound, ""},
        {"", -1, false, Broken, "0 the file ends after 0 of the header's 52 bytes"},
        {cut(359), -1, false, Broken, "44 header and 7 columns need 360 bytes, the file has 359"},
        {cut(499), 2, true, Mended, "36 the header counts 4 records, the file has room for 3"},
        {intact_ + "abc", 3, false, Sound, "500 3 bytes behind the last"},
        {put(0, {-1, -1}), 3, false, Sound, "0 the version"},
        {With(intact_, 4, long32), 3, false, Sound, "4 the description"},
        {put(36, {0, 0, 0, 0}), 0, true, Mended, "36 the header counts 0 records, the file has room for 4"},
        {put(36, {1}), 1, true, Mended, "36 the header counts 1 record, the file has room for 4", 0},
        {With(put(36, {1}), 48, "\2"), 1, true, Mended, "36 the header counts 1 record", 0},
        {put(36, {3}), 2, false, Sound, "465 35 bytes behind the last record"},
        {put(36, {-1, -1, -1, -1}), -1, false, Mended, "36 the header counts -1 records"},
        {put(40, {-1, -1, -1, -1}), 3, true, Mended, "40 the header counts -1 deleted"},
        {put(40, {2}), 3, false, Mended, "40 the header counts 2 deleted, the status bytes 1", 2},
        {With(put(40, {5}), 360, "\1"), 2, true, Mended, "40 the header counts 5 deleted, the status"},
        {put(44, {-1, -1}), -1, false, Broken, "44 the column count is -1"},
        {put(44, {8}), -1, false, Broken, "396 column "},
        {put(44, {6}).erase(316, 44), 3, false, Sound, "46 no column covers the last 3 bytes"},
        {put(46, {0, 0}), -1, false, Broken, "46 the record length is 0"},
        {put(46, {34}), -1, false, Broken, "352 column At has 3 bytes at 31, outside the 33"},
        {put(48, {2}) + std::string(70, 'x'), 3, false, Sound, "48 the reserved field is 2"},
        {With(With(intact_, 4, long32), 52, long32), 3, false, Broken, "52 column nnnnnnnnnnnnnnnnnnnnnn"},
        {put(84, {99}), 3, false, Broken, "84 column Name is of the unknown type 99"},
        {put(86, {-1, -1}), -1, false, Broken, "88 column Name has -1 bytes"},
        {put(86, {15}), 3, false, Sound, "132 column Tag begins at byte 16"},
        {put(86, {17}), 3, false, Broken, "132 column Tag begins at byte 16"},
        {With(intact_, 96, "Name"), 3, false, Sound, "96 column Name has the name"},
        {put(218, {0}), 3, false, Sound, "264 column Price begins at byte 23 of"},
        {put(DataStartOfRows, {85}), 3, false, Broken, "360 record 0 the status byte is 85"},
        {put(DataStartOfRows + RowLength, {0}), 4, false, Mended, "40 the header counts 1 deleted", 3},
    };
    for (const auto& [bytes, readable, damaged, kind, finding, active] : cases) {
        SCOPED_TRACE(testing::Message() << finding << " of " << testing::PrintToString(bytes));
        EXPECT_EQ(Code(Open(bytes)), readable < 0 ? 1103 : 0);
        const CONTENT content = ContentOf(database_);
        const auto deleted = std::count(content.begin(), content.end(), std::nullopt);
        EXPECT_EQ(std::ssize(content) - deleted, std::max(readable, 0L));
        EXPECT_EQ(database_.IsDamaged(), damaged);
        EXPECT_EQ(database_.GetNumberOfActiveRecords(), active);
        EXPECT_TRUE(!damaged || Run("compress") == 2708);
        FileCheck check;
        ASSERT_EQ(check.Run(path_), 0);
        EXPECT_EQ(std::pair(check.IsSound(), check.CanRepair()), std::pair(kind == Sound, kind == Mended));
        std::string said;
        for (const FileFinding& one : check.Findings()) {
            said += (one.problem ? "!" : "@") + std::to_string(one.offset) + " ";
            said += (one.record >= 0 ? "record " + std::to_string(one.record) + " " : "") + one.text + "\n";
        }
        const std::string expected = finding.empty() ? "" : (kind == Sound ? "@" : "!") + finding;
        EXPECT_TRUE(said.find(expected) != said.npos && said.empty() == expected.empty()) << said;
        EXPECT_EQ(folder_.Read("rows.db"), bytes) << "looking must not change anything";
        std::string backup;
        ASSERT_EQ(check.Repair(path_, &backup), 0);
        EXPECT_EQ(std::pair(check.IsSound(), check.CanRepair()), std::pair(kind != Broken, false));
        const std::string mended = folder_.Read("rows.db");
        if (kind != Mended) {
            EXPECT_EQ(mended, bytes);
            EXPECT_EQ(folder_.Names(), std::vector<std::string>{"rows.db"});
            continue;
        }
        EXPECT_EQ(With(mended, 36, bytes.substr(36, 16)), bytes) << "only counts may change";
        EXPECT_EQ(mended.substr(48, 4), std::string(4, '\0')) << "nothing is announced";
        EXPECT_EQ(backup, path_ + ".before-repair");
        EXPECT_EQ(folder_.Read("rows.db.before-repair"), bytes);
        EXPECT_TRUE(Run("open") == 0 && !database_.IsDamaged());
        std::filesystem::remove(backup);
    }
}

TEST_F(DamageTest, CountsThatAreTooLowLoseNothing) {
    const std::string tooLow = With(intact_, 36, "\x01");
    ASSERT_EQ(Open(tooLow), 0);
    Play("append: 2803");
    EXPECT_EQ(folder_.Read("rows.db"), tooLow);
    ASSERT_EQ(Open(With(intact_, 40, std::string(1, '\0'))), 0);
    Play("undelete 1: 0");
    EXPECT_EQ(database_.GetNumberOfActiveRecords(), 4);
}

TEST_F(DamageTest, FileThatShrinksWhileOpen) {
    Play("new Name >= a: 3; cache 256: 0");
    std::filesystem::resize_file(path_, DataStartOfRows + RowLength * 3 / 2);
    Play("change Tag = 1: 2206");
    std::filesystem::resize_file(path_, DataStartOfRows + RowLength / 2);
    Play("sort Name: 1709; export 0: 1907; export 1: 1907; write 3: 1309; new Tag = 1: 1609");
    EXPECT_EQ(database_.QueryGetFirst(nullptr), nullptr);
    Play("compress: 2707");
    EXPECT_FALSE(folder_.Has("rows.new"));
}

TEST_F(DamageTest, ListsNoMoreThanItsBound) {
    std::string bytes = With(intact_, 36, std::string("\xFA\0\0\0", 4)); // 250 records
    folder_.Write("rows.db", bytes.substr(0, DataStartOfRows) + std::string(250 * RowLength, '\x07'));
    FileCheck check;
    ASSERT_EQ(check.Run(path_), 0);
    ASSERT_EQ(check.Findings().size(), FileCheck::MostFindings);
    EXPECT_EQ(check.Findings()[98].record, 97) << "the deleted count comes first";
    EXPECT_EQ(check.Findings().back().text, "152 more findings are not listed");
}

TEST_F(DamageTest, WhatCannotBeReadIsRefused) {
    FileCheck check;
    EXPECT_EQ(check.Run(folder_.File("nothing")), ENOENT);
    EXPECT_EQ(check.Run(folder_.Path()), EINVAL);
    const std::string bytes = With(With(intact_, 0, "\xFF"), 40, "\5"); // which is told of and counted anew
    bool met = true;
    for (int at = 0; met; ++at) {
        files_.Arm(Fault::NoRead, at);
        const int opened = Open(bytes);
        met = files_.Disarm();
        EXPECT_EQ(opened, met ? -1 : 0);
        EXPECT_TRUE(met || at > 10) << "header, columns and records";
    }
}

TEST_F(DamageTest, BackupTakesAFreeNameAndThePermissions) {
    std::filesystem::create_directory(folder_.File("home"));
    folder_.Write("home/rows.db", miscounted_);
    std::filesystem::permissions(folder_.File("home/rows.db"), std::filesystem::perms{0640});
    std::filesystem::remove(path_);
    std::filesystem::create_symlink("home/rows.db", path_);
    folder_.Write("home/rows.db.before-repair", "precious");
    std::filesystem::create_symlink("nowhere", folder_.File("home/rows.db.before-repair-2"));
    FileCheck check;
    std::string backup;
    ASSERT_EQ(check.Repair(path_, &backup), 0);
    EXPECT_TRUE(check.IsSound());
    EXPECT_EQ(folder_.Read("home/rows.db"), intact_);
    EXPECT_EQ(folder_.Read("home/rows.db.before-repair-3"), miscounted_);
    EXPECT_EQ(std::filesystem::status(backup).permissions(), std::filesystem::perms{0600});
}

// Whatever fails, the file is the old one or the mended one, and it is mended only when the backup is whole.
TEST_F(DamageTest, FailedRepairLosesNothing) {
    for (Fault fault : {Fault::Error, Fault::HalfThenError, Fault::ShortWrite, Fault::Interrupted,
                        Fault::Broken, Fault::NoRead}) {
        bool met = true;
        for (int at = 0; met; ++at) {
            SCOPED_TRACE("call " + std::to_string(at) + " fault " + std::to_string(static_cast<int>(fault)));
            folder_.Clear();
            folder_.Write("rows.db", miscounted_);
            FileCheck check(files_);
            std::string backup;
            files_.Arm(fault, at);
            const int error = check.Repair(path_, &backup);
            met = files_.Disarm();
            EXPECT_EQ(error != 0, met && fault != Fault::ShortWrite && fault != Fault::Interrupted);
            const std::string found = folder_.Read("rows.db");
            EXPECT_TRUE(found == intact_ || (error != 0 && (found == miscounted_ || fault == Fault::Broken)));
            if (found != miscounted_)
                EXPECT_EQ(folder_.Read("rows.db.before-repair"), miscounted_);
            EXPECT_TRUE(fault == Fault::Broken || backup.empty() == (folder_.Names().size() == 1))
                << "no half copy is left";
            EXPECT_TRUE(met || at == 7 || fault == Fault::NoRead)
                << "open, write, mode, sync, sync of the folder, write, sync";
        }
        EXPECT_EQ(files_.firstMode, 0600U);
    }
}

} // namespace
