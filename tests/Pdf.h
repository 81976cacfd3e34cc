#pragma once

#include <algorithm>
#include <sstream>
#include <vector>

#include "Shell.h"

// PDF files read back with a PDF reader's programs.

// A word on the page, in points from the sheet's left top.
struct PdfWord {
    std::string text;
    float left = -1, top = -1, right = -1, bottom = -1;
};

// The words of the first page, as they follow each other in the file.
inline std::vector<PdfWord> PdfWords(const std::string& file) {
    std::istringstream list(Output("pdftotext -l 1 -bbox " + file + R"( - | sed -n 's/"//g
        s/.*<word xMin=\(.*\) yMin=\(.*\) xMax=\(.*\) yMax=\(.*\)>\(.*\)<.*/\1 \2 \3 \4 \5/p')"));
    std::vector<PdfWord> words;
    for (PdfWord word; list >> word.left >> word.top >> word.right >> word.bottom >> word.text;)
        words.push_back(word);
    return words;
}
// The first such word; one at -1 when there is none.
inline PdfWord FindWord(const std::vector<PdfWord>& words, const std::string& text) {
    const auto found = std::ranges::find(words, text, &PdfWord::text);
    return found == words.end() ? PdfWord() : *found;
}

inline int PdfPages(const std::string& file) {
    return std::atoi(Output("pdfinfo " + file + " | sed -n 's/^Pages: *//p'").c_str());
}
