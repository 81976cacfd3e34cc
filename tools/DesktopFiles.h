#pragma once

#include <iosfwd>
#include <optional>
#include <string>

// Where a person's own programs, icons and metadata lie: $XDG_DATA_HOME when that is an absolute path, else
// ~/.local/share. Empty when there is no home folder either.
[[nodiscard]] std::string PersonalDataFolder();

// The desktop entry that starts the executable `program`, an absolute path. Nothing when no desktop entry can
// name it: it holds a control character or bytes that are no UTF-8.
[[nodiscard]] std::optional<std::string> DesktopEntryFor(const std::string& program);

// Puts the desktop entry that starts `program`, the icon and the metadata below `dataFolder`, each complete
// or not at all. An entry that starts a program elsewhere is replaced; a file of one of these names that is
// not Quorvan's is left alone, which is a failure. Tells each file's fate on `output`, each failure in a
// sentence on `errors`. True when all three are there.
[[nodiscard]] bool InstallDesktopFiles(const std::string& program, const std::string& dataFolder,
                                       std::ostream& output, std::ostream& errors);

// Takes away what InstallDesktopFiles put there, unless the entry starts another program than `program`:
// then all stays, and `output` says so. Files that are not Quorvan's stay. True when nothing failed.
[[nodiscard]] bool RemoveDesktopFiles(const std::string& program, const std::string& dataFolder,
                                      std::ostream& output, std::ostream& errors);
