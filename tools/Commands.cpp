#include "tools/Commands.h"

#include <CLI/CLI.hpp>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <pwd.h>
#include <unistd.h>

#include "app/model/DataFolders.h"
#include "db/Database.h"
#include "util/File.h"
#include "util/Strings.h"

namespace fs = std::filesystem;

namespace {

fs::path PersonsFolder() {
    if (const char* home = std::getenv("HOME"); home && *home != '\0')
        return home;
    const passwd* person = getpwuid(getuid());
    return person ? person->pw_dir : ".";
}

// The toolkit reads its environment as the application is made.
const char* PrepareToolkit() {
    setenv("QT_QPA_PLATFORM", "offscreen", 1);
    setenv("QT_LOGGING_RULES", "*.warning=false", 1); // what the toolkit misses of a desktop is no news
    return "application/x-vnd.Palandri-Quorvan-cli";
}

} // namespace

void AddPortfolioOptions(CLI::App& command, PortfolioOptions& options, const char* outputHelp) {
    command.add_option("PORTFOLIO", options.portfolio, "The portfolio's name")->required();
    RefuseEmpty(command.add_option("-o,--output", options.output, outputHelp))->required()->type_name("FILE");
}

CLI::Option* RefuseEmpty(CLI::Option* option) {
    return option->check([](const std::string& text) { return text.empty() ? "it is empty" : ""; });
}

CLI::Option* AddHomeOption(CLI::App& command, std::string& home) {
    return command
        .add_option("--home", home,
                    "Quorvan's folder (default: that of quorvan-cli when it holds an invest.db, else "
                    "~/Quorvan)")
        ->type_name("FOLDER");
}

CLI::Option* AddJsonOption(CLI::App& command, OutputFormat& format) {
    return command.add_flag_callback(
        "--json", [&format] { format = OutputFormat::Json; }, "Write an object on each line, for programs");
}

std::string HomeFolder(const std::string& named) {
    if (!named.empty())
        return named;
    const fs::path own = fs::path(BApplication::ExecutablePath()).parent_path();
    std::error_code error;
    if (!own.empty() && fs::is_regular_file(own / "invest.db", error))
        return own.string();
    return (PersonsFolder() / "Quorvan").string();
}

std::unique_ptr<DATABASE> OpenOrFail(const ToolFolder& folder, const DataFileKind& file, DataFileUse use) {
    std::string wrong;
    std::unique_ptr<DATABASE> database = folder.Open(file, use, wrong);
    if (!wrong.empty())
        Fail(wrong);
    return database;
}

std::unique_ptr<DATABASE> OpenInvestments(PortfolioOptions& options) {
    options.home = HomeFolder(options.home);
    if (!MayWriteOutput(options.home, options.output))
        return nullptr;
    const ToolFolder folder(options.home);
    const auto portfolios = OpenOrFail(folder, PortfolioFile, DataFileUse::Look);
    if (!portfolios)
        return nullptr;
    const std::string wrong =
        folder.FindPortfolio(*portfolios, options.portfolio, ToolFolder::Letters::AnyCase);
    if (!wrong.empty()) {
        Fail(wrong);
        return nullptr;
    }
    return OpenOrFail(folder, InvestmentFile, DataFileUse::Look);
}

bool MayWriteOutput(const std::string& home, const std::string& path) {
    const std::string real = RealPath(path);
    std::string wrong;
    if (real.starts_with("/proc/"))
        wrong = " stands for what is open already, which is not replaced";
    for (const char* name : {PortfolioFile.name, InvestmentFile.name, CategoryFile.name, "cut.db"}) {
        const fs::path own = fs::path(home) / name;
        std::error_code missing;
        if (real == RealPath(own.string()) || fs::equivalent(real, own, missing))
            wrong = std::string(" is the folder's own ") + name + ", which is not replaced";
    }
    if (!wrong.empty())
        Fail(path + wrong);
    return wrong.empty();
}

int WriteOutputFile(const std::string& path, std::string_view bytes) {
    const int error = WriteNamedFile(path, bytes);
    return error == 0 ? 0 : Fail(path + " cannot be written: " + Reason(error));
}

int Fail(const std::string& sentence, int status) {
    std::cerr << "quorvan-cli: " << sentence << '\n';
    return status;
}

int WithOutput(const std::function<int(TextOutput&)>& work) {
    // A reader that goes away shall not end the program in the middle of a change.
    std::signal(SIGPIPE, SIG_IGN);
    TextOutput output(STDOUT_FILENO);
    const int status = work(output);
    return FinishOutput(output, std::cerr, status);
}

OffscreenApplication::OffscreenApplication() : BApplication(PrepareToolkit()) {}
