#include <limits>
#include <random>

#include "SampleFile.h"

namespace {

using SortTest = RowsTest;

// A record with few and extreme values, so that there are equal ones and those that a careless key misplaces.
ROW RandomRow(std::mt19937& random) {
    const auto pick = [&random](auto values) {
        return *(values.begin() + static_cast<std::ptrdiff_t>(random() % values.size()));
    };
    using Limits = std::numeric_limits<float>;
    const auto byte = [&] { return pick(std::initializer_list<std::int8_t>{-128, -1, 0, 1, 127}); };
    ROW row = Row(pick(std::initializer_list<const char*>{
                      "", "a", "A", "ab", "AB", "investm", "INVESTME", "investment", "Investment 1",
                      "investment 2", "investment 10", "[", "_", "\xC3\x84pfel", "\xC3\xA4PFEL", "a\xC3\x84X",
                      "A\xC3\x84x", "sixteen letters!", "SIXTEEN LETTERS?"}),
                  byte(), pick(std::initializer_list<int>{-32768, -1, 0, 1, 300, 32767}),
                  pick(std::initializer_list<int>{std::numeric_limits<int>::min(), -1, 0, 1, 256, 65536,
                                                  std::numeric_limits<int>::max()}),
                  pick(std::initializer_list<float>{
                      Limits::quiet_NaN(), -Limits::quiet_NaN(), Limits::infinity(), -Limits::infinity(),
                      0.0F, -0.0F, 1, -1, 1.5F, Limits::max(), Limits::denorm_min(), -Limits::denorm_min()}),
                  {byte(), byte(), pick(std::initializer_list<std::int16_t>{-1, 0, 1999, 2000})},
                  {byte(), byte(), byte()});
    if (random() % 4 == 0) {
        std::memcpy(row.name, "ab\0garbage\xFF", 12); // what follows a text's end means nothing
    }
    return row;
}

bool IsGreater(const ROW& a, const ROW& b, int column) {
    static const DATABASE rules(nullptr);
    return column == 0
               ? rules.CompareStringVals(CompareOperator::Greater, NameOf(a).c_str(), NameOf(b).c_str()) != 0
               : KeyOf(a, column) > KeyOf(b, column);
}

void BubbleSort(const std::vector<ROW>& rows, int column, std::vector<long>* order) {
    const auto row = [&](std::size_t i) { return rows[static_cast<std::size_t>((*order)[i])]; };
    for (bool swapped = true; swapped;) {
        swapped = false;
        for (std::size_t i = 1; i < order->size(); ++i) {
            if (IsGreater(row(i - 1), row(i), column)) {
                std::swap((*order)[i - 1], (*order)[i]);
                swapped = true;
            }
        }
    }
}

// Of few records, and of so many that they are sorted without comparing them. One after the other, each sort
// begins with the order that the one before has left.
TEST_F(SortTest, OrderIsThatOfABubbleSort) {
    std::mt19937 random(20260101);
    for (const auto& [count, rounds] : {std::pair(60, 200), {1500, 14}}) {
        ASSERT_EQ(CreateRows(database_, folder_.File(std::to_string(count))), 0);
        std::vector<ROW> rows;
        std::vector<long> order;
        for (int i = 0; i < count; ++i) {
            rows.push_back(RandomRow(random));
            rows.back().count /= static_cast<std::int32_t>(count < 100 ? 1 : random() % 1000 + 1);
            if (rows.back().small != 1) {
                order.push_back(i);
            }
        }
        Append(rows);
        ASSERT_EQ(database_.Query("Small != 1", QueryMode::New), static_cast<long>(order.size()));
        for (int round = 0; round < rounds; ++round) {
            const int column = count < 100 ? static_cast<int>(random() % 7) : round % 7;
            SCOPED_TRACE(std::to_string(count) + " by column " + std::to_string(column));
            database_.SetReadCache(round % 3);
            ASSERT_EQ(database_.SortBy(RowColumns()[static_cast<std::size_t>(column)].name, 0), 0);
            BubbleSort(rows, column, &order);
            ASSERT_EQ(Walked(database_), order);
        }
    }
}

TEST_F(SortTest, LongTextsThatDifferLate) {
    const std::string head(5000, 'x');
    DATABASE database(nullptr);
    const COLUMN_ENTRY column = Column("Text", ColumnType::String, 5003); // no multiple of a word
    ASSERT_EQ(database.Create(folder_.File("long.db").c_str(), "", 1, &column), 0);
    for (const char* tail : {"c", "B", "", "bb", "b", "abc"}) { // the last one fills its column
        std::string text = head + tail;
        text.resize(5003);
        ASSERT_GE(database.Append(text.data()), 0);
    }
    EXPECT_EQ(database.SortBy("Text", 0), 0);
    EXPECT_EQ(Walked(database), (std::vector<long>{2, 5, 1, 4, 3, 0}));
}

TEST_F(SortTest, NextSortSlots) {
    Append({Row("a", 1), Row("b"), Row("c", 1), Row("d", 1)});
    EXPECT_EQ(database_.Query("Tag = 1", QueryMode::New), 3);
    Append({Row("e", 1)}); // has no slot
    const struct {
        long from, first, second;
    } cases[] = {{-1, 0, 2}, {-7, 0, 2}, {0, 2, 3}, {1, 2, 3},
                 {2, 3, 5},  {3, 5, 5},  {5, 5, 5}, {std::numeric_limits<long>::max(), 5, 5}};
    for (const auto& pair : cases) {
        long first = pair.from;
        long second = 0;
        database_.GetNextSortSlots(&first, &second);
        EXPECT_EQ(first, pair.first) << pair.from;
        EXPECT_EQ(second, pair.second) << pair.from;
    }
}

} // namespace
