#pragma once

#include <array>
#include <cstdio>
#include <memory>
#include <string>
#include <vector>

// PDF files read back with a PDF reader's programs.

// What a command prints.
inline std::string Output(const std::string& command) {
    const std::unique_ptr<FILE, int (*)(FILE*)> pipe(popen(command.c_str(), "r"), pclose);
    std::string output;
    std::array<char, 4096> part;
    while (pipe && std::fgets(part.data(), part.size(), pipe.get()))
        output += part.data();
    return output;
}

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
        PdfWord word;
        std::sscanf(list.c_str() + place, "<word xMin=\"%f\" yMin=\"%f\" xMax=\"%f\" yMax=\"%f\"", &word.left,
                    &word.top, &word.right, &word.bottom);
        place = list.find('>', place) + 1;
        word.text = list.substr(place, list.find("</word>", place) - place);
        words.push_back(word);
    }
    return words;
}

// The first such word; one at -1 when there is none.
inline PdfWord FindWord(const std::vector<PdfWord>& words, const std::string& text) {
    for (const PdfWord& word : words)
        if (word.text == text)
            return word;
    return {};
}

inline int PdfPages(const std::string& file) {
    const std::string info = Output("pdfinfo " + file);
    const std::size_t place = info.find("Pages:");
    return place == std::string::npos ? 0 : std::atoi(info.c_str() + place + 6);
}
