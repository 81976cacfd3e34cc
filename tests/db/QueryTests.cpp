#include <climits>
#include <random>

#include "SampleFile.h"

namespace {

class QueryTest : public RowsTest {
  protected:
    QueryTest() { Append(rows_); }

    // The numbers of the records found, a digit each.
    std::string Find(const std::string& statement) {
        const long count = Run("new " + statement);
        std::string found;
        for (const long number : Walked())
            found += std::to_string(number);
        EXPECT_EQ(count, std::ssize(found)) << statement;
        return found;
    }

    std::vector<ROW> rows_ = {
        Row("My Fund", -5, 300, 70000, 1.5F, {31, 12, 1998}, {59, 59, 11}),
        Row("growth stock", 7, -300, -70000, 10.25F, {1, 1, 1999}, {0, 0, 12}),
        Row("GROWTH", 127, 0, 4, -2, {15, 6, 2001}, {30, 15, 23}),
        Row("", 0, 1, 5, 0, {0, 0, 0}, {0, 0, 0}),
        Row("Exactly 16 chars", 1, 2, 3, 4, {28, 2, 2000}, {1, 0, 0}), // no room for a terminator
    };
};

constexpr const char* Operators[] = {"=", "!=", "<", "<=", ">", ">=", "contains"};

TEST_F(QueryTest, FindsByEveryOperatorInEveryColumn) {
    std::vector<ROW> values = rows_;
    values[3].name[0] = ' '; // as no text is written
    rows_.push_back(Row("odd", -128, -32768, INT_MIN, 1e30F, {70, -1, -5}, {-1, 70, -3}));
    Append({rows_.back()});
    for (std::size_t i = 0; i < 5 * 7 * 6; ++i) {
        const ROW& value = values[i % 5];
        const std::size_t column = i / 5 % 7;
        const int op = static_cast<int>(i / 35);
        std::string expected;
        for (const ROW& row : rows_)
            if (Holds(op, row, value, static_cast<int>(column)))
                expected += std::to_string(&row - rows_.data());
        const std::string start = std::string(RowColumns[column].name) + " " + Operators[op] + " ";
        EXPECT_EQ(Find(start + FieldOf(&value, column)), expected) << start << i;
    }
}

TEST_F(QueryTest, TakesValuesAsTheyAreWritten) {
    // A second blank belongs to the value. No month and no day come before all of them.
    for (const auto& [statement, found] :
         Cases("Name\t=\nMY FUND: 0; Name = growth : ; Name = exactly 16 chars: 4; "
               "Name = exactly 16 charsx: ; Name > exactly 16 char: 0124; Name CONTAINS rowTH: 12; "
               "Name contains 16 chars: 4; Name contains x: 4; Name contains  stock: 1; Tag = 251: 0; "
               "Name \tcontains \t\r\n fund\rmore: 0; Small = 65836: 0; Count = 4294967300: 2; "
               "Price = 1025e-2: 1; Price > 1e300: ; Price = number: 3; Day = x: 3; Day > 2000: 24; "
               "At = 23:15: ; At > 23: 2; At = -12: 3"))
        EXPECT_EQ(Find("\r\n " + statement), found) << statement;
}

TEST_F(QueryTest, RefusesAndKeepsTheSetAndTheFile) {
    const std::string token31(31, 'v');
    ASSERT_EQ(Find("Name contains growth"), "12");
    const std::string start = folder_.Read("rows.db");
    EXPECT_EQ(Code(database_.Query("Name = x", 3)), 1608);
    const auto wrong =
        Cases("Name =: 1608; Name = \t: 1608; Name=Fund: 1608; Name == x: 1603; Price contains 1: 1606; " +
              token31 + " = x: 1602; " + token31 + "v = x: 1608; Name = " + token31 + "v: 1608; Name = x" +
              std::string(120, '\t') + ": 1608");
    for (const char* mode : {"new ", "and ", "or "})
        for (const auto& [statement, code] : wrong)
            EXPECT_EQ(std::to_string(Run(mode + statement)), code) << statement;
    EXPECT_EQ(Code(database_.QueryUpdate(nullptr)), 2201);
    Play("change: 2201; change Name: 2205; change Name =: 2205; change Name ~ x: 2201; "
         "change Name == x: 2201; change name = x: 2202; change Nothing ~ x: 2201; "
         "change Name + x: 2203; change Name * 2: 2203");
    EXPECT_EQ(folder_.Read("rows.db"), start);
    EXPECT_EQ(Walked(), (std::vector<long>{1, 2}));
    Play("new Name = " + token31 + ": 0; new Name = x" + std::string(119, '\t') + ": 0");
}

// Each step's outcome, the set in its order, and * when it lacks any of the active records.
TEST_F(QueryTest, SetsFromStepToStep) {
    for (const auto& [step, outcome] :
         Cases("and Tag > 0: 1607 -; or: 1607 -; new: 5 01234; and Tag > 0: 3 124*; and Small >= 0: 2 24*; "
               "or Name contains fund: 3 024*; or Count > 4: 4 0234*; delete 2: 0 034*; "
               "or Small < 1: 4 0134; undelete 2: 0 0134*; refresh: 0 12*; and Name = nobody: 0 -*; "
               "or Tag = 127: 1 2*; sort Tag: 0 2*; or Tag = 7: 2 12*; append: 5 12*; "
               "or Tag >= -128: 5 01234*; change Count + 1: 5 01234*; new Tag = 127: 1 2*; and: 6 012345; "
               "refresh: 0 012345; append: 6 012345*; change Count + 1: 7 0123456; new Tag = 1: 3 456*; "
               "sort count: 1701 456*; sort Count: 0 564*; and Tag > 0: 1601 564*; or: 1601 564*; "
               "delete 5: 0 64*; reset: 6 012346; and Tag = 1: 1601 012346; new Tag = 1: 2 46*; "
               "and Small = 9: 1 6*; open: 0 -; refresh: 0 012346; cache 1: 0 012346; lose 3: 0 012346; "
               "sort Small: 0 12460*; new Tag = 1: 2 46*; compress: 0 -; new Tag = 1: 2 34*")) {
        std::string found = std::to_string(Run(step)) + ' ', set(8, ' ');
        for (long n = -1; n < 7; ++n)
            if (const long place = database_.ConvertPhysToLogRecordNumber(n); place >= 0)
                set.at(static_cast<std::size_t>(place)) = static_cast<char>('0' + n);
        set.erase(set.find(' '));
        found += (set.empty() ? "-" : set) + (database_.IsQueryActive() != 0 ? "*" : "");
        EXPECT_EQ(found, outcome) << step;
    }
}

TEST_F(QueryTest, WalksOnFromWhereItStands) {
    Play("new Count > 3: 3; append: 5"); // 0, 2 and 3; the new one has no slot
    const std::string start = folder_.Read("rows.db");
    const std::map<char, void* (DATABASE::*)(long*)> moves = {{'f', &DATABASE::QueryGetFirst},
                                                              {'n', &DATABASE::QueryGetNext},
                                                              {'l', &DATABASE::QueryGetLast},
                                                              {'p', &DATABASE::QueryGetPrev}};
    std::string found; // a query stands on the first slot
    for (const char move : std::string("nnnnppppppnnnllpffn")) {
        long number = -1;
        const void* data = (database_.*moves.at(move))(&number);
        found += data != nullptr ? std::to_string(number) : "-";
        EXPECT_EQ(data != nullptr ? database_.Update(data) : -1, number < 0 ? -1 : 0) << "it is current";
    }
    EXPECT_EQ(found, "23---320---02332002");
    EXPECT_EQ(folder_.Read("rows.db"), start);
}

TEST_F(QueryTest, WalkKeepsWithinTheSetOfTheMoment) {
    Play("cache 0: 0; reset: 5; lose 3: 0");
    EXPECT_EQ(Walked(), (std::vector<long>{0, 1, 2, 4})) << "a record deleted elsewhere drops out";
    EXPECT_EQ(database_.IsQueryActive(), 1);
    EXPECT_EQ(database_.ConvertPhysToLogRecordNumber(4), 3);
    for (auto [start, step] : {std::pair<long, long>{3, 0}, {LONG_MAX, 1}, {-1, LONG_MAX}, {-1, LONG_MIN}})
        EXPECT_EQ(database_.QueryGetXXX(start, step, nullptr), nullptr) << start << " " << step;
}

// Whatever the column's width and wherever letters beyond ASCII stand.
TEST_F(RowsTest, TextQueriesAgreeWithPlainComparison) {
    std::mt19937 random(20260101);
    const auto text = [&](std::size_t longest) {
        std::string result;
        for (std::size_t length = random() % (longest + 1); result.size() < length;)
            result += "aAbBzZ@[`{\xC3\xA9"[random() % 12];
        return result;
    };
    for (std::size_t width : {1, 3, 8, 16, 24, 31, 40}) {
        Create(std::to_string(width), {Column("T", ColumnType::String, static_cast<int>(width)),
                                       Column("After", ColumnType::String, 9)});
        std::vector<std::string> texts;
        for (std::size_t i = 0; i < 300; ++i) {
            texts.push_back(text(std::min<std::size_t>(width, i % 4 == 0 ? 40 : 5)));
            std::string data(width + 9, 'a'); // behind the terminator lies anything
            data.replace(0, texts[i].size() + 1, texts[i] + '\0');
            ASSERT_GE(database_.Append(data.data()), 0);
        }
        for (std::size_t i = 0; i < 300; ++i) {
            const int op = static_cast<int>(random() % 7);
            const std::string value = i % 2 == 0 || texts[i].empty() ? text(4) + "a" : texts[i].substr(0, 31);
            database_.SetCaseSensitivity(i % 5 == 0 ? 1 : 0);
            const std::string statement = "T " + std::string(Operators[op]) + " " + value;
            ASSERT_GE(database_.Query(statement.c_str(), QueryMode::New), 0);
            for (std::size_t n = 0; n < 300; ++n)
                ASSERT_EQ(database_.ConvertPhysToLogRecordNumber(static_cast<long>(n)) >= 0,
                          database_.CompareStringVals(op, texts[n].c_str(), value.c_str()) == 1)
                    << texts[n] << ": " << statement << " width " << width;
        }
    }
}

TEST_F(RowsTest, OperationsOfStatementsByThemselves) {
    // Behind the first byte beyond ASCII case counts.
    const std::tuple<int, const char*, const char*, int> texts[] = {{5, "Z\xC3\xA9z", "z\xC3\xA9Z", 1},
                                                                    {6, "xAy", "aY", 1},
                                                                    {6, "x\xC3\xA9Z", "z", 0},
                                                                    {6, "x", "", 1},
                                                                    {7, "x", "x", 0}};
    for (const auto& [op, field, value, expected] : texts)
        EXPECT_EQ(database_.CompareStringVals(op, field, value), expected) << field << op << value;
    EXPECT_EQ(database_.CompareVals(4, 2.5F, 2.0F), 1);
    EXPECT_EQ(database_.CompareVals(-1, 1L, 1L), 0);
    char column[32], op[32], value[32];
    EXPECT_EQ(database_.ParseQueryStatement(nullptr, column, op, value), 1);
    EXPECT_EQ(database_.ParseQueryStatement("A b\n\t\rc d\re", column, op, value), 0);
    EXPECT_EQ(std::string(column) + op + value, "Abc d");
    dbDATE date{31, 12, 32767};
    long packed = 65536 + 256 + 100;
    database_.QueryUpdateDateFunction(1, &date, &packed);
    EXPECT_EQ(PackDate(date), PackDate({-125, 13, -32768}));
    dbTIME time{1, 2, 3};
    packed = 0x01020304;
    database_.QueryUpdateTimeFunction(0, &time, &packed);
    EXPECT_EQ(PackTime(time), PackTime({4, 3, 2}));
    std::int16_t number = 7;
    database_.QueryUpdateFunction<std::int16_t>(5, &number, 2);
    EXPECT_EQ(number, 7);
}

// What the column of three records is then, as text.
TEST_F(RowsTest, SetStatementsChangeEveryTypeByEveryOperator) {
    Append({Row("Old Name", 100, 30000, 10, 1.5F, {31, 12, 1999}, {30, 59, 10}),
            Row("old name", -128, -32768, INT_MIN, -2, {15, 6, 1999}, {0, 0, 0}),
            Row("Other", 7, 7, 7, 7, {31, 2, 1999}, {75, 10, 10})});
    const std::string start = folder_.Read("rows.db");
    // The parts of a packed number; a part that is too much is carried, also when nothing changes.
    for (const auto& [statement, expected] :
         Cases("Tag = 300: 44 44 44; Tag + 100: -56 -28 107; Tag * 3: 44 -128 21; Tag / 7: 14 -18 1; "
               "Tag / -1: -100 -128 -7; Small + 40000: 4464 7232 -25529; Count / -1: -10 -2147483648 -7; "
               "Count / word: 10 -2147483648 7; Count - 1: 9 2147483647 6; "
               "Count * 2147483647: -10 -2147483648 2147483641; Count = 4294967297: 1 1 1; "
               "Count = 99999999999999999999: -1 -1 -1; Price = 0.1: 0.10 0.10 0.10; Price + 1: 2.50 -1.00 "
               "8.00; Price - 0.5: 1.00 -2.50 6.50; "
               "Price * 2: 3.00 -4.00 14.00; Price / 0: inf -inf inf; Price = 1e99: inf inf inf; "
               "Price = -1e999: -inf -inf -inf; Price = -inf: -inf -inf -inf; "
               "Price = nancy: 0.00 0.00 0.00; Day + 1: 20000101 19990616 19990304; "
               "Day + 256: 20000131 19990715 19990331; Day + -1: 19981130 19980514 19980130; "
               "Day - 65536: 19981231 19980615 19980303; Day * 2: 19991231 19990615 19990303; "
               "At + 90: 110100 000130 100829; At - 1: 105929 235959 101114; At / 5: 105930 000000 101115; "
               "At + 1507328: 095930 230000 091115")) {
        ASSERT_EQ(Open(start), 0);
        EXPECT_EQ(Run("change " + statement), 3) << statement;
        std::size_t column = 0;
        while (!statement.starts_with(RowColumns[column].name + std::string(" ")))
            ++column;
        std::string found;
        for (const auto& record : ContentOf(database_))
            found += FieldOf(record->data(), column) + " ";
        EXPECT_EQ(found, expected + " ") << statement;
    }
}

// Whatever the set, its order and the cache: each of its records, and not a byte of another.
TEST_F(RowsTest, SetStatementsChangeTheSetAndNothingElse) {
    for (int i = 0; i < 400; ++i)
        Append({Row(std::to_string(i), i % 7, i % 150, i)});
    Play("delete 10: 0; lock 20: 0");
    const std::string start = folder_.Read("rows.db");
    for (const std::string query : {"new Tag = 3", "new Small < 2", "new Count = -1"}) {
        for (const std::string cache : {"cache 0", "cache 1", "cache 256"}) {
            SCOPED_TRACE(query + cache);
            ASSERT_EQ(Open(start) + Run(cache), 0);
            Run(query);
            ASSERT_EQ(cache == "cache 1" ? 0 : Run("sort Name"), 0);
            std::vector<long> numbers = Walked();
            if (cache != "cache 256") { // by another, who is noticed when the record is read
                std::erase(numbers, 150);
                ASSERT_EQ(Run("lose 150") + Run(cache), 0);
            }
            std::string expected = folder_.Read("rows.db");
            for (const long n : numbers) {
                const std::size_t at = DataStartOfRows + static_cast<std::size_t>(n) * RowLength;
                expected[at] = 0;
                expected[at + 17] = 99;
            }
            EXPECT_EQ(Run("change Tag = 99"), std::ssize(numbers));
            EXPECT_EQ(folder_.Read("rows.db"), expected);
            EXPECT_TRUE(ContentOf(database_) == ContentOf(*std::make_unique<DATABASE>(path_.c_str())));
        }
    }
}

// A foreign file may have a column narrower than its type, right before another.
TEST_F(QueryTest, SetStatementsDoNotWritePastNarrowColumns) {
    const std::string start = folder_.Read("rows.db");
    for (std::size_t column = 1; column < 7; ++column) {
        const std::size_t size = column % 2;
        ASSERT_EQ(Open(With(start, FirstColumn + 44 * column + 34, {static_cast<char>(size)})), 0);
        COLUMN_ENTRY info{};
        ASSERT_EQ(database_.GetColumnInfo(static_cast<int>(column), &info), 0);
        const auto offset = static_cast<std::size_t>(info.offset);
        const std::string before = *ContentOf(database_)[0];
        EXPECT_EQ(Run("change " + std::string(info.name) + " = 16909060"), 5);
        std::string after = *ContentOf(database_)[0];
        EXPECT_TRUE(size == 0 || after[offset] != before[offset]) << info.name;
        EXPECT_EQ(after.replace(offset, size, before, offset, size), before) << info.name;
    }
}

} // namespace
