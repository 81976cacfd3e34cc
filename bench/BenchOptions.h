#pragma once

// The options that all benchmarks have, and how they take times.

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

struct OPTIONS {
    explicit OPTIONS(long defaultRecords) : records(defaultRecords) {}

    long records;
    int rounds = 7;
    int peerCache = 0; // of SQLite, in KB; 0: its own default
    std::string folder = std::filesystem::temp_directory_path();
};

// False when the arguments are no pairs of a known option and its value.
inline bool ReadOptions(int argc, char** argv, OPTIONS* options) {
    for (int i = 1; i + 1 < argc; i += 2) {
        const std::string_view name = argv[i];
        if (name == "--records")
            options->records = std::max(std::atol(argv[i + 1]), 1L);
        else if (name == "--rounds")
            options->rounds = std::max(std::atoi(argv[i + 1]), 1);
        else if (name == "--peer-cache")
            options->peerCache = std::max(std::atoi(argv[i + 1]), 0);
        else if (name == "--folder")
            options->folder = argv[i + 1];
        else
            return false;
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

// Something to be timed; `prepare` comes before it and is not counted.
struct TIMED {
    std::function<void()> work;
    std::function<void()> prepare = [] {};
};

// The shortest of several runs of each, in seconds. They take turns, so that a busy moment of the machine
// meets all of them.
inline std::vector<double> ShortestInTurn(int rounds, const std::vector<TIMED>& all) {
    std::vector<double> shortest(all.size(), 1e9);
    for (int round = 0; round < rounds; ++round)
        for (std::size_t i = 0; i < all.size(); ++i)
            shortest[i] = std::min(shortest[i], Shortest(1, all[i].prepare, all[i].work));
    return shortest;
}
