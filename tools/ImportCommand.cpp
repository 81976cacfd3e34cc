#include <CLI/CLI.hpp>
#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <map>
#include <memory>
#include <string>
#include <unistd.h>
#include <vector>

#include "app/model/PortfolioRules.h"
#include "db/Database.h"
#include "tools/Commands.h"
#include "tools/CsvImport.h"
#include "tools/InvestmentCells.h"
#include "tools/ProgressLine.h"
#include "tools/Sentences.h"
#include "util/File.h"
#include "util/Strings.h"
#include "util/Utf8.h"

namespace {

constexpr std::size_t LongestTable = std::size_t{1} << 30;

struct ImportCommandOptions : ImportOptions {
    std::string home;
    bool all = false;
    std::string file;
    bool dryRun = false;
    std::string updateBy;
    OutputFormat format = OutputFormat::Table;
};

void AppendRows(const std::vector<ImportedInvestment>& imported, const char* action, OutputFormat format,
                std::vector<std::vector<Cell>>* rows) {
    std::vector<Cell> listed;
    for (const ImportedInvestment& each : imported) {
        FillListed(each.data, format, &listed);
        std::vector<Cell>& row = rows->emplace_back();
        row = {NumberCell(each.line), TextCell(action), TextCell(FieldText(each.data.Portfolio))};
        row.insert(row.end(), listed.begin() + 1, listed.end());
    }
}

// What would come in, in the order of the lines.
void ShowRows(const CsvImport& import, OutputFormat format, TextOutput& output) {
    std::vector<std::vector<Cell>> rows;
    AppendRows(import.Changed(), "change", format, &rows);
    AppendRows(import.Added(), "add", format, &rows);
    std::sort(rows.begin(), rows.end(),
              [](const auto& a, const auto& b) { return a[0].number < b[0].number; });
    std::vector<std::string> names = ListedNames();
    names.front() = "Portfolio";
    names.insert(names.begin(), {"Line", "Action"});
    WriteRows(format, names, rows, output);
}

std::string Summary(const CsvImport& import, const char* would) {
    std::string text =
        Counted(static_cast<std::int64_t>(import.Added().size()), "investment") + would + " added";
    if (!import.Changed().empty())
        text += ", " + std::to_string(import.Changed().size()) + " changed";
    for (const std::string& name : import.NewPortfolios())
        AppendEscaped(text += ", new portfolio ", name);
    return text + '\n';
}

// Tells what is wrong with the lines, and what is not taken of them.
int Judge(const CsvImport& import, const std::string& file) {
    for (const std::string& wrong : import.Wrong())
        Fail(file + ", " + wrong);
    if (!import.Wrong().empty())
        return 1;
    std::string unused;
    for (const std::string& heading : import.Unused()) {
        unused += unused.empty() ? "" : ", ";
        unused += Quoted(heading);
    }
    if (!unused.empty())
        Fail(file + ": nothing is taken of " + unused);
    for (const long line : import.Ahead())
        Fail(file + ", line " + std::to_string(line) + ": Date lies ahead");
    return 0;
}

// Whether the one portfolio that is named is none that differs in the case of letters only.
bool IsNameExact(const ImportCommandOptions& options, const ToolFolder& folder, DATABASE& portfolios) {
    std::string name = options.portfolio;
    if (!CanBePortfolioName(name.c_str()) || SelectPortfolios(portfolios, name.c_str()) == 0)
        return true; // it is missing, which the import judges
    const std::string wrong = folder.FindPortfolio(portfolios, name, ToolFolder::Letters::Exact);
    if (!wrong.empty())
        Fail(wrong);
    return wrong.empty();
}

int ReadStandardInput(std::string& text) {
    std::vector<char> buffer(std::size_t{1} << 16);
    ssize_t got = 1;
    while (got > 0 && text.size() <= LongestTable) {
        got = read(STDIN_FILENO, buffer.data(), buffer.size());
        text.append(buffer.data(), static_cast<std::size_t>(std::max<ssize_t>(got, 0)));
    }
    if (got < 0)
        return errno;
    return text.size() > LongestTable ? EFBIG : 0;
}

int ReadTable(const std::string& named, CsvImport& import) {
    const bool standard = named == "-";
    const std::string file = standard ? "standard input" : named;
    std::string text;
    if (const int error = standard ? ReadStandardInput(text) : ReadWholeFile(file, text, LongestTable);
        error != 0)
        return Fail(file + " cannot be read: " + (error == EINVAL ? "it is no regular file" : Reason(error)));
    std::string wrong;
    {
        ProgressLine progress(STDERR_FILENO);
        wrong = import.Read(text, [&](long line) { progress.Show("line " + std::to_string(line)); });
    }
    return wrong.empty() ? Judge(import, file) : Fail(wrong);
}

int Write(const CsvImport& import, ToolFolder& folder, TextOutput& output) {
    std::string wrong = folder.KeepBackup();
    if (wrong.empty()) {
        ProgressLine progress(STDERR_FILENO);
        progress.Show("writing");
        wrong = import.Write(folder);
    }
    if (!wrong.empty())
        return Fail(wrong);
    output.Write(Summary(import, ""));
    return 0;
}

int RunImport(const ImportCommandOptions& options, TextOutput& output) {
    ToolFolder folder(HomeFolder(options.home));
    const DataFileUse use = options.dryRun ? DataFileUse::Look : DataFileUse::Change;
    if (const std::string wrong = options.dryRun ? "" : folder.Lock(); !wrong.empty())
        return Fail(wrong);
    const auto portfolios = OpenOrFail(folder, PortfolioFile, options.create ? use : DataFileUse::Look);
    const auto investments = portfolios ? OpenOrFail(folder, InvestmentFile, use) : nullptr;
    if (!investments || !IsNameExact(options, folder, *portfolios))
        return 1;
    CsvImport import(options, *portfolios, *investments);
    if (ReadTable(options.file, import) != 0)
        return 1;
    if (!options.dryRun)
        return Write(import, folder, output);
    ShowRows(import, options.format, output);
    if (options.format == OutputFormat::Table)
        output.Write(Summary(import, " would be"));
    return 0;
}

// NAME=HEADING, kept by the column's name.
std::string TakeHeader(const std::string& text, std::map<std::string, std::string>* headers) {
    const std::size_t end = text.find('=');
    for (const COLUMN_ENTRY& column : TextColumns())
        if (end != text.npos && strcmpi(text.substr(0, end).c_str(), column.name) == 0) {
            if (IsColumn(column, offsetof(INVESTMENT_DATA, Value)) && end + 1 < text.size())
                return "Value is no column that is read, but always Shares times Price";
            (*headers)[column.name] = text.substr(end + 1);
            return {};
        }
    return "'" + text + "' is no NAME=HEADING of a column that export writes";
}

// How the table is written.
void AddReadingOptions(CLI::App& command, ImportCommandOptions& options) {
    command
        .add_option_function<std::vector<std::string>>(
            "--column",
            [&options](const std::vector<std::string>& renamed) {
                for (const std::string& each : renamed)
                    static_cast<void>(TakeHeader(each, &options.headers));
            },
            "What the table calls a column, as in Shares=Quantity; nothing behind the = leaves it out")
        ->check(CLI::Validator(
            [](const std::string& text) {
                std::map<std::string, std::string> headers;
                return TakeHeader(text, &headers);
            },
            ""))
        ->allow_extra_args(false)
        ->option_text("NAME=HEADING");
    command
        .add_option_function<std::string>(
            "--delimiter",
            [&options](const std::string& text) { options.delimiter = text == "tab" ? '\t' : text[0]; },
            "What stands between two fields (default: a comma)")
        ->check(CLI::Validator(
            [](const std::string& text) {
                const bool one = text.size() == 1 && text.find_first_of("\"\r\n") == text.npos;
                return one || text == "tab" ? "" : "a delimiter is one character, or tab";
            },
            ""))
        ->option_text("CHARACTER");
    command
        .add_option_function<std::string>(
            "--decimal", [&options](const std::string& text) { options.decimal = text[0]; },
            "The decimal mark (default: a point)")
        ->check(CLI::IsMember({".", ","}))
        ->option_text("CHARACTER");
}

} // namespace

void AddImportCommand(CLI::App& application, int& status) {
    CLI::App* command = application.add_subcommand(
        "import", "Add the investments of a table (CSV) to a portfolio, all of them or none.");
    const auto options = std::make_shared<ImportCommandOptions>();
    command->add_option("PORTFOLIO", options->portfolio, "The portfolio's name; with --all there is none");
    command->add_option("FILE", options->file,
                        "The table, which begins with the columns' names; - for standard input");
    command->add_flag("--all", options->all, "Each line names its portfolio in a column Portfolio");
    command->add_flag("--create", options->create, "Make a portfolio where it is missing");
    command->add_option("--update-by", options->updateBy, "Change the investments with this in common")
        ->check(CLI::IsMember({"ticker"}, CLI::ignore_case))
        ->option_text("ticker");
    CLI::Option* dryRun = command->add_flag("--dry-run", options->dryRun, "Show what would come in");
    AddJsonOption(*command, options->format)->needs(dryRun);
    AddReadingOptions(*command, *options);
    AddHomeOption(*command, options->home);
    command->footer("Example: quorvan-cli import Growth orders.csv --column Shares=Quantity --dry-run");
    command->callback([options, &status] {
        if (options->all)
            options->file.swap(options->portfolio);
        if (options->file.empty() || options->portfolio.empty() != options->all)
            throw CLI::RequiredError("PORTFOLIO and FILE, or --all and FILE,");
        options->updateByTicker = !options->updateBy.empty();
        status = WithOutput([&](TextOutput& output) { return RunImport(*options, output); });
    });
}
