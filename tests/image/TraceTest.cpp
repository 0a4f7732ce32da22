// The trace routines have no result: what can be seen is which samples they read, that they come back, and
// (under the leak check of the sanitizer builds) that their bitmap is released.
#include "media/MediaRecords.h"
#include "tests/image/TestPicture.h"

#include <csignal>
#include <cstring>
#include <limits>
#include <utility>

namespace {

VideoImage MakeImage(TestPlanes& planes, int width, int height) {
    VideoImage image{};
    image.nType = kMediaTypePicture;
    image.nFormat = kPictureFormatPlanar420;
    image.pY = planes.y.Data();
    image.pU = planes.u.Data();
    image.pV = planes.v.Data();
    image.nWidth = width;
    image.nHeight = height;
    image.nPitchY = planes.y.Pitch();
    image.nPitchU = planes.u.Pitch();
    image.nPitchV = planes.v.Pitch();
    return image;
}

TEST(TraceImage, ReadsNothingButThePicture) {
    for (const PictureSize size : PictureSizes()) {
        TestPlanes planes(size.width, size.height, 3);
        const VideoImage image = MakeImage(planes, size.width, size.height);
        xTraceImage(&image);
    }
}

TEST(TraceImage, LooksAtPlanesOfPlanarPicturesOnly) {
    VideoImage image{}; // without planes
    image.nWidth = image.nHeight = 4;
    for (const auto& [type, format] :
         {std::pair<int, int>{kMediaTypePicture, 1}, {3, kPictureFormatPlanar420}}) {
        image.nType = type;
        image.nFormat = format;
        xTraceImage(&image);
    }
}

TEST(Trace, DoesNothingForASizeOfZeroOrLess) {
    VideoImage image{};
    image.nType = kMediaTypePicture;
    image.nFormat = kPictureFormatPlanar420;
    tagBITMAPINFO info{};
    for (const PictureSize size :
         {PictureSize{0, 4}, {4, 0}, {-1, 4}, {4, std::numeric_limits<int>::min()}}) {
        image.nWidth = size.width;
        image.nHeight = size.height;
        xTraceImage(&image);
        info.bmiHeader = BitmapHeader(size.width, size.height, 12);
        xTraceImage(&info, nullptr);
    }
}

TEST(TraceImageDeathTest, NullPlaneFailsTheConversionsCheck) {
    TestPlanes planes(4, 4, 0);
    VideoImage image = MakeImage(planes, 4, 4);
    image.pU = nullptr;
    EXPECT_EXIT(xTraceImage(&image), testing::KilledBySignal(SIGABRT),
                "ImageConvert.cpp:284: failed assertion `lpDstBits && pY && pU && pV'");
}

TEST(TraceBitmap, ReadsThePlanesAtOrBehindTheHeader) {
    for (const PictureSize size : PictureSizes()) {
        const int chroma = (size.width + 1) / 2 * ((size.height + 1) / 2);
        const int pixels = size.width * size.height + 2 * chroma;
        TestRows bits(pixels, 1, pixels);
        tagBITMAPINFO info{};
        info.bmiHeader = BitmapHeader(size.width, size.height, 12);
        xTraceImage(&info, bits.Data());

        const int unused = pixels % 2; // headers lie at even addresses
        TestRows packed(40 + pixels + unused, 1, 40 + pixels + unused);
        std::memcpy(packed.Data(), &info.bmiHeader, 40);
        xTraceImage(reinterpret_cast<tagBITMAPINFO*>(packed.Data()), nullptr);
        EXPECT_EQ(std::memcmp(packed.Data(), &info.bmiHeader, 40), 0);
    }
}

} // namespace
