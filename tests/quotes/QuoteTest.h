#pragma once

#include <string>
#include <sys/eventfd.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "TemporaryFolder.h"
#include "quotes/QuoteRetrieval.h"
#include "util/GatheredLog.h"

// What a retrieval needs, with a log that can be read.
class QuoteTest : public testing::Test {
  protected:
    QuoteTest() {
        context_.log = &log_;
        context_.stopFd = eventfd(0, EFD_CLOEXEC);
    }
    ~QuoteTest() override { close(context_.stopFd); }

    // What has been logged since the last call, with HOST for any loopback server.
    [[nodiscard]] std::string Log() {
        log_.Write();
        std::string text = folder_.Read("log");
        folder_.Write("log", "");
        for (std::size_t at = text.find("127.0.0.1:"); at != text.npos; at = text.find("127.0.0.1:"))
            text.replace(at, text.find_first_not_of("0123456789", at + 10) - at, "HOST");
        return text;
    }

    TemporaryFolder folder_;
    std::string logPath_ = folder_.File("log");
    GatheredLog log_{logPath_.c_str()};
    QuoteContext context_;
};
