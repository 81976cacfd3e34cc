#pragma once

#include <functional>
#include <memory>
#include <string>
#include <string_view>

#include "platform/Application.h"
#include "tools/TableWriter.h"
#include "tools/ToolFolder.h"

namespace CLI {
class App;
class Option;
} // namespace CLI

// The subcommands of quorvan-cli. Each function adds one to `application`. When the command line names it,
// parsing runs it and stores the process's exit status in `status`, which must live as long as the
// application.
void AddBackupsCommand(CLI::App& application, int& status);
void AddChartCommand(CLI::App& application, int& status);
void AddCheckCommand(CLI::App& application, int& status);
void AddDbCommand(CLI::App& application, int& status);
void AddExportCommand(CLI::App& application, int& status);
void AddImportCommand(CLI::App& application, int& status);
void AddListCommand(CLI::App& application, int& status);
void AddQuoteCommand(CLI::App& application, int& status);
void AddReportCommand(CLI::App& application, int& status);
void AddSetupCommand(CLI::App& application, int& status);
void AddUpdateCommand(CLI::App& application, int& status);

// What they share. Options must live as long as the application.

struct PortfolioOptions {
    std::string home;
    std::string portfolio;
    std::string output;
};

// Adds PORTFOLIO and --output, of which `outputHelp` tells.
void AddPortfolioOptions(CLI::App& command, PortfolioOptions& options, const char* outputHelp);
// Refuses an empty text, which a script gives for a name that it has not.
CLI::Option* RefuseEmpty(CLI::Option* option);
// Adds --home; `home` stays empty when it is not given.
CLI::Option* AddHomeOption(CLI::App& command, std::string& home);

// Adds --json, which makes `format` that.
CLI::Option* AddJsonOption(CLI::App& command, OutputFormat& format);

// The folder that --home named or else the usual one: that of quorvan-cli itself when it holds an invest.db,
// else "Quorvan" in the person's own folder.
[[nodiscard]] std::string HomeFolder(const std::string& named);

// The folder's Open, which tells the person what is wrong.
[[nodiscard]] std::unique_ptr<DATABASE> OpenOrFail(const ToolFolder& folder, const DataFileKind& file,
                                                   DataFileUse use);

// Opens the investment file of the portfolio, which must be listed in the portfolio file, for looking;
// `options` gets the folder that is used and the portfolio's name as it is written there. Null, with one
// sentence for the person, when a file cannot be read, there is no such portfolio, or not MayWriteOutput.
[[nodiscard]] std::unique_ptr<DATABASE> OpenInvestments(PortfolioOptions& options);

// Whether a command that uses the folder `home` may write the file that was asked for; else tells the person
// why not: the folder's data files, and what is open already, such as /dev/stdout, are not replaced.
[[nodiscard]] bool MayWriteOutput(const std::string& home, const std::string& path);
// Writes a file that was asked for, whole or not at all, and returns an exit status. One that exists keeps
// its permissions, and a link to it stays a link.
int WriteOutputFile(const std::string& path, std::string_view bytes);

// Lets `work` write to standard output, and returns its exit status or that of the writing.
int WithOutput(const std::function<int(TextOutput&)>& work);

// Writes the sentence for the person. Returns `status`.
int Fail(const std::string& sentence, int status = 1);

// An application for commands that draw and show nothing: it needs no display and does not even look for one.
// Made on the main thread, in place of a BApplication.
class OffscreenApplication : public BApplication {
  public:
    OffscreenApplication();
};
