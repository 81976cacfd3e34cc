#include "util/Strings.h"

#include <cstring>

#include "util/LoweredText.h"

namespace {

bool IsAscii(char c) {
    return static_cast<unsigned char>(c) < FirstNonAscii;
}

char Lowered(char c) {
    return static_cast<char>(LoweredByte(static_cast<unsigned char>(c)));
}

char Raised(char c) {
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}

} // namespace

void ReplaceCharacter(char* text, char from, char to) {
    // A NUL is the text's end, not one of its characters.
    for (; *text != '\0'; ++text)
        if (*text == from)
            *text = to;
}

void Trim(char* text) {
    std::size_t length = std::strlen(text);
    while (length > 0 && (text[length - 1] == ' ' || text[length - 1] == '\n'))
        --length;
    text[length] = '\0';
}

void strlwr(char* text) {
    for (; *text != '\0' && IsAscii(*text); ++text)
        *text = Lowered(*text);
}

void strupr(char* text) {
    for (; *text != '\0' && IsAscii(*text); ++text)
        *text = Raised(*text);
}

int strcmpi(const char* a, const char* b) {
    // While the texts agree, both reach their first byte of 128 or above together: one flag serves both.
    bool fold = true;
    for (;; ++a, ++b) {
        fold = fold && IsAscii(*a) && IsAscii(*b);
        const auto x = static_cast<unsigned char>(fold ? Lowered(*a) : *a);
        const auto y = static_cast<unsigned char>(fold ? Lowered(*b) : *b);
        if (x != y)
            return x < y ? -1 : 1;
        if (x == 0)
            return 0;
    }
}
