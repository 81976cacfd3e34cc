#pragma once

#include <string>

// Finds out whether files can be made and filled in the folder now, by doing it: a temporary file is made,
// loses its name at once, and takes some bytes. 0, or the errno number that says why not: EROFS, EACCES,
// ENOSPC and the like. A folder that takes them may still refuse more.
[[nodiscard]] int TryWritingIn(const std::string& folder);
