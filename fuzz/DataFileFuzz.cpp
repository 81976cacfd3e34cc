// A data file of any bytes: looking at it changes nothing and reads nothing outside it; check and engine
// agree about it; a repaired file has right counts; whatever is changed in it, the counts stay right.
#include <cstdint>
#include <string>
#include <vector>

#include "FuzzFiles.h"
#include "db/Database.h"
#include "db/FileCheck.h"

namespace {

constexpr int MostColumns = 6; // of which queries are made
constexpr long MostRecords = 500;

const std::string& Path() {
    static const std::string path = FuzzFolder() + "/any.db";
    return path;
}

struct LOOK {
    bool open;
    bool damaged;
};

std::vector<std::string> Statements(DATABASE& database) {
    std::vector<std::string> statements = {""};
    COLUMN_ENTRY column{};
    for (int i = 0; i < MostColumns && database.GetColumnInfo(i, &column) == 0; ++i)
        for (const char* rest : {" contains a", " = 1", " > 19990101", " != x"})
            statements.push_back(column.name + std::string(rest));
    return statements;
}

void ReadAll(DATABASE& database, const DATABASE_HEADER& header) {
    const auto size = static_cast<std::size_t>(header.recordLength) - 1;
    std::string cached(size, '\0');
    std::string direct(size, '\0');
    long readable = 0;
    for (long n = 0; n < header.recordCount; ++n) {
        const int got = database.Read(n, cached.data());
        if (n < MostRecords) {
            Require(got == database.UnBufferedRead(n, direct.data()), "cache and file disagree");
            Require(got != 1 || cached == direct, "cache and file differ");
        }
        readable += got == 1 ? 1 : 0;
    }
    Require(database.QueryReset() == readable || header.deletedCount == 0,
            "the set of all records is not all of them");
}

LOOK Look(bool sound) {
    DATABASE database(Path().c_str());
    DATABASE_HEADER header{};
    database.GetHeaderInfo(&header);
    if (!database.IsOpen())
        return {false, false};
    ReadAll(database, header);
    database.SetReadCache(1);
    int mode = QueryMode::New;
    for (const std::string& statement : Statements(database)) {
        const long count = database.Query(statement.c_str(), mode);
        long walked = 0;
        for (void* data = database.QueryGetFirst(nullptr); data != nullptr;
             data = database.QueryGetNext(nullptr))
            ++walked;
        Require(count < 0 || walked == count || !sound, "the walk misses records");
        mode = (mode + 1) % 3;
    }
    return {true, database.IsDamaged()};
}

void Change() {
    DATABASE database(Path().c_str());
    DATABASE_HEADER header{};
    database.GetHeaderInfo(&header);
    const std::string data(static_cast<std::size_t>(header.recordLength), 'x');
    Require(database.Append(data.data()) == header.recordCount, "nothing can be appended to a sound file");
    database.Lock(0);
    database.Delete(0);
    database.Delete(1);
    database.UnDelete(1);
    COLUMN_ENTRY column{};
    for (int i = 0; i < MostColumns && database.GetColumnInfo(i, &column) == 0; ++i) {
        database.QueryUpdate((column.name + std::string(" = 7")).c_str());
        database.SortBy(column.name, 0);
    }
    Require(database.Compress(0) == 0, "a sound file cannot be compacted");
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string bytes = BytesOf(data, size);
    WriteBytes(Path(), bytes);
    FileCheck check;
    Require(check.Run(Path()) == 0, "a file that can be read cannot be checked");
    const LOOK look = Look(check.IsSound());
    Require(ReadBytes(Path()) == bytes, "looking at the file changed it");
    Require(look.open || !check.IsSound(), "a file that is refused counts as sound");
    Require(!look.damaged || check.CanRepair() || !check.IsSound(), "a damaged file counts as sound");
    std::string backup;
    const bool mendable = check.CanRepair();
    Require(check.Repair(Path(), &backup) == 0 && !check.CanRepair(), "counts are wrong after a repair");
    Require(backup.empty() == !mendable && (!mendable || ReadBytes(backup) == bytes), "no whole backup");
    if (mendable) {
        std::filesystem::remove(backup);
        const DATABASE mended(Path().c_str());
        Require(mended.IsOpen() && !mended.IsDamaged(), "a repaired file is not taken");
    }
    if (check.IsSound()) {
        Change();
        Require(check.Run(Path()) == 0 && check.IsSound(), "changes left a file that is not sound");
    }
    return 0;
}
