#pragma once

#include <cstddef>

// The program's paths are kept in buffers of this size: 127 bytes and a NUL.
inline constexpr std::size_t PathBufferSize = 128;

// Splits `path` into the text before its last "/" (`dir`), the text between that and the last "." after it
// (`fname`) and the text after that "." (`ext`). Separators are not included, and a part that is not there is
// empty; so is the directory of a file in the root. `drive` is never written. Each result must hold
// PathBufferSize bytes: of a path that does not fit that size itself all three are empty.
void _splitpath(const char* path, char* drive, char* dir, char* fname, char* ext);

// Joins "dir/fname", or "dir/fname.ext" when `ext` is not empty, into the PathBufferSize bytes at `out`;
// `drive` is ignored. A path that does not fit leaves `out` empty: a cut path would name another file.
void _makepath(char* out, const char* drive, const char* dir, const char* fname, const char* ext);
