// What the engine itself costs: its loops over decoders, a media writer and an event queue that do nothing.
#include "api/MovieConv.h"
#include "tests/engine/CountingAllocator.h"
#include "tests/engine/IdleParts.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <fstream>
#include <string>
#include <thread>

namespace {

unsigned GoOn(void*, unsigned, unsigned, uintptr_t) {
    return 1;
}

/// Converts everything; the time from the start to the end of the worker.
double Convert(VideoDecoder* video, AudioDecoder* audio, ProgressCallback callback) {
    const MCHandle handle = MCCreate(video, audio);
    const auto start = std::chrono::steady_clock::now();
    MCStart(handle, 0.0, 0.0, nullptr, callback, nullptr);
    MCWait(handle, MC_INFINITE);
    const std::chrono::duration<double> elapsed = std::chrono::steady_clock::now() - start;
    MCDestroy(handle);
    return elapsed.count();
}

/// Peak of the process's memory, in KiB.
double PeakMemory() {
    std::ifstream status("/proc/self/status");
    for (std::string word; status >> word;)
        if (word == "VmHWM:") {
            double kib = 0.0;
            status >> kib;
            return kib;
        }
    return 0.0;
}

/// Converts `pictures` pictures with two blocks of sound each, or one of the two streams, and tells the time
/// that a picture (or two blocks) takes, what a conversion allocates and how much the peak memory grows.
void Loop(benchmark::State& state, bool hasVideo, bool hasAudio) {
    const int64_t pictures = state.range(0);
    const double memory = PeakMemory();
    int64_t allocations = 0;
    while (state.KeepRunning()) {
        IdleVideo video(pictures);
        IdleAudio audio(2 * pictures);
        const int64_t before = Allocations();
        state.SetIterationTime(Convert(hasVideo ? &video : nullptr, hasAudio ? &audio : nullptr, GoOn));
        allocations = Allocations() - before;
    }
    state.counters["per_picture"] =
        benchmark::Counter(static_cast<double>(pictures),
                           benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
    state.counters["allocations"] = static_cast<double>(allocations);
    state.counters["memory_KiB"] = PeakMemory() - memory;
}

constexpr int64_t kTenHours = 10 * 3600 * 25;

void AudioVideo(benchmark::State& state) {
    Loop(state, true, true);
}
void Audio(benchmark::State& state) {
    Loop(state, false, true);
}
void Video(benchmark::State& state) {
    Loop(state, true, false);
}
BENCHMARK(AudioVideo)->Arg(kTenHours / 10)->Arg(kTenHours)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(Audio)->Arg(kTenHours)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(Video)->Arg(kTenHours)->UseManualTime()->Unit(benchmark::kMillisecond);

/// From MCStop to its return, while the loop runs (0) or is paused (1).
void Stop(benchmark::State& state) {
    double longest = 0.0;
    while (state.KeepRunning()) {
        IdleVideo video(INT64_MAX);
        IdleAudio audio(INT64_MAX);
        const MCHandle handle = MCCreate(&video, &audio);
        MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr);
        if (state.range(0) != 0)
            MCPause(handle);
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
        const auto start = std::chrono::steady_clock::now();
        MCStop(handle);
        const std::chrono::duration<double> elapsed = std::chrono::steady_clock::now() - start;
        state.SetIterationTime(elapsed.count());
        longest = std::max(longest, elapsed.count());
        MCDestroy(handle);
    }
    state.counters["longest"] = longest;
}
BENCHMARK(Stop)->Arg(0)->Arg(1)->UseManualTime()->Iterations(100)->Unit(benchmark::kMillisecond);

} // namespace

int main(int argc, char** argv) {
    // Nobody else takes its lines here, and they would stand between those of the table.
    MCSetLogCallback([](void*, int, const char*) {}, nullptr);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
