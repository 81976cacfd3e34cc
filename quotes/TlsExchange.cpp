#include "quotes/Exchange.h"

#include <algorithm>
#include <curl/curl.h>
#include <memory>
#include <string_view>

#include "quotes/Host.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"
#include "quotes/QuoteScanner.h"

namespace {

constexpr long ConnectSeconds = 15;
constexpr long TotalSeconds = 30;
constexpr long MaxRedirects = 5;
constexpr std::size_t MaxPageSize = 10'000'000;
constexpr int WaitMilliseconds = 1000; // the longest the library is left alone with its own timers

// The path as part of an address: what cannot stand there is written as %XX.
std::string Escaped(std::string_view path) {
    constexpr char digits[] = "0123456789ABCDEF";
    std::string escaped;
    for (const char c : path) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte > 0x20 && byte < 0x7F && c != '#' && c != '\\')
            escaped += c;
        else
            escaped += {'%', digits[byte >> 4U], digits[byte & 0xFU]};
    }
    return escaped;
}

std::string Address(const HostField& host, std::string_view path) {
    const char* slash = path.starts_with('/') ? "" : "/";
    return "https://" + host.name + ":" + std::to_string(host.port) + slash + Escaped(path);
}

// The page, which stops growing at its limit.
struct Page {
    std::string text;
    bool tooLarge = false;
};

std::size_t TakeBytes(const char* bytes, std::size_t one, std::size_t count, void* target) {
    auto* page = static_cast<Page*>(target);
    page->tooLarge = page->text.size() + count > MaxPageSize;
    if (page->tooLarge)
        return 0;
    page->text.append(bytes, count * one);
    return count;
}

// Lives for one page. The system's or the given certificates are trusted.
class Transfer {
  public:
    Transfer(const std::string& address, const char* caFile);
    Transfer(const Transfer&) = delete;
    Transfer& operator=(const Transfer&) = delete;
    ~Transfer() { curl_multi_remove_handle(multi_.get(), easy_.get()); }

    // False when the caller shall stop.
    [[nodiscard]] bool Run(int stopFd);
    [[nodiscard]] CURL* Handle() const { return easy_.get(); }
    [[nodiscard]] CURLcode Result() const { return result_; }
    [[nodiscard]] std::string Problem() const;
    [[nodiscard]] const std::string& PageText() const { return page_.text; }

  private:
    template <class Value>
    void Set(CURLoption option, Value value) {
        if (result_ == CURLE_OK)
            result_ = curl_easy_setopt(easy_.get(), option, value);
    }

    Page page_;
    char reason_[CURL_ERROR_SIZE] = "";
    std::unique_ptr<CURL, decltype(&curl_easy_cleanup)> easy_{curl_easy_init(), curl_easy_cleanup};
    std::unique_ptr<CURLM, decltype(&curl_multi_cleanup)> multi_{curl_multi_init(), curl_multi_cleanup};
    CURLcode result_ = CURLE_OK;
};

// The library's calls refuse a handle that could not be had.
Transfer::Transfer(const std::string& address, const char* caFile) {
    Set(CURLOPT_ERRORBUFFER, reason_);
    Set(CURLOPT_URL, address.c_str());
    Set(CURLOPT_USERAGENT, "Quorvan");
    Set(CURLOPT_PATH_AS_IS, 1L);
    Set(CURLOPT_PROTOCOLS_STR, "https");
    Set(CURLOPT_REDIR_PROTOCOLS_STR, "https");
    Set(CURLOPT_FOLLOWLOCATION, 1L);
    Set(CURLOPT_MAXREDIRS, MaxRedirects);
    Set(CURLOPT_CONNECTTIMEOUT, ConnectSeconds);
    Set(CURLOPT_TIMEOUT, TotalSeconds);
    Set(CURLOPT_NOSIGNAL, 1L);
    // Without this a cancelled look-up of the name would be waited for.
    Set(CURLOPT_QUICK_EXIT, 1L);
    if (caFile)
        Set(CURLOPT_CAINFO, caFile);
    Set(CURLOPT_WRITEFUNCTION, &TakeBytes);
    Set(CURLOPT_WRITEDATA, &page_);
    if (curl_multi_add_handle(multi_.get(), easy_.get()) != CURLM_OK)
        result_ = CURLE_FAILED_INIT;
}

bool Transfer::Run(int stopFd) {
    int running = 1;
    while (result_ == CURLE_OK) {
        if (IsStopped(stopFd))
            return false;
        if (curl_multi_perform(multi_.get(), &running) != CURLM_OK)
            result_ = CURLE_FAILED_INIT;
        if (running == 0)
            break;
        curl_waitfd stop{stopFd, CURL_WAIT_POLLIN, 0};
        curl_multi_poll(multi_.get(), &stop, stopFd >= 0 ? 1 : 0, WaitMilliseconds, nullptr);
    }
    int left = 0;
    if (const CURLMsg* message = curl_multi_info_read(multi_.get(), &left))
        result_ = message->data.result;
    return true;
}

std::string Transfer::Problem() const {
    if (page_.tooLarge)
        return "the page has more than 10 MB";
    return reason_[0] != '\0' ? reason_ : curl_easy_strerror(result_);
}

// Empty when there was no connection.
std::string Server(CURL* transfer) {
    char* address = nullptr;
    long port = 0;
    curl_easy_getinfo(transfer, CURLINFO_PRIMARY_IP, &address);
    curl_easy_getinfo(transfer, CURLINFO_PRIMARY_PORT, &port);
    if (!address || *address == '\0')
        return {};
    return std::string(address) + " port " + std::to_string(port);
}

// The host asked last, which is another one after a redirect.
std::string LastHost(CURL* transfer) {
    const char* address = nullptr;
    curl_easy_getinfo(transfer, CURLINFO_EFFECTIVE_URL, &address);
    std::string_view host(address ? address : "");
    host.remove_prefix(std::min(host.size(), std::string_view("https://").size()));
    return std::string(host.substr(0, host.find_first_of(":/?#")));
}

// Whether there was a connection to be trusted, on which a request goes out at once.
bool RequestWasSent(CURL* transfer) {
    curl_off_t handshake = 0;
    curl_easy_getinfo(transfer, CURLINFO_APPCONNECT_TIME_T, &handshake);
    return handshake > 0;
}

// What a transfer that could not ask says about the price.
float StatusOf(CURLcode result) {
    const bool nowhere = result == CURLE_COULDNT_RESOLVE_HOST || result == CURLE_COULDNT_RESOLVE_PROXY ||
                         result == CURLE_URL_MALFORMAT;
    return nowhere ? NoQuote : QuoteNetworkFailure;
}

} // namespace

float AskOverTls(const HostField& host, const char* path, QuoteScanner& scanner, const QuoteContext& context,
                 QuoteReport& report) {
    Transfer transfer(Address(host, path), context.caFile);
    if (!transfer.Run(context.stopFd))
        return QuoteCancelled;
    if (const std::string server = Server(transfer.Handle()); !server.empty()) {
        report.Log("connected to " + server + "\n");
        report.Observer().Connected((server + ", TLS").c_str());
    }
    if (transfer.Result() != CURLE_OK) {
        report.Log("https error: " + transfer.Problem() + "\n");
        report.Observer().Failed(transfer.Problem().c_str());
        if (transfer.Result() == CURLE_PEER_FAILED_VERIFICATION) {
            report.Observer().CertificateRefused(LastHost(transfer.Handle()).c_str());
            return QuoteNetworkFailure;
        }
        if (!RequestWasSent(transfer.Handle()))
            return StatusOf(transfer.Result());
    }
    report.Log("received " + std::to_string(transfer.PageText().size()) + " bytes\n");
    report.Observer().PieceReceived(transfer.PageText());
    (void)scanner.Scan(transfer.PageText());
    report.LogNumber("Returning price = ", scanner.Price());
    return scanner.Price();
}
