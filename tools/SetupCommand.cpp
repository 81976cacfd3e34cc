#include <CLI/CLI.hpp>
#include <filesystem>
#include <iostream>
#include <memory>

#include "tools/Commands.h"
#include "tools/DesktopFiles.h"
#include "tools/Setup.h"

namespace {

// The program lies beside quorvan-cli, above its bin folder, or in its own folder of the same build. Empty
// when it is in none of them.
std::string FindProgram() {
    std::error_code error;
    const auto own = std::filesystem::path(BApplication::ExecutablePath()).parent_path();
    for (const char* place : {"quorvan", "../quorvan", "../app/quorvan"}) {
        const std::filesystem::path candidate = (own / place).lexically_normal();
        if (std::filesystem::is_regular_file(candidate, error))
            return candidate.string();
    }
    return {};
}

} // namespace

void AddSetupCommand(CLI::App& application, int& status) {
    CLI::App* command = application.add_subcommand(
        "setup", "Make a folder that Quorvan runs from. Files that exist are never changed.");
    const auto options = std::make_shared<SetupOptions>();
    command->add_option("FOLDER", options->folder, "The folder; made where it does not exist")->required();
    command->add_flag("--sample", options->sample, "Fill new data files with two sample portfolios");
    command->add_option("--program", options->program,
                        "The quorvan executable to copy (default: the one found beside quorvan-cli)");
    command->add_flag("--update-program", options->updateProgram,
                      "Replace the folder's program and help when they are another version's");
    CLI::Option* desktop = command->add_flag(
        "--desktop", options->desktop,
        "Put the folder's program among the desktop's, with its icon (for you, not for everybody)");
    const auto remove = std::make_shared<bool>(false);
    command
        ->add_flag("--remove-desktop", *remove,
                   "Take the folder's program out of the desktop's; do nothing else")
        ->excludes(desktop);
    command->callback([options, remove, &status] {
        if (options->program.empty())
            options->program = FindProgram();
        options->companion = BApplication::ExecutablePath();
        options->dataFolder = PersonalDataFolder();
        status = *remove ? RunDesktopRemoval(*options, std::cout, std::cerr)
                         : RunSetup(*options, std::cout, std::cerr);
        std::cout.flush();
    });
}
