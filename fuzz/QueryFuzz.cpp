// Query statements of any bytes, each behind a byte that chooses mode and case and ended by a NUL: a
// statement is refused with a code and changes nothing, or selects a set that the walk hands out whole and in
// order.
#include <algorithm>
#include <cstdint>
#include <set>
#include <string>

#include "SampleRows.h"

namespace {

std::set<long> Walk(DATABASE& database) {
    std::set<long> numbers;
    long number = -1;
    for (void* data = database.QueryGetFirst(&number); data != nullptr;
         data = database.QueryGetNext(&number)) {
        Require(numbers.empty() || number > *numbers.rbegin(), "the walk is out of order");
        Require(number >= 0 && number < SampleRecords && number != 3, "no record of the file is selected");
        numbers.insert(number);
    }
    return numbers;
}

void RunStatement(DATABASE& database, const std::string& statement, int mode) {
    const std::set<long> before = Walk(database);
    const long count = database.Query(statement.c_str(), mode);
    const int code = database.GetLastError(nullptr);
    const std::set<long> after = Walk(database);
    char tokens[3][32];
    const bool parsed = database.ParseQueryStatement(statement.c_str(), tokens[0], tokens[1], tokens[2]) == 0;
    Require(parsed || statement.empty() || code == DatabaseError::QueryInvalidStatement,
            "a statement without its tokens is taken");
    if (count < 0) {
        Require(code != 0 && after == before, "a refused statement changed the set");
        return;
    }
    Require(code == 0 && static_cast<long>(after.size()) == count, "the set is not as large as it is said");
    const bool within = std::includes(before.begin(), before.end(), after.begin(), after.end());
    const bool over = std::includes(after.begin(), after.end(), before.begin(), before.end());
    Require(statement.empty() || mode != QueryMode::And || within, "AND added records");
    Require(statement.empty() || mode != QueryMode::Or || over, "OR took records away");
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::string path = FuzzFolder() + "/query.db";
    static const std::string sample = MakeSample(path);
    DATABASE database(path.c_str());
    std::string rest = BytesOf(data, size);
    while (!rest.empty()) {
        const auto choice = static_cast<unsigned char>(rest[0]);
        const std::string statement = rest.substr(1, rest.find('\0', 1) - 1);
        rest.erase(0, std::min(rest.size(), statement.size() + 2));
        database.SetCaseSensitivity(choice & 4U ? 1 : 0);
        RunStatement(database, statement, choice % 3);
    }
    Require(ReadBytes(path) == sample, "queries changed the file");
    return 0;
}
