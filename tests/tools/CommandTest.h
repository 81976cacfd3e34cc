#pragma once

#include <string>

#include "DataFolder.h"
#include "InChild.h"
#include "Shell.h"
#include "db/FaultyFiles.h"

// The built quorvan-cli as a person runs it in a folder, with `built` for the program and without a display.
class CommandTest : public testing::Test {
  protected:
    CommandTest() {
        unsetenv("DISPLAY");
        unsetenv("XDG_RUNTIME_DIR");
        setenv("XDG_DATA_HOME", folder_.File("data").c_str(), 1);
        setenv("PATH", std::string(QUORVAN_CLI_FOLDER ":").append(getenv("PATH")).c_str(), 1);
        folder_.Write("built", "#!/bin/sh\necho \"$#\" >\"$(dirname \"$0\")/started\"\n");
    }

    // The command for a folder, in whose name is no single quote.
    static std::string Setup(const std::string& options = "", const std::string& folder = "home") {
        return "quorvan-cli setup '" + folder + "' --program built " + options;
    }
    // Whether a command succeeds and says so.
    testing::AssertionResult Works(const std::string& command, const std::string& text = "") {
        return testing::AssertionResult(folder_.Run(command) == 0 && folder_.Says(text))
               << command + ":\n" + folder_.Output() + folder_.Errors();
    }
    struct Step {
        std::string arguments;
        std::string output;
        std::string error = {}; // what is told
        int status = error.empty() ? 0 : 1;
    };
    // Goes through the command's steps.
    void Expect(const std::string& command, const std::vector<Step>& steps) {
        for (const Step& step : steps) {
            SCOPED_TRACE(step.arguments);
            EXPECT_EQ(folder_.Run(command + step.arguments), step.status) << folder_.Errors();
            EXPECT_EQ(folder_.Output(), step.output);
            EXPECT_TRUE(folder_.Complains(step.error) && folder_.Errors().empty() == step.error.empty());
        }
    }
    // All that a command prints, which must succeed.
    std::string Printed(const std::string& command) {
        EXPECT_TRUE(Works("export LC_ALL=C; " + command));
        return folder_.Output() + folder_.Errors();
    }
    // Everything below the folder: names, permissions and where links lead; of files what is in them and when
    // they were changed.
    std::string State(const std::string& below = ".") {
        return Printed("find '" + below +
                       "' -printf '%p %M %l\\n' -type f -printf '%p %T@\\n' -exec md5sum {} + | sort");
    }

    Shell folder_;
};

// The same with a program's folder.
class HomeTest : public CommandTest {
  protected:
    // Does work on the folder as it is now in a child process, once for each of its calls that change a file,
    // which meets the fault, and looks at the result: 1 failed, -1 killed; over 1 when no call was left.
    void AtEveryCall(const std::vector<Fault>& faults, const std::function<int(FileOperations&)>& work,
                     const std::function<void(int)>& look) {
        constexpr auto all = std::filesystem::copy_options::recursive;
        const TemporaryFolder before;
        std::filesystem::copy(home_.Path(), before.Path(), all);
        for (const Fault fault : faults)
            for (int at = 0, result = 0; result < 2; ++at) {
                SCOPED_TRACE(std::to_string(static_cast<int>(fault)) + " at call " + std::to_string(at));
                home_.Clear();
                std::filesystem::copy(before.Path(), home_.Path(), all);
                result = ResultInChild([&] {
                    FaultyFiles files;
                    files.Arm(fault, at);
                    const int failed = work(files);
                    return files.Disarm() ? failed : 2 + failed;
                });
                look(result);
            }
    }

    DataFolder home_;
};
