#include <CLI/CLI.hpp>
#include <cerrno>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "db/Database.h"
#include "platform/PrintJob.h"
#include "print/Report.h"
#include "tools/Commands.h"
#include "tools/Sentences.h"
#include "util/Strings.h"

namespace {

struct ReportOptions : PortfolioOptions {
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
    BPrintJob job(ReportJobName);
    job.SetSettings(&settings);
    const ReportResult result = PrintReport(job, nullptr, options.portfolio.c_str(), investments);
    error = errno;
    return result;
}

int RunReport(ReportOptions& options) {
    const auto investments = OpenInvestments(options);
    if (!investments)
        return 1;
    int error = 0;
    const ReportResult result = WriteReport(options, *investments, error);
    if (result == ReportResult::NotRead)
        return Fail(NotAllRead("investments", options.home));
    return result == ReportResult::Printed ? 0
                                           : Fail(options.output + " cannot be written: " + Reason(error));
}

} // namespace

void AddReportCommand(CLI::App& application, int& status) {
    CLI::App* command =
        application.add_subcommand("report", "Write a portfolio's printed report into a PDF file.");
    const auto options = std::make_shared<ReportOptions>();
    AddPortfolioOptions(*command, *options, "The PDF file; replaced where it exists");
    const std::vector<std::string> pages = {"A3", "A4",     "A5",    "A6",        "B4",
                                            "B5", "Letter", "Legal", "Executive", "Tabloid"};
    command->add_option("--page", options->page, "The paper's size (default: A4)")
        ->transform(CLI::IsMember(pages, CLI::ignore_case))
        ->type_name("NAME");
    command->add_flag("--landscape", options->landscape, "The paper lies on its long side");
    AddHomeOption(*command, options->home);
    command->callback([options, &status] { status = RunReport(*options); });
}
