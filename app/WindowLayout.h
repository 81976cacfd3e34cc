#pragma once

#include <vector>

#include "util/IniFile.h"

// What the settings file keeps of how the main window was left, besides the columns' widths.
inline constexpr const char* DisplaySection = "DISPLAY";
inline constexpr const char* PlaceKey = "WindowPlace"; // left, top, width and height
inline constexpr const char* OrderKey = "ColumnOrder"; // the columns' numbers from left to right
inline constexpr const char* SortKey = "SortKeys";     // columns, primary first; below 0: descending

// The whole numbers of an entry, with blanks between them. None when it holds anything else, or a number that
// no screen is large enough for.
[[nodiscard]] std::vector<int> ReadNumbers(const INI_FILEx& settings, const char* key);

// Without a settings file there is nowhere to keep them.
void WriteNumbers(const INI_FILEx& settings, const char* key, const std::vector<int>& numbers);
