#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "quotes/QuoteRetrieval.h"
#include "quotes/QuoteSource.h"
#include "tools/Commands.h"
#include "tools/QuoteTrace.h"
#include "util/Numbers.h"

namespace {

struct QuoteOptions {
    std::string home;
    std::string source; // a line to be tried in place of the file
    std::vector<std::string> tickers;
};

// Both give the reason why not, or nothing.
std::string CheckSource(const std::string& line) {
    QuoteSourceReader reader(line);
    if (reader.Next() == QuoteSourceReader::Line::Source &&
        reader.Next() == QuoteSourceReader::Line::EndOfFile)
        return {};
    return "'" + line +
           "' is no source: " + (reader.Problem() ? reader.Problem() : "see doc/quote-sources.md");
}

std::string CheckTicker(const std::string& ticker) {
    const auto isControl = [](char c) { return static_cast<unsigned char>(c) < 0x20 || c == 0x7F; };
    const bool usable = !ticker.empty() && std::none_of(ticker.begin(), ticker.end(), isControl);
    return usable ? "" : "a ticker is empty or has control characters";
}

int RunQuote(const QuoteOptions& options) {
    const std::string sourcePath = HomeFolder(options.home) + "/Quorvan.cfg";
    QuoteContext context;
    context.sourcePath = sourcePath.c_str();
    bool all = true;
    for (const std::string& ticker : options.tickers) {
        QuoteTrace trace(std::cerr);
        context.observer = &trace;
        std::cerr << ticker << ": looking in " << (options.source.empty() ? sourcePath : "the given line")
                  << '\n';
        const float price = options.source.empty()
                                ? GetPriceQuote(ticker.c_str(), context)
                                : GetPriceQuoteFrom(options.source, ticker.c_str(), context);
        if (trace.Why() == QuoteTrace::NoSource)
            std::cerr << QuoteTrace::NoSource << '\n';
        char number[64];
        FormatFixed(static_cast<double>(price), number, sizeof number, 2);
        std::cout << ticker << '\t' << number << std::endl;
        all = all && price > 0;
    }
    return all && std::cout ? 0 : 1;
}

} // namespace

void AddQuoteCommand(CLI::App& application, int& status) {
    CLI::App* command = application.add_subcommand(
        "quote", "Look up prices as the program does, and show why a source works or does not.");
    const auto options = std::make_shared<QuoteOptions>();
    command->add_option("TICKER", options->tickers, "What to look up")->required()->check(CheckTicker);
    CLI::Option* home = AddHomeOption(*command, options->home);
    command
        ->add_option("--source", options->source,
                     "Try this line, 'LABEL HOST PATH MARKER SKIP', in place of Quorvan.cfg")
        ->check(CheckSource)
        ->excludes(home);
    command->footer(
        "Each TICKER gets a line with its price, or a number of 0 or less, on standard output; what "
        "was tried and found goes to standard error. No file is changed. The exit status is 0 when "
        "every ticker got a price.");
    command->callback([options, &status] { status = RunQuote(*options); });
}
