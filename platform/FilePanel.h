#pragma once

#include <string>
#include <vector>

// What a file can be saved as.
struct FileKind {
    const char* label;
    const char* extension; // such as ".png"
};

// Asks the person where to save something and waits. `proposed` is the name that is offered, with the
// extension of the first kind, in the folder chosen last or, at first, in the person's folder of pictures. Of
// a file that exists the person is asked whether to replace it. The path, whose extension may be another or
// missing; empty when the person cancels. Interface thread.
[[nodiscard]] std::string RunSavePanel(const char* title, const std::string& proposed,
                                       const std::vector<FileKind>& kinds);
