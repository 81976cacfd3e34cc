#include "tools/Commands.h"

#include <CLI/CLI.hpp>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <pwd.h>
#include <unistd.h>

#include "app/model/PortfolioRules.h"
#include "db/Database.h"

namespace fs = std::filesystem;

namespace {

fs::path PersonsFolder() {
    if (const char* home = std::getenv("HOME"); home && *home != '\0')
        return home;
    const passwd* person = getpwuid(getuid());
    return person ? person->pw_dir : ".";
}

std::unique_ptr<DATABASE> OpenFile(const std::string& folder, const char* name, bool (*holds)(DATABASE&)) {
    const std::string path = (fs::path(folder) / name).string();
    auto database = std::make_unique<DATABASE>(path.c_str());
    if (database->IsOpen() && holds(*database))
        return database;
    Fail(path + (database->IsOpen() ? " has other columns than Quorvan's" : " cannot be opened"));
    return nullptr;
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
    command.add_option("-o,--output", options.output, outputHelp)->required()->type_name("FILE");
}

CLI::Option* AddHomeOption(CLI::App& command, std::string& home) {
    return command
        .add_option("--home", home,
                    "Quorvan's folder (default: that of quorvan-cli when it holds an invest.db, else "
                    "~/Quorvan)")
        ->type_name("FOLDER");
}

fs::path OwnPath() {
    std::error_code error;
    return fs::read_symlink("/proc/self/exe", error);
}

std::string HomeFolder(const std::string& named) {
    if (!named.empty())
        return named;
    const fs::path own = OwnPath().parent_path();
    std::error_code error;
    if (!own.empty() && fs::is_regular_file(own / "invest.db", error))
        return own.string();
    return (PersonsFolder() / "Quorvan").string();
}

std::unique_ptr<DATABASE> OpenInvestments(PortfolioOptions& options) {
    options.home = HomeFolder(options.home);
    const auto portfolios = OpenFile(options.home, "portfol.db", HoldsPortfolios);
    if (!portfolios)
        return nullptr;
    const long count = SelectPortfolios(*portfolios, options.portfolio.c_str());
    const void* found = count > 0 ? portfolios->QueryGetFirst(nullptr) : nullptr;
    if (!found) {
        Fail(count == 0 ? "there is no portfolio \"" + options.portfolio + "\" in " + options.home
                        : "the portfolios in " + options.home + " could not all be read");
        return nullptr;
    }
    PORTFOLIO_DATA record;
    std::memcpy(&record, found, sizeof record);
    options.portfolio = FieldText(record.Name);
    return OpenFile(options.home, "invest.db", HoldsInvestments);
}

int Fail(const std::string& sentence, int status) {
    std::cerr << "quorvan-cli: " << sentence << '\n';
    return status;
}

OffscreenApplication::OffscreenApplication() : BApplication(PrepareToolkit()) {}
