#pragma once

#include <string>

// What a person is told when a data file or the network lets a command down, in a window's alert or at a
// shell.

inline constexpr const char* NotSavedText =
    "The change could not be saved! Is the disk full, or the file protected?";
inline constexpr const char* NotConnectedText =
    "No Internet connection found!\nPlease establish your connection and try again.";

// A record could not be read.
[[nodiscard]] inline std::string NotReadText(const char* what = "An investment") {
    return std::string(what) + " could not be read from its file!";
}

// A quote server's certificate was refused.
[[nodiscard]] inline std::string NotTrustedText(const std::string& host) {
    return "The server " + host +
           " could not be trusted: its certificate was refused, and it was not asked for a price.\nIs the "
           "name in Quorvan.cfg right, and the date of this computer?";
}
