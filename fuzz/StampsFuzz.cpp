// What the program makes of a source's time stamps: pictures that rise, sound on one clock, whatever they
// say.
#include "fuzz/Fuzz.h"
#include "host/source/SoundTimeline.h"
#include "host/source/StampRepair.h"
#include "media/MediaRecords.h"

#include <algorithm>
#include <optional>

namespace {

constexpr int64_t kFarthest = int64_t{1} << 60; // the source hands on nothing beyond

/// The next stamp of a stream that is at `due`: there, near it, anywhere, or none.
std::optional<int64_t> NextStamp(FuzzedDataProvider& input, int64_t due) {
    switch (input.ConsumeIntegralInRange(0, 5)) {
    case 0:
        return std::nullopt;
    case 1:
        return std::clamp(WildInteger<int64_t>(input, due), -kFarthest, kFarthest);
    case 2:
        return due + input.ConsumeIntegralInRange(-20'000'000, 20'000'000);
    default:
        return due;
    }
}

void FuzzPictures(FuzzedDataProvider& input) {
    const auto step = input.ConsumeIntegralInRange<int64_t>(1, 1 << 30);
    movieconv::StampRepair repair(step);
    std::optional<int64_t> last;
    int64_t given = 0;
    const auto take = [&](const std::optional<movieconv::StampRepair::Stamp>& stamp) {
        if (!stamp)
            return;
        ++given;
        FUZZ_CHECK(stamp->duration > 0 && (!last || stamp->time > *last));
        last = stamp->time;
    };
    int64_t pushed = 0;
    for (; input.remaining_bytes() > 0; ++pushed)
        take(repair.Push(NextStamp(input, pushed * step)));
    take(repair.Finish());
    FUZZ_CHECK(given == pushed && repair.Repaired() <= pushed);
}

void FuzzSound(FuzzedDataProvider& input) {
    const int rate = input.PickValueInArray({8000, 44100, 48000, 384000});
    const int64_t begin = WildInteger<int64_t>(input, 0) >> 4;
    movieconv::SoundTimeline timeline(rate, begin);
    for (int64_t due = begin; input.remaining_bytes() > 0;) {
        const int64_t samples = input.ConsumeIntegralInRange(1, 8192);
        const int64_t before = timeline.Position();
        const auto placed = timeline.Place(NextStamp(input, due), samples);
        FUZZ_CHECK(placed.silence >= 0 && placed.cut >= 0 && placed.cut <= samples);
        FUZZ_CHECK(placed.silence == 0 || placed.cut == 0);
        FUZZ_CHECK(timeline.Position() == before + placed.silence + samples - placed.cut);
        due += samples * kTicksPerSecond / rate;
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    constexpr void (*kTargets[])(FuzzedDataProvider&) = {FuzzPictures, FuzzSound};
    input.PickValueInArray(kTargets)(input);
    return 0;
}
