#include "QuoteServer.h"

#include <cmath>
#include <cstdlib>

#include "app/model/RecordLayouts.h"
#include "db/Database.h"
#include "util/CharacterBuffer.h"

namespace {

constexpr std::string_view Path = "/quote/";
constexpr int HeldAnswer = 8;
constexpr float Moves[] = {1.0125F, 0.975F, 1.0F, 1.05F};

std::map<std::string, float> PricesOfToday(const std::string& investmentFile) {
    std::map<std::string, float> prices;
    DATABASE file(investmentFile.c_str());
    std::size_t number = 0;
    for (const void* data = file.QueryGetFirst(nullptr); data; data = file.QueryGetNext(nullptr)) {
        const auto* record = static_cast<const INVESTMENT_DATA*>(data);
        const std::string ticker(FieldText(record->Ticker));
        if (ticker.empty())
            continue;
        const float price = record->Price * Moves[number++ % std::size(Moves)];
        // As the page says it, so that it is the same number again when it is read.
        prices[ticker] = std::round(price * 1000) / 1000;
    }
    return prices;
}

} // namespace

QuoteServer::QuoteServer(const std::string& investmentFile)
    : prices_(PricesOfToday(investmentFile)),
      server_([this](const std::string& request) { return Answer(request); }) {}

std::string QuoteServer::SourceLine() const {
    return "tour " + server_.Host() + " " + std::string(Path) + " Last 3\n";
}

float QuoteServer::PriceOf(const std::string& ticker) const {
    const auto found = prices_.find(ticker);
    return found == prices_.end() ? 0 : found->second;
}

Reply QuoteServer::Answer(const std::string& request) {
    const std::size_t begin = request.find(Path) + Path.size();
    const std::string ticker = request.substr(begin, request.find(' ', begin) - begin);
    if (++answered_ == HeldAnswer) {
        heldTicker_ = ticker;
        holding_ = true;
        return {{}, Reply::End::Hold};
    }
    if (PriceOf(ticker) <= 0)
        return {{"HTTP/1.0 404 Not Found\r\n\r\n"}};
    char price[32];
    std::snprintf(price, sizeof price, "%.3f", static_cast<double>(PriceOf(ticker)));
    return {{"HTTP/1.0 200 OK\r\n\r\n<td>Last Trade</td><td><b>" + std::string(price) + "</b></td>"}};
}
