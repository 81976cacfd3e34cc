// A table of investments of any bytes: reading it ends, and what it gives comes back the same when it is
// written as a table.
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "FuzzFiles.h"
#include "db/Database.h"
#include "tools/CsvImport.h"
#include "tools/InvestmentCells.h"

namespace {

const std::string& MadeFile(const char* name, int count, const COLUMN_ENTRY* columns) {
    static std::vector<std::string> paths(2);
    std::string& path = paths[count == 1 ? 0 : 1];
    if (path.empty()) {
        path = FuzzFolder() + "/" + name;
        Require(DATABASE(nullptr).Create(path.c_str(), name, count, columns) == 0, "no file to read beside");
    }
    return path;
}

// The lines of a table that could all be read.
std::vector<ImportedInvestment> Read(const std::string& table, const ImportOptions& options) {
    DATABASE portfolios(MadeFile("portfol.db", 1, PortfolioColumns.data()).c_str());
    DATABASE investments(MadeFile("invest.db", 13, InvestmentColumns.data()).c_str());
    CsvImport import(options, portfolios, investments);
    Require(import.Read(table, [](long) {}).empty(), "a table hinders the files beside it");
    return import.Wrong().empty() ? import.Added() : std::vector<ImportedInvestment>();
}

std::string Written(const std::vector<ImportedInvestment>& rows) {
    TextOutput text;
    std::vector<std::string> names;
    for (const COLUMN_ENTRY& column : TextColumns())
        names.emplace_back(column.name);
    TableWriter writer(OutputFormat::Csv, names, text);
    writer.WriteHeading();
    std::vector<Cell> cells(names.size());
    for (const ImportedInvestment& row : rows) {
        for (std::size_t i = 0; i < cells.size(); ++i)
            FillForPrograms(TextColumns()[i], row.data, &cells[i]);
        writer.WriteRow(cells);
    }
    return text.Kept();
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    ImportOptions options;
    options.create = true;
    for (const char delimiter : {',', ';', '\t'}) {
        options.delimiter = delimiter;
        const std::vector<ImportedInvestment> rows = Read(BytesOf(data, size), options);
        options.delimiter = ',';
        const std::vector<ImportedInvestment> again = Read(Written(rows), options);
        Require(rows.size() == again.size(), "written lines are not read");
        for (std::size_t i = 0; i < rows.size(); ++i)
            Require(AreSame(rows[i].data, again[i].data), "a written line is read as another");
    }
    return 0;
}
