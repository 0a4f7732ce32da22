// Pictures in RGB, such as a program draws them: the colour routines make the planes that the engine takes.
// Usage: rgb OUTPUT.mp4
#include <movieconv/ImageConvert.h>
#include <movieconv/MovieConv.h>

#include <cstdio>
#include <string>
#include <vector>

struct Canvas {
    static constexpr int kWidth = 321, kHeight = 241, kRate = 25, kPictures = 50; // odd sizes do too
    // The routines go by BT.601, and players take BT.709 from 720 lines on where a file tells nothing: larger
    // pictures need nColorMatrix 6 in the media writer's options (movieconv/WriterStatus.h).
    static_assert(kHeight < 720);
    static constexpr int kChromaWidth = (kWidth + 1) / 2, kChromaHeight = (kHeight + 1) / 2;
    std::vector<unsigned char> pixels =
        std::vector<unsigned char>(4 * kWidth * kHeight); // blue, green, red, -
    std::vector<unsigned char> y = std::vector<unsigned char>(kWidth * kHeight);
    std::vector<unsigned char> u = std::vector<unsigned char>(kChromaWidth * kChromaHeight);
    std::vector<unsigned char> v = std::vector<unsigned char>(kChromaWidth * kChromaHeight);
    int number = 0;

    /// A square that grows, orange on blue.
    void Draw() {
        for (int row = 0; row < kHeight; ++row) {
            for (int column = 0; column < kWidth; ++column) {
                unsigned char* pixel = &pixels[static_cast<std::size_t>(4 * (row * kWidth + column))];
                const bool inside = row < 4 * number && column < 6 * number;
                pixel[0] = inside ? 0 : 160;
                pixel[1] = inside ? 140 : 40;
                pixel[2] = inside ? 255 : 20;
            }
        }
    }
};

static int Describe(void*, VideoFormat* format) {
    *format = {Canvas::kWidth, Canvas::kHeight, Canvas::kRate, double(Canvas::kPictures) / Canvas::kRate};
    return 1;
}

static int Give(void* user, VideoImage* image) {
    Canvas& canvas = *static_cast<Canvas*>(user);
    if (canvas.number == Canvas::kPictures)
        return 0;
    canvas.Draw();
    ++canvas.number;
    // A positive height: the first row in memory is the top one.
    Rgb32_2_yuv420_Ex(canvas.y.data(), canvas.u.data(), canvas.v.data(), Canvas::kWidth, Canvas::kChromaWidth,
                      Canvas::kChromaWidth, canvas.pixels.data(), Canvas::kWidth, Canvas::kHeight,
                      4 * Canvas::kWidth);
    image->pY = canvas.y.data();
    image->pU = canvas.u.data();
    image->pV = canvas.v.data();
    return 1;
}

int main(int argc, char** argv) {
    const std::string name = argc == 2 ? argv[1] : "out.mp4"; // ASCII; wide names are UTF-32
    const std::wstring wide(name.begin(), name.end());
    Canvas canvas;
    const MCVideoSource video = {sizeof video, &canvas, Describe, nullptr, Give, nullptr};
    MCSetLogCallback([](void*, int, const char*) {}, nullptr);
    const MCHandle converter = MCCreateFromSources(&video, nullptr);
    EncodeParam param;
    if (!converter || MCEncodeParamForFile(wide.c_str(), &param) == 0)
        return std::fprintf(stderr, "no converter, or an extension that tells no format\n"), 1;
    MCSetEncodeParam(converter, &param);
    MCSetOutputFile(converter, wide.c_str());
    MCEnableEvents(converter, 0);
    MCEnableStopOnFailure(converter, 1);
    MCStart(converter, 0.0, 0.0, nullptr, nullptr, nullptr);
    MCWait(converter, MC_INFINITE);
    MCResult result = {};
    result.nSize = sizeof result;
    MCGetResult(converter, &result);
    MCDestroy(converter);
    if (!result.bDone)
        std::fprintf(stderr, "%s: %s\n", result.szPath, result.szWhat);
    return result.bDone ? 0 : 1;
}
