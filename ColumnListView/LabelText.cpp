#include "ColumnListView/LabelText.h"

#include <algorithm>
#include <cstring>

std::string TruncatedLabel(std::string_view text, float width,
                           const std::function<float(const std::string&)>& measure) {
    std::string shown(text);
    while (!text.empty() && measure(shown) > width) {
        std::size_t cut = text.size() - 1;
        while (cut > 0 && (static_cast<unsigned char>(text[cut]) & 0xC0U) == 0x80U)
            --cut;
        text = text.substr(0, cut);
        shown = std::string(text) + "...";
    }
    return shown;
}

char* ToUpperStr(const char* text) {
    const std::size_t size = std::strlen(text) + 1;
    char* copy = new char[size];
    std::transform(text, text + size, copy,
                   [](char c) { return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c; });
    return copy;
}
