#include <algorithm>
#include <climits>
#include <functional>
#include <random>
#include <sstream>

#include "SampleFile.h"
#include "db/Statement.h"

namespace {

using Numbers = std::vector<long>;

class QueryTest : public RowsTest {
  protected:
    QueryTest() { Append(rows_); }

    Numbers Find(const std::string& statement) {
        const long count = database_.Query(statement.c_str(), QueryMode::New);
        Numbers found = Walked(database_);
        EXPECT_EQ(count, static_cast<long>(found.size())) << statement;
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
    std::string line;
    for (const ROW& value : values) {
        database_.FormatRecordData(&line, &value, "|");
        std::istringstream fields(line);
        std::string field;
        for (int column = 0; std::getline(fields, field, '|') && column < 7; ++column) {
            for (int op = 0; op < 6; ++op) {
                Numbers expected;
                for (const ROW& row : rows_) {
                    if ((column == 0
                             ? database_.CompareStringVals(op, NameOf(row).c_str(), field.c_str())
                             : database_.CompareVals(op, KeyOf(row, column), KeyOf(value, column))) == 1) {
                        expected.push_back(&row - rows_.data());
                    }
                }
                const std::string statement = RowColumns()[static_cast<std::size_t>(column)].name +
                                              std::string(" ") + Operators[op] + " " + field;
                EXPECT_EQ(Find(statement), expected) << statement;
            }
        }
    }
}

TEST_F(QueryTest, TakesValuesAsTheyAreWritten) {
    const std::pair<const char*, Numbers> cases[] = {
        {"  Name\t=\nMY FUND", {0}},
        {"Name = growth ", {}},
        {"Name = exactly 16 chars", {4}},
        {"Name = exactly 16 charsx", {}},
        {"Name > exactly 16 char", {0, 1, 2, 4}},
        {"Name CONTAINS rowTH", {1, 2}},
        {"Name contains 16 chars", {4}},
        {"Name contains  stock", {1}}, // the second blank belongs to the value
        {"Name contains x", {4}},
        {"Tag = 251", {0}}, // 8 bits of it
        {"Small = 65836", {0}},
        {"Count = 4294967300", {2}},
        {"Price = 1025e-2", {1}},
        {"Price > 1e300", {}},
        {"Price = number", {3}},
        {"Day > 2000", {2, 4}}, // no month and no day come before all of them
        {"Day = x", {3}},
        {"At = 23:15", {}},
        {"At > 23", {2}},
    };
    for (const auto& [statement, found] : cases) {
        EXPECT_EQ(Find(statement), found) << statement;
    }
}

TEST_F(QueryTest, RefusesAndKeepsTheSet) {
    const std::string token31(31, 'v');
    const struct {
        std::string statement;
        int mode;
        int code;
    } cases[] = {
        {"Name =", QueryMode::New, 1608},
        {"Name = ", QueryMode::New, 1608},
        {"Name=Fund", QueryMode::New, 1608},
        {" \t", QueryMode::And, 1608},
        {"Name = x", 3, 1608},
        {"name = x", QueryMode::New, 1602},
        {"Nam = x", QueryMode::New, 1602},
        {token31 + " = x", QueryMode::New, 1602},
        {token31 + "v = x", QueryMode::New, 1608},
        {"Name == x", QueryMode::Or, 1603},
        {"Price contains 1", QueryMode::New, 1606},
        {"Name = " + token31 + "v", QueryMode::New, 1608},
        {"Name = x" + std::string(120, '\t'), QueryMode::New, 1608},
    };
    ASSERT_EQ(Find("Name contains growth"), (Numbers{1, 2}));
    for (const auto& [statement, mode, code] : cases) {
        EXPECT_EQ(CodeOf(database_.Query(statement.c_str(), mode)), code) << statement;
        EXPECT_EQ(Walked(database_), (Numbers{1, 2})) << statement;
    }
    EXPECT_EQ(Find("Name = " + token31), Numbers{});
    EXPECT_EQ(Find("Name = x" + std::string(119, '\t')), Numbers{});
}

TEST(Statement, IsSplitIntoTokens) {
    DATABASE database(nullptr);
    const struct {
        const char* statement;
        const char *column, *op, *value; // no column: refused
    } cases[] = {
        {"Name = My Fund", "Name", "=", "My Fund"},
        {"\r\n Name \t = \t My Fund \tmore", "Name", "=", " My Fund "},
        {"A b  c ", "A", "b", " c "},
        {"A b\n\t\rc d\re", "A", "b", "c d"},
        {"A b", nullptr, nullptr, nullptr},
        {"A b \t", "A", "b", ""},
        {"", nullptr, nullptr, nullptr},
        {nullptr, nullptr, nullptr, nullptr},
    };
    for (const auto& split : cases) {
        char column[32];
        char op[32];
        char value[32];
        const bool refused = split.column == nullptr || *split.value == '\0';
        ASSERT_EQ(database.ParseQueryStatement(split.statement, column, op, value), refused ? 1 : 0)
            << split.statement;
        if (!refused) {
            EXPECT_STREQ(column, split.column);
            EXPECT_STREQ(op, split.op);
            EXPECT_STREQ(value, split.value);
        }
    }
    EXPECT_EQ(PackedDate("1999"), 1999 * 65536);
    EXPECT_EQ(PackedDate("199912319"), 1999 * 65536 + 12 * 256 + 31);
    EXPECT_EQ(PackedTime("-12"), 0);
    EXPECT_EQ(WholeNumber("99999999999999999999"), INT64_MAX);
}

// Step by step: what an operation answers (from 1000 on, an error code), and the set in its order.
TEST_F(QueryTest, SetsFromStepToStep) {
    const auto query = [](const char* statement, int mode) {
        return [=](DATABASE& database) { return database.Query(statement, mode); };
    };
    const auto refresh = [](DATABASE& database) {
        database.QueryRefresh();
        return 0L;
    };
    const auto append = [](DATABASE& database) {
        const ROW row = Row("new", 1, 9, 1);
        return database.Append(&row);
    };
    const auto reopen = [this](DATABASE& database) -> long { return database.Open(path_.c_str()); };
    const struct {
        std::function<long(DATABASE&)> run;
        long answer;
        Numbers set;
        int active = 1; // whether the set lacks any of the active records
    } steps[] = {
        {query("Tag > 0", QueryMode::And), 1607, {}, 0},
        {query("", QueryMode::Or), 1607, {}, 0},
        {query(nullptr, QueryMode::New), 5, {0, 1, 2, 3, 4}, 0},
        {query("Tag > 0", QueryMode::And), 3, {1, 2, 4}},
        {query("Small >= 0", QueryMode::And), 2, {2, 4}},
        {query("Name contains fund", QueryMode::Or), 3, {0, 2, 4}},
        {query("Count > 4", QueryMode::Or), 4, {0, 2, 3, 4}},
        {[](DATABASE& database) { return database.Delete(2); }, 0, {0, 3, 4}},
        {query("Small < 0", QueryMode::Or), 4, {0, 1, 3, 4}, 0},
        {query("Small = 0", QueryMode::Or), 4, {0, 1, 3, 4}, 0},
        {[](DATABASE& database) { return database.UnDelete(2); }, 0, {0, 1, 3, 4}},
        {refresh, 0, {2}},
        {query("Name = nobody", QueryMode::And), 0, {}},
        {query("Tag = 127", QueryMode::Or), 1, {2}},
        {append, 5, {2}},
        {query("Tag >= -128", QueryMode::Or), 5, {0, 1, 2, 3, 4}},
        {[](DATABASE& database) { return database.QueryUpdate("Count + 1"); }, 5, {0, 1, 2, 3, 4}},
        {query("Tag >= -128", QueryMode::New), 6, {0, 1, 2, 3, 4, 5}, 0},
        {query("Tag = 127", QueryMode::New), 1, {2}},
        {query("", QueryMode::And), 6, {0, 1, 2, 3, 4, 5}, 0},
        {refresh, 0, {0, 1, 2, 3, 4, 5}, 0},
        {append, 6, {0, 1, 2, 3, 4, 5}},
        {[](DATABASE& database) { return database.QueryUpdate("Count + 1"); }, 7, {0, 1, 2, 3, 4, 5, 6}, 0},
        {query("Tag = 1", QueryMode::New), 3, {4, 5, 6}},
        {[](DATABASE& database) { return database.SortBy("Count", 0); }, 0, {5, 6, 4}},
        {query("Tag > 0", QueryMode::And), 1601, {5, 6, 4}},
        {query("", QueryMode::Or), 1601, {5, 6, 4}},
        {[](DATABASE& database) { return database.Delete(5); }, 0, {6, 4}},
        {[](DATABASE& database) { return database.QueryReset(); }, 6, {0, 1, 2, 3, 4, 6}, 0},
        {query("Tag = 1", QueryMode::And), 1601, {0, 1, 2, 3, 4, 6}, 0},
        {query("Tag = 1", QueryMode::New), 2, {4, 6}},
        {query("Small = 9", QueryMode::And), 1, {6}},
        {reopen, 0, {}, 0},
        {refresh, 0, {0, 1, 2, 3, 4, 6}, 0},
        {query("Tag = 1", QueryMode::New), 2, {4, 6}},
        {[](DATABASE& database) { return database.Compress(0); }, 0, {}, 0},
        {query("Tag = 1", QueryMode::New), 2, {4, 5}},
    };
    for (const auto& step : steps) {
        SCOPED_TRACE(testing::Message() << "step " << &step - steps);
        const long result = step.run(database_);
        EXPECT_EQ(result, step.answer < 1000 ? step.answer : -1);
        EXPECT_EQ(CodeOf(result), step.answer < 1000 ? 0 : step.answer);
        EXPECT_EQ(database_.IsQueryActive(), step.active);
        for (long n = -1; n < 8; ++n) {
            const auto found = std::find(step.set.begin(), step.set.end(), n);
            EXPECT_EQ(database_.ConvertPhysToLogRecordNumber(n),
                      found == step.set.end() ? -1 : found - step.set.begin())
                << n;
        }
    }
}

TEST_F(QueryTest, WalksOnFromWhereItStands) {
    ASSERT_EQ(database_.Query("Count > 3", QueryMode::New), 3); // 0, 2 and 3
    Append({Row("has no slot")});
    const std::string start = folder_.Read("rows.db");
    const struct {
        void* (DATABASE::*move)(long*);
        Numbers found;                                      // one call after the other; -1: nothing
    } walks[] = {{&DATABASE::QueryGetNext, {2, 3, -1, -1}}, // a query stands on the first slot
                 {&DATABASE::QueryGetPrev, {-1, 3, 2, 0, -1, -1}},
                 {&DATABASE::QueryGetNext, {-1, 0, 2}},
                 {&DATABASE::QueryGetLast, {3, 3}},
                 {&DATABASE::QueryGetPrev, {2}},
                 {&DATABASE::QueryGetFirst, {0, 0}},
                 {&DATABASE::QueryGetNext, {2}}};
    for (const auto& walk : walks) {
        for (const long expected : walk.found) {
            long number = -1;
            const void* data = (database_.*walk.move)(&number);
            EXPECT_EQ(number, expected) << "walk " << &walk - walks;
            ASSERT_EQ(data != nullptr, expected >= 0);
            if (data != nullptr) {
                EXPECT_EQ(database_.Update(data), 0) << "it is current";
                EXPECT_EQ(BytesOf(At(number)), BytesOf(*static_cast<const ROW*>(data)));
            }
        }
    }
    EXPECT_EQ(folder_.Read("rows.db"), start);
    EXPECT_EQ(Find("Count > 1000000"), Numbers{});
}

TEST_F(QueryTest, WalkKeepsWithinTheSetOfTheMoment) {
    ASSERT_EQ(database_.SetReadCache(0), 0);
    ASSERT_EQ(database_.QueryReset(), 5);
    ASSERT_EQ(DATABASE(path_.c_str()).Delete(3), 0);
    EXPECT_EQ(Walked(database_), (Numbers{0, 1, 2, 4})) << "a record deleted elsewhere drops out";
    EXPECT_EQ(database_.ConvertPhysToLogRecordNumber(4), 3);
    for (auto [start, step] : {std::pair<long, long>{3, 0}, {LONG_MAX, 1}, {-1, LONG_MAX}, {-1, LONG_MIN}}) {
        EXPECT_EQ(database_.QueryGetXXX(start, step, nullptr), nullptr) << start << " " << step;
    }
}

// Every way to compare texts agrees with the comparison of two plain strings, whatever the column's width and
// wherever letters beyond ASCII stand.
TEST(TextQuery, AgreesWithPlainComparison) {
    std::mt19937 random(20260101);
    const auto text = [&](std::size_t longest) {
        std::string result;
        for (std::size_t length = random() % (longest + 1); result.size() < length;) {
            result += "aAbBzZ@[`{\xC3\xA9"[random() % 12];
        }
        return result;
    };
    for (int width : {1, 3, 8, 16, 24, 31, 40}) {
        TemporaryFolder folder;
        DATABASE database(nullptr);
        const COLUMN_ENTRY columns[] = {Column("T", ColumnType::String, width),
                                        Column("After", ColumnType::String, 9)};
        ASSERT_EQ(database.Create(folder.File("t.db").c_str(), "", 2, columns), 0);
        std::vector<std::string> texts;
        for (std::size_t i = 0; i < 300; ++i) {
            texts.push_back(
                text(std::min<std::size_t>(static_cast<std::size_t>(width), i % 4 == 0 ? 40 : 5)));
            std::string data(static_cast<std::size_t>(width) + 9, 'a'); // behind the terminator lies anything
            data.replace(0, texts[i].size() + 1, texts[i] + '\0');
            ASSERT_GE(database.Append(data.data()), 0);
        }
        for (std::size_t i = 0; i < 300; ++i) {
            const int op = static_cast<int>(random() % 7);
            const std::string value = i % 2 == 0 || texts[i].empty() ? text(4) + "a" : texts[i].substr(0, 31);
            database.SetCaseSensitivity(i % 5 == 0 ? 1 : 0);
            const std::string statement = "T " + std::string(Operators[op]) + " " + value;
            ASSERT_GE(database.Query(statement.c_str(), QueryMode::New), 0);
            for (long n = 0; n < 300; ++n) {
                const std::string& field = texts[static_cast<std::size_t>(n)];
                ASSERT_EQ(database.ConvertPhysToLogRecordNumber(n) >= 0,
                          database.CompareStringVals(op, field.c_str(), value.c_str()) == 1)
                    << field << ": " << statement << " width " << width;
            }
        }
    }
}

TEST(Comparisons, TakeTheirOperatorsAlone) {
    DATABASE database(nullptr);
    EXPECT_EQ(database.CompareStringVals(5, "Z\xC3\xA9z", "z\xC3\xA9Z"), 1);
    EXPECT_EQ(database.CompareStringVals(6, "xAy", "aY"), 1);
    // Behind the first byte beyond ASCII case counts.
    EXPECT_EQ(database.CompareStringVals(6, "x\xC3\xA9Z", "z"), 0);
    EXPECT_EQ(database.CompareStringVals(6, "x", ""), 1);
    EXPECT_EQ(database.CompareStringVals(7, "x", "x"), 0);
    EXPECT_EQ(database.CompareVals(4, 2.5F, 2.0F), 1);
    EXPECT_EQ(database.CompareVals(6, 1, 1), 0);
    EXPECT_EQ(database.CompareVals(-1, 1L, 1L), 0);
}

} // namespace
