#pragma once

#include <string>
#include <sys/eventfd.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "TemporaryFolder.h"
#include "quotes/QuoteRetrieval.h"

// What a retrieval needs, with a log that can be read.
class QuoteTest : public testing::Test {
  protected:
    QuoteTest() {
        context_.sourcePath = sourcePath_.c_str();
        context_.logPath = logPath_.c_str();
        context_.stopFd = eventfd(0, EFD_CLOEXEC);
    }
    ~QuoteTest() override { close(context_.stopFd); }

    [[nodiscard]] std::string Log() {
        std::string text = folder_.Read("log");
        folder_.Write("log", "");
        return text;
    }

    TemporaryFolder folder_;
    std::string sourcePath_ = folder_.File("Quorvan.cfg");
    std::string logPath_ = folder_.File("log");
    QuoteContext context_;
};
