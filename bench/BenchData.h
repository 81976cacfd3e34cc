#pragma once

// What the benchmarks on data files share: their options, a file of made-up investments, and the same
// investments in SQLite.

#include <cstdio>
#include <cstring>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include <sqlite3.h>

#include "BenchOptions.h"
#include "db/Database.h"

inline constexpr int PortfolioCount = 100;

inline COLUMN_ENTRY Column(const char* name, std::int8_t type, std::int16_t size) {
    COLUMN_ENTRY column{};
    std::strncpy(column.name, name, NameSize - 1);
    column.type = type;
    column.size = size;
    return column;
}

inline std::vector<COLUMN_ENTRY> BenchColumns() {
    return {Column("Portfolio", ColumnType::String, 32), Column("Name", ColumnType::String, 32),
            Column("Ticker", ColumnType::String, 8),     Column("Type", ColumnType::String, 32),
            Column("Retire", ColumnType::Byte, 1),       Column("Shares", ColumnType::Float, 4),
            Column("Date", ColumnType::Date, 4),         Column("Price", ColumnType::Float, 4),
            Column("PrevPrice", ColumnType::Float, 4),   Column("Value", ColumnType::Float, 4),
            Column("Agent", ColumnType::String, 32),     Column("Risk", ColumnType::String, 72),
            Column("QuoteError", ColumnType::Byte, 1)};
}

inline constexpr std::size_t DataSize = 230;

inline void PutText(char* field, std::size_t width, std::string_view text) {
    text.copy(field, width - 1);
}

inline void PutNumbered(char* field, std::size_t width, const char* name, long number) {
    char text[64];
    std::snprintf(text, sizeof(text), "%s%ld", name, number);
    PutText(field, width, text);
}

inline void FillInvestment(long i, char* data) {
    std::memset(data, 0, DataSize);
    PutNumbered(data, 32, "Portfolio ", i % PortfolioCount);
    PutNumbered(data + 32, 32, "Investment number ", i);
    PutNumbered(data + 64, 8, "T", i % 1'000'000);
    PutText(data + 72, 32, i % 3 == 0 ? "Mutual Fund" : "Common Stock");
    const float shares = static_cast<float>(i % 1000);
    const float price = static_cast<float>(i % 20'000) / 8;
    const float value = shares * price;
    std::memcpy(data + 105, &shares, 4);
    std::memcpy(data + 113, &price, 4);
    std::memcpy(data + 121, &value, 4);
    PutText(data + 125, 32, "Broker & Sons");
    PutText(data + 157, 72, i % 10 == 3 ? "Med" : "Low");
}

inline bool MakeEmptyFile(DATABASE& database, const std::string& path) {
    const auto columns = BenchColumns();
    std::filesystem::remove(path);
    return database.Create(path.c_str(), "benchmark", static_cast<int>(columns.size()), columns.data()) == 0;
}

inline bool MakeFile(const std::string& path, long records) {
    DATABASE database(nullptr);
    if (!MakeEmptyFile(database, path))
        return false;
    database.SetImmediateHeaderWrite(0);
    char data[DataSize];
    for (long i = 0; i < records; ++i) {
        FillInvestment(i, data);
        if (database.Append(data) != i)
            return false;
    }
    return database.SetImmediateHeaderWrite(1) == 0;
}

// The same records in SQLite.
class Peer {
  public:
    enum class Journal { Off, Default };

    static constexpr const char* Table =
        "CREATE TABLE t (Portfolio TEXT COLLATE NOCASE, Name TEXT, Ticker TEXT, Type TEXT, Retire INT,"
        " Shares REAL, Date INT, Price REAL, PrevPrice REAL, Value REAL, Agent TEXT,"
        " Risk TEXT COLLATE NOCASE, QuoteError INT)";

    // Opens a file, or makes an empty one. Without a size of the cache SQLite has its own, 2 MB.
    explicit Peer(const std::string& path, int cacheKilobytes = 0, Journal journal = Journal::Off) {
        good_ = sqlite3_open(path.c_str(), &connection_) == SQLITE_OK;
        Run("PRAGMA synchronous = OFF");
        if (cacheKilobytes > 0)
            Run(("PRAGMA cache_size = -" + std::to_string(cacheKilobytes)).c_str());
        Run(journal == Journal::Off ? "PRAGMA journal_mode = OFF" : "PRAGMA journal_mode = DELETE");
    }
    Peer(const Peer&) = delete;
    Peer& operator=(const Peer&) = delete;
    ~Peer() { sqlite3_close(connection_); }

    void Run(const char* statements) {
        good_ &= sqlite3_exec(connection_, statements, nullptr, nullptr, nullptr) == SQLITE_OK;
    }

    // Makes the table, with made-up investments.
    void Make(long records) {
        Run(Table);
        Insert(0, records);
    }
    // Adds made-up investments in one transaction.
    void Insert(long first, long count) {
        Run("BEGIN");
        InsertEach(first, count);
        Run("COMMIT");
    }
    // The same, each in a transaction of its own.
    void InsertEach(long first, long count) {
        sqlite3_stmt* insert = nullptr;
        sqlite3_prepare_v2(connection_, "INSERT INTO t VALUES (?1,?2,?3,?4,0,?5,0,?6,0,?7,?8,?9,0)", -1,
                           &insert, nullptr);
        char data[DataSize];
        for (long i = first; i < first + count && insert != nullptr; ++i) {
            FillInvestment(i, data);
            Bind(insert, data);
            good_ &= sqlite3_step(insert) == SQLITE_DONE;
            sqlite3_reset(insert);
        }
        sqlite3_finalize(insert);
    }

    // Runs a statement that changes rows, and tells how many.
    long Change(const char* update) {
        Run(update);
        return sqlite3_changes(connection_);
    }

    // Steps through all rows of a query, looking at each column.
    long Step(const char* query) {
        sqlite3_stmt* select = nullptr;
        good_ &= sqlite3_prepare_v2(connection_, query, -1, &select, nullptr) == SQLITE_OK;
        long rows = 0;
        for (; sqlite3_step(select) == SQLITE_ROW; ++rows)
            for (int i = 0; i < sqlite3_column_count(select); ++i)
                sqlite3_column_value(select, i);
        sqlite3_finalize(select);
        return rows;
    }

    [[nodiscard]] bool IsGood() const { return good_; }

  private:
    static void Bind(sqlite3_stmt* insert, const char* data) {
        int parameter = 0;
        for (int text : {0, 32, 64, 72})
            sqlite3_bind_text(insert, ++parameter, data + text, -1, SQLITE_TRANSIENT);
        for (int number : {105, 113, 121}) {
            float value = 0;
            std::memcpy(&value, data + number, sizeof(value));
            sqlite3_bind_double(insert, ++parameter, static_cast<double>(value));
        }
        for (int text : {125, 157})
            sqlite3_bind_text(insert, ++parameter, data + text, -1, SQLITE_TRANSIENT);
    }

    sqlite3* connection_ = nullptr;
    bool good_ = false;
};
