#include <algorithm>
#include <climits>

#include "SampleFile.h"

namespace {

class QueryUpdateTest : public RowsTest {
  protected:
    QueryUpdateTest() {
        Append({
            Row("Old Name", 100, 30000, 10, 1.5F, {31, 12, 1999}, {30, 59, 10}),
            Row("old name", -128, -32768, INT_MIN, -2, {15, 6, 1999}, {0, 0, 0}),
            Row("Other", 7, 7, 7, 7, {31, 2, 1999}, {75, 10, 10}),
        });
        start_ = folder_.Read("rows.db");
    }

    std::string start_;
};

TEST_F(QueryUpdateTest, RefusesAndChangesNothing) {
    const std::pair<const char*, int> cases[] = {
        {nullptr, 2201},    {"", 2201},          {"Name", 2205},     {"Name =", 2205},
        {"Name ~ x", 2201}, {"Name == x", 2201}, {"name = x", 2202}, {"Nothing ~ x", 2201},
        {"Name + x", 2203}, {"Name * 2", 2203}};
    for (const auto& [statement, code] : cases)
        EXPECT_EQ(CodeOf(database_.QueryUpdate(statement)), code) << statement;
    EXPECT_EQ(folder_.Read("rows.db"), start_);
}

// What the column of the first three records is then, as text.
TEST_F(QueryUpdateTest, ChangesEveryTypeByEveryOperator) {
    // The parts of a packed number; a part that is too much is carried, also when nothing changes.
    std::istringstream cases(
        "Tag = 300: 44 44 44; Tag + 100: -56 -28 107; Tag * 3: 44 -128 21; Tag / 7: 14 -18 1; "
        "Tag / -1: -100 -128 -7; Small + 40000: 4464 7232 -25529; Count / -1: -10 -2147483648 -7; "
        "Count / word: 10 -2147483648 7; Count - 1: 9 2147483647 6; "
        "Count * 2147483647: -10 -2147483648 2147483641; Count = 4294967297: 1 1 1; "
        "Price = 0.1: 0.10 0.10 0.10; Price + 1: 2.50 -1.00 8.00; Price - 0.5: 1.00 -2.50 6.50; "
        "Price * 2: 3.00 -4.00 14.00; Price / 0: inf -inf inf; Price = 1e99: inf inf inf; "
        "Price = -1e999: -inf -inf -inf; Price = -inf: -inf -inf -inf; "
        "Price = nancy: 0.00 0.00 0.00; Day + 1: 20000101 19990616 19990304; "
        "Day + 256: 20000131 19990715 19990331; Day + -1: 19981130 19980514 19980130; "
        "Day - 65536: 19981231 19980615 19980303; Day * 2: 19991231 19990615 19990303; "
        "At + 90: 110100 000130 100829; At - 1: 105929 235959 101114; At / 5: 105930 000000 101115; "
        "At + 1507328: 095930 230000 091115");
    for (std::string statement; std::getline(cases >> std::ws, statement, ';');) {
        const std::string expected = statement.substr(statement.find(':') + 2);
        statement.erase(statement.find(':'));
        folder_.Write("rows.db", start_);
        ASSERT_EQ(database_.Open(path_.c_str()), 0);
        EXPECT_EQ(database_.QueryUpdate(statement.c_str()), 3) << statement;
        const std::string names[] = {"Name", "Tag", "Small", "Count", "Price", "Day", "At"};
        const auto column = std::find(names, names + 7, statement.substr(0, statement.find(' '))) - names;
        const auto field = [&](long n) { return FieldOf(database_, At(n), static_cast<int>(column)); };
        EXPECT_EQ(field(0) + " " + field(1) + " " + field(2), expected) << statement;
    }
}

// Whatever the set, its order and the cache: each of its records, and not a byte of another.
TEST_F(QueryUpdateTest, ChangesTheSetAndNothingElse) {
    std::vector<ROW> rows;
    for (int i = 0; i < 400; ++i)
        rows.push_back(Row(std::to_string(i), i % 7, i % 150, i));
    Append(rows);
    ASSERT_EQ(database_.Delete(10) + database_.Lock(20), 0);
    const std::string start = folder_.Read("rows.db");
    for (const char* statement : {"Tag = 3", "Small < 2", "Count = -1"}) {
        for (const auto& [kilobytes, sorted] : {std::pair(0, true), {1, false}, {256, true}}) {
            SCOPED_TRACE(testing::Message() << statement << " cache " << kilobytes << " sorted " << sorted);
            folder_.Write("rows.db", start);
            ASSERT_EQ(database_.Open(path_.c_str()) + database_.SetReadCache(kilobytes), 0);
            ASSERT_GE(database_.Query(statement, QueryMode::New), 0);
            ASSERT_EQ(sorted ? database_.SortBy("Name", 0) : 0, 0);
            std::vector<long> numbers = Walked(database_);
            if (kilobytes <= 1) { // by another, who is noticed when the record is read
                std::erase(numbers, 17);
                ASSERT_EQ(DATABASE(path_.c_str()).Delete(17) + database_.SetReadCache(kilobytes), 0);
            }
            std::string expected = folder_.Read("rows.db");
            for (const long n : numbers) {
                const std::size_t at = DataStartOfRows + static_cast<std::size_t>(n) * RowLength;
                expected[at] = 0;
                expected[at + 17] = 99;
            }
            EXPECT_EQ(database_.QueryUpdate("Tag = 99"), static_cast<long>(numbers.size()));
            EXPECT_EQ(folder_.Read("rows.db"), expected);
            EXPECT_TRUE(ContentOf(database_) == ContentOf(*std::make_unique<DATABASE>(path_.c_str())));
        }
    }
}

TEST_F(QueryUpdateTest, PartsWrap) {
    dbDATE date{31, 12, 32767};
    long packed = 65536 + 256 + 100;
    database_.QueryUpdateDateFunction(1, &date, &packed);
    EXPECT_EQ(PackDate(date), PackDate({-125, 13, -32768}));
    dbTIME time{1, 2, 3};
    packed = 0x01020304;
    for (int op : {0, 3}) {
        database_.QueryUpdateTimeFunction(op, &time, &packed);
        EXPECT_EQ(PackTime(time), PackTime({4, 3, 2}));
    }
    std::int16_t number = 7;
    database_.QueryUpdateFunction<std::int16_t>(5, &number, 2);
    EXPECT_EQ(number, 7);
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
        EXPECT_TRUE(size == 0 || after.substr(offset, size) != before.substr(offset, size)) << info.name;
        after.replace(offset, size, before, offset, size);
        EXPECT_EQ(after, before) << info.name;
    }
}

} // namespace
