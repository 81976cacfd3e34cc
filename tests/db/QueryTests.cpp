#include <climits>
#include <cstdlib>
#include <functional>
#include <map>
#include <random>

#include "SampleFile.h"
#include "db/Statement.h"

namespace {

using namespace QueryMode;

class QueryTest : public RowsTest {
  protected:
    QueryTest() { Append(rows_); }

    // The numbers of the records found, a digit each.
    std::string Find(const std::string& statement) {
        const long count = database_.Query(statement.c_str(), New);
        const std::vector<long> walked = Walked(database_);
        EXPECT_EQ(count, static_cast<long>(walked.size())) << statement;
        std::string found;
        for (const long number : walked)
            found += std::to_string(number);
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
    const std::vector<ROW> values = rows_;
    rows_.push_back(Row("odd", -128, -32768, INT_MIN, 1e30F, {70, -1, -5}, {-1, 70, -3}));
    Append({rows_.back()});
    for (int i = 0; i < 5 * 7 * 6; ++i) {
        const ROW& value = values[static_cast<std::size_t>(i) % 5];
        const int column = i / 5 % 7;
        const int op = i / 35;
        const std::string field = FieldOf(database_, value, column);
        const auto holds = [&](const ROW& row) {
            return column == 0 ? database_.CompareStringVals(op, NameOf(row).c_str(), field.c_str())
                               : database_.CompareVals(op, KeyOf(row, column), KeyOf(value, column));
        };
        std::string expected;
        for (const ROW& row : rows_)
            expected += holds(row) == 1 ? std::to_string(&row - rows_.data()) : "";
        const std::string name = RowColumns()[static_cast<std::size_t>(column)].name;
        EXPECT_EQ(Find(name + " " + Operators[op] + " " + field), expected) << name << Operators[op] << field;
    }
}

TEST_F(QueryTest, TakesValuesAsTheyAreWritten) {
    // A second blank belongs to the value. No month and no day come before all of them.
    std::istringstream cases(
        "  Name\t=\nMY FUND: 0;Name = growth : ;Name = exactly 16 chars: 4;"
        "Name = exactly 16 charsx: ;Name > exactly 16 char: 0124;Name CONTAINS rowTH: 12;"
        "Name contains 16 chars: 4;Name contains x: 4;Name contains  stock: 1;Tag = 251: 0;"
        "Small = 65836: 0;Count = 4294967300: 2;Price = 1025e-2: 1;Price > 1e300: ;Price = number: 3;"
        "Day = x: 3;Day > 2000: 24;At = 23:15: ;At > 23: 2");
    for (std::string statement; std::getline(cases, statement, ';');) {
        const std::size_t colon = statement.rfind(':');
        EXPECT_EQ(Find(statement.substr(0, colon)), statement.substr(colon + 2)) << statement;
    }
}

TEST_F(QueryTest, RefusesAndKeepsTheSet) {
    const std::string token31(31, 'v');
    ASSERT_EQ(Find("Name contains growth"), "12");
    EXPECT_EQ(CodeOf(database_.Query("Name = x", 3)), 1608);
    for (const auto& [statement, code] : CASES{{"Name =", "1608"},
                                               {"Name=Fund", "1608"},
                                               {"Name == x", "1603"},
                                               {"Price contains 1", "1606"},
                                               {token31 + " = x", "1602"},
                                               {token31 + "v = x", "1608"},
                                               {"Name = " + token31 + "v", "1608"},
                                               {"Name = x" + std::string(120, '\t'), "1608"}}) {
        for (int mode : {New, And, Or})
            EXPECT_EQ(std::to_string(CodeOf(database_.Query(statement.c_str(), mode))), code) << statement;
        EXPECT_EQ(Walked(database_), (std::vector<long>{1, 2})) << statement;
    }
    EXPECT_EQ(Find("Name = " + token31), "");
    EXPECT_EQ(Find("Name = x" + std::string(119, '\t')), "");
}

TEST(Statement, IsSplitIntoTokens) {
    DATABASE database(nullptr);
    const std::pair<const char*, std::string> cases[] = {
        {"\r\n Name \t = \t My Fund \tmore", "Name|=| My Fund "},
        {"A b\n\t\rc d\re", "A|b|c d"},
        {"A b \t", "refused"},
        {nullptr, "refused"}};
    for (const auto& [statement, expected] : cases) {
        char tokens[3][32];
        const int refused = database.ParseQueryStatement(statement, tokens[0], tokens[1], tokens[2]);
        const auto found = [&] { return std::string(tokens[0]) + "|" + tokens[1] + "|" + tokens[2]; };
        EXPECT_EQ(refused == 1 ? "refused" : found(), expected);
    }
    EXPECT_EQ(PackedTime("-12"), 0);
    EXPECT_EQ(WholeNumber("99999999999999999999"), INT64_MAX);
}

// Step by step: what an operation answers or its error code, the set in its order, and * when it lacks any of
// the active records.
TEST_F(QueryTest, SetsFromStepToStep) {
    const ROW row = Row("new", 1, 9, 1);
    const auto lose = [this](const char* number) { // another deletes it
        return database_.SetReadCache(1) + DATABASE(path_.c_str()).Delete(std::atol(number));
    };
    const std::map<std::string, std::function<long(const char*)>> operations = {
        {"new", [&](const char* text) { return database_.Query(text, New); }},
        {"and", [&](const char* text) { return database_.Query(text, And); }},
        {"or", [&](const char* text) { return database_.Query(text, Or); }},
        {"reset", [&](const char*) { return database_.QueryReset(); }},
        {"refresh", [&](const char*) { return database_.QueryRefresh(), 0; }},
        {"sort", [&](const char* text) { return database_.SortBy(text, 0); }},
        {"update", [&](const char* text) { return database_.QueryUpdate(text); }},
        {"append", [&](const char*) { return database_.Append(&row); }},
        {"delete", [&](const char* text) { return database_.Delete(std::atol(text)); }},
        {"undelete", [&](const char* text) { return database_.UnDelete(std::atol(text)); }},
        {"lose", lose},
        {"open", [&](const char*) { return database_.Open(path_.c_str()); }},
        {"compress", [&](const char*) { return database_.Compress(0); }}};
    std::istringstream steps(
        "and Tag > 0: 1607; or: 1607; new: 5 01234; and Tag > 0: 3 124*; and Small >= 0: 2 24*; "
        "or Name contains fund: 3 024*; or Count > 4: 4 0234*; delete 2: 0 034*; "
        "or Small < 1: 4 0134; undelete 2: 0 0134*; refresh: 0 12*; and Name = nobody: 0 *; "
        "or Tag = 127: 1 2*; sort Tag: 0 2*; or Tag = 7: 2 12*; append: 5 12*; "
        "or Tag >= -128: 5 01234*; update Count + 1: 5 01234*; new Tag = 127: 1 2*; and: 6 012345; "
        "refresh: 0 012345; append: 6 012345*; update Count + 1: 7 0123456; new Tag = 1: 3 456*; "
        "sort count: 1701 456*; sort Count: 0 564*; and Tag > 0: 1601 564*; or: 1601 564*; "
        "delete 5: 0 64*; reset: 6 012346; and Tag = 1: 1601 012346; new Tag = 1: 2 46*; "
        "and Small = 9: 1 6*; open: 0; refresh: 0 012346; lose 3: 0 012346; sort Small: 0 12460*; "
        "new Tag = 1: 2 46*; compress: 0; new Tag = 1: 2 34*");
    for (std::string step; std::getline(steps >> std::ws, step, ';');) {
        const std::size_t colon = step.find(':');
        const std::string outcome = step.substr(colon + 2);
        step.erase(colon);
        const std::size_t blank = std::min(step.find(' '), step.size());
        const std::string argument = blank < step.size() ? step.substr(blank + 1) : "";
        const long result = operations.at(step.substr(0, blank))(argument.c_str());
        const long code = CodeOf(result);
        std::string set(8, ' ');
        for (long n = -1; n < 8; ++n)
            if (const long place = database_.ConvertPhysToLogRecordNumber(n); place >= 0)
                set.at(static_cast<std::size_t>(place)) = static_cast<char>('0' + n);
        set = set.substr(0, set.find(' ')) + (database_.IsQueryActive() != 0 ? "*" : "");
        set = set.empty() ? "" : " " + set;
        EXPECT_EQ(std::to_string(code != 0 ? code : result) + set, outcome) << step;
    }
}

TEST_F(QueryTest, WalksOnFromWhereItStands) {
    ASSERT_EQ(database_.Query("Count > 3", New), 3); // 0, 2 and 3
    Append({Row("has no slot")});
    const std::string start = folder_.Read("rows.db");
    constexpr auto first = &DATABASE::QueryGetFirst;
    constexpr auto next = &DATABASE::QueryGetNext;
    constexpr auto last = &DATABASE::QueryGetLast;
    constexpr auto prev = &DATABASE::QueryGetPrev;
    // What each call finds, -1 for nothing. A query stands on the first slot.
    const std::pair<void* (DATABASE::*)(long*), long> walk[] = {
        {next, 2}, {next, 3},  {next, -1}, {next, -1}, {prev, -1}, {prev, 3}, {prev, 2},
        {prev, 0}, {prev, -1}, {prev, -1}, {next, -1}, {next, 0},  {next, 2}, {last, 3},
        {last, 3}, {prev, 2},  {first, 0}, {first, 0}, {next, 2}};
    for (const auto& [move, expected] : walk) {
        long number = -1;
        const void* data = (database_.*move)(&number);
        ASSERT_EQ(number, data != nullptr ? expected : -1);
        ASSERT_TRUE(expected < 0 || BytesOf(*static_cast<const ROW*>(data)) ==
                                        BytesOf(rows_[static_cast<std::size_t>(expected)]));
        EXPECT_EQ(expected < 0 ? 0 : database_.Update(data), 0) << "it is current";
    }
    EXPECT_EQ(folder_.Read("rows.db"), start);
    EXPECT_EQ(Find("Count > 1000000"), "");
}

TEST_F(QueryTest, WalkKeepsWithinTheSetOfTheMoment) {
    ASSERT_EQ(database_.SetReadCache(0), 0);
    ASSERT_EQ(database_.QueryReset(), 5);
    ASSERT_EQ(DATABASE(path_.c_str()).Delete(3), 0);
    EXPECT_EQ(Walked(database_), (std::vector<long>{0, 1, 2, 4})) << "a record deleted elsewhere drops out";
    EXPECT_EQ(database_.IsQueryActive(), 1);
    EXPECT_EQ(database_.ConvertPhysToLogRecordNumber(4), 3);
    for (auto [start, step] : {std::pair<long, long>{3, 0}, {LONG_MAX, 1}, {-1, LONG_MAX}, {-1, LONG_MIN}})
        EXPECT_EQ(database_.QueryGetXXX(start, step, nullptr), nullptr) << start << " " << step;
}

// Every way to compare texts agrees with the comparison of two plain strings, whatever the column's width and
// wherever letters beyond ASCII stand.
TEST_F(RowsTest, TextQueriesAgreeWithPlainComparison) {
    std::mt19937 random(20260101);
    const auto text = [&](std::size_t longest) {
        std::string result;
        for (std::size_t length = random() % (longest + 1); result.size() < length;)
            result += "aAbBzZ@[`{\xC3\xA9"[random() % 12];
        return result;
    };
    for (std::size_t width : {1, 3, 8, 16, 24, 31, 40}) {
        const COLUMN_ENTRY columns[] = {Column("T", ColumnType::String, static_cast<int>(width)),
                                        Column("After", ColumnType::String, 9)};
        ASSERT_EQ(database_.Create(folder_.File(std::to_string(width)).c_str(), "", 2, columns), 0);
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
            ASSERT_GE(database_.Query(statement.c_str(), New), 0);
            for (long n = 0; n < 300; ++n) {
                const std::string& field = texts[static_cast<std::size_t>(n)];
                ASSERT_EQ(database_.ConvertPhysToLogRecordNumber(n) >= 0,
                          database_.CompareStringVals(op, field.c_str(), value.c_str()) == 1)
                    << field << ": " << statement << " width " << width;
            }
        }
    }
}

TEST(Comparisons, TakeTheirOperatorsAlone) {
    DATABASE database(nullptr);
    // Behind the first byte beyond ASCII case counts.
    const std::tuple<int, const char*, const char*, int> texts[] = {{5, "Z\xC3\xA9z", "z\xC3\xA9Z", 1},
                                                                    {6, "xAy", "aY", 1},
                                                                    {6, "x\xC3\xA9Z", "z", 0},
                                                                    {6, "x", "", 1},
                                                                    {7, "x", "x", 0}};
    for (const auto& [op, field, value, expected] : texts)
        EXPECT_EQ(database.CompareStringVals(op, field, value), expected) << field << op << value;
    EXPECT_EQ(database.CompareVals(4, 2.5F, 2.0F), 1);
    EXPECT_EQ(database.CompareVals(-1, 1L, 1L), 0);
}

} // namespace
