// The trace routines have no result: what can be seen is which samples they read, whether they convert, and
// (under the leak check of the sanitizer builds) that their bitmap is released.
#include "media/MediaRecords.h"
#include "tests/image/TestPicture.h"
#include "tests/support/Process.h"

#include <csignal>
#include <cstring>
#include <limits>

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

/// Whether a process that does this dies of it. Pictures without planes, or at the end of their memory, make
/// a conversion show.
template <class Call>
bool Dies(Call call) {
    const auto live = [&] {
        call();
        return 0;
    };
    return InChild(live).code != 0;
}

TEST(TraceImage, ReadsThePictureAndNothingBehindIt) {
    for (const PictureSize size : PictureSizes()) {
        TestPlanes planes(size.width, size.height, 3);
        const VideoImage image = MakeImage(planes, size.width, size.height);
        xTraceImage(&image);
        planes.Check();
    }
    TestPlanes planes(34, 3, 3); // each ends with accessible memory
    for (unsigned char* VideoImage::*const plane : {&VideoImage::pY, &VideoImage::pU, &VideoImage::pV}) {
        VideoImage image = MakeImage(planes, 34, 3);
        ++(image.*plane);
        EXPECT_TRUE(Dies([&] { xTraceImage(&image); })) << "the last sample was not read";
    }
}

TEST(TraceImage, ConvertsPlanarPicturesOfASizeAboveZero) {
    constexpr int kLeast = std::numeric_limits<int>::min();
    struct {
        int type, format, width, height;
        bool converts;
    } const rows[] = {
        {kMediaTypePicture, kPictureFormatPlanar420, 4, 4, true},
        {kMediaTypePicture, 1, 4, 4, false},
        {3, kPictureFormatPlanar420, 4, 4, false},
        {kMediaTypePicture, kPictureFormatPlanar420, 0, 4, false},
        {kMediaTypePicture, kPictureFormatPlanar420, 4, 0, false},
        {kMediaTypePicture, kPictureFormatPlanar420, -1, 4, false},
        {kMediaTypePicture, kPictureFormatPlanar420, 4, kLeast, false},
    };
    for (const auto& row : rows) {
        VideoImage image{}; // without planes
        image.nType = row.type;
        image.nFormat = row.format;
        image.nWidth = row.width;
        image.nHeight = row.height;
        EXPECT_EQ(Dies([&] { xTraceImage(&image); }), row.converts)
            << "type " << row.type << ", format " << row.format << ", " << row.width << " x " << row.height;
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
        bits.Check("pixels");

        const int unused = pixels % 2; // headers lie at even addresses
        TestRows packed(40 + pixels + unused, 1, 40 + pixels + unused);
        std::memcpy(packed.Data(), &info.bmiHeader, 40);
        xTraceImage(reinterpret_cast<tagBITMAPINFO*>(packed.Data()), nullptr);
        EXPECT_EQ(std::memcmp(packed.Data(), &info.bmiHeader, 40), 0);
    }
}

TEST(TraceBitmap, ConvertsSizesAboveZero) {
    for (const PictureSize size :
         {PictureSize{4, 4}, {0, 4}, {4, 0}, {-1, 4}, {4, std::numeric_limits<int>::min()}}) {
        TestRows header(40, 1, 40); // no pixels behind it
        const tagBITMAPINFOHEADER value = BitmapHeader(size.width, size.height, 12);
        std::memcpy(header.Data(), &value, 40);
        EXPECT_EQ(Dies([&] { xTraceImage(reinterpret_cast<tagBITMAPINFO*>(header.Data()), nullptr); }),
                  size.width > 0 && size.height > 0)
            << size.width << " x " << size.height;
    }
}

} // namespace
