#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

#include "tools/Commands.h"
#include "tools/FolderCheck.h"

namespace {

struct CheckOptions {
    std::string home;
    bool repair = false;
    OutputFormat format = OutputFormat::Table;
};

const char* Name(FolderFinding::Kind kind) {
    switch (kind) {
    case FolderFinding::Kind::Problem:
        return "problem";
    case FolderFinding::Kind::Mended:
        return "mended";
    case FolderFinding::Kind::Remark:
        break;
    }
    return "remark";
}

void WriteFindings(const FolderCheck& check, OutputFormat format, TextOutput& output) {
    const auto place = [](std::int64_t number) { return number >= 0 ? NumberCell(number) : Cell(); };
    std::vector<std::vector<Cell>> rows;
    for (const FolderFinding& each : check.Findings())
        rows.push_back({TextCell(Name(each.kind)), TextCell(each.file), place(each.offset),
                        place(each.record), TextCell(each.text)});
    if (rows.empty() && format == OutputFormat::Table)
        output.Write("nothing is wrong\n");
    else
        WriteRows(format, {"kind", "file", "offset", "record", "finding"}, rows, output);
}

int RunCheck(const CheckOptions& options, TextOutput& output) {
    ToolFolder folder(HomeFolder(options.home), {PortfolioFile.name, InvestmentFile.name, CategoryFile.name});
    if (const std::string wrong = options.repair ? folder.Lock() : ""; !wrong.empty())
        return Fail(wrong);
    FolderCheck check(folder);
    const std::string hindered = check.Run(options.repair);
    if (hindered.empty() || !check.Findings().empty())
        WriteFindings(check, options.format, output);
    if (!hindered.empty())
        return Fail(hindered);
    return check.IsSound() ? 0 : 1;
}

} // namespace

void AddCheckCommand(CLI::App& application, int& status) {
    CLI::App* command =
        application.add_subcommand("check", "Say what is wrong with the folder's data files, and where.");
    const auto options = std::make_shared<CheckOptions>();
    command->add_flag("--repair", options->repair,
                      "Set right what can be without a guess, after the day's backup");
    AddJsonOption(*command, options->format);
    AddHomeOption(*command, options->home);
    command->footer("Example: quorvan-cli check --repair");
    command->callback([options, &status] {
        status = WithOutput([&](TextOutput& output) { return RunCheck(*options, output); });
    });
}
