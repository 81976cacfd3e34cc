#include "tools/ReportCommand.h"

#include <CLI/CLI.hpp>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <memory>

#include "db/Database.h"
#include "platform/PrintJob.h"
#include "print/Report.h"
#include "tools/HomeFolder.h"
#include "tools/OffscreenApplication.h"

namespace {

constexpr float Margin = 36; // half an inch, which any printer can print within

struct ReportOptions {
    std::string home;
    std::string portfolio;
    std::string output;
};

// Returns what came of it, and in `error` the errno number of a file that cannot be written.
ReportResult WriteReport(const ReportOptions& options, DATABASE& investments, int& error) {
    const OffscreenApplication application;
    BMessage settings;
    settings.AddString("output file", options.output.c_str());
    for (const char* name : {"left margin", "top margin", "right margin", "bottom margin"})
        settings.AddFloat(name, Margin);
    BPrintJob job("Quorvan");
    job.SetSettings(&settings);
    const ReportResult result = PrintReport(job, nullptr, options.portfolio.c_str(), investments);
    error = errno;
    return result;
}

int RunReport(ReportOptions& options) {
    if (options.home.empty())
        options.home = DefaultHomeFolder();
    const auto investments = OpenInvestments(options.home, options.portfolio, std::cerr);
    if (!investments)
        return 1;
    int error = 0;
    const ReportResult result = WriteReport(options, *investments, error);
    if (result == ReportResult::NotRead)
        std::cerr << "quorvan-cli: the investments in " << options.home << " could not all be read\n";
    else if (result != ReportResult::Printed)
        std::cerr << "quorvan-cli: " << options.output << " cannot be written: " << std::strerror(error)
                  << '\n';
    return result == ReportResult::Printed ? 0 : 1;
}

} // namespace

void AddReportCommand(CLI::App& application, int& status) {
    CLI::App* command =
        application.add_subcommand("report", "Write a portfolio's printed report into a PDF file.");
    const auto options = std::make_shared<ReportOptions>();
    command->add_option("PORTFOLIO", options->portfolio, "The portfolio's name")->required();
    command->add_option("-o,--output", options->output, "The PDF file; replaced where it exists")
        ->required()
        ->type_name("FILE");
    command
        ->add_option("--home", options->home,
                     "Quorvan's folder (default: that of quorvan-cli when it holds an "
                     "invest.db, else ~/Quorvan)")
        ->type_name("FOLDER");
    command->callback([options, &status] { status = RunReport(*options); });
}
