#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "app/NorvelApp.h"

namespace {

constexpr int WrongCommandLine = 2;

int AnswerArguments(const char* first) {
    if (std::strcmp(first, "--version") == 0)
        return std::puts("quorvan " QUORVAN_VERSION) < 0;
    const bool asked = std::strcmp(first, "--help") == 0;
    std::fputs(
        "Usage: quorvan\n\nShows the portfolios of the folder that the program lies in. Its help is in "
        "help/Quorvan.html there;\nquorvan-cli beside it works at the shell.\n",
        asked ? stdout : stderr);
    return asked ? 0 : WrongCommandLine;
}

// Without one the toolkit would end the program with a crash report.
bool HasDisplay() {
    for (const char* name : {"DISPLAY", "WAYLAND_DISPLAY", "QT_QPA_PLATFORM"}) {
        const char* value = std::getenv(name);
        if (value && *value != '\0')
            return true;
    }
    return false;
}

} // namespace

int main(int argc, char** argv) {
    if (argc > 1)
        return AnswerArguments(argv[1]);
    if (!HasDisplay()) {
        std::fputs("quorvan: there is no display to show a window on\n", stderr);
        return 1;
    }
    // A file-size limit shall be a failed write like any other, not a sudden end.
    std::signal(SIGXFSZ, SIG_IGN);
    const auto application = std::make_unique<NorvelApp>();
    application->Run();
    return application->ExitStatus();
}
