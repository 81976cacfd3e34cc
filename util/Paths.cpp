#include "util/Paths.h"

#include <string_view>

#include "util/CharacterBuffer.h"

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
