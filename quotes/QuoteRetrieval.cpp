#include "quotes/QuoteRetrieval.h"

#include <string>

#include "quotes/Exchange.h"
#include "quotes/Host.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteScanner.h"
#include "quotes/QuoteSource.h"
#include "util/File.h"

namespace {

constexpr std::size_t MaxSourceFileSize = 16'000'000;

// Null, or why the line cannot be used for this ticker.
const char* PrepareSource(const QuoteSourceReader& reader, const char* ticker, QuoteSource* source) {
    if (reader.Problem())
        return reader.Problem();
    *source = reader.Source();
    return AppendTicker(source, ticker) ? nullptr : "its path has more than 127 bytes with the ticker";
}

float AskForTicker(const QuoteSource& source, const QuoteContext& context, QuoteReport& report) {
    report.Log(std::string("Checking '") + source.host + source.path + "'\n");
    report.Observer().SourceTried(source);
    const float result = GetQuote(source.host, source.path, source.tag, source.skip, context);
    report.Observer().SourceAnswered(result);
    if (result > 0)
        report.LogNumber("Price = ", result);
    else if (result == QuoteCancelled)
        report.LogText("cancelled\n");
    return result;
}

bool EndsTheSearch(float result) {
    return result > 0 || result == QuoteSearchEnded || result == QuoteCancelled;
}

} // namespace

float GetPriceQuote(const char* ticker, const QuoteContext& context) {
    std::string sources;
    if (ReadWholeFile(context.sourcePath, sources, MaxSourceFileSize) == 0)
        return GetPriceQuoteFrom(sources, ticker, context);
    QuoteReport report(context.logPath, context.observer);
    report.Log(std::string("Unable to open '") + context.sourcePath + "'\n");
    report.Observer().Failed((std::string("the file ") + context.sourcePath + " cannot be read").c_str());
    return NoQuoteSources;
}

float GetPriceQuoteFrom(std::string_view sources, const char* ticker, const QuoteContext& context) {
    using Line = QuoteSourceReader::Line;
    QuoteReport report(context.logPath, context.observer);
    QuoteSourceReader reader(sources);
    float result = NoQuote;
    bool anySource = false;
    for (Line line = reader.Next(); line != Line::EndOfFile && !EndsTheSearch(result); line = reader.Next()) {
        // A line that is no source, be it the last, takes back what the source before it answered.
        result = NoQuote;
        if (line == Line::EndOfList) {
            report.Observer().ListEnded(reader.LineNumber());
            break;
        }
        if (line == Line::Skipped && !reader.Problem())
            continue;
        anySource = true;
        QuoteSource source;
        if (const char* problem = PrepareSource(reader, ticker, &source)) {
            report.Log("Skipped line " + std::to_string(reader.LineNumber()) + ": " + problem + "\n");
            report.Observer().SourceSkipped(reader.LineNumber(), problem);
            continue;
        }
        result = AskForTicker(source, context, report);
    }
    if (!anySource)
        report.LogText("no source to ask\n");
    return result;
}

float GetQuote(const char* host, const char* path, const char* tag, int skip, const QuoteContext& context) {
    QuoteReport report(context.logPath, context.observer);
    report.LogText("In GetQuote\n");
    if (IsStopped(context.stopFd))
        return QuoteCancelled;
    HostField server;
    if (!ParseHostField(host, &server)) {
        const char* reason = "the host is none of NAME, NAME:PORT and https://NAME[:PORT]";
        report.Log(std::string("'") + host + "': " + reason + "\n");
        report.Observer().Failed(reason);
        return NoQuote;
    }
    QuoteScanner scanner(tag, skip, report);
    if (server.tls)
        return AskOverTls(server, path, scanner, context, report);
    return AskPlainly(server, path, scanner, context, report);
}

bool IsConnected(const char* hostName, int stopFd) {
    in_addr address{};
    return LookUpHost(hostName, stopFd, &address) == HostLookup::Found;
}
