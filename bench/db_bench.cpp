// Prints how long the record engine takes beside SQLite (same columns, no index, journal and synchronous off)
// and beside a limit, all from one run over one file of investments (230 bytes of data) that lies in the page
// cache. The limit is a bare sequential read or copy of the same bytes, or the part of the work that cannot
// be left out. Text is written and read beside the sqlite3 shell, when there is one.
//
//   db_bench [--records N] [--rounds N] [--folder PATH] [--peer-cache KB]
//
// Both engines have their own default cache, 256 KB and 2 MB, unless SQLite is given a larger one.

#include <fcntl.h>
#include <unistd.h>

#include "BenchData.h"

namespace {

constexpr long AppendedAtMost = 100'000;

// Reads a file, and writes what it reads to `copy` unless that is null.
void BareRead(const std::string& path, const char* copy = nullptr) {
    static std::vector<char> buffer(256 * 1024);
    const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    const int target = copy != nullptr ? open(copy, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600) : -1;
    ssize_t got = 0;
    while ((got = read(file, buffer.data(), buffer.size())) > 0)
        if (target >= 0 && write(target, buffer.data(), static_cast<std::size_t>(got)) != got)
            break;
    close(file);
    close(target);
}

// One line of the table.
struct LINE {
    const char* work;
    std::vector<double> seconds; // ours, SQLite's and, where there is one, the limit's
    double wantedOfTheirs = 0;   // at most so many times
    double wantedOfLimit = 0;
};

void PrintRatio(double ours, double other, double wanted) {
    char bracket[16] = "";
    if (wanted > 0)
        std::snprintf(bracket, sizeof(bracket), "(%.2f)", wanted);
    std::printf(" %10.2f %8.3f %-7s", other * 1e3, ours / other, bracket);
}

// What is done in both engines, again and again on the same file; each tells how many records it met.
struct WORK {
    const char* name;
    double wantedOfTheirs;
    double wantedOfLimit; // a bare read
    long (*ours)(DATABASE&);
    long (*theirs)(Peer&);
};

long SortAll(DATABASE& database, const char* column) {
    const long all = database.QueryReset();
    return database.SortBy(column, 0) == 0 ? all : -1;
}

constexpr WORK Works[] = {
    {"NEW query, \"=\" on text", 0.5, 1.3,
     [](DATABASE& database) { return database.Query("Portfolio = portfolio 17", QueryMode::New); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t WHERE Portfolio = 'portfolio 17'"); }},
    {"NEW query, \">\" on float", 0.5, 1.3,
     [](DATABASE& database) { return database.Query("Price > 1000", QueryMode::New); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t WHERE Price > 1000"); }},
    {"NEW query, \"contains\" ignoring case", 0.2, 2,
     [](DATABASE& database) { return database.Query("Name contains NUMBER 99", QueryMode::New); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t WHERE Name LIKE '%NUMBER 99%'"); }},
    {"walk of all records", 0.5, 1.5,
     [](DATABASE& database) {
         database.QueryReset();
         long walked = 0;
         for (void* data = database.QueryGetFirst(nullptr); data != nullptr; ++walked)
             data = database.QueryGetNext(nullptr);
         return walked;
     },
     [](Peer& peer) { return peer.Step("SELECT * FROM t"); }},
    {"sort by text", 0.35, 0, [](DATABASE& database) { return SortAll(database, "Name"); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t ORDER BY Name COLLATE NOCASE"); }},
    {"sort by text, 100 different ones", 0.35, 0,
     [](DATABASE& database) { return SortAll(database, "Portfolio"); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t ORDER BY Portfolio"); }},
    {"sort by number", 0.3, 0, [](DATABASE& database) { return SortAll(database, "Price"); },
     [](Peer& peer) { return peer.Step("SELECT rowid FROM t ORDER BY Price"); }},
};

// Changes of the records that a query selects.
struct CHANGE {
    const char* name;
    double wantedOfTheirs;
    double wantedOfLimit; // the query alone
    const char* query;
    const char* set;
    const char* theirs;
};

constexpr CHANGE Changes[] = {
    {"query and update of 1 %", 1, 1.5, "Portfolio = portfolio 17", "Retire = 1",
     "UPDATE t SET Retire = 1 WHERE Portfolio = 'portfolio 17'"},
    {"query and update of 10 %, text", 1, 0, "Risk = med", "Agent = Somebody Else",
     "UPDATE t SET Agent = 'Somebody Else' WHERE Risk = 'med'"},
};

// The files of one run, and its table.
class Bench {
  public:
    Bench(const OPTIONS& options, std::string folder)
        : rounds_(options.rounds),
          fewRounds_(std::min(options.rounds, 3)),
          records_(options.records),
          peerCache_(options.peerCache),
          folder_(std::move(folder)),
          path_(folder_ + "/invest.db"),
          peerPath_(folder_ + "/peer.sqlite") {}

    // True when everything worked and both engines met the same records.
    bool Run() {
        std::printf("%ld records; wanted at most in brackets\n%-36s %10s %10s %16s %10s %16s\n", records_,
                    "work", "ms", "SQLite ms", "ratio", "limit ms", "ratio");
        if (!MakeFile(path_, records_))
            return false;
        {
            Peer peer(peerPath_, peerCache_);
            peer.Make(records_);
            DATABASE database(path_.c_str());
            MeasureWorks(database, peer);
            MeasureChanges(database, peer);
            Check(peer.IsGood(), "SQLite");
        }
        MeasureAppend();
        MeasureText();
        MeasureCompaction();
        return good_;
    }

  private:
    static void Print(const LINE& line) {
        const double ours = line.seconds[0];
        std::printf("%-36s %10.2f", line.work, ours * 1e3);
        PrintRatio(ours, line.seconds[1], line.wantedOfTheirs);
        if (line.seconds.size() > 2)
            PrintRatio(ours, line.seconds[2], line.wantedOfLimit);
        std::printf("\n");
        std::fflush(stdout);
    }

    void Check(bool good, const char* work) {
        if (!good) {
            std::fprintf(stderr, "%s: failed, or SQLite has another result\n", work);
            good_ = false;
        }
    }

    void MeasureWorks(DATABASE& database, Peer& peer) {
        BareRead(path_); // warms the page cache
        for (const WORK& work : Works) {
            long ours = 0;
            long theirs = 0;
            const auto times = ShortestInTurn(rounds_, {{[&] { ours = work.ours(database); }},
                                                        {[&] { theirs = work.theirs(peer); }},
                                                        {[&] { BareRead(path_); }}});
            Print({work.name, times, work.wantedOfTheirs, work.wantedOfLimit});
            Check(ours == theirs, work.name);
        }
    }

    void MeasureChanges(DATABASE& database, Peer& peer) {
        for (const CHANGE& change : Changes) {
            long ours = 0;
            long theirs = 0;
            const auto query = [&] { database.Query(change.query, QueryMode::New); };
            const auto update = [&] {
                query();
                ours = database.QueryUpdate(change.set);
            };
            const auto times =
                ShortestInTurn(rounds_, {{update}, {[&] { theirs = peer.Change(change.theirs); }}, {query}});
            Print({change.name, times, change.wantedOfTheirs, change.wantedOfLimit});
            Check(ours == theirs, change.name);
        }
    }

    void MeasureAppend() {
        const long count = std::min(records_, AppendedAtMost);
        std::vector<char> data(static_cast<std::size_t>(count) * DataSize);
        for (long i = 0; i < count; ++i)
            FillInvestment(i, &data[static_cast<std::size_t>(i) * DataSize]);
        DATABASE database(nullptr);
        Peer peer(folder_ + "/append.sqlite", peerCache_);
        peer.Make(0);
        bool good = true;
        const auto append = [&] {
            for (long i = 0; i < count; ++i)
                good &= database.Append(&data[static_cast<std::size_t>(i) * DataSize]) == i;
        };
        const auto times = ShortestInTurn(
            rounds_, {{append, [&] { good &= MakeEmptyFile(database, folder_ + "/append.db"); }},
                      {[&] { peer.InsertEach(0, count); }, [&] { peer.Run("DELETE FROM t"); }}});
        Print({"append, flushed, header written", times, 0.4});
        Check(good && peer.IsGood(), "append");
    }

    void MeasureText() {
        if (std::system("command -v sqlite3 > /dev/null") != 0) {
            std::printf("Text is not compared: there is no sqlite3 shell.\n");
            return;
        }
        const std::string text = folder_ + "/invest.txt";
        const std::string csv = folder_ + "/peer.csv";
        const std::string copyPath = folder_ + "/copy.db";
        const std::string peerCopyPath = folder_ + "/copy.sqlite";
        DATABASE database(path_.c_str());
        DATABASE copy(nullptr);
        long exported = 0;
        long loaded = 0;
        bool good = true;
        auto times = ShortestInTurn(
            fewRounds_, {{[&] { exported = database.Export(text.c_str(), 1, "\t"); }}, {[&] {
                             good &= Shell(peerPath_, "'.mode csv' 'SELECT * FROM t' > '" + csv + "'");
                         }}});
        Print({"export of text", times, 0.5});
        const std::string import =
            "'PRAGMA journal_mode = OFF' 'PRAGMA synchronous = OFF' '.mode csv' '.import \"" + csv +
            "\" t' > /dev/null";
        const auto emptyPeer = [&] {
            std::filesystem::remove(peerCopyPath);
            Peer(peerCopyPath).Make(0);
        };
        times = ShortestInTurn(fewRounds_, {{[&] { loaded = copy.Load(text.c_str(), "\t\n"); },
                                             [&] { good &= MakeEmptyFile(copy, copyPath); }},
                                            {[&] { good &= Shell(peerCopyPath, import); }, emptyPeer}});
        Print({"load of text", times, 0.5});
        good &= exported == records_ && loaded == records_;
        good &= Peer(peerCopyPath).Step("SELECT rowid FROM t") == records_;
        Check(good, "text");
        for (const std::string& path : {text, csv, copyPath, peerCopyPath})
            std::filesystem::remove(path); // makes room for what follows
    }

    static bool Shell(const std::string& path, const std::string& arguments) {
        return std::system(("sqlite3 '" + path + "' " + arguments).c_str()) == 0;
    }

    // What was copied has reached the disk before a run, as the data of yesterday has. Afterwards the
    // compacted data has, in either engine, and whatever happens meanwhile loses none.
    void MeasureCompaction() {
        bool good = DeleteHalf();
        const std::string work = folder_ + "/work.db";
        const std::string peerWork = folder_ + "/work.sqlite";
        DATABASE database(nullptr);
        const auto compress = [&] { good &= database.Compress(0) == 0; };
        const auto vacuum = [&] {
            Peer peer(peerWork, peerCache_, Peer::Journal::Default);
            peer.Run("PRAGMA synchronous = FULL");
            peer.Run("VACUUM");
            good &= peer.IsGood();
        };
        const auto copy = [&] {
            BareRead(path_, work.c_str());
            sync();
            good &= database.Open(work.c_str()) == 0;
        };
        const auto copyPeer = [&] {
            BareRead(peerPath_, peerWork.c_str());
            sync();
        };
        const auto times = ShortestInTurn(fewRounds_, {{compress, copy}, {vacuum, copyPeer}, {[&] {
                                                           BareRead(path_, (folder_ + "/copy.db").c_str());
                                                       }}});
        Print({"compaction, half deleted", times, 0.5, 3});
        good &= Peer(peerWork).Step("SELECT rowid FROM t") == database.GetNumberOfActiveRecords();
        Check(good, "compaction");
    }

    // Deletes every other record of both files.
    bool DeleteHalf() {
        DATABASE database(path_.c_str());
        database.SetImmediateHeaderWrite(0);
        bool good = true;
        for (long i = 1; i < records_; i += 2)
            good &= database.Delete(i) == 0;
        Peer peer(peerPath_);
        peer.Run("DELETE FROM t WHERE rowid % 2 = 0");
        return database.SetImmediateHeaderWrite(1) == 0 && good && peer.IsGood();
    }

    int rounds_;
    int fewRounds_;
    long records_;
    int peerCache_;
    std::string folder_;
    std::string path_;
    std::string peerPath_;
    bool good_ = true;
};

} // namespace

int main(int argc, char** argv) {
    OPTIONS options(1'000'000);
    if (!ReadOptions(argc, argv, &options)) {
        std::fprintf(stderr,
                     "usage: db_bench [--records N] [--rounds N] [--folder PATH] [--peer-cache KB]\n");
        return 2;
    }
    std::string folder = options.folder + "/db_bench.XXXXXX";
    if (mkdtemp(folder.data()) == nullptr) {
        std::perror(folder.c_str());
        return 1;
    }
    const bool good = Bench(options, folder).Run();
    std::filesystem::remove_all(folder);
    return good ? 0 : 1;
}
