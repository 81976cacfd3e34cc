#pragma once

#include <string>

#include <gtest/gtest.h>

#include "StopSwitch.h"
#include "TemporaryFolder.h"
#include "quotes/QuoteRetrieval.h"
#include "util/GatheredLog.h"

// What a retrieval needs, with a log that can be read.
class QuoteTest : public testing::Test {
  protected:
    QuoteTest() {
        context_.log = &log_;
        context_.stopFd = stop_.Fd();
    }

    // What has been logged since the last call.
    [[nodiscard]] std::string Log() {
        log_.Write();
        std::string text = folder_.Read("log");
        folder_.Write("log", "");
        return text;
    }

    TemporaryFolder folder_;
    std::string logPath_ = folder_.File("log");
    GatheredLog log_{logPath_.c_str()};
    StopSwitch stop_;
    QuoteContext context_;
};

// As the pieces of a reply.
inline std::vector<std::string> SingleBytes(const std::string& text) {
    std::vector<std::string> bytes;
    for (const char byte : text)
        bytes.emplace_back(1, byte);
    return bytes;
}
