#include "tools/OffscreenApplication.h"

#include <cstdlib>

namespace {

// The toolkit reads its environment as the application is made.
const char* Prepare() {
    setenv("QT_QPA_PLATFORM", "offscreen", 1);
    setenv("QT_LOGGING_RULES", "*.warning=false", 1); // what the toolkit misses of a desktop is no news
    return "application/x-vnd.Palandri-Quorvan-cli";
}

} // namespace

OffscreenApplication::OffscreenApplication() : BApplication(Prepare()) {}
