// Prints how long the look-up of prices takes beside a bare loop that connects, sends the same request and
// reads the answer to its end. The server is a thread of this program; the log is written, as in an update.
//
//   quote_bench [--records N] [--rounds N] [--folder PATH]

#include <cstdio>
#include <cstring>
#include <exception>
#include <filesystem>
#include <fstream>

#include "BenchOptions.h"
#include "quotes/LoopbackServer.h"
#include "quotes/QuoteRetrieval.h"

namespace {

// What a small quote page looks like.
std::string Page() {
    std::string page = "HTTP/1.0 200 OK\r\nContent-Type: text/html\r\n\r\n<html><body><table><tr><td>";
    for (int i = 0; i < 10; ++i)
        page += "Some other figure</td><td>17.25</td></tr>\n<tr><td>";
    return page + "Last Trade</td><td><b>45 3/8</b></td></tr></table></body></html>\n";
}

bool AskBarely(std::uint16_t port) {
    const int fd = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    sockaddr_in server{};
    server.sin_family = AF_INET;
    server.sin_port = htons(port);
    server.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    const char request[] = "GET /q?s=ABC HTTP/1.0\n\n";
    bool read = connect(fd, reinterpret_cast<sockaddr*>(&server), sizeof server) == 0 &&
                send(fd, request, sizeof request - 1, MSG_NOSIGNAL) == sizeof request - 1;
    char buffer[1024];
    ssize_t got = 1;
    while (read && got > 0) {
        got = recv(fd, buffer, sizeof buffer, 0);
        read = got >= 0;
    }
    close(fd);
    return read;
}

int MeasureIn(const std::string& folder, const OPTIONS& options) {
    LoopbackServer server(Reply{{Page()}});
    const std::string sources = folder + "/Quorvan.cfg";
    const std::string log = folder + "/Quorvan.log";
    std::ofstream(sources) << "; a comment as people write it\nnet " << server.Host() << " /q?s= Last 3\n";
    QuoteContext context;
    context.sourcePath = sources.c_str();
    context.logPath = log.c_str();
    bool right = true;
    double ours = 1e9;
    double bare = 1e9;
    // In turns, since the machine's speed drifts.
    for (int round = 0; round < options.rounds; ++round) {
        ours = std::min(ours, Shortest(
                                  1,
                                  [&] {
                                      for (long i = 0; i < options.records; ++i)
                                          right = GetPriceQuote("ABC", context) == 45.375F && right;
                                  }));
        bare = std::min(bare, Shortest(1, [&] {
                            for (long i = 0; i < options.records; ++i)
                                right = AskBarely(server.Port()) && right;
                        }));
    }
    const auto each = 1e6 / static_cast<double>(options.records);
    std::printf(
        "%ld prices   %8.2f ms %6.1f us each   bare requests %8.2f ms %6.1f us each   ratio %.2f (at most "
        "2.5)\n",
        options.records, ours * 1e3, ours * each, bare * 1e3, bare * each, ours / bare);
    if (!right)
        std::fprintf(stderr, "a price was wrong, or a request failed\n");
    return right ? 0 : 1;
}

int Measure(const OPTIONS& options) {
    std::string folder = options.folder + "/quote_bench.XXXXXX";
    if (mkdtemp(folder.data()) == nullptr) {
        std::perror(folder.c_str());
        return 1;
    }
    const int result = MeasureIn(folder, options);
    std::filesystem::remove_all(folder);
    return result;
}

} // namespace

int main(int argc, char** argv) try {
    OPTIONS options(500);
    if (!ReadOptions(argc, argv, &options)) {
        std::fprintf(stderr, "usage: quote_bench [--records N] [--rounds N] [--folder PATH]\n");
        return 2;
    }
    return Measure(options);
} catch (const std::exception& error) {
    std::fprintf(stderr, "quote_bench: %s\n", error.what());
    return 1;
}
