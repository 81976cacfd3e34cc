// Prints how long a price update of the whole program takes beside a bare loop of the same requests, from the
// first one's arrival at the server to the last one's, and with its window's coming and going: the medians
// of some rounds of both in turns, each on a thread of its own, since the machine's speed drifts and its
// scheduler is in better luck at times. Then, in a run of its own, how long a mouse event waits during an
// update. The server is on loopback; the window is the program's own, on the
// toolkit's offscreen platform unless QT_QPA_PLATFORM says otherwise.
//
//   update_bench [--records N] [--rounds N] [--folder PATH]

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include <QWidget>

#include "BenchOptions.h"
#include "StepDriver.h"
#include "app/NorvelApp.h"
#include "app/NorvelWindow.h"
#include "app/model/RecordLayouts.h"
#include "app/state/MessageCodes.h"
#include "db/Database.h"
#include "quotes/LoopbackServer.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

using Clock = std::chrono::steady_clock;
constexpr const char* ProgressTitle = "Getting current prices...";

double MillisecondsSince(Clock::time_point start) {
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

// The times at which requests arrive. The server's thread notes them.
class Arrivals {
  public:
    void Note() {
        const std::lock_guard lock(mutex_);
        last_ = Clock::now();
        if (count_++ == 0)
            first_ = last_;
    }
    // From the first to the last; then it begins anew.
    [[nodiscard]] double TakeMilliseconds() {
        const std::lock_guard lock(mutex_);
        count_ = 0;
        return std::chrono::duration<double, std::milli>(last_ - first_).count();
    }

  private:
    std::mutex mutex_;
    Clock::time_point first_;
    Clock::time_point last_;
    int count_ = 0;
};

// Takes a mouse event every few milliseconds from another thread to the progress window, and keeps the
// longest time from posting it to the end of its handling.
class MouseProbe : public QObject {
  public:
    MouseProbe() : poster_([this] { Post(); }) {}
    ~MouseProbe() override {
        stopping_ = true;
        poster_.join();
    }
    MouseProbe(const MouseProbe&) = delete;
    MouseProbe& operator=(const MouseProbe&) = delete;

    [[nodiscard]] double LongestWait() const { return longest_; }
    [[nodiscard]] int Count() const { return count_; }

  private:
    struct Posted : QEvent {
        Posted() : QEvent(QEvent::User) {}
        Clock::time_point when = Clock::now();
    };
    void Post() {
        while (!stopping_) {
            QCoreApplication::postEvent(this, new Posted);
            std::this_thread::sleep_for(std::chrono::milliseconds(2));
        }
    }
    bool event(QEvent* event) override {
        if (event->type() != QEvent::User)
            return QObject::event(event);
        if (QWidget* window = StepDriver::Window(ProgressTitle)) {
            QTest::mouseMove(window, QPoint(20 + count_ % 100, 20));
            longest_ = std::max(longest_, MillisecondsSince(static_cast<Posted*>(event)->when));
            ++count_;
        }
        return true;
    }

    double longest_ = 0;
    int count_ = 0;
    std::atomic<bool> stopping_ = false;
    std::thread poster_;
};

// What any client has to do for the same pages.
bool AskBare(std::uint16_t port, long records) {
    for (long i = 0; i < records; ++i) {
        const int fd = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_port = htons(port);
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        const std::string request = "GET /quote/T" + std::to_string(i) + " HTTP/1.0\n\n";
        bool asked = connect(fd, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0 &&
                     send(fd, request.data(), request.size(), MSG_NOSIGNAL) > 0;
        char bytes[1024];
        while (asked && recv(fd, bytes, sizeof bytes, 0) > 0) {
        }
        close(fd);
        if (!asked)
            return false;
    }
    return true;
}

double Median(std::vector<double> values) {
    const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return values.empty() ? 0 : *middle;
}

struct Times {
    std::vector<double> prices;
    std::vector<double> withWindow;
    std::vector<double> bare;
    std::vector<double> ratios; // of each round
    double longestWait = 0;
    int mouseEvents = 0;
    bool failed = false;
};

// The program's updates and the bare requests in turns, and at last an update under the mouse.
class UpdateRuns : public StepDriver {
  public:
    UpdateRuns(const OPTIONS& options, std::uint16_t port, Arrivals& arrivals, Times& times)
        : options_(options), port_(port), arrivals_(arrivals), times_(times) {
        for (int round = 0; round < options.rounds; ++round)
            AddRound();
        AddUpdate([this] { probe_ = std::make_unique<MouseProbe>(); },
                  [this] {
                      times_.longestWait = probe_->LongestWait();
                      times_.mouseEvents = probe_->Count();
                      probe_.reset();
                      be_app->PostMessage(B_QUIT_REQUESTED);
                  });
    }

  protected:
    void Fail(const std::string& sentence) override {
        std::fprintf(stderr, "update_bench: %s\n", sentence.c_str());
        times_.failed = true;
    }

  private:
    void AddUpdate(const Action& before, const Action& after) {
        When("the main window", WindowShown("Quorvan"), [this, before] {
            before();
            start_ = Clock::now();
            GetAppWindow(be_app, "Quorvan")->PostMessage(MessagePortfolioUpdate);
        });
        When(
            "the progress window", WindowShown(ProgressTitle), [] {});
        When(
            "the end", [] { return Window(ProgressTitle) == nullptr; }, after);
    }
    void AddRound() {
        AddUpdate([] {},
                  [this] {
                      times_.withWindow.push_back(MillisecondsSince(start_));
                      times_.prices.push_back(arrivals_.TakeMilliseconds());
                      std::thread([this] {
                          if (!AskBare(port_, options_.records))
                              times_.failed = true;
                      }).join();
                      times_.bare.push_back(arrivals_.TakeMilliseconds());
                      times_.ratios.push_back(times_.prices.back() / times_.bare.back());
                  });
    }

    const OPTIONS& options_;
    std::uint16_t port_;
    Arrivals& arrivals_;
    Times& times_;
    Clock::time_point start_;
    std::unique_ptr<MouseProbe> probe_;
};

template <std::size_t Count>
bool Create(DATABASE& file, const std::string& path, const std::array<COLUMN_ENTRY, Count>& columns) {
    return file.Create(path.c_str(), "benchmark", Count, columns.data()) == 0;
}

bool MakeFolder(const std::string& folder, const std::string& host, long records) {
    DATABASE portfolios(nullptr);
    DATABASE investments(nullptr);
    DATABASE categories(nullptr);
    if (!Create(portfolios, folder + "/portfol.db", PortfolioColumns) ||
        !Create(investments, folder + "/invest.db", InvestmentColumns) ||
        !Create(categories, folder + "/misc.db", CategoryColumns))
        return false;
    PORTFOLIO_DATA portfolio{};
    CopyText(portfolio.Name, "All");
    portfolios.Append(&portfolio);
    for (long i = 0; i < records; ++i) {
        INVESTMENT_DATA record{};
        CopyText(record.Portfolio, "All");
        FormatInto(record.Name, sizeof record.Name, "Investment %ld", i);
        FormatInto(record.Ticker, sizeof record.Ticker, "T%ld", i % 100'000);
        record.Shares = 1;
        if (investments.Append(&record) < 0)
            return false;
    }
    std::ofstream(folder + "/Quorvan.cfg") << "local " << host << " /quote/ Last 3\n";
    std::ofstream(folder + "/Quorvan.ini") << "[GENERAL]\nIsConnectedURL=127.0.0.1\n[DISPLAY]\n";
    return true;
}

int Measure(const OPTIONS& options) {
    const std::string folder = options.folder + "/quorvan-update-bench";
    std::filesystem::remove_all(folder);
    std::filesystem::create_directories(folder);
    Arrivals arrivals;
    LoopbackServer server([&](const std::string&) {
        arrivals.Note();
        return Reply{{"HTTP/1.0 200 OK\r\n\r\n<td>Last Trade</td><td><b>45 3/8</b></td>"}};
    });
    if (!MakeFolder(folder, server.Host(), options.records)) {
        std::fprintf(stderr, "update_bench: the folder could not be filled\n");
        return 1;
    }
    BApplication::SetExecutablePath((folder + "/quorvan").c_str());
    Times times;
    UpdateRuns runs(options, server.Port(), arrivals, times);
    {
        NorvelApp application;
        application.Run();
    }
    std::printf("%ld prices: %.1f ms, bare requests %.1f ms: %.2f x (at most 2.5); with the window %.1f ms\n",
                options.records, Median(times.prices), Median(times.bare), Median(times.ratios),
                Median(times.withWindow));
    std::printf("%d mouse events meanwhile, the longest wait %.1f ms\n", times.mouseEvents,
                times.longestWait);
    std::filesystem::remove_all(folder);
    return times.failed ? 1 : 0;
}

} // namespace

int main(int argc, char** argv) try {
    setenv("QT_QPA_PLATFORM", "offscreen", 0);
    OPTIONS options(500);
    if (!ReadOptions(argc, argv, &options)) {
        std::fprintf(stderr, "usage: update_bench [--records N] [--rounds N] [--folder PATH]\n");
        return 2;
    }
    return Measure(options);
} catch (const std::exception& error) {
    std::fprintf(stderr, "update_bench: %s\n", error.what());
    return 1;
}
