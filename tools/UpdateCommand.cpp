#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <cmath>
#include <csignal>
#include <cstdint>
#include <iostream>
#include <map>
#include <memory>
#include <optional>
#include <ostream>
#include <set>
#include <string>
#include <sys/eventfd.h>
#include <unistd.h>
#include <vector>

#include "app/model/PortfolioRules.h"
#include "quotes/run/PriceRun.h"
#include "tools/Commands.h"
#include "tools/ProgressLine.h"
#include "tools/QuoteTrace.h"
#include "tools/Sentences.h"
#include "util/FailureTexts.h"
#include "util/IniFile.h"
#include "util/Numbers.h"
#include "util/Strings.h"
#include "util/Utf8.h"

namespace {

constexpr int SomeWithoutPrice = 3;
constexpr int Stopped = 130; // as a shell has it of a program that Ctrl+C ended

struct UpdateOptions {
    std::string home;
    std::vector<std::string> portfolios;
    bool all = false;
    std::vector<std::string> tickers; // none for all
    OutputFormat format = OutputFormat::Table;
};

int stopFd = -1; // for the signals' handler

void StopRun(int /*signal*/) {
    const int before = errno;
    eventfd_write(stopFd, 1);
    errno = before;
}

// Makes `stopFd` readable once the program is asked to end. Asked a second time, it ends.
void CatchSignals() {
    stopFd = eventfd(0, EFD_CLOEXEC);
    struct sigaction action {};
    action.sa_handler = StopRun;
    action.sa_flags = static_cast<int>(SA_RESETHAND);
    for (const int signal : {SIGINT, SIGTERM, SIGHUP})
        sigaction(signal, &action, nullptr);
    std::signal(SIGPIPE, SIG_IGN); // a reader that has gone away stops no run
}

// Says what ended the run, if something did. Returns the process's exit status, `status` when nothing did.
int Conclude(std::string failure, int status) {
    std::replace(failure.begin(), failure.end(), '\n', ' ');
    if (!failure.empty())
        return Fail(failure);
    return IsStopped(stopFd) ? Fail("stopped; what was not asked for yet is as it was", Stopped) : status;
}

std::string Price(float price) {
    char text[64];
    FormatFixed(static_cast<double>(price), text, sizeof text, 2);
    return text;
}

// Tells how the run goes: on a terminal in one line, which is written over again and again and followed by
// those without a price; elsewhere in a line for each investment.
class UpdateReport : public PriceRunObserver {
  public:
    UpdateReport(OutputFormat format, std::size_t total) : format_(format), total_(total) {
        if (format == OutputFormat::Table && isatty(STDOUT_FILENO) == 1)
            line_.emplace(STDOUT_FILENO, std::chrono::milliseconds(0)); // the next answer may take its time
    }

    void Asking(const std::string& ticker) override;
    RefusalObserver& Watcher() override { return trace_.emplace(nowhere_); }
    void Done(const PriceRunResult& result) override;
    // Once the run is over: returns the process's exit status.
    int Finish(bool onDisk);

  private:
    [[nodiscard]] std::string WhyNot(const PriceRunResult& result) const;
    void WriteLine(const INVESTMENT_DATA& before, const std::optional<float>& price, const std::string& why);
    int Summarize();

    const OutputFormat format_;
    const std::size_t total_;
    std::optional<ProgressLine> line_; // on a terminal
    std::ostream nowhere_{nullptr};    // only the reason is wanted
    std::optional<QuoteTrace> trace_;
    TextOutput output_{STDOUT_FILENO};
    TableWriter json_{
        OutputFormat::Json, {"portfolio", "name", "ticker", "old", "new", "change", "why"}, output_};
    std::string later_; // lines that would break the one that is written over
    std::size_t done_ = 0;
    std::size_t priced_ = 0;
    std::size_t withoutPrice_ = 0;
    std::string failure_; // what ended the run
};

void UpdateReport::Asking(const std::string& ticker) {
    std::string text = std::to_string(done_ + 1) + " of " + std::to_string(total_) + ": ";
    AppendEscaped(text, ticker);
    if (line_)
        line_->Show(text);
}

std::string UpdateReport::WhyNot(const PriceRunResult& result) const {
    switch (result.outcome) {
    case QuoteOutcome::Priced:
        return {};
    case QuoteOutcome::NoTicker:
        return "no ticker";
    case QuoteOutcome::NotRead:
        return NotReadText();
    case QuoteOutcome::NotSaved:
        return NotSavedText;
    default:
        return "no price: " + trace_->Why();
    }
}

void UpdateReport::Done(const PriceRunResult& result) {
    const bool priced = result.outcome == QuoteOutcome::Priced;
    ++done_;
    priced_ += priced ? 1 : 0;
    withoutPrice_ += result.outcome == QuoteOutcome::NoPrice ? 1 : 0;
    if (result.outcome == QuoteOutcome::NotRead)
        failure_ = NotReadText();
    else if (result.outcome == QuoteOutcome::NotSaved)
        failure_ = NotSavedText;
    else if (result.outcome == QuoteOutcome::Failed)
        failure_ = result.refusedHost.empty() ? NotConnectedText : NotTrustedText(result.refusedHost);
    WriteLine(result.before, priced ? std::optional(result.after.Price) : std::nullopt, WhyNot(result));
    static_cast<void>(output_.Flush());
}

void UpdateReport::WriteLine(const INVESTMENT_DATA& before, const std::optional<float>& price,
                             const std::string& why) {
    const float old = before.Price;
    // What the rounding of floats adds to it is no news.
    const auto change = static_cast<float>(
        std::round((static_cast<double>(price.value_or(old)) - static_cast<double>(old)) * 1e4) / 1e4);
    const std::string ticker(FieldText(before.Ticker));
    const std::string name(FieldText(before.Name));
    if (format_ == OutputFormat::Json) {
        std::array<Cell, 7> row = {TextCell(FieldText(before.Portfolio)), TextCell(name), TextCell(ticker)};
        row[3].SetFloat(old, 2);
        if (price) {
            row[4].SetFloat(*price, 2);
            row[5].SetFloat(change, 2);
        } else {
            row[6] = TextCell(why);
        }
        json_.WriteRow(row);
        return;
    }
    std::string line;
    AppendEscaped(line, IsBlank(ticker) ? name : ticker);
    line +=
        '\t' +
        (price ? Price(old) + '\t' + Price(*price) + '\t' + (change > 0 ? "+" : "") + Price(change) : why) +
        '\n';
    if (!line_)
        output_.Write(line);
    else if (!price)
        later_ += line;
}

int UpdateReport::Summarize() {
    line_.reset();
    std::string text = later_ + std::to_string(priced_) + " of " +
                       Counted(static_cast<std::int64_t>(total_), "investment") + " priced";
    if (withoutPrice_ > 0)
        text += ", " + std::to_string(withoutPrice_) + " without a price";
    if (format_ != OutputFormat::Json)
        output_.Write(text + '\n');
    return FinishOutput(output_, std::cerr, withoutPrice_ > 0 ? SomeWithoutPrice : 0);
}

int UpdateReport::Finish(bool onDisk) {
    const int status = Summarize();
    if (failure_.empty() && !onDisk)
        failure_ = NotSavedText;
    return Conclude(failure_, status);
}

// The names of the portfolios that are wanted. Empty, with a sentence for the person, when one is not there.
std::vector<std::string> WantedPortfolios(const UpdateOptions& options, const ToolFolder& folder) {
    const auto portfolios = OpenOrFail(folder, PortfolioFile, DataFileUse::Look);
    std::vector<std::string> names = options.portfolios;
    if (!portfolios)
        return {};
    std::string wrong;
    if (options.all && !CollectPortfolios(*portfolios, &names))
        wrong = NotAllRead("portfolios", folder.Path());
    for (std::string& name : names)
        if (wrong.empty())
            wrong = folder.FindPortfolio(*portfolios, name, ToolFolder::Letters::Exact);
    if (wrong.empty() && names.empty())
        wrong = "there is no portfolio in " + folder.Path();
    return wrong.empty() ? names : (Fail(wrong), std::vector<std::string>());
}

// The records of the investments that are wanted. False, with a sentence for the person, when they cannot be
// read, or none has one of the tickers.
bool FindRecords(const UpdateOptions& options, const ToolFolder& folder,
                 const std::vector<std::string>& portfolios, DATABASE& investments,
                 std::vector<long>& records) {
    std::map<std::string, std::string> missing; // as it was typed, by its lowered letters
    for (const std::string& ticker : options.tickers)
        missing.emplace(Lowered(ticker), ticker);
    const auto wanted = missing;
    std::set<long> seen; // a portfolio may be named twice
    const auto take = [&](const INVESTMENT_DATA& record, long number) {
        const std::string ticker = Lowered(FieldText(record.Ticker));
        missing.erase(ticker);
        if ((wanted.empty() || wanted.contains(ticker)) && seen.insert(number).second)
            records.push_back(number);
    };
    for (const std::string& portfolio : portfolios)
        if (!ForEachInvestment(investments, portfolio.c_str(), take)) {
            Fail(NotAllRead("investments", folder.Path()));
            return false;
        }
    for (const auto& [lowered, ticker] : missing)
        Fail("no investment there has the ticker " + ticker);
    return missing.empty();
}

// Whether there is a network, as the window's command finds it out.
bool IsNetworkThere(const std::string& home, const char* logPath) {
    char host[128];
    ReadSetting(INI_FILEx((home + "/Quorvan.ini").c_str()), "GENERAL", "IsConnectedURL", host, sizeof host);
    const bool found = IsConnected(host, stopFd);
    LogConnection(host,
                  found               ? Connection::Found
                  : IsStopped(stopFd) ? Connection::Cancelled
                                      : Connection::NotFound,
                  logPath);
    return found;
}

int RunUpdate(const UpdateOptions& options) {
    ToolFolder folder(HomeFolder(options.home));
    if (const std::string held = folder.Lock(); !held.empty())
        return Fail(held);
    const std::vector<std::string> portfolios = WantedPortfolios(options, folder);
    const auto investments =
        portfolios.empty() ? nullptr : OpenOrFail(folder, InvestmentFile, DataFileUse::Change);
    std::vector<long> records;
    if (!investments || !FindRecords(options, folder, portfolios, *investments, records))
        return 1;
    CatchSignals();
    const std::string sourcePath = folder.Path() + "/Quorvan.cfg";
    const std::string logPath = folder.Path() + "/Quorvan.log";
    PrintDebugStatement("CLEAR", logPath.c_str());
    UpdateReport report(options.format, records.size());
    if (!IsNetworkThere(folder.Path(), logPath.c_str()))
        return Conclude(IsStopped(stopFd) ? "" : NotConnectedText, 0);
    if (const std::string wrong = folder.KeepBackup(); !wrong.empty())
        return Fail(wrong);
    QuoteContext context;
    context.sourcePath = sourcePath.c_str();
    context.logPath = logPath.c_str();
    context.stopFd = stopFd;
    return report.Finish(PriceRun(*investments, context, report).Run(records));
}

} // namespace

void AddUpdateCommand(CLI::App& application, int& status) {
    CLI::App* command = application.add_subcommand(
        "update", "Bring prices up to date as the program does, from a timer as well.");
    const auto options = std::make_shared<UpdateOptions>();
    CLI::Option* names =
        command->add_option("PORTFOLIO", options->portfolios, "The portfolios to bring up to date");
    command->add_flag("--all", options->all, "All portfolios")->excludes(names);
    command
        ->add_option("--ticker", options->tickers, "Only investments of this ticker; may be given repeatedly")
        ->type_name("T")
        ->allow_extra_args(false);
    AddJsonOption(*command, options->format);
    AddHomeOption(*command, options->home);
    command->footer(
        "On a terminal one line tells how far it is. Elsewhere each investment gets a line: ticker, old "
        "price, new price and change, or why there is none. An investment without a ticker is passed over. "
        "Ctrl+C ends the run within a second.\n\n"
        "Exit status: 0 when all have a price, 3 when some have none, 1 when the run could not go on, 2 when "
        "the command line is wrong, 130 when it was stopped.\n\n"
        "Example: quorvan-cli update 'My Retirement Fund' --ticker ABC --ticker XYZ\n\n"
        "Every weekday evening, by cron:\n"
        "  30 18 * * 1-5 quorvan-cli update --all >/dev/null\n"
        "or by systemd, ~/.config/systemd/user/quorvan-update.service:\n"
        "  [Service]\n"
        "  Type=oneshot\n"
        "  ExecStart=quorvan-cli update --all\n"
        "  SuccessExitStatus=3\n"
        "and quorvan-update.timer beside it:\n"
        "  [Timer]\n"
        "  OnCalendar=Mon..Fri 18:30\n"
        "  Persistent=true\n"
        "  [Install]\n"
        "  WantedBy=timers.target\n"
        "switched on with: systemctl --user enable --now quorvan-update.timer\n"
        "Where quorvan-cli is not on the path, name it in full: %h/Quorvan/quorvan-cli, for cron\n"
        "$HOME/Quorvan/quorvan-cli.");
    command->callback([options, &status] {
        if (options->portfolios.empty() && !options->all)
            throw CLI::RequiredError("a PORTFOLIO or --all");
        status = RunUpdate(*options);
    });
}
