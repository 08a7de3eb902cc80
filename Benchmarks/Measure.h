#pragma once

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <vector>

/// Timing of small pieces side by side.
namespace Benchmarks {

/// Keeps the compiler from leaving out work whose result nobody reads.
template <class T>
void keep(T&& value) {
    asm volatile("" : : "g"(&value) : "memory");
}

/// The seconds that `body` takes.
template <class Body>
double secondsOf(Body&& body) {
    const auto start = std::chrono::steady_clock::now();
    body();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

inline double median(std::vector<double> times) {
    std::sort(times.begin(), times.end());
    return times[times.size() / 2];
}

/// The medians of what `measured` and `floor` take, each run `rounds` times by turns, so that what
/// else the machine does meets both alike.
struct Comparison {
    double measured;
    double floor;
    double ratio() const { return measured / floor; }
};

struct Nothing {
    void operator()() const {}
};

/// `prepare` is done before each round, and not measured.
template <class Measured, class Floor, class Prepare = Nothing>
Comparison compare(Measured&& measured, Floor&& floor, int rounds = 15, Prepare&& prepare = {}) {
    std::vector<double> a, b;
    for (int i = 0; i < rounds; ++i) {
        prepare();
        a.push_back(secondsOf(measured));
        b.push_back(secondsOf(floor));
    }
    return {median(a), median(b)};
}

/// One line of a benchmark's report: `count` things were done in each run.
inline void report(const char* what, const Comparison& c, double count, const char* floorName) {
    std::printf("%-44s %8.1f ns  %-28s %8.1f ns  ratio %.2f\n", what, c.measured / count * 1e9,
                floorName, c.floor / count * 1e9, c.ratio());
}

}  // namespace Benchmarks
