#include "tools/ReportCommand.h"

#include <CLI/CLI.hpp>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "db/Database.h"
#include "platform/PrintJob.h"
#include "print/Report.h"
#include "tools/HomeFolder.h"
#include "tools/OffscreenApplication.h"

namespace {

struct ReportOptions {
    std::string home;
    std::string portfolio;
    std::string output;
    std::string page = "A4";
    bool landscape = false;
};

// Returns what came of it, and in `error` the errno number of a file that cannot be written.
ReportResult WriteReport(const ReportOptions& options, DATABASE& investments, int& error) {
    const OffscreenApplication application;
    BMessage settings = FirstPrintSettings();
    settings.AddString("output file", options.output.c_str());
    settings.AddString("page size", options.page.c_str());
    settings.AddBool("landscape", options.landscape);
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
    const std::vector<std::string> pages = {"A3", "A4",     "A5",    "A6",        "B4",
                                            "B5", "Letter", "Legal", "Executive", "Tabloid"};
    command->add_option("--page", options->page, "The paper's size (default: A4)")
        ->transform(CLI::IsMember(pages, CLI::ignore_case))
        ->type_name("NAME");
    command->add_flag("--landscape", options->landscape, "The paper lies on its long side");
    command
        ->add_option("--home", options->home,
                     "Quorvan's folder (default: that of quorvan-cli when it holds an "
                     "invest.db, else ~/Quorvan)")
        ->type_name("FOLDER");
    command->callback([options, &status] { status = RunReport(*options); });
}
