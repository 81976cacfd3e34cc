// The options that all benchmarks have, and how they take times.
#pragma once

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <string_view>

struct OPTIONS {
    explicit OPTIONS(long defaultRecords) : records(defaultRecords) {}

    long records;
    int rounds = 7;
    std::string folder = std::filesystem::temp_directory_path();
};

// False when the arguments are no pairs of a known option and its value.
inline bool ReadOptions(int argc, char** argv, OPTIONS* options) {
    for (int i = 1; i + 1 < argc; i += 2) {
        const std::string_view name = argv[i];
        if (name == "--records") {
            options->records = std::max(std::atol(argv[i + 1]), 1L);
        } else if (name == "--rounds") {
            options->rounds = std::max(std::atoi(argv[i + 1]), 1);
        } else if (name == "--folder") {
            options->folder = argv[i + 1];
        } else {
            return false;
        }
    }
    return argc % 2 == 1;
}

// The shortest of several runs, in seconds. `prepare` comes before each and is not counted.
template <class Prepare, class Work>
double Shortest(int rounds, Prepare prepare, Work work) {
    double shortest = 1e9;
    for (int i = 0; i < rounds; ++i) {
        prepare();
        const auto start = std::chrono::steady_clock::now();
        work();
        const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
        shortest = std::min(shortest, took.count());
    }
    return shortest;
}

template <class Work>
double Shortest(int rounds, Work work) {
    return Shortest(
        rounds, [] {}, work);
}
