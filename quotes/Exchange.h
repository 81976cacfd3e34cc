#pragma once

struct HostField;
struct QuoteContext;
class QuoteReport;
class QuoteScanner;

// One bare HTTP/1.0 request to a quote server: connects to the host's first IPv4 address, sends the request
// line and nothing else, and gives each receive of at most 1024 bytes to the scanner, until that has a price
// or the server is done. There is no time limit, but the context's stop descriptor ends every wait at once.
// It does not follow redirects and does not look at the answer's header: the scanner sees all bytes.
//
// The scanner's price once the request was sent; NoQuote when the name does not resolve, QuoteNetworkFailure
// when there is no connection or the request cannot be sent; QuoteCancelled as soon as the caller shall stop.
[[nodiscard]] float AskPlainly(const HostField& host, const char* path, QuoteScanner& scanner,
                               const QuoteContext& context, QuoteReport& report);

// One page fetched over TLS and given to the scanner as one piece. Certificates are checked against the
// system's, or the context's file. It follows up to 5 redirects, and none that leaves TLS; it takes at most
// 15 s to connect and 30 s in all, and pages of at most 10 MB.
//
// The scanner's price once the request was sent: what has come by then is scanned even if the transfer ends
// badly. NoQuote when the name does not resolve; QuoteNetworkFailure for every other failure of connection or
// TLS before, and for a certificate that is refused, also after a redirect; QuoteCancelled as soon as the
// context's stop descriptor is readable. The report gets a line that says what failed.
[[nodiscard]] float AskOverTls(const HostField& host, const char* path, QuoteScanner& scanner,
                               const QuoteContext& context, QuoteReport& report);
