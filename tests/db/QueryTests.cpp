#include <climits>
#include <random>

#include "SampleFile.h"
#include "db/Statement.h"

namespace {

using Numbers = std::vector<long>;

class QueryTest : public RowsTest {
  protected:
    QueryTest() {
        Append({
            Row("My Fund", -5, 300, 70000, 1.5F, {31, 12, 1998}, {59, 59, 11}),
            Row("growth stock", 7, -300, -70000, 10.25F, {1, 1, 1999}, {0, 0, 12}),
            Row("GROWTH", 127, 0, 4, -2, {15, 6, 2001}, {30, 15, 23}),
            Row("", 0, 1, 5, 0, {0, 0, 0}, {0, 0, 0}),
            Row("Exactly 16 chars", 1, 2, 3, 4, {28, 2, 2000}, {1, 0, 0}), // no room for a terminator
        });
    }

    Numbers Find(const std::string& statement) {
        const long count = database_.Query(statement.c_str(), QueryMode::New);
        Numbers found = Walked(database_);
        EXPECT_EQ(count, static_cast<long>(found.size())) << statement;
        return found;
    }
};

// What the operators find is compared with a plain model elsewhere; here is how values are read.
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
    const unsigned seed = std::random_device{}();
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    const auto text = [&](std::size_t longest) {
        std::string result;
        for (std::size_t length = random() % (longest + 1); result.size() < length;) {
            result += "aAbBzZ@[`{\xC3\xA9"[random() % 12];
        }
        return result;
    };
    const char* operators[] = {"=", "!=", "<", "<=", ">", ">=", "contains"};
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
            const std::string statement = "T " + std::string(operators[op]) + " " + value;
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
