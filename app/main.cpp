#include <memory>

#include "app/NorvelApp.h"

int main() {
    const auto application = std::make_unique<NorvelApp>();
    application->Run();
    return application->ExitStatus();
}
