#pragma once

#include <span>
#include <string_view>

class DATABASE;

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

// What a new folder's data files begin with. Each function appends its records to an open data file that has
// the columns of app/model/RecordLayouts.h, and is false when the engine refused one; GetLastError of the
// file then says why.

// The entries of the Type and Agent pick lists, which every folder gets.
[[nodiscard]] bool AppendPickLists(DATABASE& categories);

// Two portfolios to try the program with, and their investments: every risk, every price movement, stocks and
// funds and others, held for retirement or not, names with blanks and beyond ASCII. All names are made up.
[[nodiscard]] bool AppendSamplePortfolios(DATABASE& portfolios);
[[nodiscard]] bool AppendSampleInvestments(DATABASE& investments);
