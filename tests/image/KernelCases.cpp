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

Rows One(uint8_t* const* rows) {
    return {rows[0], 0};
}
Rows Two(uint8_t* const* rows) {
    return {rows[0], rows[1] - rows[0]};
}
Planes420 Planes(uint8_t* const* rows) {
    return {Two(rows), One(rows + 2), One(rows + 3)};
}

} // namespace

// The table reads best with each call spelled out in the same few words.
#define RUN(call) [](const RowKernels& k, uint8_t* const* t, uint8_t* const* s, Size size) { k.call; }

const std::vector<KernelCase>& KernelCases() {
    using Extents = std::vector<Extent>;
    const Extents luma{kBytes1, kBytes1}, packed{kBytes2, kBytes2}, rgb{kBytes3, kBytes3},
        rgbx{kBytes4, kBytes4};
    const Extents groups{kGroups, kGroups}, uyvySamples{kUyvySamples, kUyvySamples};
    const Extents planes{kBytes1, kBytes1, kHalf, kHalf},
        alphaPlanes{kBytes1, kBytes1, kHalf, kHalf, kBytes1, kBytes1};
    static const std::vector<KernelCase> cases{
        {"bgr32To420", planes, rgbx, 1, RUN(bgr32To420(Planes(t), Two(s), size))},
        {"bgr24To420", planes, rgb, 1, RUN(bgr24To420(Planes(t), Two(s), size))},
        {"bgr24To420Simple", planes, rgb, 1, RUN(bgr24To420Simple(Planes(t), Two(s), size))},
        {"bgra32To420", alphaPlanes, rgbx, 1, RUN(bgra32To420(Planes(t), Two(t + 4), Two(s), size))},
        {"bgr24From420", rgb, planes, 1, RUN(bgr24From420(Two(t), Planes(s), size))},
        {"bgr24From420Simple", rgb, planes, 1, RUN(bgr24From420Simple(Two(t), Planes(s), size))},
        {"bgrxFrom420", rgbx, planes, 1, RUN(bgrxFrom420(Two(t), Planes(s), size))},
        {"bgraFrom420", rgbx, planes, 1, RUN(bgraFrom420(Two(t), Planes(s), size))},
        {"packedTo420 UYVY", planes, packed, 2, RUN(packedTo420[kUyvy](Planes(t), Two(s), size))},
        {"packedTo420 YUY2", planes, packed, 2, RUN(packedTo420[kYuy2](Planes(t), Two(s), size))},
        {"packedFrom420 UYVY", packed, planes, 2, RUN(packedFrom420[kUyvy](Two(t), Planes(s), size))},
        {"packedFrom420 YUY2", packed, planes, 2, RUN(packedFrom420[kYuy2](Two(t), Planes(s), size))},
        {"packedFromBgr24 UYVY", groups, rgb, 1, RUN(packedFromBgr24[kUyvy](Two(t), Two(s), size))},
        {"packedFromBgr24 YUY2", groups, rgb, 1, RUN(packedFromBgr24[kYuy2](Two(t), Two(s), size))},
        {"bgr24FromPacked UYVY", rgb, uyvySamples, 1, RUN(bgr24FromPacked[kUyvy](Two(t), Two(s), size))},
        {"bgr24FromPacked YUY2", rgb, groups, 1, RUN(bgr24FromPacked[kYuy2](Two(t), Two(s), size))},
        {"swapPacked", packed, packed, 2, RUN(swapPacked(Two(t), Two(s), size))},
        {"copy", luma, luma, 1, RUN(copy(Two(t), Two(s), size))},
        {"halve", {kHalf}, luma, 1, RUN(halve(One(t), Two(s), size))},
        {"doubled", packed, {kBytes1}, 1, RUN(doubled(Two(t), One(s), {size.width, 1}))},
    };
    return cases;
}
