#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <random>
#include <sstream>

#include "RecordModel.h"

namespace {

constexpr int Steps = 8000;
constexpr long MostRecords = 40;

// One random operation after another on a file and on the model, compared after each.
class ModelTest : public testing::Test {
  protected:
    void SetUp() override {
        const char* wanted = std::getenv("QUORVAN_MODEL_SEED");
        const auto seed = wanted != nullptr ? static_cast<unsigned>(std::strtoul(wanted, nullptr, 10))
                                            : std::random_device{}();
        std::printf("QUORVAN_MODEL_SEED=%u\n", seed);
        random_.seed(seed);
        ASSERT_EQ(CreateRows(database_, path_), 0);
        head_ = folder_.Read("rows.db");
    }

    int Pick(int count) { return std::uniform_int_distribution<int>(0, count - 1)(random_); }
    template <class T, std::size_t Size>
    const T& Any(const T (&from)[Size]) {
        return from[static_cast<std::size_t>(Pick(static_cast<int>(Size)))];
    }
    long AnyNumber() { return Pick(static_cast<int>(model_.Size()) + 2) - 1; }
    ROW AnyRow() {
        return Row(Any(Names), Any(Numbers), Any(Numbers), Any(Numbers), Any(Prices), Any(Days), Any(Times));
    }
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

    static constexpr const char* Names[] = {
        "", "a", "B fund", "b FUND", "Fund \xC3\x84", "fund \xC3\xA4", "fifteen letters", "sixteen letters!"};
    static constexpr int Numbers[] = {-300, -128, -2, -1, 0, 1, 2, 3, 100, 40000};
    static constexpr float Prices[] = {-1.5F, 0, 0.125F, 2, 1e30F};
    static constexpr dbDATE Days[] = {{0, 0, 0}, {31, 12, 1999}, {29, 2, 2000}, {1, 1, 2001}, {70, 1, -5}};
    static constexpr dbTIME Times[] = {{0, 0, 0}, {59, 59, 23}, {30, 15, 9}, {-1, 70, -3}};

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    DATABASE database_{nullptr};
    RecordModel model_;
    std::mt19937 random_;
    std::string head_; // of the new file
    std::deque<std::string> trace_;
};

MODEL_STATEMENT ModelTest::AnyQuery() {
    static constexpr const char* operators[] = {"=", "!=", "<", "<=", ">", ">=", "contains"};
    MODEL_STATEMENT query{Pick(7), Any(operators), Any(Names), 0};
    const int number = Any(Numbers);
    const float price = Any(Prices);
    char text[32] = "";
    switch (query.column) {
    case 0:
        query.value = query.value.empty() ? "x" : query.value;
        return query;
    case 1:
    case 2:
    case 3:
        query.number = query.column == 1   ? static_cast<std::int8_t>(number)
                       : query.column == 2 ? static_cast<std::int16_t>(number)
                                           : number;
        query.value = std::to_string(number);
        return query;
    case 4:
        query.number = price;
        std::snprintf(text, sizeof(text), "%g", static_cast<double>(price));
        break;
    case 5:
        query.number = 2000 * 65536 + 2 * 256 + 29;
        std::snprintf(text, sizeof(text), "20000229");
        break;
    default:
        query.number = 9 * 65536 + 15 * 256 + 30;
        std::snprintf(text, sizeof(text), "091530");
    }
    query.value = text;
    return query;
}

MODEL_STATEMENT ModelTest::AnySet() {
    static constexpr const char* operators[] = {"=", "+", "-", "*", "/", "~"};
    static constexpr int packed[] = {1, 256, 65536, -1, 131006725, 0};
    MODEL_STATEMENT set{Pick(7), Any(operators), "", 0};
    if (set.column == 0) {
        set.value = Any(Names);
        set.value = set.value.empty() ? "longer than the column is" : set.value;
        return set;
    }
    set.number = set.column >= 5 ? Any(packed) : Any(Numbers);
    set.value = std::to_string(static_cast<int>(set.number));
    return set;
}

void ModelTest::ChangeRecords() {
    const ROW row = AnyRow();
    const long n = AnyNumber();
    switch (Pick(4)) {
    case 0:
        if (model_.Size() < MostRecords) {
            Expect("Append", model_.Append({row}), database_.Append(&row));
        }
        break;
    case 1:
        if (model_.Size() < MostRecords) {
            std::vector<ROW> rows(static_cast<std::size_t>(Pick(5)), row);
            std::generate(rows.begin(), rows.end(), [this] { return AnyRow(); });
            Expect("AppendAll", model_.Append(rows),
                   database_.AppendAll(rows.data(), sizeof(ROW), static_cast<std::int32_t>(rows.size())));
        }
        break;
    case 2:
        Expect("Write " + std::to_string(n), model_.Write(n, row), database_.Write(n, &row));
        break;
    default:
        Expect("Update", model_.Update(row), database_.Update(&row));
    }
}

void ModelTest::MarkRecord() {
    const long n = AnyNumber();
    const std::string number = " " + std::to_string(n);
    ROW expected{};
    ROW found{};
    switch (Pick(7)) {
    case 0:
        Expect("Delete" + number, model_.Delete(n), database_.Delete(n));
        break;
    case 1:
        Expect("UnDelete" + number, model_.UnDelete(n), database_.UnDelete(n));
        break;
    case 2:
        Expect("Lock" + number, model_.Lock(n), database_.Lock(n));
        break;
    case 3:
        Expect("UnLock" + number, model_.UnLock(n), database_.UnLock(n));
        break;
    case 4:
        Expect("IsLocked" + number, model_.IsLocked(n), database_.IsLocked(n));
        break;
    case 5:
        Expect("Read" + number, model_.Read(n, &expected), database_.Read(n, &found));
        break;
    default:
        Expect("UnBufferedRead" + number, model_.Read(n, &expected), database_.UnBufferedRead(n, &found));
    }
    EXPECT_EQ(BytesOf(found), BytesOf(expected));
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
    const int kind = Pick(4);
    long expected = -1;
    long found = -1;
    const void* data = nullptr;
    switch (kind) {
    case 0:
        expected = model_.Walk(0, 1);
        data = database_.QueryGetFirst(&found);
        break;
    case 1:
        expected = model_.Walk(-1, 1);
        data = database_.QueryGetNext(&found);
        break;
    case 2:
        expected = model_.Walk(model_.Size() - 1, -1);
        data = database_.QueryGetLast(&found);
        break;
    default:
        expected = model_.Walk(-1, -1);
        data = database_.QueryGetPrev(&found);
    }
    Expect("walk " + std::to_string(kind), {expected, 0}, found);
    ASSERT_EQ(data != nullptr, expected >= 0);
    if (data != nullptr) {
        const std::size_t at = static_cast<std::size_t>(expected) * (sizeof(ROW) + 1) + 1;
        EXPECT_EQ(std::string(static_cast<const char*>(data), sizeof(ROW)),
                  model_.Bytes().substr(at, sizeof(ROW)));
    }
}

void ModelTest::TextOutAndIn() {
    const bool all = Pick(2) == 0;
    const std::string text = folder_.File("rows.txt");
    std::vector<ROW> rows;
    const std::string lines = model_.Export(all, &rows);
    Expect("Export", {static_cast<long>(rows.size()), 0}, database_.Export(text.c_str(), all ? 1 : 0, "\t"));
    EXPECT_EQ(folder_.Read("rows.txt"), lines);
    if (model_.Size() < MostRecords) {
        std::transform(rows.begin(), rows.end(), rows.begin(), RecordModel::Reloaded);
        model_.Append(rows);
        Expect("Load", {static_cast<long>(rows.size()), 0}, database_.Load(text.c_str(), "\t\n"));
    }
}

void ModelTest::WholeFile() {
    const int kind = model_.Size() > MostRecords ? 0 : Pick(5);
    if (kind < 2 && !model_.IsHeaderWritten()) {
        model_.SetHeaderWriting(true);
        Expect("header on", {}, database_.SetImmediateHeaderWrite(1));
    }
    switch (kind) {
    case 0:
        for (long n = 0; n < model_.Size() && model_.Size() > MostRecords; n += 2) {
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
        const int kilobytes = Pick(3);
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

TEST_F(ModelTest, LongRandomRunBesideAPlainModel) {
    for (int step = 0; step < Steps && !HasFailure(); ++step) {
        const int kind = Pick(100);
        if (kind < 25) {
            ChangeRecords();
        } else if (kind < 50) {
            MarkRecord();
        } else if (kind < 75) {
            Select();
        } else if (kind < 95) {
            WalkOn();
        } else if (kind < 97) {
            TextOutAndIn();
        } else {
            WholeFile();
        }
        CompareAll();
        if (HasFailure()) {
            std::ostringstream operations;
            for (const std::string& operation : trace_) {
                operations << operation << '\n';
            }
            ADD_FAILURE() << "step " << step << ", after\n" << operations.str();
        }
    }
}

} // namespace
