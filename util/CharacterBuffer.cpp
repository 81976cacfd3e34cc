#include "util/CharacterBuffer.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <cstring>

namespace {

bool IsContinuation(char byte) {
    return (static_cast<unsigned char>(byte) & 0xC0U) == 0x80U;
}

// How many bytes the character that begins with `lead` takes; 1 for a byte that begins none.
std::size_t CharacterLength(char lead) {
    const auto byte = static_cast<unsigned char>(lead);
    if (byte >= 0xF0U && byte <= 0xF4U)
        return 4;
    if (byte >= 0xE0U)
        return byte <= 0xEFU ? 3 : 1;
    return byte >= 0xC2U ? 2 : 1;
}

} // namespace

std::string_view CutToBytes(std::string_view text, std::size_t maxBytes) {
    if (text.size() <= maxBytes)
        return text;
    // Only a character that began at most three bytes before the cut can reach over it.
    std::size_t lead = maxBytes;
    while (lead > 0 && maxBytes - lead < 3 && IsContinuation(text[lead]))
        --lead;
    if (lead + CharacterLength(text[lead]) > maxBytes && !IsContinuation(text[lead]))
        return text.substr(0, lead);
    return text.substr(0, maxBytes);
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
    if (length < 0) {
        target[0] = '\0';
        return false;
    }
    if (static_cast<std::size_t>(length) < size)
        return true;
    // The text that was cut off is not known any more, so a character that the cut may have split is judged
    // by what is left of it: a lead byte that wants more bytes than follow it.
    std::size_t lead = size - 1;
    while (lead > 0 && size - 1 - lead < 3 && IsContinuation(target[lead - 1]))
        --lead;
    if (lead > 0 && lead - 1 + CharacterLength(target[lead - 1]) > size - 1)
        target[lead - 1] = '\0';
    return false;
}
