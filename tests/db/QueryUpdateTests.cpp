#include <gtest/gtest.h>

#include <climits>
#include <cmath>

#include "SampleFile.h"

namespace {

class QueryUpdateTest : public testing::Test {
  protected:
    void SetUp() override {
        ASSERT_EQ(CreateRows(database_, path_), 0);
        const ROW rows[] = {
            Row("Old Name", 100, 30000, 10, 1.5F, {31, 12, 1999}, {30, 59, 10}),
            Row("old name", -128, -32768, INT_MIN, -2, {15, 6, 1999}, {0, 0, 0}),
            Row("Deleted"),
            Row("Other", 7, 7, 7, 7, {31, 1, 1999}, {59, 59, 23}),
        };
        for (const ROW& row : rows) {
            ASSERT_GE(database_.Append(&row), 0);
        }
        ASSERT_EQ(database_.Delete(2), 0);
    }

    ROW At(long n) {
        ROW row{};
        EXPECT_EQ(database_.UnBufferedRead(n, &row), 1);
        return row;
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    DATABASE database_{nullptr};
};

TEST_F(QueryUpdateTest, ChangesTheRecordsOfTheSet) {
    ASSERT_EQ(database_.Lock(1), 0);
    ASSERT_EQ(database_.Query("Name = old name", QueryMode::New), 2);
    EXPECT_EQ(database_.QueryUpdate("Name = New Name of 19 c"), 2);
    EXPECT_STREQ(At(0).name, "New Name of 19 ") << "cut to the column's width";
    EXPECT_STREQ(At(1).name, "New Name of 19 ");
    EXPECT_STREQ(At(3).name, "Other");
    EXPECT_EQ(database_.IsLocked(1), 0);
    EXPECT_EQ(Walked(database_), (std::vector<long>{0, 1})) << "the set stays as it is";
    EXPECT_EQ(database_.QueryUpdate("Name = x"), 2);
    EXPECT_EQ(BytesOf(At(0)).substr(0, 16), "x" + std::string(15, '\0')) << "nothing of the old text stays";
    ASSERT_EQ(database_.Delete(0), 0);
    EXPECT_EQ(database_.QueryUpdate("Name = y"), 1);
    EXPECT_EQ(database_.QueryReset(), 2);
    EXPECT_EQ(database_.QueryUpdate("Name = all"), 2) << "without a query all active records change";
    EXPECT_STREQ(At(3).name, "all");
    DATABASE other(path_.c_str());
    EXPECT_EQ(other.QueryUpdate("Tag = 1"), 2);
}

TEST_F(QueryUpdateTest, RefusesAndChangesNothing) {
    const std::string before = folder_.Read("rows.db");
    const struct {
        const char* statement;
        int code;
    } cases[] = {
        {nullptr, 2201},    {"", 2201},          {"Name", 2205},     {"Name =", 2205},
        {"Name ~ x", 2201}, {"Name == x", 2201}, {"name = x", 2202}, {"Nothing ~ x", 2201},
        {"Name + x", 2203}, {"Name * 2", 2203},
    };
    for (const auto& refused : cases) {
        EXPECT_EQ(database_.QueryUpdate(refused.statement), -1);
        EXPECT_EQ(database_.GetLastError(nullptr), refused.code) << refused.statement;
    }
    EXPECT_EQ(folder_.Read("rows.db"), before);
}

TEST_F(QueryUpdateTest, ChangesEveryTypeByEveryOperator) {
    const std::string start = folder_.Read("rows.db");
    const auto tag = [](const ROW& row) { return static_cast<double>(row.tag); };
    const auto small = [](const ROW& row) { return static_cast<double>(row.small); };
    const auto count = [](const ROW& row) { return static_cast<double>(row.count); };
    const auto price = [](const ROW& row) { return static_cast<double>(row.price); };
    const struct {
        const char* statement;
        double (*field)(const ROW&);
        double first, second; // of records 0 and 1
    } cases[] = {
        {"Tag = 300", tag, 44, 44},
        {"Tag + 100", tag, -56, -28},
        {"Tag - 1", tag, 99, 127},
        {"Tag * 3", tag, 44, -128},
        {"Tag / 7", tag, 14, -18},
        {"Tag / -1", tag, -100, -128},
        {"Tag / 0", tag, 100, -128},
        {"Small + 40000", small, 4464, 7232},
        {"Small * -1", small, -30000, -32768},
        {"Small / -1", small, -30000, -32768},
        {"Count / 3", count, 3, INT_MIN / 3},
        {"Count / -1", count, -10, INT_MIN},
        {"Count / word", count, 10, INT_MIN},
        {"Count - 1", count, 9, INT_MAX},
        {"Count * 2147483647", count, -10, INT_MIN},
        {"Count = 4294967297", count, 1, 1},
        {"Price = 0.1", price, 0.1F, 0.1F},
        {"Price + 1", price, 2.5, -1},
        {"Price - 0.5", price, 1, -2.5},
        {"Price * 2", price, 3, -4},
        {"Price / 4", price, 0.375, -0.5},
        {"Price / 0", price, INFINITY, -INFINITY},
        {"Price = 1e99", price, INFINITY, INFINITY},
    };
    for (const auto& change : cases) {
        folder_.Write("rows.db", start);
        ASSERT_EQ(database_.Open(path_.c_str()), 0);
        EXPECT_EQ(database_.QueryUpdate(change.statement), 3) << change.statement;
        EXPECT_EQ(change.field(At(0)), change.first) << change.statement;
        EXPECT_EQ(change.field(At(1)), change.second) << change.statement;
    }
}

TEST_F(QueryUpdateTest, ChangesDatesAndTimesByParts) {
    const std::string start = folder_.Read("rows.db");
    const struct {
        const char* statement;
        long record;
        const char* query; // then selects exactly that record
    } cases[] = {
        {"Day + 1", 0, "Day = 20000101"},
        {"Day + 256", 3, "Day = 19990303"}, // 31 February is carried one step
        {"Day + -1", 1, "Day = 19980514"},  // each part loses one
        {"Day - 65536", 1, "Day = 19980615"},
        {"Day * 2", 1, "Day = 19990615"},
        {"Day / 2", 1, "Day = 19990615"},
        {"At + 90", 0, "At = 110100"},
        {"At + 1", 3, "At = 000000"},
        {"At - 1", 1, "At = 235959"},
        {"At * 5", 0, "At = 105930"},
    };
    for (const auto& change : cases) {
        folder_.Write("rows.db", start);
        ASSERT_EQ(database_.Open(path_.c_str()), 0);
        EXPECT_EQ(database_.QueryUpdate(change.statement), 3) << change.statement;
        ASSERT_EQ(database_.Query(change.query, QueryMode::New), 1) << change.statement;
        EXPECT_EQ(Walked(database_), std::vector<long>{change.record}) << change.statement;
    }
    EXPECT_EQ(database_.QueryUpdate("Day = 131006725"), 1);
    EXPECT_EQ(database_.Query("Day = 19990105", QueryMode::New), 1);
    dbDATE date{31, 12, 32767};
    long packed = 65536 + 256 + 100;
    database_.QueryUpdateDateFunction(1, &date, &packed);
    EXPECT_EQ(PackDate(date), PackDate({-125, 13, -32768})) << "parts wrap and are not carried";
    dbTIME time{1, 2, 3};
    packed = 0x01020304;
    database_.QueryUpdateTimeFunction(0, &time, &packed);
    EXPECT_EQ(PackTime(time), PackTime({4, 3, 2}));
    database_.QueryUpdateTimeFunction(3, &time, &packed);
    EXPECT_EQ(PackTime(time), PackTime({4, 3, 2}));
    std::int16_t number = 7;
    database_.QueryUpdateFunction<std::int16_t>(5, &number, 2);
    EXPECT_EQ(number, 7);
}

// A foreign file may have a column narrower than its type, right before another.
TEST_F(QueryUpdateTest, DoesNotWritePastNarrowColumns) {
    std::string bytes = folder_.Read("rows.db");
    for (std::size_t column = 1; column < 7; ++column) {
        std::string narrow = bytes;
        narrow[52 + 44 * column + 34] = static_cast<char>(column % 2);
        folder_.Write("rows.db", narrow);
        ASSERT_EQ(database_.Open(path_.c_str()), 0);
        COLUMN_ENTRY info{};
        ASSERT_EQ(database_.GetColumnInfo(static_cast<int>(column), &info), 0);
        const std::string before = BytesOf(At(0));
        ASSERT_EQ(database_.QueryUpdate((std::string(info.name) + " = 16909060").c_str()), 3);
        std::string after = BytesOf(At(0));
        const auto offset = static_cast<std::size_t>(info.offset);
        const auto size = static_cast<std::size_t>(info.size);
        EXPECT_EQ(size > 0 && after.substr(offset, size) == before.substr(offset, size), false) << info.name;
        after.replace(offset, size, before, offset, size);
        EXPECT_EQ(after, before) << info.name;
    }
}

TEST_F(QueryUpdateTest, ReachesEveryRecordOfALargeSet) {
    for (int i = 0; i < 20000; ++i) {
        const ROW row = Row(i % 7 == 0 ? "seven" : "none", 0, i % 100, i);
        ASSERT_GE(database_.Append(&row), 0);
    }
    for (int kilobytes : {256, 1, 0}) {
        ASSERT_EQ(database_.SetReadCache(kilobytes), 0);
        for (const char* statement : {"Name = seven", "Small < 50", "Small = 3"}) {
            const long count = database_.Query(statement, QueryMode::New);
            ASSERT_GT(count, 0);
            ASSERT_EQ(database_.QueryUpdate("Price + 1"), count);
        }
    }
    float total = 0;
    database_.QueryReset();
    for (void* data = database_.QueryGetFirst(nullptr); data != nullptr;
         data = database_.QueryGetNext(nullptr)) {
        const auto* row = static_cast<const ROW*>(data);
        const int expected = (std::strcmp(row->name, "seven") == 0 ? 3 : 0) + (row->small < 50 ? 3 : 0) +
                             (row->small == 3 ? 3 : 0);
        total += row->count > 100 ? std::fabs(row->price - static_cast<float>(expected)) : 0;
    }
    EXPECT_EQ(total, 0);
}

} // namespace
