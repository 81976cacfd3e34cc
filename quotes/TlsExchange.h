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
// The scanner's price once the page is there. NoQuote when the name does not resolve or the server has no
// such page for us (an error status, redirects without end or away from TLS, too large a page);
// QuoteNetworkFailure for every other failure of connection, TLS or transfer; QuoteCancelled as soon as the
// context's stop descriptor is readable. The report gets a line that says what failed.
[[nodiscard]] float AskOverTls(const HostField& host, const char* path, QuoteScanner& scanner,
                               const QuoteContext& context, QuoteReport& report);
