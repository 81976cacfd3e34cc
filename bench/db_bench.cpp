// Prints what the record engine does in a second beside a bare sequential read of the same bytes, all from
// one run over one file of investments (230 bytes of data) that lies in the page cache.
//
//   db_bench [--records N] [--rounds N] [--folder PATH]

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include <fcntl.h>
#include <sqlite3.h>
#include <unistd.h>

#include "db/Database.h"

namespace {

struct OPTIONS {
    long records = 1'000'000;
    int rounds = 7;
    std::string folder = std::filesystem::temp_directory_path();
};

constexpr int PortfolioCount = 100;

COLUMN_ENTRY Column(const char* name, std::int8_t type, std::int16_t size) {
    COLUMN_ENTRY column{};
    std::strncpy(column.name, name, NameSize - 1);
    column.type = type;
    column.size = size;
    return column;
}

std::vector<COLUMN_ENTRY> InvestmentColumns() {
    return {Column("Portfolio", ColumnType::String, 32), Column("Name", ColumnType::String, 32),
            Column("Ticker", ColumnType::String, 8),     Column("Type", ColumnType::String, 32),
            Column("Retire", ColumnType::Byte, 1),       Column("Shares", ColumnType::Float, 4),
            Column("Date", ColumnType::Date, 4),         Column("Price", ColumnType::Float, 4),
            Column("PrevPrice", ColumnType::Float, 4),   Column("Value", ColumnType::Float, 4),
            Column("Agent", ColumnType::String, 32),     Column("Risk", ColumnType::String, 72),
            Column("QuoteError", ColumnType::Byte, 1)};
}

constexpr std::size_t DataSize = 230;

void PutText(char* field, std::size_t width, std::string_view text) {
    text.copy(field, width - 1);
}

void PutNumbered(char* field, std::size_t width, const char* name, long number) {
    char text[64];
    std::snprintf(text, sizeof(text), "%s%ld", name, number);
    PutText(field, width, text);
}

void FillInvestment(long i, char* data) {
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

bool MakeFile(const std::string& path, long records) {
    DATABASE database(nullptr);
    const auto columns = InvestmentColumns();
    if (database.Create(path.c_str(), "benchmark", static_cast<int>(columns.size()), columns.data()) != 0) {
        return false;
    }
    database.SetImmediateHeaderWrite(0);
    char data[DataSize];
    for (long i = 0; i < records; ++i) {
        FillInvestment(i, data);
        if (database.Append(data) != i) {
            return false;
        }
    }
    return database.SetImmediateHeaderWrite(1) == 0;
}

// The shortest of several runs, in seconds.
template <class Work>
double Shortest(int rounds, Work work) {
    double shortest = 1e9;
    for (int i = 0; i < rounds; ++i) {
        const auto start = std::chrono::steady_clock::now();
        work();
        const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
        shortest = std::min(shortest, took.count());
    }
    return shortest;
}

long BareRead(const std::string& path) {
    static std::vector<char> buffer(256 * 1024);
    const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    long total = 0;
    ssize_t got = 0;
    while ((got = read(file, buffer.data(), buffer.size())) > 0) {
        total += got;
    }
    close(file);
    return total;
}

// The same records in SQLite.
class Peer {
  public:
    Peer(const std::string& path, long records) {
        good_ = sqlite3_open(path.c_str(), &connection_) == SQLITE_OK;
        Run("PRAGMA journal_mode = OFF; PRAGMA synchronous = OFF; PRAGMA cache_size = -1000000;"
            "CREATE TABLE t (Portfolio TEXT COLLATE NOCASE, Name TEXT, Ticker TEXT, Type TEXT, Retire INT,"
            " Shares REAL, Date INT, Price REAL, PrevPrice REAL, Value REAL, Agent TEXT, Risk TEXT COLLATE "
            "NOCASE,"
            " QuoteError INT); BEGIN");
        sqlite3_stmt* insert = nullptr;
        sqlite3_prepare_v2(connection_, "INSERT INTO t VALUES (?1,?2,?3,?4,0,?5,0,?6,0,?7,?8,?9,0)", -1,
                           &insert, nullptr);
        char data[DataSize];
        for (long i = 0; i < records && insert != nullptr; ++i) {
            FillInvestment(i, data);
            int parameter = 0;
            for (int text : {0, 32, 64, 72}) {
                sqlite3_bind_text(insert, ++parameter, data + text, -1, SQLITE_TRANSIENT);
            }
            for (int number : {105, 113, 121}) {
                float value = 0;
                std::memcpy(&value, data + number, sizeof(value));
                sqlite3_bind_double(insert, ++parameter, static_cast<double>(value));
            }
            for (int text : {125, 157}) {
                sqlite3_bind_text(insert, ++parameter, data + text, -1, SQLITE_TRANSIENT);
            }
            good_ &= sqlite3_step(insert) == SQLITE_DONE;
            sqlite3_reset(insert);
        }
        sqlite3_finalize(insert);
        Run("COMMIT");
    }
    Peer(const Peer&) = delete;
    Peer& operator=(const Peer&) = delete;
    ~Peer() { sqlite3_close(connection_); }

    void Run(const char* statements) {
        good_ &= sqlite3_exec(connection_, statements, nullptr, nullptr, nullptr) == SQLITE_OK;
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
        for (; sqlite3_step(select) == SQLITE_ROW; ++rows) {
            for (int i = 0; i < sqlite3_column_count(select); ++i) {
                sqlite3_column_value(select, i);
            }
        }
        sqlite3_finalize(select);
        return rows;
    }

    [[nodiscard]] bool IsGood() const { return good_; }

  private:
    sqlite3* connection_ = nullptr;
    bool good_ = false;
};

// What is done, in both engines; each tells how many records it met.
struct WORK {
    const char* name;
    const char* readLimit; // wanted at most, as a multiple of the bare read
    const char* peerLimit; // and of SQLite
    long (*ours)(DATABASE&);
    long (*theirs)(Peer&);
};

const WORK Works[] = {
    {"NEW query, \"=\" on text", "(1.30)", "(0.50)",
     [](DATABASE& database) { return database.Query("Portfolio = portfolio 17", QueryMode::New); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t WHERE Portfolio = 'portfolio 17'"); }},
    {"NEW query, \">\" on float", "(1.30)", "(0.50)",
     [](DATABASE& database) { return database.Query("Price > 1000", QueryMode::New); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t WHERE Price > 1000"); }},
    {"NEW query, \"contains\" ignoring case", "(2.00)", "(0.20)",
     [](DATABASE& database) { return database.Query("Name contains NUMBER 99", QueryMode::New); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t WHERE Name LIKE '%NUMBER 99%'"); }},
    {"walk of all records", "(1.50)", "(0.50)",
     [](DATABASE& database) {
         long walked = 0;
         for (void* data = database.QueryGetFirst(nullptr); data != nullptr; ++walked) {
             data = database.QueryGetNext(nullptr);
         }
         return walked;
     },
     [](Peer& peer) { return peer.Step("SELECT * FROM t"); }},
    {"query and update of 1 %", "", "(1.00)",
     [](DATABASE& database) {
         database.Query("Portfolio = portfolio 17", QueryMode::New);
         return database.QueryUpdate("Retire = 1");
     },
     [](Peer& peer) { return peer.Change("UPDATE t SET Retire = 1 WHERE Portfolio = 'portfolio 17'"); }},
    {"query and update of 10 %, text", "", "(1.00)",
     [](DATABASE& database) {
         database.Query("Risk = med", QueryMode::New);
         return database.QueryUpdate("Agent = Somebody Else");
     },
     [](Peer& peer) { return peer.Change("UPDATE t SET Agent = 'Somebody Else' WHERE Risk = 'med'"); }},
};

bool Compare(const OPTIONS& options, const std::string& path, Peer& peer) {
    BareRead(path); // warms the page cache
    const double bareRead = Shortest(options.rounds, [&] { BareRead(path); });
    DATABASE database(path.c_str());
    bool agree = true;
    std::printf("%ld records; limits in brackets\n%-38s %10s %14s %18s %10s %18s\n", options.records, "work",
                "ms", "records/s", "x bare read", "SQLite ms", "x SQLite");
    std::printf("%-38s %10.2f\n", "bare sequential read", bareRead * 1e3);
    for (const WORK& work : Works) {
        long ours = 0;
        long theirs = 0;
        database.QueryReset();
        const double seconds = Shortest(options.rounds, [&] { ours = work.ours(database); });
        const double peers = Shortest(std::min(options.rounds, 3), [&] { theirs = work.theirs(peer); });
        std::printf("%-38s %10.2f %14.0f %10.2f %-7s %11.2f %10.3f %-7s\n", work.name, seconds * 1e3,
                    static_cast<double>(options.records) / seconds, seconds / bareRead, work.readLimit,
                    peers * 1e3, seconds / peers, work.peerLimit);
        if (ours != theirs) {
            std::fprintf(stderr, "%s: %ld records, SQLite has %ld\n", work.name, ours, theirs);
            agree = false;
        }
    }
    return agree && peer.IsGood();
}

bool ReadOptions(int argc, char** argv, OPTIONS* options) {
    for (int i = 1; i + 1 < argc; i += 2) {
        const std::string_view name = argv[i];
        if (name == "--records") {
            options->records = std::max(std::atol(argv[i + 1]), 1L);
        } else if (name == "--rounds") {
            options->rounds = std::max(std::atoi(argv[i + 1]), 1);
        } else if (name == "--folder") {
            options->folder = argv[i + 1];
        } else {
            return false;
        }
    }
    return argc % 2 == 1;
}

} // namespace

int main(int argc, char** argv) {
    OPTIONS options;
    if (!ReadOptions(argc, argv, &options)) {
        std::fprintf(stderr, "usage: db_bench [--records N] [--rounds N] [--folder PATH]\n");
        return 2;
    }
    std::string folder = options.folder + "/db_bench.XXXXXX";
    if (mkdtemp(folder.data()) == nullptr) {
        std::perror(folder.c_str());
        return 1;
    }
    const std::string path = folder + "/invest.db";
    bool good = MakeFile(path, options.records);
    if (good) {
        Peer peer(folder + "/peer.sqlite", options.records);
        good = Compare(options, path, peer);
    }
    std::filesystem::remove_all(folder);
    return good ? 0 : 1;
}
