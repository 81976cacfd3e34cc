#include <CLI/CLI.hpp>
#include <csignal>
#include <exception>

#include "tools/Commands.h"

namespace {

constexpr int WrongCommandLine = 2;

int Run(int argc, char** argv) {
    CLI::App application("Companion of the portfolio program Quorvan.", "quorvan-cli");
    application.set_version_flag("--version", "quorvan-cli " QUORVAN_VERSION);
    application.require_subcommand(1);
    int status = 0;
    AddListCommand(application, status);
    AddExportCommand(application, status);
    AddImportCommand(application, status);
    AddCheckCommand(application, status);
    AddDbCommand(application, status);
    AddSetupCommand(application, status);
    AddQuoteCommand(application, status);
    AddUpdateCommand(application, status);
    AddBackupsCommand(application, status);
    AddReportCommand(application, status);
    AddChartCommand(application, status);
    try {
        application.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return application.exit(error) == 0 ? 0 : WrongCommandLine;
    }
    return status;
}

} // namespace

// Exit status: 0 when all was done, 1 when something failed, 2 when the command line is wrong.
int main(int argc, char** argv) {
    // A file-size limit shall be a failed write with a sentence, not a sudden end.
    std::signal(SIGXFSZ, SIG_IGN);
    try {
        return Run(argc, argv);
    } catch (const std::exception& error) {
        return Fail(error.what());
    }
}
