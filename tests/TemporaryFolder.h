#pragma once

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <stdlib.h>
#include <string>
#include <vector>

// A folder of the test's own, removed with everything in it at the end.
class TemporaryFolder {
  public:
    TemporaryFolder() : path_(std::filesystem::temp_directory_path() / "quorvan-test-XXXXXX") {
        if (mkdtemp(path_.data()) == nullptr)
            throw std::runtime_error("no temporary folder");
    }
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;
    ~TemporaryFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }

    [[nodiscard]] const std::string& Path() const { return path_; }
    [[nodiscard]] std::string File(const std::string& name) const { return path_ + "/" + name; }

    void Write(const std::string& name, const std::string& content) const {
        std::ofstream(File(name), std::ios::binary) << content;
    }
    [[nodiscard]] std::string Read(const std::string& name) const {
        std::ostringstream content;
        content << std::ifstream(File(name), std::ios::binary).rdbuf();
        return content.str();
    }
    [[nodiscard]] bool Has(const std::string& name) const { return std::filesystem::exists(File(name)); }
    // The names of what lies in it, or in a folder below, in alphabetical order.
    [[nodiscard]] std::vector<std::string> Names(const std::string& below = "") const {
        std::vector<std::string> names;
        std::error_code missing;
        for (const auto& entry : std::filesystem::directory_iterator(File(below), missing))
            names.push_back(entry.path().filename().string());
        std::sort(names.begin(), names.end());
        return names;
    }
    void Clear() const {
        std::filesystem::remove_all(path_);
        std::filesystem::create_directory(path_);
    }

  private:
    std::string path_;
};
