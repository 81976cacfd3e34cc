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
    PutText(data + 157, 72, i % 2 == 0 ? "Low" : "High");
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

class Table {
  public:
    Table(long records, double bareRead) : records_(records), bareRead_(bareRead) {
        std::printf("%-44s %10s %14s %12s %7s\n", "work", "ms", "records/s", "x bare read", "limit");
        Line("bare sequential read", bareRead, 0);
    }

    void Line(const char* work, double seconds, double limit) const {
        std::printf("%-44s %10.2f %14.0f %12.2f", work, seconds * 1e3,
                    static_cast<double>(records_) / seconds, seconds / bareRead_);
        if (limit > 0) {
            std::printf(" %7.2f", limit);
        }
        std::printf("\n");
    }

  private:
    long records_;
    double bareRead_;
};

long Walk(DATABASE& database) {
    long walked = 0;
    for (void* data = database.QueryGetFirst(nullptr); data != nullptr;
         data = database.QueryGetNext(nullptr)) {
        ++walked;
    }
    return walked;
}

bool Expect(const char* what, long got, long wanted) {
    if (got != wanted) {
        std::fprintf(stderr, "%s: %ld instead of %ld\n", what, got, wanted);
    }
    return got == wanted;
}

bool RunReads(const OPTIONS& options, const std::string& path) {
    BareRead(path); // warms the page cache
    const Table table(options.records, Shortest(options.rounds, [&] { BareRead(path); }));

    DATABASE database(path.c_str());
    const auto timed = [&](const char* work, const char* statement, double limit) {
        long count = 0;
        const double seconds =
            Shortest(options.rounds, [&] { count = database.Query(statement, QueryMode::New); });
        table.Line(work, seconds, limit);
        return count;
    };
    bool good = Expect("=", timed("NEW query, \"=\" on text", "Portfolio = portfolio 17", 1.3),
                       (options.records + PortfolioCount - 18) / PortfolioCount);
    good &= timed("NEW query, \">\" on float", "Price > 1000", 1.3) >= 0;
    good &= timed("NEW query, \"contains\" ignoring case", "Name contains NUMBER 99", 2.0) >= 0;
    long walked = 0;
    database.QueryReset();
    table.Line("walk of all records", Shortest(options.rounds, [&] { walked = Walk(database); }), 1.5);
    return good & Expect("walk", walked, options.records);
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
    const bool good = MakeFile(path, options.records) && RunReads(options, path);
    std::filesystem::remove_all(folder);
    return good ? 0 : 1;
}
