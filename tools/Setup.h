#pragma once

#include <iosfwd>
#include <string>

struct SetupOptions {
    std::string folder;         // made where it does not exist
    std::string program;        // the executable to copy; empty when none was found
    std::string companion;      // quorvan-cli, to copy likewise
    bool sample = false;        // fill new data files with sample portfolios
    bool updateProgram = false; // replace a program and a help in the folder that differ
    bool desktop = false;       // put the program among the desktop's, below dataFolder
    std::string dataFolder;     // see PersonalDataFolder; empty when the person has none
};

// The longest folder path, so that every path that the program makes in it fits PathBufferSize.
inline constexpr std::size_t MaxFolderLength = 108;

// Makes a folder that the program runs from: the three data files, the settings, the quote sources, the
// programs and the help. A file that exists is never changed (but for program and help when
// options.updateProgram is set), and a new one comes into being complete or not at all. What is made is the
// person's alone, whatever the mask; what is there keeps its permissions. Each file gets a line
// on `output` that tells what was done, each failure a sentence on `errors`; one file's failure does not stop
// the others, except that no desktop gets a program whose folder is not whole. The sample goes into data
// files of its own making only: with a portfol.db or invest.db that exists there is none. A folder that
// another program uses is left as it is. Returns 0 when every file is there, else 1.
[[nodiscard]] int RunSetup(const SetupOptions& options, std::ostream& output, std::ostream& errors);

// Takes the folder's program out of the desktop's again; the folder, which need not be there any more, stays
// as it is. Returns 0 when nothing failed, else 1.
[[nodiscard]] int RunDesktopRemoval(const SetupOptions& options, std::ostream& output, std::ostream& errors);
