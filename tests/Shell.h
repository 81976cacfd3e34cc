#pragma once

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <sys/wait.h>

#include "TemporaryFolder.h"

// What a shell command writes, without the last line's end.
inline std::string Output(const std::string& command) {
    FILE* pipe = popen(command.c_str(), "r");
    std::string output;
    for (int byte = 0; (byte = std::fgetc(pipe)) != EOF;)
        output += static_cast<char>(byte);
    pclose(pipe);
    if (output.ends_with('\n'))
        output.pop_back();
    return output;
}

// A folder of the test's own in which a person works at a shell, and what the last command said. What it said
// is kept elsewhere, so that the folder holds nothing but the person's files.
class Shell : public TemporaryFolder {
  public:
    // The exit status of a shell command; -1 when a signal ended it.
    int Run(const std::string& command) {
        const int status = std::system(("cd '" + Path() + "' && { " + command + "\n} >'" + said_.File("out") +
                                        "' 2>'" + said_.File("err") + "'")
                                           .c_str());
        output_ = said_.Read("out");
        errors_ = said_.Read("err");
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    [[nodiscard]] const std::string& Output() const { return output_; }
    [[nodiscard]] const std::string& Errors() const { return errors_; }
    testing::AssertionResult Says(const std::string& text) const { return In(output_, text); }
    testing::AssertionResult Complains(const std::string& text) const { return In(errors_, text); }
    // Whether a command fails with this status and this reason: in one line, unless the usage was wrong.
    testing::AssertionResult Fails(const std::string& command, int status, const std::string& reason) {
        const int found = Run(command);
        const bool oneLine = errors_.find('\n') + 1 == errors_.size();
        return testing::AssertionResult(found == status && (status == 2 || oneLine) && Complains(reason))
               << command + " ended with " << found << ", not in one line with " + reason + ":\n" + errors_;
    }

  private:
    static testing::AssertionResult In(const std::string& all, const std::string& text) {
        return testing::AssertionResult(all.find(text) != all.npos) << text + " is not in:\n" + all;
    }

    TemporaryFolder said_;
    std::string output_;
    std::string errors_;
};
