#include "util/Strings.h"

#include <system_error>

#include "util/CharacterBuffer.h"

namespace {

bool IsAscii(char c) {
    return static_cast<std::uint8_t>(c) < FirstNonAscii;
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
        *text = static_cast<char>(LoweredByte(static_cast<std::uint8_t>(*text)));
}

void strupr(char* text) {
    for (; *text != '\0' && IsAscii(*text); ++text)
        *text = Raised(*text);
}

std::string Lowered(std::string_view text) {
    std::string lowered(text);
    strlwr(lowered.data());
    return lowered;
}

int strcmpi(const char* a, const char* b) {
    return Lowered(a).compare(Lowered(b));
}

std::string Reason(int error) {
    return std::generic_category().message(error);
}

void _splitpath(const char* path, char* /*drive*/, char* dir, char* fname, char* ext) {
    std::string_view rest(path);
    *dir = *fname = *ext = '\0';
    if (rest.size() >= PathBufferSize)
        return;
    if (const auto slash = rest.rfind('/'); slash != std::string_view::npos) {
        CopyText(dir, PathBufferSize, rest.substr(0, slash));
        rest.remove_prefix(slash + 1);
    }
    if (const auto dot = rest.rfind('.'); dot != std::string_view::npos) {
        CopyText(ext, PathBufferSize, rest.substr(dot + 1));
        rest = rest.substr(0, dot);
    }
    CopyText(fname, PathBufferSize, rest);
}

void _makepath(char* out, const char* /*drive*/, const char* dir, const char* fname, const char* ext) {
    const char* dot = *ext != '\0' ? "." : "";
    if (!FormatInto(out, PathBufferSize, "%s/%s%s%s", dir, fname, dot, ext))
        *out = '\0';
}
