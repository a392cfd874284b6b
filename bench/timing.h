#pragma once

#include <time.h>

#include <algorithm>
#include <cstddef>
#include <vector>

/// What the benchmarks do with time.
namespace zr::bench {

/// CPU time of this thread, in seconds.
inline double cpuSeconds() {
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + 1e-9 * static_cast<double>(now.tv_nsec);
}

template <class Run>
double secondsOf(const Run& run) {
    const double start = cpuSeconds();
    run();
    return cpuSeconds() - start;
}

template <class Run>
double bestTime(const Run& run, int rounds) {
    double best = secondsOf(run);
    for (int i = 1; i < rounds; ++i) best = std::min(best, secondsOf(run));
    return best;
}

inline double median(std::vector<double> values) {
    if (values.empty()) return 0;
    const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

}  // namespace zr::bench
