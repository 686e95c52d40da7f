// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BENCH_OWN_TIME_H
#define TAVIWIRELESS_BENCH_OWN_TIME_H

#include <benchmark/benchmark.h>
#include <time.h>

#include <algorithm>

namespace taviwireless::bench {

// Seconds of the processor that this process has used; those of programs that it ran are not in it.
inline double OwnTime() {
    timespec used{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &used);
    return static_cast<double>(used.tv_sec) + static_cast<double>(used.tv_nsec) / 1e9;
}

// Measures, in turns, what `all` costs this process more than `tools`, which only runs the same
// programs. For benchmarks with manual time. Each returns whether it went well.
template <typename Tools, typename All>
void MeasureOwnPart(benchmark::State& state, Tools tools, All all) {
    for (auto _ : state) {
        const double begin = OwnTime();
        const bool haveRun = tools();
        const double between = OwnTime();
        if (!haveRun || !all()) {
            state.SkipWithError("did not go well");
            return;
        }
        constexpr double kLeast = 1e-9;
        state.SetIterationTime(std::max(kLeast, OwnTime() - between - (between - begin)));
    }
}

}  // namespace taviwireless::bench

#endif
