// What a conversion does where its request leaves the choice open: what a preset is made of.
#ifndef MOVIECONV_HOST_CONVERT_PREFERENCES_H
#define MOVIECONV_HOST_CONVERT_PREFERENCES_H

#include <array>
#include <cstdint>
#include <iterator>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace movieconv {

struct Size {
    int32_t width;
    int32_t height;
};

/// How much time an encoder takes for its compression; the numbers are the media writer's.
enum class Speed { kSlowest = 1, kSlower, kSlow, kMedium, kFast, kFaster, kFastest };

constexpr std::array<std::string_view, 7> kSpeedNames{"slowest", "slower", "slow",   "medium",
                                                      "fast",    "faster", "fastest"};

/// Which tools an H.264 encoder may use; the numbers are the media writer's.
enum class Profile { kBaseline = 1, kMain, kHigh };

constexpr std::array<std::string_view, 3> kProfileNames{"baseline", "main", "high"};

/// A figure that depends on another in steps: each holds from its bound on, the first from the beginning.
template <class Figure>
struct Steps {
    std::map<int, Figure> from;

    std::optional<Figure> At(int bound) const {
        if (from.empty())
            return std::nullopt;
        const auto above = from.upper_bound(bound);
        return (above == from.begin() ? above : std::prev(above))->second;
    }
};

struct Preferences {
    std::optional<uint32_t> format;    ///< Four-character code, for outputs without an extension.
    std::vector<uint32_t> videoCodecs; ///< The first that the format carries. Empty: the engine's choice.
    std::vector<uint32_t> audioCodecs;
    bool copySound = false; ///< Sound stays as it is coded, unless a request changes it.

    static constexpr uint32_t kAnyCodec = 0;
    /// By codec, by the height of the picture; see Request::quality.
    std::map<uint32_t, Steps<double>> quality;
    std::optional<int32_t> videoRate; ///< Bits per second, where there is no quality.
    std::optional<int32_t> videoMaxRate;
    std::optional<Speed> speed;
    std::optional<Profile> profile;
    std::optional<Size> fitWithin;   ///< Larger pictures are made smaller, in their shape.
    std::optional<double> frameRate; ///< Pictures per second.
    std::optional<double> maxFrameRate;

    Steps<int32_t> audioRate; ///< Bits per second, by the number of channels.
    std::optional<int32_t> channels;
    std::optional<int32_t> maxChannels;
    std::optional<int32_t> sampleRate; ///< Samples per second and channel.
    bool noVideo = false;
    bool noAudio = false;

    /// Null where neither the codec has any nor all have.
    const Steps<double>* QualitiesOf(uint32_t codec) const {
        for (const uint32_t key : {codec, kAnyCodec})
            if (const auto found = quality.find(key); found != quality.end())
                return &found->second;
        return nullptr;
    }
};

} // namespace movieconv

#endif
