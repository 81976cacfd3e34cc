#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <sys/types.h>

// Small files read and written as a whole: a reader finds the old content or the new one, never a part.

// Reads the regular file at `path` into `content`. False, with `content` empty, when it cannot be read, is no
// regular file (a pipe would hang the caller) or is longer than `maxBytes`; errno says why (EFBIG for the
// last).
[[nodiscard]] bool ReadWholeFile(const std::string& path, std::string& content, std::size_t maxBytes);

enum class ExistingFile { Replace, Keep };

// Writes `content` to `temporaryPath`, which must lie in the folder of `path` and is replaced when it exists,
// flushes it to the disk and moves it to `path`. Should anything fail, or the program be killed at any
// moment, `path` is what it was; a temporary that this call began is removed unless the program was killed.
// The new file gets exactly the permissions `mode`. With ExistingFile::Keep an existing `path` is never
// replaced, not even one that appears meanwhile: the call fails with EEXIST. True on success; otherwise errno
// says why.
[[nodiscard]] bool WriteWholeFile(const std::string& path, const std::string& temporaryPath,
                                  std::string_view content, mode_t mode, ExistingFile existing);

// Renames `from` to `to`, which must not exist, not even as a link that leads nowhere: EEXIST then. True on
// success; otherwise errno says why.
[[nodiscard]] bool MoveWithoutReplacing(const std::string& from, const std::string& to);
