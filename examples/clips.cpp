// Clips of one second each, and what to do when the disk is full: what is complete stays, the user is told
// how much that is. Usage: clips OUTPUT.mp4   makes OUTPUT_00.mp4, OUTPUT_01.mp4, ...
#include <movieconv/MovieConv.h>

#include <cstdio>
#include <string>
#include <vector>

struct Fade {
    static constexpr int kWidth = 640, kHeight = 360, kRate = 30, kPictures = 90;
    std::vector<unsigned char> luma = std::vector<unsigned char>(kWidth * kHeight);
    std::vector<unsigned char> chroma = std::vector<unsigned char>(kWidth * kHeight / 4, 128);
    int number = 0;
};

static int Describe(void*, VideoFormat* format) {
    *format = {Fade::kWidth, Fade::kHeight, Fade::kRate, double(Fade::kPictures) / Fade::kRate};
    return 1;
}

static int Draw(void* user, VideoImage* image) {
    Fade& fade = *static_cast<Fade*>(user);
    if (fade.number == Fade::kPictures)
        return 0;
    for (std::size_t i = 0; i < fade.luma.size(); ++i)
        fade.luma[i] =
            static_cast<unsigned char>(16 + (static_cast<int>(i % Fade::kWidth) + 2 * fade.number) % 220);
    image->pY = fade.luma.data();
    image->pU = image->pV = fade.chroma.data();
    ++fade.number;
    return 1;
}

/// A name of the library's for a terminal; others than ASCII are shown as "?".
static std::string Text(const wchar_t* name) {
    std::string text;
    for (; *name; ++name)
        text += *name < 0x80 ? static_cast<char>(*name) : '?';
    return text;
}

int main(int argc, char** argv) {
    const std::string name = argc == 2 ? argv[1] : "out.mp4"; // ASCII; wide names are UTF-32
    const std::wstring wide(name.begin(), name.end());
    Fade fade;
    const MCVideoSource video = {sizeof video, &fade, Describe, nullptr, Draw, nullptr};
    MCSetLogCallback([](void*, int, const char*) {}, nullptr);
    const MCHandle converter = MCCreateFromSources(&video, nullptr);
    EncodeParam param;
    if (!converter || MCEncodeParamForFile(wide.c_str(), &param) == 0)
        return std::fprintf(stderr, "no converter, or an extension that tells no format\n"), 1;
    MCSetEncodeParam(converter, &param);
    MCSetOutputFile(converter, wide.c_str());
    MCSetSplitParam(converter, 1, 1000);
    MCEnableEvents(converter, 0);
    MCEnableStopOnFailure(converter, 1); // without it the conversion would go on and lose all the rest
    MCStart(converter, 0.0, 0.0, nullptr, nullptr, nullptr);
    MCWait(converter, MC_INFINITE);

    MCResult result = {};
    result.nSize = sizeof result;
    MCGetResult(converter, &result);
    std::printf("%d clips are complete:\n", result.nFilesComplete);
    wchar_t clip[MC_MAX_TARGET_NAME];
    for (int i = 0; i < result.nFilesComplete && MCGetTargetFileName(converter, clip, i) != 0; ++i)
        std::printf("  %s\n", Text(clip).c_str());
    MCDestroy(converter);

    if (result.nCategory == MC_RESULT_NO_SPACE)
        std::fprintf(stderr, "The disk is full. Make room and convert again from second %d on.\n%s\n",
                     result.nFilesComplete, result.szWhat);
    else if (!result.bDone)
        std::fprintf(stderr, "%s: %s\n", result.szPath, result.szWhat);
    return result.bDone ? 0 : 1;
}
