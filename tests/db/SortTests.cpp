#include <array>
#include <cfloat>
#include <climits>
#include <cmath>
#include <random>

#include "SampleFile.h"

namespace {

using SortTest = RowsTest;

// A record with few and extreme values, so that there are equal ones and those that a careless key misplaces.
ROW RandomRow(std::mt19937& random) {
    static const auto names = std::to_array<const char*>(
        {"", "a", "A", "ab", "AB", "investm", "INVESTME", "investment", "Investment 1", "investment 2",
         "investment 10", "[", "_", "\xC3\x84pfel", "\xC3\xA4PFEL", "a\xC3\x84X", "A\xC3\x84x",
         "sixteen letters!", "SIXTEEN LETTERS?"});
    static constexpr std::int8_t bytes[] = {-128, -1, 0, 1, 127};
    static constexpr std::int16_t shorts[] = {-32768, -1, 0, 1, 300, 1999, 2000, 32767};
    static constexpr int longs[] = {INT_MIN, -1, 0, 1, 256, 65536, INT_MAX};
    static constexpr float floats[] = {NAN,  -NAN,    INFINITY,     -INFINITY,    0, -0.0F, 1, -1,
                                       1.5F, FLT_MAX, FLT_TRUE_MIN, -FLT_TRUE_MIN};
    const auto any = [&random](const auto& values) { return values[random() % std::size(values)]; };
    ROW row = Row(any(names), any(bytes), any(shorts), any(longs), any(floats),
                  {any(bytes), any(bytes), any(shorts)}, {any(bytes), any(bytes), any(bytes)});
    if (random() % 4 == 0)
        std::memcpy(row.name, "ab\0garbage\xFF", 12); // what follows a text's end means nothing
    return row;
}

void BubbleSort(const std::vector<ROW>& rows, int column, std::vector<long>* order) {
    const auto row = [&](std::size_t i) { return rows[static_cast<std::size_t>((*order)[i])]; };
    for (std::size_t end = order->size(); end > 1; --end)
        for (std::size_t i = 1; i < end; ++i)
            if (Holds(CompareOperator::Greater, row(i - 1), row(i), column))
                std::swap((*order)[i - 1], (*order)[i]);
}

// Of few records, and of so many that they are sorted without comparing them; each from the order before.
TEST_F(SortTest, OrderIsThatOfABubbleSort) {
    std::mt19937 random(20260101);
    for (const auto& [count, rounds] : {std::pair(60, 200), {1500, 14}}) {
        Create(std::to_string(count));
        std::vector<ROW> rows;
        std::vector<long> order;
        for (int i = 0; i < count; ++i) {
            rows.push_back(RandomRow(random));
            rows.back().count /= static_cast<std::int32_t>(count < 100 ? 1 : random() % 1000 + 1);
            if (rows.back().small != 1)
                order.push_back(i);
        }
        Append(rows);
        ASSERT_EQ(Run("new Small != 1"), std::ssize(order));
        for (int round = 0; round < rounds; ++round) {
            const int column = count < 100 ? static_cast<int>(random() % 7) : round % 7;
            SCOPED_TRACE(std::to_string(count) + " by column " + std::to_string(column));
            database_.SetReadCache(round % 3);
            ASSERT_EQ(database_.SortBy(RowColumns[static_cast<std::size_t>(column)].name, 0), 0);
            BubbleSort(rows, column, &order);
            ASSERT_EQ(Walked(), order);
        }
    }
}

TEST_F(SortTest, LongTextsThatDifferLate) {
    Create("long.db", {Column("Text", ColumnType::String, 5003)});    // no multiple of a word
    for (const std::string tail : {"c", "B", "", "bb", "b", "abc"}) { // the last one fills its column
        std::string text = std::string(5000, 'x') + tail;
        text.resize(5003);
        ASSERT_GE(database_.Append(text.data()), 0);
    }
    Play("sort Text: 0");
    EXPECT_EQ(Walked(), (std::vector<long>{2, 5, 1, 4, 3, 0}));
}

TEST_F(SortTest, NextSortSlots) {
    Append({newRow_, Row("b"), newRow_, newRow_});
    Play("new Tag = 1: 3; append: 4"); // which has no slot
    const std::tuple<long, long, long> cases[] = {{-7, 0, 2}, {0, 2, 3}, {3, 5, 5}, {LONG_MAX, 5, 5}};
    for (const auto& [from, first, second] : cases) {
        long next = from, afterNext = 0;
        database_.GetNextSortSlots(&next, &afterNext);
        EXPECT_EQ(std::pair(next, afterNext), std::pair(first, second)) << from;
    }
}

} // namespace
