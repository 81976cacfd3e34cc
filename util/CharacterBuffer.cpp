#include "util/CharacterBuffer.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <string>

#include "util/Utf8.h"

std::string_view CutToBytes(std::string_view text, std::size_t maxBytes) {
    if (text.size() <= maxBytes)
        return text;
    // Only a character that began at most three bytes before the cut can reach over it.
    std::size_t lead = maxBytes;
    while (lead > 0 && maxBytes - lead < 3 && IsContinuation(text[lead]))
        --lead;
    const bool reachesOver = lead + DecodeFirst(text.substr(lead)).length > maxBytes;
    return text.substr(0, reachesOver ? lead : maxBytes);
}

bool CopyText(char* target, std::size_t size, std::string_view text) {
    if (size == 0)
        return false;
    const std::string_view wanted = text.substr(0, text.find('\0'));
    const std::string_view kept = CutToBytes(wanted, size - 1);
    if (!kept.empty())
        std::memmove(target, kept.data(), kept.size());
    target[kept.size()] = '\0';
    return kept.size() == wanted.size();
}

bool FormatInto(char* target, std::size_t size, const char* format, ...) {
    if (size == 0)
        return false;
    va_list arguments;
    va_start(arguments, format);
    const int length = std::vsnprintf(target, size, format, arguments);
    va_end(arguments);
    if (length >= 0 && static_cast<std::size_t>(length) < size)
        return true;
    // Once more in full, so that it can be cut between characters.
    std::string whole(static_cast<std::size_t>(std::max(length, 0)) + 1, '\0');
    va_start(arguments, format);
    std::vsnprintf(whole.data(), whole.size(), format, arguments);
    va_end(arguments);
    CopyText(target, size, whole);
    return false;
}
