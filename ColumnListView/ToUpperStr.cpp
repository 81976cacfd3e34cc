#include "ColumnListView/ToUpperStr.h"

#include <algorithm>
#include <cstring>

char* ToUpperStr(const char* text) {
    const std::size_t size = std::strlen(text) + 1;
    char* copy = new char[size];
    std::transform(text, text + size, copy,
                   [](char c) { return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c; });
    return copy;
}
