#pragma once

#include <string_view>

// The text files of a new folder, byte for byte as they lie in resources/. They live as long as the program.
[[nodiscard]] std::string_view FirstSettings();
[[nodiscard]] std::string_view FirstQuoteSources();
[[nodiscard]] std::string_view HelpDocument();
