#include "tests/image/KernelCases.h"

namespace {

using namespace image;

constexpr Extent kBytes1 = [](size_t width) { return width; };
constexpr Extent kBytes2 = [](size_t width) { return 2 * width; };
constexpr Extent kBytes3 = [](size_t width) { return 3 * width; };
constexpr Extent kBytes4 = [](size_t width) { return 4 * width; };
constexpr Extent kHalf = [](size_t width) { return (width + 1) / 2; };
constexpr Extent kGroups = [](size_t width) { return (width + 1) / 2 * 4; };
/// An odd pixel needs U, Y0 and V of its group, not Y1, which stands last.
constexpr Extent kUyvySamples = [](size_t width) { return width / 2 * 4 + width % 2 * 3; };

template <class Kernel>
void RunTo420(Kernel kernel, uint8_t* const* t, const uint8_t* const* s, ptrdiff_t width) {
    kernel({t[0], t[1]}, t[2], t[3], {s[0], s[1]}, width);
}

template <class Kernel>
void RunFrom420(Kernel kernel, uint8_t* const* t, const uint8_t* const* s, ptrdiff_t width) {
    kernel({t[0], t[1]}, {s[0], s[1]}, s[2], s[3], width);
}

} // namespace

// The table reads best with each call spelled out in the same few words.
#define RUN(call) [](const RowKernels& k, uint8_t* const* t, const uint8_t* const* s, ptrdiff_t w) { call; }

const std::vector<KernelCase>& KernelCases() {
    const std::vector<Extent> planes{kBytes1, kBytes1, kHalf, kHalf};
    static const std::vector<KernelCase> cases{
        {"bgr32To420", planes, {kBytes4, kBytes4}, 1, RUN(RunTo420(k.bgr32To420, t, s, w))},
        {"bgr24To420", planes, {kBytes3, kBytes3}, 1, RUN(RunTo420(k.bgr24To420, t, s, w))},
        {"bgr24To420Simple", planes, {kBytes3, kBytes3}, 1, RUN(RunTo420(k.bgr24To420Simple, t, s, w))},
        {"bgra32To420",
         {kBytes1, kBytes1, kHalf, kHalf, kBytes1, kBytes1},
         {kBytes4, kBytes4},
         1,
         RUN(k.bgra32To420({t[0], t[1]}, t[2], t[3], {t[4], t[5]}, {s[0], s[1]}, w))},
        {"bgr24From420", {kBytes3, kBytes3}, planes, 1, RUN(RunFrom420(k.bgr24From420, t, s, w))},
        {"bgr24From420Simple", {kBytes3, kBytes3}, planes, 1, RUN(RunFrom420(k.bgr24From420Simple, t, s, w))},
        {"bgrxFrom420", {kBytes4, kBytes4}, planes, 1, RUN(RunFrom420(k.bgrxFrom420, t, s, w))},
        {"bgraFrom420", {kBytes4, kBytes4}, planes, 1, RUN(RunFrom420(k.bgraFrom420, t, s, w))},
        {"packedTo420 UYVY", planes, {kBytes2, kBytes2}, 2, RUN(RunTo420(k.packedTo420[kUyvy], t, s, w))},
        {"packedTo420 YUY2", planes, {kBytes2, kBytes2}, 2, RUN(RunTo420(k.packedTo420[kYuy2], t, s, w))},
        {"packedFrom420 UYVY",
         {kBytes2, kBytes2},
         planes,
         2,
         RUN(RunFrom420(k.packedFrom420[kUyvy], t, s, w))},
        {"packedFrom420 YUY2",
         {kBytes2, kBytes2},
         planes,
         2,
         RUN(RunFrom420(k.packedFrom420[kYuy2], t, s, w))},
        {"packedFromBgr24 UYVY", {kGroups}, {kBytes3}, 1, RUN(k.packedFromBgr24[kUyvy](t[0], s[0], w))},
        {"packedFromBgr24 YUY2", {kGroups}, {kBytes3}, 1, RUN(k.packedFromBgr24[kYuy2](t[0], s[0], w))},
        {"bgr24FromPacked UYVY", {kBytes3}, {kUyvySamples}, 1, RUN(k.bgr24FromPacked[kUyvy](t[0], s[0], w))},
        {"bgr24FromPacked YUY2", {kBytes3}, {kGroups}, 1, RUN(k.bgr24FromPacked[kYuy2](t[0], s[0], w))},
        {"swapPacked", {kBytes2}, {kBytes2}, 2, RUN(k.swapPacked(t[0], s[0], w))},
        {"halve", {kHalf}, {kBytes1, kBytes1}, 1, RUN(k.halve(t[0], {s[0], s[1]}, w))},
        {"doubled", {kBytes2, kBytes2}, {kBytes1}, 1, RUN(k.doubled({t[0], t[1]}, s[0], w))},
    };
    return cases;
}
