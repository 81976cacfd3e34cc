#include <cfloat>
#include <climits>
#include <cmath>

#include "SampleFile.h"

namespace {

class QueryUpdateTest : public RowsTest {
  protected:
    QueryUpdateTest() {
        Append({
            Row("Old Name", 100, 30000, 10, 1.5F, {31, 12, 1999}, {30, 59, 10}),
            Row("old name", -128, -32768, INT_MIN, -2, {15, 6, 1999}, {0, 0, 0}),
            Row("Other", 7, 7, 7, 7, {31, 1, 1999}, {59, 59, 23}),
        });
        start_ = folder_.Read("rows.db");
    }
    // Makes the change in all records of the file as it was at the start.
    void Change(const std::string& statement) {
        folder_.Write("rows.db", start_);
        ASSERT_EQ(database_.Open(path_.c_str()), 0);
        EXPECT_EQ(database_.QueryUpdate(statement.c_str()), 3) << statement;
    }

    std::string start_;
};

TEST_F(QueryUpdateTest, RefusesAndChangesNothing) {
    const std::pair<const char*, int> cases[] = {
        {nullptr, 2201},    {"", 2201},          {"Name", 2205},     {"Name =", 2205},
        {"Name ~ x", 2201}, {"Name == x", 2201}, {"name = x", 2202}, {"Nothing ~ x", 2201},
        {"Name + x", 2203}, {"Name * 2", 2203},
    };
    for (const auto& [statement, code] : cases) {
        EXPECT_EQ(CodeOf(database_.QueryUpdate(statement)), code) << statement;
    }
    EXPECT_EQ(folder_.Read("rows.db"), start_);
}

TEST_F(QueryUpdateTest, ChangesEveryTypeByEveryOperator) {
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
        {"Price = -1e999", price, -INFINITY, -INFINITY},
        {"Price = -inf", price, -INFINITY, -INFINITY},
        {"Price = 3.4028235e38", price, FLT_MAX, FLT_MAX},
        {"Price = nancy", price, 0, 0},
        {"Price = infinite", price, 0, 0},
        {"Price = 0x10", price, 0, 0},
    };
    for (const auto& change : cases) {
        Change(change.statement);
        EXPECT_EQ(change.field(At(0)), change.first) << change.statement;
        EXPECT_EQ(change.field(At(1)), change.second) << change.statement;
    }
}

// Whatever the set, its order and the cache: each of its records, and not a byte of another.
TEST_F(QueryUpdateTest, ChangesTheSetAndNothingElse) {
    std::vector<ROW> rows;
    for (int i = 0; i < 400; ++i) {
        rows.push_back(Row(std::to_string(i), i % 7, i % 150, i));
    }
    Append(rows);
    ASSERT_EQ(database_.Delete(10) + database_.Lock(20), 0);
    const std::string start = folder_.Read("rows.db");
    const ROW mark = Row("mark");
    for (const char* statement : {"Tag = 3", "Small < 2", "Count > 390", "Name contains 1", "Count = -1"}) {
        for (const auto& [kilobytes, sorted] : {std::pair(0, true), {1, false}, {1, true}, {256, false}}) {
            SCOPED_TRACE(testing::Message() << statement << " cache " << kilobytes << " sorted " << sorted);
            folder_.Write("rows.db", start);
            ASSERT_EQ(database_.Open(path_.c_str()) + database_.SetReadCache(kilobytes), 0);
            ASSERT_GE(database_.Query(statement, QueryMode::New), 0);
            ASSERT_EQ(sorted ? database_.SortBy("Name", 0) : 0, 0);
            ASSERT_EQ(kilobytes > 1 ? 0 : DATABASE(path_.c_str()).Delete(17), 0); // in two of the sets
            std::string expected = folder_.Read("rows.db");
            long changed = 0;
            std::size_t last = 0;
            for (std::size_t n = 0; n < rows.size() + 3; ++n) {
                const std::size_t at = DataStartOfRows + n * RowLength;
                if (database_.ConvertPhysToLogRecordNumber(static_cast<long>(n)) >= 0 && expected[at] != 1) {
                    expected[at] = 0;
                    expected[at + 17] = 99;
                    last = at;
                    ++changed;
                }
            }
            EXPECT_EQ(database_.QueryUpdate("Tag = 99"), changed);
            EXPECT_EQ(folder_.Read("rows.db"), expected);
            EXPECT_EQ(CodeOf(database_.Update(&mark)), changed == 0 ? 2101 : 0) << "the last one is current";
            EXPECT_EQ(folder_.Read("rows.db"),
                      changed == 0 ? expected : expected.replace(last, RowLength, '\0' + BytesOf(mark)));
            EXPECT_TRUE(ContentOf(database_) == ContentOf(*std::make_unique<DATABASE>(path_.c_str())));
        }
    }
}

TEST_F(QueryUpdateTest, ChangesDatesAndTimesByParts) {
    const struct {
        const char* statement;
        long record;
        const char* query; // then selects exactly that record
    } cases[] = {
        {"Day + 1", 0, "Day = 20000101"},
        {"Day + 256", 2, "Day = 19990303"}, // 31 February is carried one step
        {"Day + -1", 1, "Day = 19980514"},  // each part loses one
        {"Day - 65536", 1, "Day = 19980615"},
        {"Day * 2", 1, "Day = 19990615"},
        {"At + 90", 0, "At = 110100"},
        {"At + 1", 2, "At = 000000"},
        {"At - 1", 1, "At = 235959"},
        {"At / 5", 0, "At = 105930"},
    };
    for (const auto& change : cases) {
        Change(change.statement);
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

TEST_F(QueryUpdateTest, CarriesPartsThatAChangeWithoutEffectLeaves) {
    Append({Row("odd", 0, 0, 0, 0, {31, 2, 1999}, {75, 10, 10})});
    ASSERT_EQ(database_.Query("Name = odd", QueryMode::New), 1);
    EXPECT_EQ(database_.QueryUpdate("Day * 2"), 1);
    EXPECT_EQ(database_.QueryUpdate("At / 2"), 1);
    EXPECT_EQ(PackDate(At(3).day), PackDate({3, 3, 1999}));
    EXPECT_EQ(PackTime(At(3).at), PackTime({15, 11, 10}));
}

// A foreign file may have a column narrower than its type, right before another.
TEST_F(QueryUpdateTest, DoesNotWritePastNarrowColumns) {
    for (std::size_t column = 1; column < 7; ++column) {
        std::string narrow = start_;
        narrow[FirstColumn + 44 * column + 34] = static_cast<char>(column % 2);
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

} // namespace
