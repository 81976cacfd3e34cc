// A text file of any bytes behind a byte that chooses the separators, its highest bit how bytes are read: its
// records are appended whole, and what is exported of them loads again.
#include <cstdint>
#include <cstring>
#include <string>

#include "SampleRows.h"
#include "db/FileCheck.h"

namespace {

constexpr const char* Separators[] = {"\t\n\r", ",\n", " \t\n", ";", "\n", ""};

struct __attribute__((packed)) ROW {
    char name[12];
    char tag;
    std::int16_t small;
    std::int32_t count;
    float price;
    char dayAndTime[7];
};
static_assert(sizeof(ROW) == SampleRecordSize);

ROW RecordOf(DATABASE& database, long number) {
    ROW row{};
    Require(database.Read(number, &row) == 1, "a loaded record cannot be read");
    Require(std::memchr(row.name, 0, sizeof(row.name)) != nullptr, "a loaded text has no end");
    return row;
}

// Whether the record's line has a field for each column again.
bool LoadsAgain(const ROW& row, int byteFormat) {
    return std::strpbrk(row.name, "\t\n") == nullptr &&
           (byteFormat != 1 || (row.tag != '\0' && row.tag != '\t' && row.tag != '\n'));
}

// What is exported loads again, prices apart, which are rounded.
void ExportAndLoad(DATABASE& database, int byteFormat, long records, const std::string& text) {
    database.SetByteOutputFormat(byteFormat);
    Require(database.Export(text.c_str(), 1, "\t") == records, "not all records are exported");
    DATABASE other(nullptr);
    other.SetByteInputFormat(byteFormat);
    CreateSample(other, FuzzFolder() + "/again.db");
    Require(other.Load(text.c_str(), "\t\n") == records, "not all records are loaded again");
    for (long n = 0; n < records; ++n) {
        ROW row = RecordOf(database, n);
        ROW again = RecordOf(other, n);
        if (row.name[0] == '\0')
            std::strcpy(row.name, " ");
        Require(std::strcmp(row.name, again.name) == 0, "a text has changed");
        row.price = again.price;
        Require(std::memcmp(&row.tag, &again.tag, sizeof(row) - sizeof(row.name)) == 0,
                "a field has changed");
    }
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::string path = FuzzFolder() + "/load.db";
    static const std::string text = FuzzFolder() + "/load.txt";
    if (size == 0)
        return 0;
    WriteBytes(text, BytesOf(data + 1, size - 1));
    DATABASE database(nullptr);
    CreateSample(database, path);
    const int byteFormat = data[0] < 128 ? 1 : 2;
    database.SetByteInputFormat(byteFormat);
    const long loaded = database.Load(text.c_str(), Separators[data[0] % std::size(Separators)]);
    DATABASE_HEADER header{};
    database.GetHeaderInfo(&header);
    if (loaded < 0)
        Require(database.GetLastError(nullptr) != 0, "a failed load without a code");
    else
        Require(header.recordCount == loaded, "not as many records are there as were loaded");
    bool loadsAgain = loaded > 0;
    for (long n = 0; n < header.recordCount; ++n)
        loadsAgain = LoadsAgain(RecordOf(database, n), byteFormat) && loadsAgain;
    FileCheck check;
    Require(check.Run(path) == 0 && check.IsSound() && check.Findings().empty(), "the file is not sound");
    if (loadsAgain)
        ExportAndLoad(database, byteFormat, loaded, text);
    return 0;
}
