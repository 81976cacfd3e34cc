#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <random>
#include <sstream>

#include "RecordModel.h"

namespace {

// One random operation after another on a file and on the model, compared after each.
class ModelTest : public RowsTest {
  protected:
    void SetUp() override {
        const char* wanted = std::getenv("QUORVAN_MODEL_SEED");
        const auto seed = wanted != nullptr ? static_cast<unsigned>(std::strtoul(wanted, nullptr, 10))
                                            : std::random_device{}();
        std::printf("QUORVAN_MODEL_SEED=%u\n", seed);
        random_.seed(seed);
        head_ = folder_.Read("rows.db");
    }

    int Pick(int count) { return std::uniform_int_distribution<int>(0, count - 1)(random_); }
    template <class T, std::size_t Size>
    const T& Any(const T (&from)[Size]) {
        return from[static_cast<std::size_t>(Pick(static_cast<int>(Size)))];
    }
    long AnyNumber() { return Pick(static_cast<int>(model_.Size()) + 2) - 1; }
    ROW AnyRow() {
        return Row(Any(Names), Any(Numbers), Any(Numbers), Any(Numbers), AnyPrice(), Any(Days), Any(Times));
    }
    float AnyPrice() { return std::strtof(Any(Prices), nullptr); }
    MODEL_STATEMENT AnyQuery();
    MODEL_STATEMENT AnySet();

    // Notes the operation for the trace of a failure, and compares its outcome.
    void Expect(const std::string& operation, OUTCOME expected, long value) {
        trace_.push_back(operation);
        if (trace_.size() > 12) {
            trace_.pop_front();
        }
        const OUTCOME found{value, database_.GetLastError(nullptr)};
        EXPECT_EQ(found, expected) << "returned " << value << " code " << found.code << ", expected "
                                   << expected.value << " code " << expected.code;
    }
    void ChangeRecords();
    void MarkRecord();
    void Select();
    void WalkOn();
    void TextOutAndIn();
    void WholeFile();
    void CompareAll();
    void Run(int steps, long mostRecords);

    static constexpr const char* Names[] = {
        "", "a", "B fund", "b FUND", "Fund \xC3\x84", "fund \xC3\xA4", "fifteen letters", "sixteen letters!"};
    static constexpr int Numbers[] = {-300, -128, -2, -1, 0, 1, 2, 3, 100, 40000};
    static constexpr const char* Prices[] = {"-1.5", "0", "0.125", "2", "1e30"};
    static constexpr dbDATE Days[] = {{0, 0, 0}, {31, 12, 1999}, {29, 2, 2000}, {1, 1, 2001}, {70, 1, -5}};
    static constexpr dbTIME Times[] = {{0, 0, 0}, {59, 59, 23}, {30, 15, 9}, {-1, 70, -3}};

    RecordModel model_;
    long mostRecords_ = 0;
    std::mt19937 random_;
    std::string head_; // of the new file
    std::deque<std::string> trace_;
};

MODEL_STATEMENT ModelTest::AnyQuery() {
    static constexpr const char* operators[] = {"=", "!=", "<", "<=", ">", ">=", "contains"};
    const std::string name = Any(Names);
    const int number = Any(Numbers);
    const std::string digits = std::to_string(number);
    const char* price = Any(Prices);
    const std::pair<std::string, double> values[] = {{name.empty() ? "x" : name, 0},
                                                     {digits, static_cast<std::int8_t>(number)},
                                                     {digits, static_cast<std::int16_t>(number)},
                                                     {digits, number},
                                                     {price, std::strtof(price, nullptr)},
                                                     {"20000229", 2000 * 65536 + 2 * 256 + 29},
                                                     {"091530", 9 * 65536 + 15 * 256 + 30}};
    const int column = Pick(7);
    const auto& [text, value] = values[column];
    return {column, Any(operators), text, value};
}

MODEL_STATEMENT ModelTest::AnySet() {
    static constexpr const char* operators[] = {"=", "+", "~"};
    const std::string name = Any(Names);
    const int number = Any(Numbers);
    if (Pick(2) == 0) {
        return {0, Any(operators), name.empty() ? "longer than the column is" : name, 0};
    }
    return {3, Any(operators), std::to_string(number), static_cast<double>(number)};
}

void ModelTest::ChangeRecords() {
    const ROW row = AnyRow();
    const long n = AnyNumber();
    switch (Pick(model_.Size() < mostRecords_ ? 4 : 2)) {
    case 0:
        Expect("Write " + std::to_string(n), model_.Write(n, row), database_.Write(n, &row));
        break;
    case 1:
        Expect("Update", model_.Update(row), database_.Update(&row));
        break;
    case 2:
        Expect("Append", model_.Append({row}), database_.Append(&row));
        break;
    default:
        std::vector<ROW> rows(static_cast<std::size_t>(Pick(5)));
        std::generate(rows.begin(), rows.end(), [this] { return AnyRow(); });
        Expect("AppendAll", model_.Append(rows),
               database_.AppendAll(rows.data(), sizeof(ROW), static_cast<std::int32_t>(rows.size())));
    }
}

void ModelTest::MarkRecord() {
    static constexpr struct {
        const char* name;
        OUTCOME (RecordModel::*expected)(long);
        int (DATABASE::*found)(long);
    } marks[] = {{"Delete ", &RecordModel::Delete, &DATABASE::Delete},
                 {"UnDelete ", &RecordModel::UnDelete, &DATABASE::UnDelete},
                 {"Lock ", &RecordModel::Lock, &DATABASE::Lock},
                 {"UnLock ", &RecordModel::UnLock, &DATABASE::UnLock},
                 {"IsLocked ", &RecordModel::IsLocked, &DATABASE::IsLocked}};
    const long n = AnyNumber();
    if (const int kind = Pick(7); kind < 5) {
        const auto& mark = marks[kind];
        Expect(mark.name + std::to_string(n), (model_.*mark.expected)(n), (database_.*mark.found)(n));
    } else {
        ROW expected{};
        ROW found{};
        Expect((kind == 5 ? "Read " : "UnBufferedRead ") + std::to_string(n), model_.Read(n, &expected),
               kind == 5 ? database_.Read(n, &found) : database_.UnBufferedRead(n, &found));
        EXPECT_EQ(BytesOf(found), BytesOf(expected));
    }
}

void ModelTest::Select() {
    const int mode = Pick(3);
    switch (Pick(8)) {
    case 0:
        Expect("Query nothing, mode " + std::to_string(mode), model_.Query(nullptr, mode),
               database_.Query("", mode));
        break;
    case 1: {
        const MODEL_STATEMENT last = model_.LastStatement();
        model_.Query(model_.HasLastStatement() ? &last : nullptr, QueryMode::New);
        database_.QueryRefresh();
        Expect("QueryRefresh", {}, 0);
        break;
    }
    case 2: {
        const int column = Pick(7);
        Expect("SortBy " + std::to_string(column), model_.Sort(column),
               database_.SortBy(RowColumns()[static_cast<std::size_t>(column)].name, 0));
        break;
    }
    case 3: {
        const MODEL_STATEMENT set = AnySet();
        Expect("QueryUpdate " + set.Text(), model_.QueryUpdate(set),
               database_.QueryUpdate(set.Text().c_str()));
        break;
    }
    default: {
        const MODEL_STATEMENT query = AnyQuery();
        Expect("Query " + query.Text() + ", mode " + std::to_string(mode), model_.Query(&query, mode),
               database_.Query(query.Text().c_str(), mode));
    }
    }
}

void ModelTest::WalkOn() {
    const struct {
        const char* name;
        long start, step;
        void* (DATABASE::*move)(long*);
    } walks[] = {{"QueryGetFirst", 0, 1, &DATABASE::QueryGetFirst},
                 {"QueryGetNext", -1, 1, &DATABASE::QueryGetNext},
                 {"QueryGetLast", model_.Size() - 1, -1, &DATABASE::QueryGetLast},
                 {"QueryGetPrev", -1, -1, &DATABASE::QueryGetPrev}};
    const auto& walk = Any(walks);
    const long expected = model_.Walk(walk.start, walk.step);
    long found = -1;
    const void* data = (database_.*walk.move)(&found);
    Expect(walk.name, {expected, 0}, found);
    ASSERT_EQ(data != nullptr, expected >= 0);
    if (ROW row{}; data != nullptr) {
        model_.Read(expected, &row);
        EXPECT_EQ(BytesOf(*static_cast<const ROW*>(data)), BytesOf(row));
    }
}

void ModelTest::TextOutAndIn() {
    const bool all = Pick(2) == 0;
    const std::string text = folder_.File("rows.txt");
    std::vector<ROW> rows;
    const std::string lines = model_.Export(all, &rows);
    Expect("Export", {static_cast<long>(rows.size()), 0}, database_.Export(text.c_str(), all ? 1 : 0, "\t"));
    EXPECT_EQ(folder_.Read("rows.txt"), lines);
    if (model_.Size() < mostRecords_) {
        std::transform(rows.begin(), rows.end(), rows.begin(), RecordModel::Reloaded);
        model_.Append(rows);
        Expect("Load", {static_cast<long>(rows.size()), 0}, database_.Load(text.c_str(), "\t\n"));
    }
}

void ModelTest::WholeFile() {
    const int kind = model_.Size() > mostRecords_ ? 0 : Pick(5);
    if (kind < 2 && !model_.IsHeaderWritten()) {
        model_.SetHeaderWriting(true);
        Expect("header on", {}, database_.SetImmediateHeaderWrite(1));
    }
    switch (kind) {
    case 0:
        for (long n = 0; n < model_.Size() && model_.Size() > mostRecords_; n += 2) {
            Expect("Delete " + std::to_string(n), model_.Delete(n), database_.Delete(n));
        }
        model_.Compress();
        Expect("Compress", {}, database_.Compress(0));
        break;
    case 1:
        model_.Reopen();
        Expect("Open", {}, database_.Open(path_.c_str()));
        break;
    case 2: {
        static constexpr int sizes[] = {0, 1, 3, 6};
        const int kilobytes = Any(sizes);
        Expect("SetReadCache " + std::to_string(kilobytes), {}, database_.SetReadCache(kilobytes));
        break;
    }
    case 3: {
        const bool exact = Pick(2) == 0;
        model_.SetExact(exact);
        database_.SetCaseSensitivity(exact ? 1 : 0);
        break;
    }
    default: {
        const bool on = Pick(3) != 0;
        model_.SetHeaderWriting(on);
        Expect("header " + std::to_string(on), {}, database_.SetImmediateHeaderWrite(on ? 1 : 0));
    }
    }
}

void ModelTest::CompareAll() {
    DATABASE_HEADER header{};
    database_.GetHeaderInfo(&header);
    EXPECT_EQ(std::pair(header.recordCount, header.deletedCount), model_.Counts());
    EXPECT_EQ(database_.GetNumberOfActiveRecords(), header.recordCount - header.deletedCount);
    EXPECT_EQ(database_.IsQueryActive(), model_.IsQueryActive());
    for (long n = -1; n <= model_.Size(); ++n) {
        EXPECT_EQ(database_.ConvertPhysToLogRecordNumber(n), model_.LogicalNumber(n)) << n;
    }
    const std::string bytes = folder_.Read("rows.db");
    std::string expected = head_;
    const auto [count, deleted] = model_.WrittenCounts();
    std::memcpy(&expected[36], &count, sizeof(count));
    std::memcpy(&expected[40], &deleted, sizeof(deleted));
    expected += model_.Bytes();
    const auto differs = std::mismatch(bytes.begin(), bytes.end(), expected.begin(), expected.end()).first;
    EXPECT_TRUE(bytes == expected) << "at byte " << differs - bytes.begin() << " of the file";
}

void ModelTest::Run(int steps, long mostRecords) {
    static constexpr std::pair<int, void (ModelTest::*)()> operations[] = {
        {25, &ModelTest::ChangeRecords}, {50, &ModelTest::MarkRecord},   {75, &ModelTest::Select},
        {95, &ModelTest::WalkOn},        {97, &ModelTest::TextOutAndIn}, {100, &ModelTest::WholeFile}};
    mostRecords_ = mostRecords;
    for (int step = 0; step < steps && !HasFailure(); ++step) {
        const int kind = Pick(100);
        for (const auto& [below, operation] : operations) {
            if (kind < below) {
                (this->*operation)();
                break;
            }
        }
        CompareAll();
        if (HasFailure()) {
            std::ostringstream last;
            std::copy(trace_.begin(), trace_.end(), std::ostream_iterator<std::string>(last, "\n"));
            ADD_FAILURE() << "step " << step << ", after\n" << last.str();
        }
    }
}

TEST_F(ModelTest, LongRandomRunBesideAPlainModel) {
    Run(8000, 40);
}

// So many records that the cache reads ahead, and not all of them at once.
TEST_F(ModelTest, RandomRunOnALargerFile) {
    for (int i = 0; i < 400; ++i) {
        const ROW row = AnyRow();
        Expect("Append", model_.Append({row}), database_.Append(&row));
    }
    Run(800, 500);
}

} // namespace
