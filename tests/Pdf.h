#pragma once

#include <algorithm>
#include <cstdio>
#include <string>
#include <vector>

#include "Shell.h"

// PDF files read back with a PDF reader's programs.

// A word on the page, in points from the sheet's left top.
struct PdfWord {
    std::string text;
    float left = -1, top = -1, right = -1, bottom = -1;
};

// The words of a page, counted from 1, as they follow each other in the file.
inline std::vector<PdfWord> PdfWords(const std::string& file, int page = 1) {
    const std::string number = std::to_string(page);
    const std::string list = Output("pdftotext -f " + number + " -l " + number + " -bbox " + file + " -");
    std::vector<PdfWord> words;
    std::size_t place = 0;
    while ((place = list.find("<word", place)) != std::string::npos) {
        PdfWord& word = words.emplace_back();
        std::sscanf(list.c_str() + place, "<word xMin=\"%f\" yMin=\"%f\" xMax=\"%f\" yMax=\"%f\"", &word.left,
                    &word.top, &word.right, &word.bottom);
        place = list.find('>', place) + 1;
        word.text = list.substr(place, list.find("</word>", place) - place);
    }
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
