#include <CLI/CLI.hpp>
#include <cstring>
#include <memory>
#include <span>
#include <string>
#include <unordered_map>
#include <vector>

#include "db/Database.h"
#include "tools/Commands.h"
#include "tools/InvestmentCells.h"
#include "tools/Sentences.h"
#include "util/Strings.h"

namespace {

struct ExportOptions {
    std::string home;
    std::string portfolio;
    bool all = false;
    std::string output = "-"; // which is standard output
    OutputFormat format = OutputFormat::Csv;
};

// All investments by portfolio in the order of the list, those of no listed portfolio last; a portfolio
// without any gets a record with its name alone. False when they could not all be read.
bool CollectAll(DATABASE& portfolios, DATABASE& investments, std::vector<INVESTMENT_DATA>* records) {
    std::vector<std::string> names;
    if (!CollectPortfolios(portfolios, &names))
        return false;
    std::unordered_map<std::string, std::size_t> places;
    for (const std::string& name : names)
        places.try_emplace(Lowered(name), places.size());
    std::vector<std::vector<INVESTMENT_DATA>> held(places.size() + 1);
    const bool read = ForEachInvestment(
        investments, investments.Query(nullptr, QueryMode::New), [&](const INVESTMENT_DATA& record, long) {
            const auto place = places.find(Lowered(FieldText(record.Portfolio)));
            held[place == places.end() ? places.size() : place->second].push_back(record);
        });
    for (const std::string& name : names) {
        std::vector<INVESTMENT_DATA>& group = held[places[Lowered(name)]];
        if (group.empty())
            CopyText(group.emplace_back().Portfolio, name);
    }
    for (const std::vector<INVESTMENT_DATA>& group : held)
        records->insert(records->end(), group.begin(), group.end());
    return read;
}

bool IsNameAlone(const INVESTMENT_DATA& record) {
    INVESTMENT_DATA alone{};
    std::memcpy(alone.Portfolio, record.Portfolio, sizeof alone.Portfolio);
    return AreSame(alone, record);
}

void WriteRecords(const ExportOptions& options, std::span<const INVESTMENT_DATA> records,
                  TextOutput& output) {
    const std::span<const COLUMN_ENTRY> columns =
        std::span(TextColumns()).subspan(options.all ? 0 : FirstListed);
    std::vector<std::string> names;
    for (const COLUMN_ENTRY& column : columns)
        names.emplace_back(column.name);
    TableWriter writer(options.format, names, output);
    writer.WriteHeading();
    std::vector<Cell> row(columns.size());
    for (const INVESTMENT_DATA& record : records) {
        const bool onlyPortfolio = IsNameAlone(record);
        for (std::size_t i = 0; i < columns.size(); ++i) {
            FillForPrograms(columns[i], record, &row[i]);
            if (onlyPortfolio && i > 0)
                row[i].kind = Cell::Kind::Nothing;
        }
        writer.WriteRow(row);
    }
}

int RunExport(ExportOptions& options, TextOutput& output) {
    options.home = HomeFolder(options.home);
    const bool toFile = options.output != "-";
    if (toFile && !MayWriteOutput(options.home, options.output))
        return 1;
    const ToolFolder folder(options.home);
    const auto portfolios = OpenOrFail(folder, PortfolioFile, DataFileUse::Look);
    const auto investments = portfolios ? OpenOrFail(folder, InvestmentFile, DataFileUse::Look) : nullptr;
    if (!investments)
        return 1;
    std::vector<INVESTMENT_DATA> records;
    if (!options.all) {
        const std::string wrong =
            folder.FindPortfolio(*portfolios, options.portfolio, ToolFolder::Letters::Exact);
        if (!wrong.empty())
            return Fail(wrong);
    }
    const bool read =
        options.all ? CollectAll(*portfolios, *investments, &records)
                    : ForEachInvestment(*investments, options.portfolio.c_str(),
                                        [&](const INVESTMENT_DATA& each, long) { records.push_back(each); });
    if (!read)
        return Fail(NotAllRead("investments", options.home));
    if (!toFile) {
        WriteRecords(options, records, output);
        return 0;
    }
    TextOutput text;
    WriteRecords(options, records, text);
    return WriteOutputFile(options.output, text.Kept());
}

} // namespace

void AddExportCommand(CLI::App& application, int& status) {
    CLI::App* command = application.add_subcommand(
        "export", "Write a portfolio's investments, or all, as a table for spreadsheets (CSV).");
    const auto options = std::make_shared<ExportOptions>();
    CLI::Option* name = command->add_option("PORTFOLIO", options->portfolio, "The portfolio's name");
    command->add_flag("--all", options->all, "All portfolios, with a column Portfolio")
        ->excludes(RefuseEmpty(name));
    RefuseEmpty(command->add_option("-o,--output", options->output,
                                    "The file to write; replaced where it exists (default: - for standard "
                                    "output)"))
        ->type_name("FILE");
    AddJsonOption(*command, options->format);
    AddHomeOption(*command, options->home);
    command->footer("Example: quorvan-cli export --all -o all.csv");
    command->callback([options, &status] {
        if (options->portfolio.empty() && !options->all)
            throw CLI::RequiredError("PORTFOLIO or --all");
        status = WithOutput([&](TextOutput& output) { return RunExport(*options, output); });
    });
}
