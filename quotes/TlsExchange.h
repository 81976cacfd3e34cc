#pragma once

#include <string>

struct HostField;
struct QuoteContext;
class QuoteReport;
class QuoteScanner;

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
