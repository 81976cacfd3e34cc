#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <system_error>
#include <vector>

#include "tools/Backups.h"
#include "tools/Commands.h"
#include "util/File.h"

namespace {

struct BackupsOptions {
    std::string home;
    std::string day;
    std::vector<std::string> files;
    OutputFormat format = OutputFormat::Table;
};

std::vector<Cell> RowOf(const BackupFile& backup, const std::optional<RecordChanges>& changes) {
    std::error_code error;
    const auto size = std::filesystem::file_size(backup.path, error);
    std::vector<Cell> row(7);
    row[0].SetText(backup.day);
    row[1].SetText(backup.name);
    if (!error)
        row[2].SetNumber(static_cast<std::int64_t>(size));
    if (changes) {
        row[3].SetNumber(changes->records);
        row[4].SetNumber(changes->added);
        row[5].SetNumber(changes->changed);
        row[6].SetNumber(changes->removed);
    }
    return row;
}

int ListBackups(const BackupsOptions& options, const std::string& home, TextOutput& output) {
    std::vector<BackupFile> backups = FindBackups(home);
    std::vector<std::vector<Cell>> rows;
    std::map<std::string, std::string> later; // what each file was next
    int status = 0;
    for (auto backup = backups.rbegin(); backup != backups.rend(); ++backup) {
        std::string wrong;
        const std::string next = later.emplace(backup->name, backup->present).first->second;
        const auto changes = CompareRecords(backup->name, backup->path, next, wrong);
        if (!wrong.empty())
            status = Fail(wrong);
        rows.push_back(RowOf(*backup, changes));
        later[backup->name] = backup->path;
    }
    std::reverse(rows.begin(), rows.end());
    WriteRows(options.format, {"day", "file", "bytes", "records", "added", "changed", "removed"}, rows,
              output);
    return status;
}

// The backups of the day, of the files that are named or of all. Empty, with a sentence for the person, when
// one is not there.
std::vector<BackupFile> WantedBackups(const BackupsOptions& options, const std::string& home) {
    std::vector<BackupFile> wanted = FindBackups(home, options.files);
    std::erase_if(wanted, [&](const BackupFile& backup) { return backup.day != options.day; });
    for (const std::string& file : options.files)
        if (std::none_of(wanted.begin(), wanted.end(),
                         [&](const BackupFile& backup) { return backup.name == file; })) {
            Fail("there is no backup of " + file + " of " + options.day);
            return {};
        }
    if (wanted.empty())
        Fail("there is no backup of " + options.day + " in " + home);
    std::erase_if(wanted, [&](const BackupFile& backup) {
        return !options.files.empty() &&
               std::find(options.files.begin(), options.files.end(), backup.name) == options.files.end();
    });
    return wanted;
}

int RestoreDay(const BackupsOptions& options, const std::string& home, TextOutput& output) {
    const std::vector<BackupFile> backups = WantedBackups(options, home);
    if (backups.empty())
        return 1;
    std::vector<std::string> names;
    std::string listed;
    for (const BackupFile& backup : backups) {
        names.push_back(backup.name);
        listed += (listed.empty() ? "" : ", ") + backup.name;
    }
    ToolFolder folder(home, names);
    if (const std::string held = folder.Lock(); !held.empty())
        return Fail(held);
    if (std::find(names.begin(), names.end(), InvestmentFile.name) != names.end() &&
        FileExists(home + "/cut.db"))
        return Fail("what was cut is not pasted yet, and would be added to the investments of another day; "
                    "start Quorvan once, which puts it back, and try again");
    std::string kept;
    if (const std::string wrong = RestoreBackups(folder, backups, &kept); !wrong.empty())
        return Fail(wrong);
    output.Write("restored " + listed + " of " + options.day + "; what was there is kept as " + kept + "\n");
    return 0;
}

} // namespace

void AddBackupsCommand(CLI::App& application, int& status) {
    CLI::App* command = application.add_subcommand(
        "backups", "List the days whose state is kept, with what changed since, and go back to one.");
    const auto options = std::make_shared<BackupsOptions>();
    AddJsonOption(*command, options->format);
    AddHomeOption(*command, options->home);
    command->footer("A day's files are as they were before its first change. What was added, changed and "
                    "removed tells how they became those of the next day in the list, or the present ones. "
                    "An investment of another name or portfolio counts as removed and added.\n\n"
                    "Example: quorvan-cli backups");
    CLI::App* restore = command->add_subcommand(
        "restore", "Bring back the files of a day. The present ones are kept as one more backup first.");
    restore->add_option("DAY", options->day, "A day as `backups` lists it")->required();
    restore->add_option("FILE", options->files,
                        "Only these files, such as invest.db (default: all of the day)");
    AddHomeOption(*restore, options->home);
    restore->footer("What was there can be brought back the same way: `backups` lists it under the day and "
                    "time of the restore.\n\n"
                    "Example: quorvan-cli backups restore 2026-11-22");
    command->callback([command, options, &status] {
        status = WithOutput([&](TextOutput& output) {
            const std::string home = HomeFolder(options->home);
            if (const std::string wrong = ToolFolder(home).WhyNotThere(); !wrong.empty())
                return Fail(wrong);
            return (command->get_subcommands().empty() ? ListBackups : RestoreDay)(*options, home, output);
        });
    });
}
