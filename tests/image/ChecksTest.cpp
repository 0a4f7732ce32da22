// What the routines say and do when a precondition is broken.
#include "tests/image/TestPicture.h"

#include <csignal>
#include <cstring>
#include <functional>
#include <limits>

#include <sys/mman.h>
#include <unistd.h>

namespace {

unsigned char buffer[64];
unsigned char* const kSome = buffer;
tagBITMAPINFOHEADER header24 = BitmapHeader(1, 1, 24);
tagBITMAPINFOHEADER header32 = BitmapHeader(1, 1, 32);

/// The failure must be an abort, but nothing but the check's line is to stand on standard error: emulators
/// add one of their own when a signal ends a program.
void ExpectFailedCheck(const std::function<void()>& call, unsigned line, const std::string& condition) {
    constexpr int kAborted = 86;
    const auto callAndCatchAbort = [&] {
        std::signal(SIGABRT, [](int) { _exit(kAborted); });
        call();
    };
    const std::string message = "../../Common/Image/ImageConvert.cpp:" + std::to_string(line) +
                                ": failed assertion `" + condition + "'\n";
    EXPECT_EXIT(callAndCatchAbort(), testing::ExitedWithCode(kAborted),
                testing::Matcher<const std::string&>(testing::Eq(message)))
        << "line " << line;
}

using Convert = void (*)(tagBITMAPINFOHEADER* header, unsigned char* bits, unsigned char* y, unsigned char* u,
                         unsigned char* v);

// The table reads best with each call spelled out in the same few words.
#define RUN(call)                                                                                            \
    []([[maybe_unused]] tagBITMAPINFOHEADER* header, unsigned char* bits, unsigned char* y,                  \
       unsigned char* u, unsigned char* v) { call; }

TEST(ChecksDeathTest, BitmapsAndPlanes) {
    struct {
        Convert convert;
        const char* bitmap;
        int bits; // 0: without a header
        unsigned line;
    } const rows[] = {
        {RUN(Rgb32_2_yuv420(y, u, v, 1, 1, 1, header, bits)), "lpSrc", 32, 652},
        {RUN(Argb_2_yuv420(y, u, v, 1, 1, 1, header, bits)), "lpSrc", 32, 887},
        {RUN(Rgb24_2_yuv420(y, u, v, 1, 1, 1, header, bits)), "lpSrc", 24, 996},
        {RUN(Rgb32_2_yuv420A(y, u, v, kSome, 1, 1, 1, header, bits, 1)), "lpSrc", 32, 1683},
        {RUN(Rgb32_2_yuv420A_R(y, u, v, kSome, 1, 1, 1, header, bits)), "lpSrc", 32, 1683},
        {RUN(Rgb32_2_yuv420_Ex(y, u, v, 1, 1, 1, bits, 0, 0, 0)), "lpSrc", 0, 760},
        {RUN(Yuv420_2_rgb24(header, bits, y, u, v, 1, 1, 1)), "lpDst", 24, 283},
        {RUN(Yuv420_2_rgb32(header, bits, y, u, v, 1, 1, 1)), "lpDst", 32, 414},
        {RUN(Yuv420_2_Argb(header, bits, y, u, v, 1, 1, 1)), "lpDst", 32, 529},
    };
    for (const auto& row : rows) {
        const std::string bitmap = row.bitmap;
        std::string format = bitmap + "Bmi && ";
        format.append(bitmap).append("Bmi->biBitCount == ").append(std::to_string(row.bits));
        auto* const right = row.bits == 32 ? &header32 : &header24;
        auto* const wrong = row.bits == 32 ? &header24 : &header32;
        if (row.bits != 0) {
            ExpectFailedCheck([&] { row.convert(nullptr, kSome, kSome, kSome, kSome); }, row.line, format);
            ExpectFailedCheck([&] { row.convert(wrong, nullptr, nullptr, nullptr, nullptr); }, row.line,
                              format);
        }
        for (const int missing : {0, 1, 2, 3}) {
            const auto at = [missing](int i) { return i == missing ? nullptr : kSome; };
            ExpectFailedCheck([&] { row.convert(right, at(0), at(1), at(2), at(3)); }, row.line + 1,
                              bitmap + "Bits && pY && pU && pV");
        }
    }
}

TEST(ChecksDeathTest, Packed) {
    const auto toPacked = [](unsigned char* to, int pitchTo, int xDst, int cx, unsigned char* from,
                             int pitchFrom, int xSrc) {
        return [=] { Rgb24_2_YUY2(to, pitchTo, xDst, 0, cx, 1, 1, from, 1, pitchFrom, xSrc, 0); };
    };
    constexpr int kMost = std::numeric_limits<int>::max();
    const std::string buffers = "lpBitsDst && lpBitsSrc";
    ExpectFailedCheck(toPacked(nullptr, 8, 0, 2, kSome, 30, 0), 1110, buffers);
    ExpectFailedCheck(toPacked(kSome, 8, 0, 2, nullptr, 30, 0), 1110, buffers);
    ExpectFailedCheck(toPacked(kSome, 8, 1, 4, kSome, 30, 0), 1111, "(xDst + cxDst) * 2 <= nPitchDst");
    ExpectFailedCheck(toPacked(kSome, 8, kMost, kMost, kSome, 30, 0), 1111,
                      "(xDst + cxDst) * 2 <= nPitchDst");
    ExpectFailedCheck(toPacked(kSome, 8, 0, 3, kSome, 30, 8), 1112, "nPitchSrc / 3 - xSrc >= cxDst");
    ExpectFailedCheck(toPacked(kSome, 8, 0, 0, kSome, -4, 0), 1112, "nPitchSrc / 3 - xSrc >= cxDst");

    ExpectFailedCheck([] { YUY2_2_Rgb24(nullptr, 1, 6, 0, 0, 2, 1, kSome, 4, 1, 0, 0); }, 1232, buffers);
    ExpectFailedCheck([] { YUY2_2_Rgb24(kSome, 1, 6, 0, 0, 0, 0, nullptr, 4, 1, 0, 0); }, 1232, buffers);
}

TEST(ChecksDeathTest, PackedToPlanesStopsBeforeTheFirstSampleOutside) {
    // V begins in row yDst / 2 = 2, the bound is the first sample of row ySrc + cy = 2: the group 0 of the
    // first pair of rows is inside, the group 1 is not.
    constexpr int kWidth = 8;
    // Shared with the process that is about to die.
    void* const planes =
        mmap(nullptr, 6 * kWidth * 3, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    ASSERT_NE(planes, MAP_FAILED);
    auto* const y = static_cast<unsigned char*>(planes);
    unsigned char* const u = y + 6 * kWidth;
    unsigned char* const v = u + 6 * kWidth;
    unsigned char packed[2 * kWidth * 2];
    std::memset(packed, 200, sizeof packed);
    ExpectFailedCheck(
        [&] { YUY2_2_Yuv420(y, u, v, kWidth, kWidth, kWidth, 0, 4, kWidth, 2, packed, 2 * kWidth, 1, 0, 0); },
        1452, "(char*)V <= ((char*)pV + (ySrc + cy) * nPt_V)");
    for (int i = 0; i < 6 * kWidth; ++i) {
        const int row = i / kWidth;
        const int column = i % kWidth;
        EXPECT_EQ(y[i], (row == 4 || row == 5) && column < 2 ? 200 : 0) << "Y " << row << ", " << column;
        EXPECT_EQ(u[i], row == 2 && column == 0 ? 200 : 0) << "U " << row << ", " << column;
        EXPECT_EQ(v[i], row == 2 && column == 0 ? 200 : 0) << "V " << row << ", " << column;
    }
    munmap(planes, 6 * kWidth * 3);
}

TEST(Checks, TopDownAlphaAndTheSimpleRoutinesMakeNone) {
    unsigned char pixel[]{1, 2, 3, 44};
    unsigned char y, u, v, a;
    Rgb32_2_yuv420A(&y, &u, &v, &a, 1, 1, 1, &header24, pixel, 0);
    EXPECT_EQ(a, 44);
    Rgb24_2_yuv420Simple(nullptr, nullptr, nullptr, 1, 1, 1, &header32, nullptr);
    Yuv420_2_rgb24Simple(&header32, nullptr, nullptr, nullptr, nullptr, 1, 1, 1);
}

} // namespace
