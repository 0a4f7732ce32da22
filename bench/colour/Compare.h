// Times two pieces of work against each other, in turns, so that what else the machine does strikes both
// alike.
#ifndef MOVIECONV_BENCH_COLOUR_COMPARE_H
#define MOVIECONV_BENCH_COLOUR_COMPARE_H

#include <algorithm>
#include <benchmark/benchmark.h>
#include <ctime>
#include <vector>

namespace bench {

/// Processor time of this thread: what other programs take away does not count.
inline double secondsUsed() {
    timespec used{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &used);
    return static_cast<double>(used.tv_sec) + 1e-9 * static_cast<double>(used.tv_nsec);
}

/// Seconds that `calls` calls take, for one call.
template <class Work>
double secondsPerCall(const Work& work, int calls) {
    const double begin = secondsUsed();
    for (int i = 0; i < calls; ++i)
        work();
    return (secondsUsed() - begin) / calls;
}

/// Calls that fill one turn: long against the clock's grain, short against the scheduler's slices.
template <class Work>
int callsPerTurn(const Work& work) {
    constexpr double kTurnSeconds = 100e-6;
    double fastest = secondsPerCall(work, 1);
    for (int i = 0; i < 4; ++i)
        fastest = std::min(fastest, secondsPerCall(work, 1));
    return std::clamp(static_cast<int>(kTurnSeconds / std::max(fastest, 1e-9)), 1, 10000);
}

/// Fills a benchmark's run with turns of both. Counters: the fastest turn of each in seconds a call, and
/// `ratio`, how many times faster `ours` is than `other` by these, after `scale` has brought the two to the
/// same amount of work.
template <class Ours, class Other>
void compare(benchmark::State& state, const Ours& ours, const Other& other, double scale = 1.0) {
    const int ourCalls = callsPerTurn(ours);
    const int otherCalls = callsPerTurn(other);
    double fastestOurs = 1e9;
    double fastestOther = 1e9;
    for (auto _ : state) {
        const double ourTurn = secondsPerCall(ours, ourCalls);
        const double otherTurn = secondsPerCall(other, otherCalls);
        fastestOurs = std::min(fastestOurs, ourTurn);
        fastestOther = std::min(fastestOther, otherTurn);
        state.SetIterationTime(ourTurn * ourCalls + otherTurn * otherCalls);
    }
    state.counters["ours"] = fastestOurs;
    state.counters["other"] = fastestOther;
    state.counters["ratio"] = scale * fastestOther / fastestOurs;
}

} // namespace bench

#endif
