// A set statement of any bytes behind a query statement ended by a NUL: it is refused and changes nothing, or
// changes one column of the selected records and nothing else.
#include <cstdint>
#include <string>

#include "SampleRows.h"
#include "db/FileCheck.h"

namespace {

COLUMN_ENTRY ColumnOf(DATABASE& database, const std::string& statement) {
    char name[32];
    char op[32];
    char value[32];
    COLUMN_ENTRY column{};
    Require(database.ParseQueryStatement(statement.c_str(), name, op, value) == 0, "a set without a column");
    for (int i = 0; database.GetColumnInfo(i, &column) == 0; ++i)
        if (std::string(column.name) == name)
            return column;
    Require(false, "a set of no column");
    return {};
}

// The file's bytes with the column and the status bytes of active records blanked.
std::string Blanked(std::string bytes, const COLUMN_ENTRY& column) {
    const auto start = static_cast<std::size_t>(DataStart(7));
    for (std::size_t at = start; at < bytes.size(); at += SampleRecordSize + 1) {
        if (bytes[at] == 1)
            continue;
        bytes[at] = 0;
        bytes.replace(at + 1 + static_cast<std::size_t>(column.offset), static_cast<std::size_t>(column.size),
                      static_cast<std::size_t>(column.size), '.');
    }
    return bytes;
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::string path = FuzzFolder() + "/set.db";
    static const std::string sample = MakeSample(path);
    const std::string input = BytesOf(data, size);
    const std::string query = input.substr(0, input.find('\0'));
    const std::string statement = input.size() > query.size() ? input.substr(query.size() + 1) : "";
    WriteBytes(path, sample);
    DATABASE database(path.c_str());
    const long selected = database.Query(query.c_str(), QueryMode::New);
    database.GetLastError(nullptr);
    const long changed = database.QueryUpdate(statement.c_str());
    const std::string after = ReadBytes(path);
    if (changed < 0) {
        Require(database.GetLastError(nullptr) != 0 && after == sample, "a refused set changed the file");
        return 0;
    }
    Require(changed == (selected < 0 ? SampleRecords - 1 : selected), "not as many are changed as selected");
    const COLUMN_ENTRY column = ColumnOf(database, statement);
    Require(Blanked(after, column) == Blanked(sample, column), "more than the column was changed");
    if (column.type == ColumnType::String) {
        Require(database.Query((std::string(column.name) + " contains x").c_str(), QueryMode::New) >= 0,
                "the column cannot be searched");
    }
    FileCheck check;
    Require(check.Run(path) == 0 && check.IsSound(), "the file is not sound any more");
    return 0;
}
