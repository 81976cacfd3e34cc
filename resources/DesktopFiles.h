#pragma once

#include <string_view>

// What a desktop shows of the program, byte for byte as it lies in resources/icons/ and resources/desktop/.

// The program's name among a desktop's programs: the stem of its desktop entry, icon and metadata files. Each
// of the three files names it in its text.
inline constexpr const char* DesktopId = "org.quorvan.quorvan";

// The icon, an SVG picture. The texts live as long as the program.
[[nodiscard]] std::string_view ProgramIcon();
// The desktop entry; its Exec and TryExec name no folder yet.
[[nodiscard]] std::string_view DesktopEntryTemplate();
// AppStream metadata.
[[nodiscard]] std::string_view ProgramMetainfo();
