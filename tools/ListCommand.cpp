#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "app/model/InvestmentTexts.h"
#include "db/Database.h"
#include "tools/Commands.h"
#include "tools/InvestmentCells.h"
#include "tools/Sentences.h"

namespace {

struct ListOptions {
    std::string home;
    std::string portfolio; // empty: list the portfolios
    std::string sortColumn;
    bool reverse = false;
    OutputFormat format = OutputFormat::Table;
};

// For a person as the window writes it.
Cell ValueCell(float value, OutputFormat format) {
    FigureText text;
    FormatValue(value, text);
    return format == OutputFormat::Table ? Cell{Cell::Kind::Figure, text}
                                         : Cell{Cell::Kind::Float, {}, 0, value};
}

int ListPortfolios(const ListOptions& options, DATABASE& portfolios, DATABASE& investments,
                   TextOutput& output) {
    std::vector<std::string> names;
    if (!CollectPortfolios(portfolios, &names))
        return Fail(NotAllRead("portfolios", options.home));
    std::vector<std::vector<Cell>> rows;
    long count = 0;
    float sum = 0;
    for (const std::string& name : names) {
        const long held = SelectInvestments(investments, name.c_str());
        const std::optional<float> total = TotalValue(investments, name.c_str());
        if (!total)
            return Fail(NotAllRead("investments", options.home));
        rows.push_back({TextCell(name), NumberCell(held), ValueCell(*total, options.format)});
        count += held;
        sum += *total;
    }
    // In JSON a portfolio that may be called so is not to be mistaken for the sum.
    rows.push_back({options.format == OutputFormat::Table ? TextCell("Total") : Cell(), NumberCell(count),
                    ValueCell(sum, options.format)});
    WriteRows(options.format, {"Portfolio", "Investments", "Value"}, rows, output);
    return 0;
}

int ListInvestments(const ListOptions& options, DATABASE& investments, TextOutput& output) {
    const std::optional<float> total = TotalValue(investments, options.portfolio.c_str());
    const long count = SelectInvestments(investments, options.portfolio.c_str());
    if (!total)
        return Fail(NotAllRead("investments", options.home));
    if (!options.sortColumn.empty() && investments.SortBy(options.sortColumn.c_str(), 0) != 0)
        return Fail("the investments cannot be sorted: " +
                    std::string(ErrorMessage(investments.GetLastError(nullptr))));
    std::vector<INVESTMENT_DATA> records;
    if (!ForEachInvestment(investments, count,
                           [&](const INVESTMENT_DATA& record, long) { records.push_back(record); }))
        return Fail(NotAllRead("investments", options.home));
    if (options.reverse)
        std::reverse(records.begin(), records.end());
    TableWriter writer(options.format, ListedNames(), output);
    std::vector<Cell> row;
    const auto forEachRow = [&](void (TableWriter::*use)(std::span<const Cell>)) {
        for (const INVESTMENT_DATA& record : records) {
            FillListed(record, options.format, &row);
            (writer.*use)(row);
        }
    };
    if (options.format == OutputFormat::Table)
        forEachRow(&TableWriter::Measure);
    writer.WriteHeading();
    forEachRow(&TableWriter::WriteRow);
    if (options.format == OutputFormat::Table)
        output.Write(TotalValueText(*total) + '\n');
    return 0;
}

int RunList(ListOptions& options, TextOutput& output) {
    options.home = HomeFolder(options.home);
    const ToolFolder folder(options.home);
    const auto portfolios = OpenOrFail(folder, PortfolioFile, DataFileUse::Look);
    const auto investments = portfolios ? OpenOrFail(folder, InvestmentFile, DataFileUse::Look) : nullptr;
    if (!investments)
        return 1;
    if (options.portfolio.empty())
        return ListPortfolios(options, *portfolios, *investments, output);
    const std::string wrong =
        folder.FindPortfolio(*portfolios, options.portfolio, ToolFolder::Letters::Exact);
    return wrong.empty() ? ListInvestments(options, *investments, output) : Fail(wrong);
}

} // namespace

void AddListCommand(CLI::App& application, int& status) {
    CLI::App* command = application.add_subcommand(
        "list", "List the portfolios with their totals, or a portfolio's investments.");
    const auto options = std::make_shared<ListOptions>();
    CLI::Option* portfolio = command->add_option("PORTFOLIO", options->portfolio,
                                                 "List its investments, with the columns of the window");
    RefuseEmpty(portfolio);
    std::vector<std::string> names = ListedNames();
    names.erase(names.begin()); // how the price moved is no column of the record
    command->add_option("--sort", options->sortColumn, "List them in the order of this column")
        ->transform(CLI::IsMember(names, CLI::ignore_case))
        ->option_text("COLUMN")
        ->needs(portfolio);
    command->add_flag("--reverse", options->reverse, "The last one first")->needs(portfolio);
    AddJsonOption(*command, options->format);
    AddHomeOption(*command, options->home);
    command->footer("Example: quorvan-cli list 'My Retirement Fund' --sort Value --reverse");
    command->callback([options, &status] {
        status = WithOutput([&](TextOutput& output) { return RunList(*options, output); });
    });
}
