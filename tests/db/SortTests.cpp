#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <limits>
#include <random>

#include "SampleFile.h"
#include "util/Strings.h"

namespace {

std::uint32_t Packed(const dbDATE& date) {
    std::uint32_t packed = 0;
    std::memcpy(&packed, &date, sizeof(date));
    return packed;
}

std::uint32_t Packed(const dbTIME& time) {
    std::uint32_t packed = 0;
    std::memcpy(&packed, &time, sizeof(time));
    return packed;
}

std::string Name(const ROW& row) {
    return {row.name, strnlen(row.name, sizeof(row.name))};
}

// When the first of two records is the greater one, by each column.
const struct {
    const char* column;
    std::function<bool(const ROW&, const ROW&)> greater;
} Orders[] = {
    {"Name", [](const ROW& a, const ROW& b) { return strcmpi(Name(a).c_str(), Name(b).c_str()) > 0; }},
    {"Tag", [](const ROW& a, const ROW& b) { return a.tag > b.tag; }},
    {"Small", [](const ROW& a, const ROW& b) { return a.small > b.small; }},
    {"Count", [](const ROW& a, const ROW& b) { return a.count > b.count; }},
    {"Price", [](const ROW& a, const ROW& b) { return a.price > b.price; }},
    {"Day",
     [](const ROW& a, const ROW& b) {
         return static_cast<std::int32_t>(Packed(a.day)) > static_cast<std::int32_t>(Packed(b.day));
     }},
    {"At", [](const ROW& a, const ROW& b) { return Packed(a.at) > Packed(b.at); }},
};

class SortTest : public testing::Test {
  protected:
    SortTest() { EXPECT_EQ(CreateRows(database_, folder_.File("rows.db")), 0); }

    void Append(const std::vector<ROW>& rows) {
        EXPECT_EQ(database_.AppendAll(rows.data(), sizeof(ROW), static_cast<std::int32_t>(rows.size())), 0);
    }

    // The order in which bubble sort leaves records.
    std::vector<long> Bubbled(std::vector<long> numbers,
                              const std::function<bool(const ROW&, const ROW&)>& greater) {
        std::vector<ROW> rows(numbers.size());
        for (std::size_t i = 0; i < numbers.size(); ++i) {
            EXPECT_EQ(database_.Read(numbers[i], &rows[i]), 1);
        }
        for (bool swapped = true; swapped;) {
            swapped = false;
            for (std::size_t i = 1; i < rows.size(); ++i) {
                if (greater(rows[i - 1], rows[i])) {
                    std::swap(rows[i - 1], rows[i]);
                    std::swap(numbers[i - 1], numbers[i]);
                    swapped = true;
                }
            }
        }
        return numbers;
    }

    TemporaryFolder folder_;
    DATABASE database_{nullptr};
};

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

TEST_F(SortTest, OrderIsThatOfABubbleSort) {
    std::mt19937 random(20260101);
    std::vector<ROW> rows(60);
    std::generate(rows.begin(), rows.end(), [&random] { return RandomRow(random); });
    Append(rows);
    EXPECT_EQ(database_.Delete(5) + database_.Delete(59), 0);
    // One after the other, each sort begins with the order that the one before has left.
    for (int round = 0; round < 200; ++round) {
        const auto& order = Orders[random() % std::size(Orders)];
        SCOPED_TRACE(std::string("round ") + std::to_string(round) + " by " + order.column);
        if (round % 20 == 0) {
            ASSERT_GT(database_.Query(round % 40 == 0 ? "Tag >= 0" : "Small != 1", QueryMode::New), 10);
        }
        database_.SetReadCache(round % 3);
        const std::vector<long> expected = Bubbled(Walked(database_), order.greater);
        ASSERT_EQ(database_.SortBy(order.column, 0), 0);
        ASSERT_EQ(Walked(database_), expected);
    }
}

// So many that they are sorted without comparing them.
TEST_F(SortTest, OrderOfManyIsThatOfABubbleSort) {
    std::mt19937 random(20260102);
    std::vector<ROW> rows;
    for (int i = 0; i < 2500; ++i) {
        rows.push_back(RandomRow(random));
        rows.back().count /= static_cast<std::int32_t>(random() % 1000 + 1);
    }
    Append(rows);
    for (const auto& order : Orders) {
        ASSERT_GT(database_.Query("Small != 1", QueryMode::New), 2000);
        const std::vector<long> expected = Bubbled(Walked(database_), order.greater);
        EXPECT_EQ(database_.SortBy(order.column, 0), 0);
        EXPECT_EQ(Walked(database_), expected) << order.column;
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

TEST_F(SortTest, WhatBecomesOfTheSet) {
    Append({Row("cherry", 1), Row("Banana", 2), Row("apple", 3), Row("date", 4)});
    // A set of one is not sorted: it can still be refined.
    EXPECT_EQ(database_.Query("Tag = 2", QueryMode::New), 1);
    EXPECT_EQ(database_.SortBy("Name", 0), 0);
    EXPECT_EQ(database_.Query("Tag = 4", QueryMode::Or), 2);
    // A failed sort changes nothing.
    EXPECT_EQ(database_.SortBy("name", 0), -1);
    EXPECT_EQ(database_.GetLastError(nullptr), 1701);
    EXPECT_EQ(Walked(database_), (std::vector<long>{1, 3}));
    // Records deleted since the query drop out, where they stood.
    EXPECT_EQ(database_.QueryReset(), 4);
    {
        DATABASE other(folder_.File("rows.db").c_str());
        EXPECT_EQ(other.Delete(1), 0);
    }
    database_.SetReadCache(256);
    EXPECT_EQ(database_.SortBy("Name", 0), 0);
    EXPECT_EQ(Walked(database_), (std::vector<long>{2, 0, 3}));
    EXPECT_EQ(database_.ConvertPhysToLogRecordNumber(3), 2);
    EXPECT_EQ(database_.Query("Tag = 4", QueryMode::And), -1);
    EXPECT_EQ(database_.GetLastError(nullptr), 1601);
    EXPECT_EQ(database_.Query("Tag >= 3", QueryMode::New), 2);
    EXPECT_EQ(database_.Query("Tag = 4", QueryMode::And), 1);
}

TEST_F(SortTest, NoSetIsAllActiveRecords) {
    Append({Row("b"), Row("c"), Row("a")});
    EXPECT_EQ(database_.Delete(1), 0);
    EXPECT_EQ(database_.SortBy("Name", 0), 0);
    EXPECT_EQ(Walked(database_), (std::vector<long>{2, 0}));
    EXPECT_EQ(DATABASE(nullptr).SortBy("Name", 0), -1);
}

TEST_F(SortTest, NextSortSlots) {
    Append({Row("a", 1), Row("b"), Row("c", 1), Row("d", 1)});
    EXPECT_EQ(database_.Query("Tag = 1", QueryMode::New), 3);
    const ROW later = Row("e", 1); // has no slot
    EXPECT_EQ(database_.Append(&later), 4);
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
