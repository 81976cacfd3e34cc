// Prints what the record engine does in a second beside a bare sequential read of the same bytes, all from
// one run over one file of investments (230 bytes of data) that lies in the page cache.
//
//   db_bench [--records N] [--rounds N] [--folder PATH]

#include <fcntl.h>
#include <unistd.h>

#include "BenchData.h"

namespace {

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

} // namespace

int main(int argc, char** argv) {
    OPTIONS options(1'000'000);
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
