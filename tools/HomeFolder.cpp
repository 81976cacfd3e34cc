#include "tools/HomeFolder.h"

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <ostream>
#include <pwd.h>
#include <unistd.h>

#include "app/model/PortfolioRules.h"
#include "db/Database.h"

namespace {

std::filesystem::path OwnFolder() {
    std::error_code error;
    return std::filesystem::read_symlink("/proc/self/exe", error).parent_path();
}

std::filesystem::path PersonsFolder() {
    if (const char* home = std::getenv("HOME"); home && *home != '\0')
        return home;
    const passwd* person = getpwuid(getuid());
    return person ? person->pw_dir : ".";
}

std::unique_ptr<DATABASE> OpenFile(const std::string& folder, const char* name, bool (*holds)(DATABASE&),
                                   std::ostream& errors) {
    const std::string path = (std::filesystem::path(folder) / name).string();
    auto database = std::make_unique<DATABASE>(path.c_str());
    if (database->IsOpen() && holds(*database))
        return database;
    errors << "quorvan-cli: " << path
           << (database->IsOpen() ? " has other columns than Quorvan's\n" : " cannot be opened\n");
    return nullptr;
}

} // namespace

std::string DefaultHomeFolder() {
    const std::filesystem::path own = OwnFolder();
    std::error_code error;
    if (!own.empty() && std::filesystem::is_regular_file(own / "invest.db", error))
        return own.string();
    return (PersonsFolder() / "Quorvan").string();
}

std::unique_ptr<DATABASE> OpenInvestments(const std::string& homeFolder, std::string& portfolio,
                                          std::ostream& errors) {
    const auto portfolios = OpenFile(homeFolder, "portfol.db", HoldsPortfolios, errors);
    if (!portfolios)
        return nullptr;
    const long count = SelectPortfolios(*portfolios, portfolio.c_str());
    const void* found = count > 0 ? portfolios->QueryGetFirst(nullptr) : nullptr;
    if (!found) {
        errors << "quorvan-cli: ";
        if (count == 0)
            errors << "there is no portfolio \"" << portfolio << "\" in " << homeFolder << '\n';
        else
            errors << "the portfolios in " << homeFolder << " could not all be read\n";
        return nullptr;
    }
    PORTFOLIO_DATA record;
    std::memcpy(&record, found, sizeof record);
    portfolio = FieldText(record.Name);
    return OpenFile(homeFolder, "invest.db", HoldsInvestments, errors);
}
