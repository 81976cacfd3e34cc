#pragma once

#include <span>
#include <string_view>

struct EmbeddedFile {
    const char* name;
    std::string_view content;
};

// The files of a new folder, byte for byte as they lie in resources/. They live as long as the program.
[[nodiscard]] std::string_view FirstSettings();
[[nodiscard]] std::string_view FirstQuoteSources();
[[nodiscard]] std::string_view HelpDocument();
// What lies in the folder help/pictures.
[[nodiscard]] std::span<const EmbeddedFile> HelpPictures();
