#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "util/FolderLock.h"
#include "util/Utf8.h"

// Parts of the sentences that quorvan-cli says.

inline constexpr const char* ToolName = "quorvan-cli"; // as a folder's lock names it

[[nodiscard]] inline std::string Counted(std::int64_t count, const char* thing) {
    return std::to_string(count) + " " + thing + (count == 1 ? "" : "s");
}

// `what` are the investments or the portfolios.
[[nodiscard]] inline std::string NotAllRead(const char* what, const std::string& folder) {
    return std::string("the ") + what + " in " + folder + " could not all be read";
}

// A text of any bytes between quotation marks.
[[nodiscard]] inline std::string Quoted(std::string_view text) {
    std::string quoted = "'";
    AppendEscaped(quoted, text);
    return quoted + "'";
}

// What follows the folder's name when its lock was not given since somebody else has it; else empty.
[[nodiscard]] inline std::string UseOf(const FolderLock& lock, const std::string& folder,
                                       FolderLock::Outcome outcome) {
    if (outcome == FolderLock::Outcome::Held)
        return " is in use by " + DescribeHolder(lock.Holder());
    if (outcome == FolderLock::Outcome::Doubtful)
        return " was in use by " + DescribeHolder(lock.Holder()) + "; once that program has ended, delete " +
               folder + "/" + FolderLock::FileName;
    return {};
}
