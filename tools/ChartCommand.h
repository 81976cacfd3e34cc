#pragma once

namespace CLI {
class App;
}

// Adds the subcommand `chart` to `application`. When the command line names it, parsing runs it and stores
// the process's exit status in `status`, which must live as long as the application.
void AddChartCommand(CLI::App& application, int& status);
